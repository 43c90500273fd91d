#!/usr/bin/env bash
# Takes the screenshots of the help pages (help/images/) from the built program under its own
# Xvfb, driven through the window tests' hook. Run after a build: bash scripts/help-screenshots.sh
set -euo pipefail
top=$(cd "$(dirname "$0")/.." && pwd)
bin=${BUILD_DIR:-$top/build}/bin
out=$top/help/images
work=$(mktemp -d)
trap 'kill $(jobs -p) 2>/dev/null || true; rm -rf "$work"' EXIT
display=:$((80 + RANDOM % 100))
Xvfb "$display" -screen 0 1280x1024x24 >/dev/null 2>&1 &
sleep 1
export DISPLAY=$display HOME=$work/home XDG_CONFIG_HOME=$work/home/.config XDG_DATA_HOME=$work/home/.local/share
export AUDIOCONV_TEST_DIR=$work/hook AUDIOCONV_POWER_DRYRUN=$work/power LANGUAGE=en LANG=C.UTF-8
mkdir -p "$work/hook" "$work/in"
for name in "Morning Raga" "Harbour Lights" "Night Train"; do
  ffmpeg -nostdin -loglevel error -f lavfi -i "sine=frequency=330:duration=3" "$work/in/$name.flac"
done
ffmpeg -nostdin -loglevel error -f lavfi -i "sine=duration=4" "$work/in/Cut Short.wav"
truncate -s 200000 "$work/in/Cut Short.wav"
echo "no audio here" > "$work/in/notes.mp3"

send() { printf '%s\n' "$@" > "$work/hook/command.txt"; sleep "${PAUSE:-1.5}"; }
shot() { # name: the main window, cut from the screen by the rectangle the hook reports
  local rect; rect=$(grep '^rect=' "$work/hook/state.txt" | cut -d= -f2)
  IFS=, read -r x y w h <<<"$rect"
  import -window root -crop "${w}x${h}+${x}+${y}" +repage "$out/$1.png"
}
"$bin/audio-converter" &
sleep 3
send "move 120 60 1000 760"
send "outdir $work/out" "add $work/in/Morning Raga.flac" "add $work/in/Harbour Lights.flac" "add $work/in/Night Train.flac"
PAUSE=6 send "command 32776"
send "select 1"
shot convert
send "advanced on"
shot profiles
send "advanced off" "command 32773"
send "add $work/in/Morning Raga.flac" "add $work/in/Cut Short.wav" "add $work/in/notes.mp3"
PAUSE=5 send "command 32776"
send "select 1"
shot failed
send close
echo "help-screenshots: $(ls "$out" | tr '\n' ' ')"
