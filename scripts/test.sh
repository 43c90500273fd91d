#!/usr/bin/env bash
# Installs what is missing, builds, and runs every test suite. Extra arguments go to cmake's
# configure, e.g. -DAC_ASAN=ON with BUILD_DIR=build-asan.
set -euo pipefail
top=$(cd "$(dirname "$0")/.." && pwd)
bash "$top/scripts/install-deps.sh"
bash "$top/scripts/build.sh" "$@"
cd "${BUILD_DIR:-$top/build}"
ctest --output-on-failure -j "${JOBS:-2}"
