#!/usr/bin/env python3
"""Measures how many one-line faults the test suite catches.

  fault-hunt.py draw --seed 7 --count 40 > faults.tsv   # random faults over the library's sources
  fault-hunt.py run faults.tsv --build build/opt         # apply each, rebuild, run ctest, restore

A fault is one line of a source file replaced by another: file, line number, the original text and
the faulty text, tab-separated (hand-written faults use the same form; `#` starts a comment line).
`run` applies each fault to the working tree, rebuilds the given build folder, runs the whole
suite there, restores the file and prints one line per fault: caught (with the first failing
tests), escaped, or no-build (the fault does not compile and says nothing about the suite). A
fault whose original text is no longer at its line is looked up elsewhere in its file; if the text
is gone the fault is reported as moved. Run it on a scratch clone: it edits sources in place.
"""
import argparse
import os
import random
import re
import subprocess
import sys

LIBRARY_DIRS = ["base/geometryBase/src", "resmgt", "pluginAPI/imageAPI/src", "primitives",
                "internalAPI", "render/renderLib/src", "render/suave/src", "render/yarp/src",
                "render/shaders/src"]

# Operators are only mutated where spaces surround them, which tells a comparison from a template
# bracket and a binary minus from a sign.
SWAPS = [(" < ", [" <= ", " > "]), (" <= ", [" < "]), (" > ", [" >= ", " < "]), (" >= ", [" > "]),
         (" == ", [" != "]), (" != ", [" == "]), (" + ", [" - "]), (" - ", [" + "]),
         (" * ", [" / "]), (" && ", [" || "]), (" || ", [" && "]), (" += ", [" -= "]),
         (" -= ", [" += "]), ("true", ["false"]), ("false", ["true"])]
NUMBER = re.compile(r"(?<![\w.])(\d+\.\d*|\d+)(f?)(?![\w.])")


def library_files(root):
    files = []
    for d in LIBRARY_DIRS:
        base = os.path.join(root, d)
        if not os.path.isdir(base):
            continue
        for name in sorted(os.listdir(base)):
            if name.endswith((".cpp", ".h")) and "test" not in name.lower():
                files.append(os.path.join(d, name))
    return files


def computing_line(text):
    """Lines worth mutating: code, not comments, includes, printers or assertion texts."""
    s = text.strip()
    if not s or s.startswith(("//", "/*", "*", "#")):
        return False
    return not any(k in s for k in ("<<", "dump", "Assertions::", "static_assert", "operator"))


def mutants(text):
    code = text.split("//")[0]
    out = []
    for old, news in SWAPS:
        start = code.find(old)
        while start >= 0:
            if old in ("true", "false") and (code[start - 1:start].isalnum() or
                                             code[start + len(old):start + len(old) + 1].isalnum()):
                start = code.find(old, start + 1)
                continue
            for new in news:
                out.append(text[:start] + new + text[start + len(old):])
            start = code.find(old, start + 1)
    for m in NUMBER.finditer(code):
        digits = m.group(1)
        if "." in digits:
            last = len(digits.rstrip("0")) - 1
            if digits[last] == ".":
                changed = str(int(digits[:last]) + 1) + digits[last:]
            else:
                changed = digits[:last] + str((int(digits[last]) + 1) % 10) + digits[last + 1:]
        else:
            changed = str(int(digits) + 1)
        out.append(text[:m.start(1)] + changed + text[m.end(1):])
    return out


def draw(args):
    rng = random.Random(args.seed)
    candidates = []
    for f in library_files(args.root):
        with open(os.path.join(args.root, f)) as fh:
            for n, line in enumerate(fh.read().split("\n"), 1):
                if computing_line(line) and mutants(line):
                    candidates.append((f, n, line))
    print(f"# {args.count} faults, seed {args.seed}, over {len(candidates)} mutable lines")
    for f, n, line in rng.sample(candidates, args.count):
        print(f"{f}\t{n}\t{line}\t{rng.choice(mutants(line))}")


def read_faults(path):
    with open(path) as fh:
        for row in fh.read().split("\n"):
            if row and not row.startswith("#"):
                f, n, old, new = row.split("\t")
                yield f, int(n), old, new


def run_suite(build):
    test = subprocess.run(["ctest", "--test-dir", build, "-j2", "--timeout", "120"],
                          capture_output=True, text=True)
    if test.returncode == 0:
        return "escaped", ""
    # Typed tests have spaces in their names: take the whole name up to ctest's closing verdict.
    failed = re.findall(r"^\s*\d+ - (.+) \([^()]*\)\s*$", test.stdout, re.M)
    return "caught", " ".join(failed[:3]) + (" ..." if len(failed) > 3 else "")


def run(args):
    caught = escaped = 0
    for f, n, old, new in read_faults(args.faults):
        path = os.path.join(args.root, f)
        with open(path) as fh:
            original = fh.read()
        lines = original.split("\n")
        where = n - 1 if n <= len(lines) and lines[n - 1] == old else \
            (lines.index(old) if old in lines else -1)
        if where < 0:
            print(f"moved\t{f}:{n}\t{new.strip()}", flush=True)
            continue
        lines[where] = new
        try:
            with open(path, "w") as fh:
                fh.write("\n".join(lines))
            build = subprocess.run(["cmake", "--build", args.build], capture_output=True, text=True)
            if build.returncode != 0:
                verdict, tests = "no-build", ""
            else:
                verdict, tests = run_suite(args.build)
        finally:
            with open(path, "w") as fh:
                fh.write(original)
        caught += verdict == "caught"
        escaped += verdict == "escaped"
        print(f"{verdict}\t{f}:{where + 1}\t{old.strip()}  =>  {new.strip()}\t{tests}", flush=True)
    subprocess.run(["cmake", "--build", args.build], capture_output=True)
    print(f"# caught {caught}, escaped {escaped}")


def main():
    parser = argparse.ArgumentParser(description=__doc__.split("\n")[0])
    parser.add_argument("--root", default=os.path.dirname(os.path.dirname(os.path.abspath(__file__))))
    sub = parser.add_subparsers(dest="command", required=True)
    d = sub.add_parser("draw")
    d.add_argument("--seed", type=int, default=1)
    d.add_argument("--count", type=int, default=40)
    r = sub.add_parser("run")
    r.add_argument("faults")
    r.add_argument("--build", default="build/opt")
    args = parser.parse_args()
    draw(args) if args.command == "draw" else run(args)


if __name__ == "__main__":
    sys.exit(main())
