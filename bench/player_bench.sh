#!/usr/bin/env bash
# The preview library against ffplay on the same files, on SDL's dummy sound driver:
#
#   (a) from the press of Play (avp_open) to the first sample handed to the sound device, for
#       a local MP3, FLAC and WAV; goal: under 150 ms
#   (b) a seek, from avp_set_cur_pos to the first sample of the new place; goal: under 100 ms
#   (c) avp_stop until avp_run returns; goal: under 100 ms
#   (d) CPU while playing: audio (goal under 5% of a core) beside ffplay -nodisp, and a 720p
#       H.264 video with sound (goal under 60%, decoding included) beside ffplay showing it on
#       this script's Xvfb; and the peak memory of a 1-minute and a 1-hour file, which the
#       bounded queues keep alike
#   (e) the file information page after a selection change, in the real program: built,
#       written, read back and laid out; goal: under 50 ms
#
#   bench/player_bench.sh [BUILD_DIR] [ROUNDS]      (BUILD_DIR defaults to build, ROUNDS to 5)
set -euo pipefail
top=$(cd "$(dirname "$0")/.." && pwd)
build=${1:-$top/build}
rounds=${2:-5}
play_seconds=${PLAY_SECONDS:-10}
bin=$(cd "$build/bin" && pwd)
if [ -z "${DISPLAY:-}" ]; then
  exec xvfb-run -a -s "-screen 0 1280x1024x24" "$0" "$@"
fi
export SDL_AUDIODRIVER=dummy
work=$(mktemp -d "${TMPDIR:-/tmp}/player-bench-XXXXXX")
trap 'echo close > "$work/hook/command.txt" 2>/dev/null; sleep 1; rm -rf "$work"' EXIT
ff() { ffmpeg -nostdin -hide_banner -loglevel error -y "$@"; }
median() { sort -n | awk '{v[NR]=$1} END {if (NR % 2) print v[(NR+1)/2]; else print (v[NR/2]+v[NR/2+1])/2}'; }

echo "Making the files..."
ff -f lavfi -i "sine=frequency=440:duration=60" -ac 2 "$work/minute.wav"
ff -i "$work/minute.wav" -c:a libmp3lame -b:a 192k "$work/minute.mp3"
ff -i "$work/minute.wav" -c:a flac "$work/minute.flac"
ff -f lavfi -i "testsrc2=size=1280x720:rate=30:duration=30" -f lavfi -i "sine=duration=30" \
   -c:v libx264 -preset veryfast -pix_fmt yuv420p -c:a aac -b:a 128k -shortest "$work/clip720.mp4"
# An hour of 16-bit stereo, zeros kept sparse on disk behind a real header.
ff -f lavfi -i "anullsrc=r=44100:cl=stereo" -t 1 "$work/hour.wav"
bytes=$((3600 * 44100 * 4))
python3 - "$work/hour.wav" "$bytes" <<'PY'
import struct, sys
path, size = sys.argv[1], int(sys.argv[2])
data = open(path, 'rb').read()
at = data.find(b'data')
with open(path, 'r+b') as f:
    f.seek(4); f.write(struct.pack('<I', at + 4 + size))
    f.seek(at + 4); f.write(struct.pack('<I', size))
    f.truncate(at + 8 + size)
PY

figure() { # MODE FILE: the median of ROUNDS runs of player_bench
  for ((r = 0; r < rounds; r++)); do "$bin/player_bench" "$1" "$2"; done | median
}
# CPU % of a command over its run: user + system over elapsed, from /usr/bin/time.
cpu_of() {
  /usr/bin/time -f '%U %S %e' -o "$work/time.txt" "$@" >/dev/null 2>&1 || true
  awk '{ if ($3 > 0) printf "%.1f", 100 * ($1 + $2) / $3; else print "n/a" }' "$work/time.txt"
}

echo
echo "(a) Play to first sample (ms, median of $rounds; goal < 150)"
for f in minute.mp3 minute.flac minute.wav; do
  printf '    %-12s %s\n' "$f" "$(figure first "$work/$f")"
done
echo "(b) Seek to first sample of the new place (ms, median; goal < 100)"
for f in minute.mp3 minute.flac minute.wav clip720.mp4; do
  printf '    %-12s %s\n' "$f" "$(figure seek "$work/$f")"
done
echo "(c) avp_stop until avp_run returns (ms, median; goal < 100)"
for f in minute.mp3 clip720.mp4; do
  printf '    %-12s %s\n' "$f" "$(figure stop "$work/$f")"
done

echo "(d) CPU while playing for ${play_seconds} s (% of one core) and peak memory"
read -r ours_audio ours_audio_mb _ < <("$bin/player_bench" play "$work/minute.mp3" "$play_seconds")
ffplay_audio=$(cpu_of ffplay -nodisp -autoexit -loglevel quiet -t "$play_seconds" "$work/minute.mp3")
read -r ours_video ours_video_mb ours_pictures < <("$bin/player_bench" play "$work/clip720.mp4" "$play_seconds")
ffplay_video=$(cpu_of ffplay -autoexit -loglevel quiet -t "$play_seconds" "$work/clip720.mp4")
printf '    %-34s %6s %%   (ffplay -nodisp %s %%; goal < 5)\n' "MP3 192k" "$ours_audio" "$ffplay_audio"
printf '    %-34s %6s %%   (ffplay %s %%; goal < 60; %s pictures)\n' "H.264 1280x720 30 fps + AAC" \
  "$ours_video" "$ffplay_video" "$ours_pictures"
awk -v a="$ours_audio" -v b="$ffplay_audio" -v c="$ours_video" -v d="$ffplay_video" 'BEGIN {
  if (b > 0) printf "    ratio to ffplay: audio %.2f", a / b;
  if (d > 0) printf ", video %.2f", c / d;
  print "" }'
read -r _ minute_mb _ < <("$bin/player_bench" play "$work/minute.wav" 3)
read -r _ hour_mb _ < <("$bin/player_bench" play "$work/hour.wav" 3)
printf '    peak memory: 1-minute WAV %s MB, 1-hour WAV %s MB, 720p video %s MB, MP3 %s MB\n' \
  "$minute_mb" "$hour_mb" "$ours_video_mb" "$ours_audio_mb"

echo "(e) File information page after a selection change (ms, median of $rounds; goal < 50)"
export HOME=$work/home XDG_CONFIG_HOME=$work/home/.config XDG_DATA_HOME=$work/home/.local/share
export AUDIOCONV_TEST_DIR=$work/hook
mkdir -p "$work/hook" "$HOME"
state() { sed -n "s/^$1=//p" "$work/hook/state.txt" 2>/dev/null; }
send() { # waits until the program has taken the last command
  for _ in $(seq 100); do [ -e "$work/hook/command.txt" ] || break; sleep 0.05; done
  printf '%s\n' "$@" > "$work/hook/command.tmp" && mv "$work/hook/command.tmp" "$work/hook/command.txt"
}
"$bin/audio-converter" &
until [ -n "$(state firstpaint_ms)" ] && [ "$(state firstpaint_ms)" != 0 ]; do sleep 0.1; done
send "add $work/minute.mp3"
send "add $work/clip720.mp4"
send "select 0"
send "command 33045"
for _ in $(seq 100); do [ "$(state fileinfo_shown)" = 1 ] && break; sleep 0.1; done
: > "$work/info.log"
for ((r = 0; r < rounds; r++)); do
  send "select $(((r + 1) % 2))"
  sleep 0.5
  state fileinfo_ms >> "$work/info.log"
done
printf '    %s\n' "$(median < "$work/info.log")"
