#!/bin/sh
# 200 one-second WAV files to MP3 with two running slots: acconvert (driver, ctt children,
# capture) against Debian's ffmpeg command line with two in parallel, side by side in one run.
# Prints both wall times and their ratio; the goal is a ratio of at most 1.3.
#
#   bench/acconvert_vs_ffmpeg.sh [BUILD_DIR] [FILE_COUNT]
set -eu

build=${1:-build}
count=${2:-200}
acconvert=$build/bin/acconvert
if [ ! -x "$acconvert" ] || [ ! -x "$build/bin/ctt" ]; then
    echo "skipped: $acconvert or $build/bin/ctt is not built" >&2
    exit 77
fi
command -v ffmpeg >/dev/null || { echo "skipped: no ffmpeg on PATH" >&2; exit 77; }

work=$(mktemp -d "${TMPDIR:-/tmp}/acconvert-bench-XXXXXX")
trap 'rm -rf "$work"' EXIT INT TERM
# Settings and user profiles of this run stay in the scratch folder.
export XDG_CONFIG_HOME="$work/config" XDG_DATA_HOME="$work/data"
mkdir -p "$work/in" "$work/out-ac" "$work/out-ff"

ffmpeg -nostdin -loglevel error -f lavfi -i "sine=frequency=440:duration=1:sample_rate=44100" \
    -ac 2 "$work/in/0000.wav"
i=1
while [ "$i" -lt "$count" ]; do
    cp "$work/in/0000.wav" "$work/in/$(printf %04d "$i").wav"
    i=$((i + 1))
done

# Both sides encode MP3 at 128 kbit/s; the profile is written here so the comparison does not
# depend on what the shipped mp3 profile chooses.
printf '[Main]\r\nname=Bench MP3\r\nFormat=mp3\r\nExtName=mp3\r\n[Parameter]\r\nacodec = 0, "mp3", "mp3"\r\nab = 0, "128", "128"\r\nss = 0, "0", "0"\r\n' \
    > "$work/bench.pf"

now() { date +%s.%N; }

start=$(now)
"$acconvert" --profile "$work/bench.pf" --out "$work/out-ac" --jobs 2 "$work"/in/*.wav > "$work/ac.log" 2>&1 ||
    { echo "acconvert failed:" >&2; tail -20 "$work/ac.log" >&2; exit 1; }
ac_time=$(echo "$(now) - $start" | bc -l)

start=$(now)
ls "$work"/in/*.wav | xargs -P2 -I{} sh -c \
    'ffmpeg -nostdin -loglevel error -y -i "$1" -vn -codec:a libmp3lame -b:a 128k \
        "$2/$(basename "$1" .wav).mp3"' sh {} "$work/out-ff"
ff_time=$(echo "$(now) - $start" | bc -l)

ac_files=$(ls "$work/out-ac" | wc -l)
ff_files=$(ls "$work/out-ff" | wc -l)
printf 'files            %d (acconvert wrote %d, ffmpeg wrote %d)\n' "$count" "$ac_files" "$ff_files"
printf 'acconvert -j2    %.2f s\n' "$ac_time"
printf 'ffmpeg xargs -P2 %.2f s\n' "$ff_time"
printf 'ratio            %.2f (goal <= 1.30)\n' "$(echo "$ac_time / $ff_time" | bc -l)"
