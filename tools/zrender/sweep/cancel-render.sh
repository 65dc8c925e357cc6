#!/usr/bin/env bash
# Presses Ctrl-C (SIGINT) on zrender at random moments of a render on two threads: each time it
# must end with status 130 and leave no picture, or, if the render was already done, with status
# 0 and the picture written. Under the sanitizers a leak or bad access turns the status non-zero.
# usage: cancel-render.sh ZRENDER [ROUNDS]
set -u
zrender="$1"
rounds="${2:-6}"
work="$(mktemp -d)"
trap 'rm -rf "$work"' EXIT
RANDOM=2026
failures=0
for ((round = 0; round < rounds; ++round)); do
  out="$work/out$round.png"
  "$zrender" --size 4000x3000 --threads 2 --tile-size 64 -o "$out" 2>"$work/err" &
  pid=$!
  sleep "0.$((RANDOM % 9 + 1))"
  kill -INT "$pid" 2>/dev/null
  wait "$pid"
  status=$?
  leftovers=$(find "$work" -name "out$round*" | wc -l)
  if [ "$status" -eq 130 ] && [ "$leftovers" -eq 0 ] && grep -qx "zrender: render cancelled" "$work/err"; then
    echo "round $round: cancelled"
  elif [ "$status" -eq 0 ] && [ -f "$out" ]; then
    echo "round $round: done before the interrupt"
  else
    echo "round $round: status $status, $leftovers files, stderr: $(tr '\n' '|' <"$work/err" | tail -c 300)"
    failures=$((failures + 1))
  fi
done
exit $((failures > 0))
