#!/usr/bin/env bash
# Start-up, resize repaint and list paint figures of the skinned main window. Runs its own Xvfb.
# Usage: bench/skin_bench.sh [build-dir]   (needs the audio-converter and skin_paint_bench targets)
# ROUNDS (default 11) rounds of the start, each the empty frame then the program; the medians
# are compared: a start is tens of milliseconds and a shared machine's noise is a few.
set -euo pipefail
build=${1:-build}
bin=$(cd "$build/bin" && pwd)
if [ -z "${DISPLAY:-}" ]; then
  exec xvfb-run -a -s "-screen 0 1280x1024x24" "$0" "$@"
fi
home=$(mktemp -d)
trap 'rm -rf "$home"' EXIT
hook=$home/hook
mkdir -p "$hook"
export HOME=$home XDG_CONFIG_HOME=$home/.config XDG_DATA_HOME=$home/.local/share
export AUDIOCONV_TEST_DIR=$hook

# The wait for the hook's state uses shell builtins only: a loop that forks sed and sleep a
# hundred times a second takes a core from the program it is timing (a fork costs milliseconds
# on a small virtual machine), and the empty frame, timed in the foreground, has no such loop.
mkfifo "$home/nap"
exec {nap}<>"$home/nap"
state() {  # state KEY: the hook's value of KEY in $value, empty if none yet
  local line
  value=
  [ -f "$hook/state.txt" ] || return 0
  while IFS= read -r line; do
    if [[ $line == "$1="* ]]; then value=${line#*=}; return 0; fi
  done < "$hook/state.txt"
}
await() {  # await KEY: until the hook's state holds KEY with a value other than 0
  while state "$1"; [ -z "$value" ] || [ "$value" = 0 ]; do
    read -r -t 0.005 -u "$nap" || true
  done
}

median() { sort -n | awk '{v[NR]=$1} END {if (NR % 2) print v[(NR+1)/2]; else print (v[NR/2]+v[NR/2+1])/2}'; }
: > "$home/program.log"; : > "$home/empty.log"
rounds=${ROUNDS:-11}
for run in $(seq "$rounds"); do
  # The floor first, then the program: the same machine state for both sides of a round.
  start=$(date +%s%3N)
  painted=$("$bin/empty_frame_bench" | sed -n 's/^firstpaint_ms //p')
  echo $(( painted - start )) >> "$home/empty.log"
  rm -f "$hook/state.txt"
  start=$(date +%s%3N)
  "$bin/audio-converter" &
  pid=$!
  await firstpaint_ms
  echo $(( value - start )) >> "$home/program.log"
  echo "startup_to_first_paint_ms $(tail -1 "$home/program.log") (empty frame $(tail -1 "$home/empty.log"))"
  if [ "$run" = "$rounds" ]; then
    echo "benchresize 100" > "$hook/command.txt"
    await resize_ms
    echo "resize_repaint_ms_per_step $value"
  fi
  echo close > "$hook/command.txt"
  wait "$pid" || true
done
program=$(median < "$home/program.log")
empty=$(median < "$home/empty.log")
awk -v p="$program" -v e="$empty" 'BEGIN {
  printf "start to first paint: program %.0f ms, empty frame %.0f ms, ratio %.2f (goal at most 1.30)\n", p, e, p / e }'
"$bin/skin_paint_bench"
