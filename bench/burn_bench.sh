#!/usr/bin/env bash
# The burn mode's speed beside the tools a user would otherwise use, each pair in one run:
#
#   (a) the conversion stage of a 20-track audio burn (acburn --times, ctt children with two
#       running) against a two-way ffmpeg loop converting the same files to WAV; goal <= 1.2
#   (b) writing a 70-minute audio image (NAME.bin + NAME.cue) from 20 WAV tracks through the image
#       recorder against cp of the same files, both synced to disk; goal <= 1.2. (Within acburn
#       the write also shares the disk with the writeback of the files the conversion just made:
#       its own --times figure is printed beside.)
#   (c) a 600 MB data image through libisofs and libburn's stdio: drive against
#       xorriso -as mkisofs -J on the same files; goal <= 1.2
#   (d) the recorder poll's CPU while the burn tab sits idle, in the real program under Xvfb;
#       goal under 1% of a core
#
#   bench/burn_bench.sh [BUILD_DIR] [ROUNDS]      (BUILD_DIR defaults to build, ROUNDS to 3)
set -euo pipefail
top=$(cd "$(dirname "$0")/.." && pwd)

# (d) alone, under the Xvfb the main run starts for it: the program idle in the burn tab, its
# recorders polled once a second (the image recorder, and every real one the machine has).
if [ "${1:-}" = --idle-only ]; then
  bin=$(cd "$2/bin" && pwd)
  idle_seconds=${IDLE_SECONDS:-20}
  work=$(mktemp -d "${TMPDIR:-/tmp}/burn-idle-XXXXXX")
  trap 'echo close > "$work/hook/command.txt" 2>/dev/null; sleep 1; rm -rf "$work"' EXIT
  export HOME=$work/home XDG_CONFIG_HOME=$work/home/.config XDG_DATA_HOME=$work/home/.local/share
  export AUDIOCONV_TEST_DIR=$work/hook
  unset AC_NO_RECORDER_SCAN
  mkdir -p "$work/hook" "$XDG_CONFIG_HOME/audio-converter"
  printf '[Software\\Velmorant\\Audio Converter\\Settings]\nlast_run_function=dword:2\n' \
    > "$XDG_CONFIG_HOME/audio-converter/settings.ini"
  "$bin/audio-converter" &
  pid=$!
  until grep -q '^burnrecorders=[1-9]' "$work/hook/state.txt" 2>/dev/null; do sleep 0.2; done
  sleep 2
  hz=$(getconf CLK_TCK)
  ticks() { awk '{print $14 + $15}' "/proc/$pid/stat"; }
  before=$(ticks)
  sleep "$idle_seconds"
  after=$(ticks)
  recorders=$(sed -n 's/^burnrecorders=//p' "$work/hook/state.txt")
  awk -v t=$((after - before)) -v hz="$hz" -v s="$idle_seconds" -v n="$recorders" \
    'BEGIN {printf "(d) idle in the burn tab, %d recorder(s) polled: %.2f%% of a core over %d s (goal < 1%%)\n", n, 100 * t / hz / s, s}'
  exit 0
fi

build=${1:-$top/build}
rounds=${2:-3}
bin=$(cd "$build/bin" && pwd)
for tool in acburn ctt burn_image audio-converter; do
  [ -x "$bin/$tool" ] || { echo "skipped: $bin/$tool is not built" >&2; exit 77; }
done
for tool in ffmpeg xorriso bc; do
  command -v "$tool" >/dev/null || { echo "skipped: no $tool on PATH" >&2; exit 77; }
done

work=$(mktemp -d "${TMPDIR:-/tmp}/burn-bench-XXXXXX")
trap 'rm -rf "$work"' EXIT INT TERM
export HOME=$work/home XDG_CONFIG_HOME=$work/home/.config XDG_DATA_HOME=$work/home/.local/share
export TMPDIR=$work/tmp AC_NO_RECORDER_SCAN=1
mkdir -p "$HOME" "$TMPDIR" "$work/src" "$work/long" "$work/data" "$work/out"
# Two children running at once on both sides.
mkdir -p "$XDG_CONFIG_HOME/audio-converter"
printf '[Software\\Velmorant\\Audio Converter\\Settings]\nmax_running_processes=dword:2\n' \
  > "$XDG_CONFIG_HOME/audio-converter/settings.ini"

now() { date +%s.%N; }
median() { sort -n | awk '{v[NR]=$1} END {if (NR % 2) print v[(NR+1)/2]; else print (v[NR/2]+v[NR/2+1])/2}'; }
ratio() { echo "scale=2; $1 / $2" | bc -l; }

