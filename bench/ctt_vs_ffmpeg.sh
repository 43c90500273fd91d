#!/usr/bin/env bash
# ctt against Debian's ffmpeg on the same generated WAV inputs, side by side: for each length
# and format the two run interleaved (the order swaps every round), REPEATS rounds, and the
# medians of wall time and peak memory are compared. Ratios below 1 mean ctt was faster.
#
#   bench/ctt_vs_ffmpeg.sh [CTT] [REPEATS]      (CTT defaults to build/bin/ctt)
#
# Goals: ctt/ffmpeg <= 1.05 for a 60 s MP3 and <= 1.10 for the others, <= 1.00 on 1 s
# (ctt loads fewer libraries), <= 1.03 on 10 minutes; ctt's peak memory at most ffmpeg's and
# flat in the input's length. Needs /usr/bin/time (Debian package "time").
set -euo pipefail
top=$(cd "$(dirname "$0")/.." && pwd)
ctt=${1:-$top/build/bin/ctt}
repeats=${2:-5}
work=$(mktemp -d "${TMPDIR:-/tmp}/ctt-bench-XXXXXX")
trap 'rm -rf "$work"' EXIT

for seconds in 1 60 600; do
  ffmpeg -nostdin -loglevel error -y -filter_complex \
    "sine=frequency=440:duration=$seconds:sample_rate=44100[a];anoisesrc=seed=1:amplitude=0.3:duration=$seconds:sample_rate=44100[b];[a][b]amerge=inputs=2" \
    -c:a pcm_s16le "$work/in$seconds.wav"
done

# format name | ctt options | ffmpeg options | extension
formats=(
  "mp3-192k|-acodec mp3 -ab 192|-c:a libmp3lame -b:a 192k|mp3"
  "flac|-f flac|-c:a flac|flac"
  "ogg-vorbis|-acodec vorbis -ab 128|-c:a libvorbis -b:a 128k|ogg"
  "aac-m4a|-acodec aac -ab 128|-c:a aac -b:a 128k|m4a"
  "wma|-acodec wmav2 -ab 128|-c:a wmav2 -b:a 128k|wma"
)

# run OUTFILE_PREFIX COMMAND...: appends "seconds peak_kb" to OUTFILE_PREFIX.log
run() {
  local log=$1; shift
  local start end
  start=$(date +%s%N)
  /usr/bin/time -f %M -o "$work/mem" "$@" >/dev/null 2>&1
  end=$(date +%s%N)
  echo "$(( (end - start) / 1000 )) $(cat "$work/mem")" >> "$log"
}

median() { sort -n | awk '{v[NR]=$1} END {if (NR % 2) print v[(NR+1)/2]; else print (v[NR/2]+v[NR/2+1])/2}'; }

printf '%-11s %6s %10s %10s %7s %10s %10s\n' format input ctt_s ffmpeg_s ratio ctt_KB ffmpeg_KB
for seconds in 1 60 600; do
  rounds=$repeats
  [ "$seconds" = 600 ] && rounds=$(( repeats < 3 ? repeats : 3 ))
  for entry in "${formats[@]}"; do
    IFS='|' read -r name cttopts ffopts ext <<< "$entry"
    rm -f "$work/ctt.log" "$work/ff.log"
    in="$work/in$seconds.wav"
    for ((r = 0; r < rounds; r++)); do
      # shellcheck disable=SC2086
      if (( r % 2 )); then
        run "$work/ff.log" ffmpeg -nostdin -loglevel error -y -i "$in" $ffopts "$work/ff.$ext"
        run "$work/ctt.log" "$ctt" -relk -y -i "$in" $cttopts -vol 256 "$work/ctt.$ext"
      else
        run "$work/ctt.log" "$ctt" -relk -y -i "$in" $cttopts -vol 256 "$work/ctt.$ext"
        run "$work/ff.log" ffmpeg -nostdin -loglevel error -y -i "$in" $ffopts "$work/ff.$ext"
      fi
    done
    ct=$(awk '{print $1}' "$work/ctt.log" | median)
    ft=$(awk '{print $1}' "$work/ff.log" | median)
    cm=$(awk '{print $2}' "$work/ctt.log" | median)
    fm=$(awk '{print $2}' "$work/ff.log" | median)
    awk -v n="$name" -v s="${seconds}s" -v ct="$ct" -v ft="$ft" -v cm="$cm" -v fm="$fm" \
      'BEGIN {printf "%-11s %6s %10.3f %10.3f %7.3f %10d %10d\n", n, s, ct/1e6, ft/1e6, ct/ft, cm, fm}'
  done
done
