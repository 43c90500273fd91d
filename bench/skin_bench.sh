#!/usr/bin/env bash
# Start-up, resize repaint and list paint figures of the skinned main window. Runs its own Xvfb.
# Usage: bench/skin_bench.sh [build-dir]   (needs the audio-converter and skin_paint_bench targets)
set -euo pipefail
build=${1:-build}
bin=$(cd "$build/bin" && pwd)
if [ -z "${DISPLAY:-}" ]; then
  exec xvfb-run -a -s "-screen 0 1280x1024x24" "$0" "$@"
fi
home=$(mktemp -d)
trap 'rm -rf "$home"' EXIT
hook=$home/hook
mkdir -p "$hook"
export HOME=$home XDG_CONFIG_HOME=$home/.config XDG_DATA_HOME=$home/.local/share
export AUDIOCONV_TEST_DIR=$hook

state() { sed -n "s/^$1=//p" "$hook/state.txt" 2>/dev/null; }

for run in 1 2 3 4 5; do
  rm -f "$hook/state.txt"
  start=$(date +%s%3N)
  "$bin/audio-converter" &
  pid=$!
  until [ -n "$(state firstpaint_ms)" ] && [ "$(state firstpaint_ms)" != 0 ]; do sleep 0.05; done
  echo "startup_to_first_paint_ms $(( $(state firstpaint_ms) - start ))"
  if [ "$run" = 5 ]; then
    echo "benchresize 100" > "$hook/command.txt"
    until [ -n "$(state resize_ms)" ] && [ "$(state resize_ms)" != 0 ]; do sleep 0.05; done
    echo "resize_repaint_ms_per_step $(state resize_ms)"
  fi
  echo close > "$hook/command.txt"
  wait "$pid" || true
done
"$bin/skin_paint_bench"