# 20 FLAC tracks of 30 s (a), 20 WAV tracks of 210 s = 70 minutes (b), 600 MB of files (c).
for i in $(seq -w 1 20); do
  ffmpeg -nostdin -loglevel error -f lavfi -i "sine=frequency=$((200 + 10#$i * 20)):duration=30:sample_rate=44100" \
    -ac 2 "$work/src/t$i.flac"
done
ffmpeg -nostdin -loglevel error -f lavfi -i "anoisesrc=seed=5:duration=210:sample_rate=44100" -ac 2 \
  -c:a pcm_s16le "$work/long/t01.wav"
for i in $(seq -w 2 20); do cp "$work/long/t01.wav" "$work/long/t$i.wav"; done
for i in $(seq -w 1 12); do head -c 50000000 /dev/urandom > "$work/data/f$i.mp3"; done

: > "$work/a_ours"; : > "$work/a_ff"; : > "$work/b_ours"; : > "$work/b_cp"; : > "$work/b_acburn"
: > "$work/c_ours"; : > "$work/c_xo"
sync
for ((r = 0; r < rounds; r++)); do
  rm -f "$work"/out/*
  "$bin/acburn" --times --image "$work/out/a" "$work"/src/*.flac > /dev/null 2> "$work/a.log"
  sed -n 's/.*conversion \([0-9.]*\) s.*/\1/p' "$work/a.log" >> "$work/a_ours"
  rm -rf "$work/ff" && mkdir -p "$work/ff"
  start=$(now)
  ls "$work"/src/*.flac | xargs -P2 -I{} sh -c \
    'ffmpeg -nostdin -loglevel error -y -i "$1" -vn -c:a pcm_s16le -ar 44100 -ac 2 "$2/$(basename "$1" .flac).wav"' \
    sh {} "$work/ff"
  echo "$(now) - $start" | bc -l >> "$work/a_ff"

  rm -rf "$work"/out/*
  "$bin/burn_image" --audio "$work/out/b" "$work"/long/*.wav >> "$work/b_ours"
  mkdir -p "$work/out/cp"
  start=$(now)
  cp "$work"/long/*.wav "$work/out/cp/" && sync -f "$work/out/cp"
  echo "$(now) - $start" | bc -l >> "$work/b_cp"
  rm -rf "$work"/out/*
  "$bin/acburn" --times --image "$work/out/b" "$work"/long/*.wav > /dev/null 2> "$work/b.log"
  sed -n 's/.*writing \([0-9.]*\) s.*/\1/p' "$work/b.log" >> "$work/b_acburn"
  sync

  rm -f "$work"/out/*
  rm -rf "$work"/out/*
  "$bin/burn_image" "$work/out/c" "$work"/data/*.mp3 >> "$work/c_ours"
  start=$(now)
  xorriso -as mkisofs -quiet -J -o "$work/out/x.iso" "$work/data" 2> /dev/null
  echo "$(now) - $start" | bc -l >> "$work/c_xo"
done
bin_mb=$(($(stat -c %s "$work/long/t01.wav") * 20 / 1048576))

a1=$(median < "$work/a_ours"); a2=$(median < "$work/a_ff")
b1=$(median < "$work/b_ours"); b2=$(median < "$work/b_cp"); b3=$(median < "$work/b_acburn")
c1=$(median < "$work/c_ours"); c2=$(median < "$work/c_xo")
printf '(a) conversion stage, 20 x 30 s FLAC -> WAV:  acburn %6.2f s  ffmpeg x2 %6.2f s  ratio %s (goal <= 1.2)\n' "$a1" "$a2" "$(ratio "$a1" "$a2")"
printf '(b) 70-minute audio image (%d MB):          write  %6.2f s  cp        %6.2f s  ratio %s (goal <= 1.2)\n' "$bin_mb" "$b1" "$b2" "$(ratio "$b1" "$b2")"
printf '    the same write inside acburn, after its conversion: %6.2f s\n' "$b3"
printf '(c) 600 MB data image:                       ours   %6.2f s  xorriso   %6.2f s  ratio %s (goal <= 1.2)\n' "$c1" "$c2" "$(ratio "$c1" "$c2")"

# (d) The recorder poll, idle in the burn tab.
if [ -z "${DISPLAY:-}" ] && command -v xvfb-run >/dev/null; then
  idle=$(xvfb-run -a -s "-screen 0 1280x1024x24" "$0" --idle-only "$build")
else
  idle=$("$0" --idle-only "$build")
fi
echo "$idle"
