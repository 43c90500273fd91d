#!/usr/bin/env bash
# Probing speed: acprobe over 200 small files in one process against a loop of ffprobe calls
# (one process per file, as a program that shells out would do), interleaved, REPEATS rounds,
# medians. Prints files per second of each and the ratio.
#
#   bench/probe_vs_ffprobe.sh [ACPROBE] [REPEATS]      (ACPROBE defaults to build/bin/acprobe)
#
# Goals: at least 8x the files/s of the ffprobe loop on 1 s WAV files, and at least 1,000
# compressed files/s (MP3, FLAC, Ogg, M4A, WMA mixed).
set -euo pipefail
top=$(cd "$(dirname "$0")/.." && pwd)
acprobe=${1:-$top/build/bin/acprobe}
repeats=${2:-3}
work=$(mktemp -d "${TMPDIR:-/tmp}/probe-bench-XXXXXX")
trap 'rm -rf "$work"' EXIT
mkdir -p "$work/wav" "$work/mixed"

gen() { ffmpeg -nostdin -loglevel error -y -f lavfi -i "sine=frequency=$1:duration=1:sample_rate=44100" -ac 2 \
          -metadata title="Tone $1" -metadata artist=Bench "${@:2}"; }
gen 440 -c:a pcm_s16le "$work/one.wav"
gen 550 -c:a libmp3lame -b:a 128k "$work/one.mp3"
gen 660 -c:a flac "$work/one.flac"
gen 770 -c:a libvorbis "$work/one.ogg"
gen 880 -c:a aac "$work/one.m4a"
gen 990 -c:a wmav2 "$work/one.wma"
for i in $(seq -w 1 200); do
  cp "$work/one.wav" "$work/wav/f$i.wav"
done
i=0
for n in $(seq 1 40); do
  for ext in mp3 flac ogg m4a wma; do
    i=$((i + 1))
    cp "$work/one.$ext" "$work/mixed/f$(printf %03d $i).$ext"
  done
done

elapsed() {  # COMMAND...: prints microseconds
  local start end
  start=$(date +%s%N)
  "$@" >/dev/null 2>&1 || true
  end=$(date +%s%N)
  echo $(( (end - start) / 1000 ))
}
ffprobe_loop() { for f in "$1"/*; do ffprobe -v error -show_format -show_streams "$f" >/dev/null; done; }
median() { sort -n | awk '{v[NR]=$1} END {if (NR % 2) print v[(NR+1)/2]; else print (v[NR/2]+v[NR/2+1])/2}'; }

printf '%-8s %14s %14s %8s\n' files acprobe_files/s ffprobe_files/s ratio
for set in wav mixed; do
  : > "$work/a.log"; : > "$work/f.log"
  for ((r = 0; r < repeats; r++)); do
    elapsed "$acprobe" "$work/$set"/* >> "$work/a.log"
    elapsed ffprobe_loop "$work/$set" >> "$work/f.log"
  done
  a=$(median < "$work/a.log")
  f=$(median < "$work/f.log")
  awk -v s="$set" -v a="$a" -v f="$f" \
    'BEGIN {printf "%-8s %14.0f %14.1f %8.1f\n", s, 200/(a/1e6), 200/(f/1e6), f/a}'
done
