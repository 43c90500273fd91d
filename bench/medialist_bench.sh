#!/usr/bin/env bash
# The conversion list's intake: CMediaListWnd adding 1,000 one-second WAV files (AddFolder:
# probing, a profile clone and the cells of each row) against acprobe probing the same files
# in one process; then the resident memory of 10,000 rows of the mp3 profile. Medians of
# REPEATS rounds. Runs its own Xvfb.
#
#   bench/medialist_bench.sh [BUILD_DIR] [REPEATS]   (needs medialist_add_bench, acprobe, data_pkg)
set -euo pipefail
build=${1:-build}
repeats=${2:-3}
bin=$(cd "$build/bin" && pwd)
if [ -z "${DISPLAY:-}" ]; then
  exec xvfb-run -a -s "-screen 0 1280x1024x24" "$0" "$@"
fi
work=$(mktemp -d "${TMPDIR:-/tmp}/medialist-bench-XXXXXX")
trap 'rm -rf "$work"' EXIT
export HOME=$work/home XDG_CONFIG_HOME=$work/home/.config XDG_DATA_HOME=$work/home/.local/share
mkdir -p "$work/files" "$HOME"
ffmpeg -nostdin -loglevel error -y -f lavfi -i "sine=frequency=440:duration=1:sample_rate=44100" \
  -ac 2 -c:a pcm_s16le "$work/one.wav"
for i in $(seq -w 1 1000); do cp "$work/one.wav" "$work/files/f$i.wav"; done

median() { sort -n | awk '{v[NR]=$1} END {if (NR % 2) print v[(NR+1)/2]; else print (v[NR/2]+v[NR/2+1])/2}'; }
: > "$work/list.log"; : > "$work/probe.log"
for ((r = 0; r < repeats; r++)); do
  "$bin/medialist_add_bench" "$work/files" "$bin" 10 > "$work/run.txt"
  [ "$(sed -n 's/^rows //p' "$work/run.txt")" = 1000 ] || { echo "the list did not take 1000 rows" >&2; exit 1; }
  sed -n 's/^add_ms //p' "$work/run.txt" >> "$work/list.log"
  start=$(date +%s%N)
  "$bin/acprobe" "$work/files"/* > /dev/null
  echo $(( ($(date +%s%N) - start) / 1000000 )) >> "$work/probe.log"
done
list=$(median < "$work/list.log")
probe=$(median < "$work/probe.log")
awk -v l="$list" -v p="$probe" 'BEGIN {
  printf "add 1000 files: list %.0f ms (%.0f files/s), acprobe %.0f ms (%.0f files/s), list/probe %.2f\n",
         l, 1000 / (l / 1000), p, 1000 / (p / 1000), l / p }'
"$bin/medialist_add_bench" "$work/files" "$bin" 10000 | grep -E 'heap|rss'
