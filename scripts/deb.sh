#!/usr/bin/env bash
# Builds the program (scripts/build.sh) and its Debian package, build/velmorant-audio-converter_*.deb.
set -euo pipefail
top=$(cd "$(dirname "$0")/.." && pwd)
bash "$top/scripts/install-deps.sh"
bash "$top/scripts/build.sh"
cd "${BUILD_DIR:-$top/build}"
cpack -G DEB
