#!/usr/bin/env bash
# Ripping against Debian's ffmpeg on the same audio, side by side in one run, the two sides
# interleaved (the order swaps every round) and their median wall times compared:
#
#   (a) one 60-second track of a generated BIN/CUE image to MP3 at 192 kbit/s by ctt, as the
#       rip driver runs it, against ffmpeg encoding that track's audio from a WAV file;
#       goal: ratio at most 1.10
#   (b) a generated 20-track image to FLAC by acrip (driver, ctt per track, naming, tags)
#       against a loop of ffmpeg over the 20 tracks as WAV files; goal: ratio at most 1.15
#
#   bench/rip_vs_ffmpeg.sh [BUILD_DIR] [ROUNDS]      (BUILD_DIR defaults to build, ROUNDS to 5)
#   TRACK_SECONDS=20 bench/rip_vs_ffmpeg.sh          (length of each track of the 20-track disc)
set -euo pipefail
top=$(cd "$(dirname "$0")/.." && pwd)
build=${1:-$top/build}
rounds=${2:-5}
track_seconds=${TRACK_SECONDS:-20}
ctt=$build/bin/ctt
acrip=$build/bin/acrip
if [ ! -x "$ctt" ] || [ ! -x "$acrip" ]; then
  echo "skipped: $ctt or $acrip is not built" >&2
  exit 77
fi
command -v ffmpeg >/dev/null || { echo "skipped: no ffmpeg on PATH" >&2; exit 77; }

work=$(mktemp -d "${TMPDIR:-/tmp}/rip-bench-XXXXXX")
trap 'rm -rf "$work"' EXIT INT TERM
# Settings and disc records of this run stay in the scratch folder.
export XDG_CONFIG_HOME="$work/config" XDG_DATA_HOME="$work/data"

sector=2352
msf() { printf '%02d:%02d:%02d' $(($1 / 75 / 60)) $(($1 / 75 % 60)) $(($1 % 75)); }

# make_disc NAME SECONDS...: NAME.bin and NAME.cue in $work, one audio track per length (a
# sine left, noise right, a different tone each), every track padded to whole sectors as a
# disc holds it; also NAME-NN.wav with exactly each track's samples, padding included.
make_disc() {
  local name=$1; shift
  local number=0 lsn=0 seconds bytes padded
  : > "$work/$name.bin"
  echo "FILE \"$name.bin\" BINARY" > "$work/$name.cue"
  for seconds in "$@"; do
    number=$((number + 1))
    ffmpeg -nostdin -loglevel error -y -filter_complex \
      "sine=frequency=$((200 + 20 * number)):duration=$seconds:sample_rate=44100[a];anoisesrc=seed=$number:amplitude=0.3:duration=$seconds:sample_rate=44100[b];[a][b]amerge=inputs=2" \
      -f s16le -c:a pcm_s16le "$work/track.raw"
    bytes=$(stat -c %s "$work/track.raw")
    padded=$(( (bytes + sector - 1) / sector * sector ))
    truncate -s "$padded" "$work/track.raw"
    cat "$work/track.raw" >> "$work/$name.bin"
    ffmpeg -nostdin -loglevel error -y -f s16le -ar 44100 -ac 2 -i "$work/track.raw" \
      -c:a pcm_s16le "$work/$name-$(printf %02d "$number").wav"
    printf '  TRACK %02d AUDIO\n    INDEX 01 %s\n' "$number" "$(msf "$lsn")" >> "$work/$name.cue"
    lsn=$((lsn + padded / sector))
  done
  rm -f "$work/track.raw"
}

now() { date +%s%N; }
# timed LOG COMMAND...: appends the wall time in microseconds to LOG; a failure ends the bench.
timed() {
  local log=$1; shift
  local start end
  start=$(now)
  "$@" > "$work/last.log" 2>&1 || { echo "failed: $*" >&2; tail -20 "$work/last.log" >&2; exit 1; }
  end=$(now)
  echo $(( (end - start) / 1000 )) >> "$log"
}
median() { sort -n "$1" | awk '{v[NR]=$1} END {if (NR % 2) print v[(NR+1)/2]; else print (v[NR/2]+v[NR/2+1])/2}'; }

# (a) -------------------------------------------------------------------------------------
make_disc one 60 5
rip_track() {
  "$ctt" -relk -y -i "$work/one.cue/Track01.cda" -acodec mp3 -title "Track01" -album "" \
    -author "" -genre "" -year "" -id3v1 -id3v2 -ar 44100 -ac 2 -ab 192 -vol 256 "$work/a-ctt.mp3"
}
encode_wav() {
  ffmpeg -nostdin -loglevel error -y -i "$work/one-01.wav" -c:a libmp3lame -b:a 192k \
    "$work/a-ff.mp3"
}
rm -f "$work/a-ctt.log" "$work/a-ff.log"
for ((r = 0; r < rounds; r++)); do
  if (( r % 2 )); then
    timed "$work/a-ff.log" encode_wav
    timed "$work/a-ctt.log" rip_track
  else
    timed "$work/a-ctt.log" rip_track
    timed "$work/a-ff.log" encode_wav
  fi
done

# (b) -------------------------------------------------------------------------------------
lengths=()
for ((i = 0; i < 20; i++)); do lengths+=("$track_seconds"); done
make_disc many "${lengths[@]}"
rip_disc() {
  rm -rf "$work/b-acrip"
  "$acrip" --device "$work/many.cue" --profile flac --out "$work/b-acrip"
}
encode_wavs() {
  rm -rf "$work/b-ff" && mkdir -p "$work/b-ff"
  for wav in "$work"/many-*.wav; do
    ffmpeg -nostdin -loglevel error -y -i "$wav" -c:a flac "$work/b-ff/$(basename "$wav" .wav).flac"
  done
}
b_rounds=$(( rounds < 3 ? rounds : 3 ))
rm -f "$work/b-acrip.log" "$work/b-ff.log"
for ((r = 0; r < b_rounds; r++)); do
  if (( r % 2 )); then
    timed "$work/b-ff.log" encode_wavs
    timed "$work/b-acrip.log" rip_disc
  else
    timed "$work/b-acrip.log" rip_disc
    timed "$work/b-ff.log" encode_wavs
  fi
done
acrip_files=$(find "$work/b-acrip" -name '*.flac' | wc -l)
ff_files=$(find "$work/b-ff" -name '*.flac' | wc -l)

a_ctt=$(median "$work/a-ctt.log"); a_ff=$(median "$work/a-ff.log")
b_acrip=$(median "$work/b-acrip.log"); b_ff=$(median "$work/b-ff.log")
printf '%-44s %10s %10s %7s %6s\n' case ours_s ffmpeg_s ratio goal
printf '%-44s %10.3f %10.3f %7.2f %6s\n' "(a) ctt 60 s track to MP3 vs ffmpeg from WAV" \
  "$(echo "$a_ctt / 1000000" | bc -l)" "$(echo "$a_ff / 1000000" | bc -l)" \
  "$(echo "$a_ctt / $a_ff" | bc -l)" "1.10"
printf '%-44s %10.3f %10.3f %7.2f %6s\n' "(b) acrip 20 x $track_seconds s to FLAC vs ffmpeg loop" \
  "$(echo "$b_acrip / 1000000" | bc -l)" "$(echo "$b_ff / 1000000" | bc -l)" \
  "$(echo "$b_acrip / $b_ff" | bc -l)" "1.15"
printf 'rounds: (a) %d, (b) %d; (b) files: acrip %d, ffmpeg %d\n' "$rounds" "$b_rounds" \
  "$acrip_files" "$ff_files"
