#!/usr/bin/env bash
# Options > Preferences in the real program: from the command to the sheet shown with its five
# pages and idle, as the sheet measures it; the median of ROUNDS openings. Goal: under 200 ms.
#   bench/prefs_bench.sh [BUILD_DIR] [ROUNDS]
set -euo pipefail
build=${1:-build}
rounds=${2:-5}
bin=$(cd "$build/bin" && pwd)
if [ -z "${DISPLAY:-}" ]; then
  exec xvfb-run -a -s "-screen 0 1280x1024x24" "$0" "$@"
fi
work=$(mktemp -d "${TMPDIR:-/tmp}/prefs-bench-XXXXXX")
trap 'rm -rf "$work"' EXIT
export HOME=$work/home XDG_CONFIG_HOME=$work/home/.config XDG_DATA_HOME=$work/home/.local/share
export AUDIOCONV_TEST_DIR=$work/hook XDG_RUNTIME_DIR=$work
mkdir -p "$work/hook" "$HOME"
state() { sed -n "s/^$1=//p" "$work/hook/state.txt" 2>/dev/null; }
send() { printf '%s\n' "$1" > "$work/hook/command.txt"; while [ -e "$work/hook/command.txt" ]; do sleep 0.02; done; }
"$bin/audio-converter" &
pid=$!
until [ -n "$(state firstpaint_ms)" ] && [ "$(state firstpaint_ms)" != 0 ]; do sleep 0.05; done
sleep 1
: > "$work/open.log"
for ((r = 0; r < rounds; r++)); do
  send "command 33003"
  for _ in $(seq 100); do
    ms=$(state prefopenms)
    [ -n "$ms" ] && [ "$ms" != 0 ] && break
    sleep 0.05
  done
  echo "$ms" >> "$work/open.log"
  send "dialog cancel"
  sleep 0.3
done
send close
wait "$pid" || true
median=$(sort -n "$work/open.log" | awk '{v[NR]=$1} END {if (NR % 2) print v[(NR+1)/2]; else print (v[NR/2]+v[NR/2+1])/2}')
echo "preferences sheet opens in $median ms (median of $rounds; goal under 200 ms); each: $(tr '\n' ' ' < "$work/open.log")"
