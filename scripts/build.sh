#!/usr/bin/env bash
# Configures and builds into BUILD_DIR (default: build). Extra arguments go to cmake's configure.
set -euo pipefail
top=$(cd "$(dirname "$0")/.." && pwd)
build_dir=${BUILD_DIR:-$top/build}
cmake -S "$top" -B "$build_dir" -G Ninja "$@" >/dev/null
cmake --build "$build_dir" -j "${JOBS:-2}"
