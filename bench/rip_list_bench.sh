#!/usr/bin/env bash
# The rip list as a user meets it, in the real program under its own Xvfb:
#
#   (a) loading a 99-track disc image into the list (read from the drive list to the last row
#       filled, as the program measures it); goal: under 200 ms
#   (b) the program's CPU while it sits idle in the Rip tab polling its drives (every CD device
#       of the machine plus two disc images), measured from /proc over IDLE_SECONDS; goal: under
#       1% of a core; the same program idle in the Convert tab is shown beside it
#
#   bench/rip_list_bench.sh [BUILD_DIR] [ROUNDS]      (BUILD_DIR defaults to build, ROUNDS to 5)
set -euo pipefail
top=$(cd "$(dirname "$0")/.." && pwd)
build=${1:-$top/build}
rounds=${2:-5}
idle_seconds=${IDLE_SECONDS:-20}
bin=$(cd "$build/bin" && pwd)
if [ -z "${DISPLAY:-}" ]; then
  exec xvfb-run -a -s "-screen 0 1280x1024x24" "$0" "$@"
fi
work=$(mktemp -d "${TMPDIR:-/tmp}/rip-list-bench-XXXXXX")
trap 'echo close > "$work/hook/command.txt" 2>/dev/null; sleep 1; rm -rf "$work"' EXIT
export HOME=$work/home XDG_CONFIG_HOME=$work/home/.config XDG_DATA_HOME=$work/home/.local/share
export AUDIOCONV_TEST_DIR=$work/hook
mkdir -p "$work/hook" "$HOME"

# A disc image of N tracks of 2 seconds of silence each, whole sectors, as a disc holds them.
make_image() {
  local name=$1 tracks=$2 sector=2352 frames=150 i
  truncate -s $((tracks * frames * sector)) "$work/$name.bin"
  echo "FILE \"$name.bin\" BINARY" > "$work/$name.cue"
  for ((i = 0; i < tracks; i++)); do
    local lsn=$((i * frames))
    printf '  TRACK %02d AUDIO\n    INDEX 01 %02d:%02d:%02d\n' $((i + 1)) \
      $((lsn / 75 / 60)) $((lsn / 75 % 60)) $((lsn % 75)) >> "$work/$name.cue"
  done
}
make_image ninetynine 99
make_image second 12

state() { sed -n "s/^$1=//p" "$work/hook/state.txt" 2>/dev/null; }
send() { printf '%s\n' "$@" > "$work/hook/command.txt"; }
wait_for() { # KEY VALUE: until the hook reports it, at most 20 s
  for _ in $(seq 200); do [ "$(state "$1")" = "$2" ] && return 0; sleep 0.1; done
  echo "timed out waiting for $1=$2 (now: $(state "$1"))" >&2; exit 1
}
cpu_ticks() { awk '{print $14 + $15}' "/proc/$1/stat"; }
median() { sort -n | awk '{v[NR]=$1} END {if (NR % 2) print v[(NR+1)/2]; else print (v[NR/2]+v[NR/2+1])/2}'; }

"$bin/audio-converter" &
pid=$!
until [ -n "$(state firstpaint_ms)" ] && [ "$(state firstpaint_ms)" != 0 ]; do sleep 0.1; done
send "tab 1"
wait_for mode 1
: > "$work/load.log"
for ((r = 0; r < rounds; r++)); do
  # Adding an image the list already holds reads it afresh and loads it again.
  send "ripimage $work/ninetynine.cue"
  sleep 1.5
  [ -n "$(state riprow98)" ] || { echo "the list did not take 99 tracks" >&2; exit 1; }
  state riploadms >> "$work/load.log"
done
send "ripimage $work/second.cue"
sleep 3
hz=$(getconf CLK_TCK)
before=$(cpu_ticks "$pid")
sleep "$idle_seconds"
after=$(cpu_ticks "$pid")
rip_cpu=$(awk -v t=$((after - before)) -v hz="$hz" -v s="$idle_seconds" 'BEGIN {printf "%.2f", 100 * t / hz / s}')
send "tab 0"
wait_for mode 0
sleep 3
before=$(cpu_ticks "$pid")
sleep "$idle_seconds"
after=$(cpu_ticks "$pid")
convert_cpu=$(awk -v t=$((after - before)) -v hz="$hz" -v s="$idle_seconds" 'BEGIN {printf "%.2f", 100 * t / hz / s}')
send close
wait "$pid" || true

load=$(median < "$work/load.log")
echo "load 99-track image into the rip list: median $load ms over $rounds rounds (goal under 200 ms)"
echo "idle in the Rip tab polling $(ls /dev/sr* 2>/dev/null | wc -l) drive(s) and 2 images: ${rip_cpu}% of a core (goal under 1%); idle in the Convert tab: ${convert_cpu}%"
