#!/usr/bin/env bash
# Builds the libFuzzer targets with clang and runs each for SECONDS (default 60).
set -euo pipefail
top=$(cd "$(dirname "$0")/.." && pwd)
seconds=${1:-60}
build=${BUILD_DIR:-$top/build-fuzz}
CC=clang CXX=clang++ cmake -S "$top" -B "$build" -G Ninja -DAC_FUZZ=ON -DAC_BUILD_TESTS=OFF \
  -DAC_BUILD_BENCH=OFF -DAC_WERROR=OFF >/dev/null
cmake --build "$build" -j "${JOBS:-2}" --target data_pkg \
  $(cd "$top/tests/fuzz" && ls fuzz_*.cpp | sed 's/\.cpp$//')
mkdir -p "$build/findings"
# FUZZ_TARGETS="fuzz_xmcd fuzz_ini" runs only those.
for src in "$top"/tests/fuzz/fuzz_*.cpp; do
  if [ -n "${FUZZ_TARGETS:-}" ] && ! [[ " $FUZZ_TARGETS " == *" $(basename "$src" .cpp) "* ]]; then
    continue
  fi
  name=$(basename "$src" .cpp)
  corpus="$build/corpus/$name"
  mkdir -p "$corpus"
  case "$name" in
    fuzz_ini|fuzz_settings) seeds="$top/../shared/corpus/ini" ;;
    fuzz_cddb_matches|fuzz_cddb_match_line|fuzz_cddb_batch) seeds="$top/tests/data/cddb/seeds" ;;
    fuzz_language) seeds="$top/data/lang" ;;
    fuzz_cue_sheet|fuzz_ctt_cue) seeds="$top/../shared/corpus/cue" ;;
    fuzz_xmcd) seeds="$top/../shared/corpus/xmcd" ;;
    fuzz_cddb_ini) seeds="$top/../shared/corpus/cddb" ;;
    fuzz_package) seeds="$build/seeds/package"
      mkdir -p "$seeds" && cp -f "$build/bin/data.pkg" "$seeds/" 2>/dev/null || true ;;
    *) seeds="" ;;
  esac
  echo "== $name for ${seconds}s"
  "$build/bin/$name" -max_total_time="$seconds" -max_len=65536 -timeout=10 \
    -artifact_prefix="$build/findings/$name-" "$corpus" $( [ -d "$seeds" ] && echo "$seeds" ) \
    2>&1 | grep -E '^(#[0-9]+ +DONE|==|SUMMARY|Done)' || true
done
if ls "$build/findings"/* >/dev/null 2>&1; then
  echo "fuzz: findings in $build/findings" >&2
  exit 1
fi
echo "fuzz: no findings"
