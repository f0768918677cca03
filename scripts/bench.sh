#!/usr/bin/env bash
# Builds and runs every benchmark program (time and heap allocations per iteration).
#   scripts/bench.sh [benchmark flags...]     e.g. --benchmark_filter=Translate
set -euo pipefail
cd "$(dirname "$0")/.."

scripts/install-deps.sh > /dev/null
build=build
cmake -S . -B "$build" -G Ninja -DCMAKE_BUILD_TYPE=RelWithDebInfo -DTAVIK_BUILD_BENCHMARKS=ON \
  > /dev/null
cmake --build "$build" > /dev/null
for program in "$build"/bench/*_bench; do
  echo "== $(basename "$program")"
  "$program" --benchmark_repetitions=5 --benchmark_report_aggregates_only=true "$@"
done
