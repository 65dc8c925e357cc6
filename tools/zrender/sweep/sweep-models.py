#!/usr/bin/env python3
"""Renders every model file under a folder with zrender, as small pictures, and checks that each
either renders or fails with a one-line message: no crash, no hang, no sanitizer report.

usage: sweep-models.py ZRENDER [FOLDER] [--jobs N] [--timeout S]

Prints the counts (rendered, refused by the importer, refused by zrender) and every file that
broke the rule; exits 1 if any did, 0 otherwise (also when the folder is missing: nothing to do).
"""
import argparse
import concurrent.futures
import os
import subprocess
import sys
import tempfile

# Files beside the models that are not models themselves: images, material libraries, buffers,
# notes.
NOT_MODELS = {".png", ".jpg", ".jpeg", ".bmp", ".tga", ".dds", ".gif", ".tif", ".tiff", ".pcx", ".mtl",
              ".bin", ".txt", ".md", ".html", ".xml", ".ini", ".json", ".py", ".sh", ".material", ".skeleton",
              ".program", ".ktx", ".ktx2", ".hdr", ".exr", ".mat", ".shader", ".cfg", ".xsd", ".zip"}
SKIPPED_FOLDERS = {"ReferenceImages", "SourceFiles"}
SANITIZER_MARKS = ("AddressSanitizer", "LeakSanitizer", "UndefinedBehaviorSanitizer", "runtime error:")


def model_files(folder):
    for root, dirs, files in os.walk(folder):
        dirs[:] = sorted(d for d in dirs if d not in SKIPPED_FOLDERS)
        for name in sorted(files):
            if os.path.splitext(name)[1].lower() not in NOT_MODELS:
                yield os.path.join(root, name)


# Under LeakSanitizer, leaks inside the importer library on its refusal paths are not ours.
SUPPRESSIONS = os.path.join(os.path.dirname(os.path.abspath(__file__)), "lsan-importer.supp")
ENVIRONMENT = dict(os.environ, LSAN_OPTIONS=":".join(
    filter(None, [os.environ.get("LSAN_OPTIONS"), "suppressions=" + SUPPRESSIONS, "print_suppressions=0"])))


def render(zrender, path, timeout, out_dir):
    output = os.path.join(out_dir, "%d.png" % (abs(hash(path)) % 10**12))
    try:
        done = subprocess.run([zrender, path, "--size", "48x36", "--threads", "1", "-o", output],
                              capture_output=True, text=True, errors="replace", timeout=timeout,
                              env=ENVIRONMENT)
    except subprocess.TimeoutExpired:
        return path, "broken", "no answer within %d s" % timeout
    finally:
        if os.path.exists(output):
            os.remove(output)
    errors = [line for line in done.stderr.splitlines() if not line.startswith("zrender: warning: ")]
    if any(mark in done.stderr for mark in SANITIZER_MARKS):
        report = [line for line in done.stderr.splitlines() if any(mark in line for mark in SANITIZER_MARKS)]
        return path, "broken", "sanitizer report: " + report[0]
    if done.returncode == 0 and not errors:
        return path, "rendered", ""
    if done.returncode == 1 and len(errors) == 1 and errors[0].startswith("zrender: "):
        kind = "refused by zrender" if "no triangles" in errors[0] else "refused by the importer"
        return path, kind, errors[0]
    return path, "broken", "exit status %d, stderr: %r" % (done.returncode, done.stderr[-400:])


def main():
    parser = argparse.ArgumentParser()
    parser.add_argument("zrender")
    parser.add_argument("folder", nargs="?", default="/usr/share/assimp/models")
    parser.add_argument("--jobs", type=int, default=os.cpu_count() or 1)
    parser.add_argument("--timeout", type=int, default=120)
    args = parser.parse_args()
    if not os.path.isdir(args.folder):
        print("no models in %s: nothing to sweep" % args.folder)
        return 0
    files = list(model_files(args.folder))
    counts = {"rendered": 0, "refused by the importer": 0, "refused by zrender": 0, "broken": 0}
    broken = []
    with tempfile.TemporaryDirectory() as out_dir, \
            concurrent.futures.ThreadPoolExecutor(max_workers=args.jobs) as pool:
        for path, kind, detail in pool.map(lambda p: render(args.zrender, p, args.timeout, out_dir), files):
            counts[kind] += 1
            if kind == "broken":
                broken.append("%s: %s" % (path, detail))
    print("%d files: %s" % (len(files), ", ".join("%d %s" % (n, kind) for kind, n in counts.items())))
    for line in broken:
        print("BROKEN " + line)
    return 1 if broken else 0


if __name__ == "__main__":
    sys.exit(main())
