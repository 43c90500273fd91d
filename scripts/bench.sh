#!/usr/bin/env bash
# Builds in release mode and runs every benchmark in bench/.
set -euo pipefail
top=$(cd "$(dirname "$0")/.." && pwd)
build=${BUILD_DIR:-$top/build-bench}
cmake -S "$top" -B "$build" -G Ninja -DCMAKE_BUILD_TYPE=Release -DAC_BUILD_TESTS=OFF >/dev/null
cmake --build "$build" -j "${JOBS:-2}"
for b in "$build"/bin/*Bench; do
  echo "== $(basename "$b")"
  "$b" --benchmark_min_time=0.2 "$@"
done
