#!/usr/bin/env bash
# Installs the build tree into a scratch prefix and uses the program from there, as a user of
# the installed program would: a conversion with the installed acconvert (which must find its
# ctt and data.pkg), the installed window under Xvfb with a file of its command line, the man
# pages, and the desktop files under their validators.
#   install_test.sh BUILD_DIR
set -euo pipefail
build=$1
work=$(mktemp -d "${TMPDIR:-/tmp}/install-test-XXXXXX")
trap 'kill $(jobs -p) 2>/dev/null || true; rm -rf "$work"' EXIT
prefix=$work/prefix
export HOME=$work/home XDG_CONFIG_HOME=$work/home/.config XDG_DATA_HOME=$work/home/.local/share
export XDG_RUNTIME_DIR=$work/home
mkdir -p "$HOME"
fail() { echo "install test: $*" >&2; exit 1; }

cmake --install "$build" --prefix "$prefix" > "$work/install.log" || fail "cmake --install failed"
for path in bin/audio-converter bin/acconvert bin/acrip bin/acburn bin/acprobe lib/audio-converter/ctt \
            share/audio-converter/data.pkg share/audio-converter/help/Default.htm \
            share/audio-converter/wav/hint1.wav share/applications/io.velmorant.AudioConverter.desktop \
            share/metainfo/io.velmorant.AudioConverter.metainfo.xml \
            share/icons/hicolor/48x48/apps/io.velmorant.AudioConverter.png \
            share/icons/hicolor/scalable/apps/io.velmorant.AudioConverter.svg \
            share/man/man1/acconvert.1.gz share/bash-completion/completions/acconvert \
            share/man/man1/acburn.1.gz share/bash-completion/completions/acburn; do
  [ -e "$prefix/$path" ] || fail "not installed: $path"
done

# The installed acconvert converts with the installed ctt and profiles.
ffmpeg -nostdin -loglevel error -f lavfi -i "sine=duration=2" "$work/tone.wav"
"$prefix/bin/acconvert" --profile ogg --out "$work/out" "$work/tone.wav" > "$work/acconvert.log" 2>&1 \
  || { cat "$work/acconvert.log" >&2; fail "installed acconvert failed"; }
[ -s "$work/out/tone.ogg" ] || fail "no tone.ogg"
ffprobe -v error -show_entries stream=codec_name -of csv=p=0 "$work/out/tone.ogg" | grep -qx vorbis \
  || fail "tone.ogg is not Vorbis"
"$prefix/bin/acrip" --help | grep -q -- "--device" || fail "installed acrip has no help"
"$prefix/bin/acburn" --help | grep -q -- "--image" || fail "installed acburn has no help"

# Man pages read as man pages.
for page in audio-converter acconvert acrip acburn acprobe ctt; do
  MANWIDTH=80 man -l "$prefix/share/man/man1/$page.1.gz" 2>/dev/null | grep -q "^NAME" \
    || fail "man page of $page does not read"
done

# The installed window shows, with the file of its command line in the list.
hook=$work/hook
mkdir -p "$hook"
AUDIOCONV_TEST_DIR=$hook xvfb-run -a -s "-screen 0 1280x1024x24" \
  "$prefix/bin/audio-converter" "$work/tone.wav" > "$work/window.log" 2>&1 &
for _ in $(seq 300); do
  grep -q '^row0=tone' "$hook/state.txt" 2>/dev/null && break
  sleep 0.1
done
grep -q '^row0=tone' "$hook/state.txt" 2>/dev/null || { cat "$work/window.log" >&2; fail "the installed window did not list tone.wav"; }
grep -q '^profiles=10' "$hook/state.txt" || fail "the installed window found no system profiles"
# Read through the installed media module: a row it could not probe has no duration.
grep -q '^row0=tone	00:00:02' "$hook/state.txt" \
  || { cat "$work/window.log" >&2; fail "the installed window could not read tone.wav (media module)"; }
echo close > "$hook/command.txt"
wait || true

if command -v desktop-file-validate > /dev/null; then
  desktop-file-validate "$prefix/share/applications/io.velmorant.AudioConverter.desktop" \
    || fail "desktop entry is not valid"
fi
if command -v appstreamcli > /dev/null; then
  appstreamcli validate --no-net "$prefix/share/metainfo/io.velmorant.AudioConverter.metainfo.xml" \
    > "$work/appstream.log" 2>&1 || { cat "$work/appstream.log" >&2; fail "metainfo is not valid"; }
fi
echo "install test: passed"
