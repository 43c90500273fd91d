#!/usr/bin/env bash
# CDDB figures against the loopback test server: one whole lookup (query and read) and a batch
# pass over 1,000 kept records, each answer written as a .cddb file; then the same lookup from
# acrip as a user runs it. Goals: a lookup well under 50 ms, the batch pass under 10 s.
# Usage: bench/cddb_bench.sh [build-dir]   (needs the CddbLookupBench target)
set -euo pipefail
build=${1:-build}
"$build/bin/CddbLookupBench" --benchmark_min_time=0.5
