#!/usr/bin/env bash
# Builds the Debian package from the build tree, checks it with lintian, unpacks it into a
# throwaway root and runs the unpacked program and tools from there.
#   deb_test.sh BUILD_DIR
set -euo pipefail
build=$(cd "$1" && pwd)
work=$(mktemp -d "${TMPDIR:-/tmp}/deb-test-XXXXXX")
trap 'rm -rf "$work"' EXIT
fail() { echo "deb test: $*" >&2; exit 1; }
export HOME=$work/home XDG_CONFIG_HOME=$work/home/.config XDG_DATA_HOME=$work/home/.local/share
mkdir -p "$HOME"

(cd "$build" && cpack -G DEB -B "$work/pkg" > "$work/cpack.log" 2>&1) \
  || { cat "$work/cpack.log" >&2; fail "cpack failed"; }
deb=$(ls "$work"/pkg/*.deb)
dpkg-deb -f "$deb" Depends | grep -q libwxgtk3.2 || fail "dpkg-shlibdeps found no dependencies"

if command -v lintian > /dev/null; then
  # Errors fail the package; what is overridden is justified in packaging/lintian-overrides.
  lintian --fail-on error,warning "$deb" 2>&1 | grep -v "running with root privileges" \
    > "$work/lintian.log" || true
  if [ -s "$work/lintian.log" ]; then cat "$work/lintian.log" >&2; fail "lintian complains"; fi
fi

root=$work/root
dpkg-deb -x "$deb" "$root"
[ -x "$root/usr/bin/audio-converter" ] && [ -x "$root/usr/lib/audio-converter/ctt" ] \
  && [ -f "$root/usr/share/audio-converter/data.pkg" ] || fail "the package lacks the program's files"
ffmpeg -nostdin -loglevel error -f lavfi -i "sine=duration=1" "$work/tone.wav"
"$root/usr/bin/acconvert" --profile flac --out "$work/out" "$work/tone.wav" > "$work/run.log" 2>&1 \
  || { cat "$work/run.log" >&2; fail "the unpacked acconvert failed"; }
[ -s "$work/out/tone.flac" ] || fail "no tone.flac"
"$root/usr/bin/acrip" --help | grep -q -- "--cddb" || fail "the unpacked acrip has no help"
echo "deb test: passed ($(basename "$deb"), $(du -k "$deb" | cut -f1) KiB)"
