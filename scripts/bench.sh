#!/usr/bin/env bash
# Builds and runs every benchmark program (time and heap allocations per iteration), and writes
# beside the text one JSON summary: each benchmark's median time, allocations per call and, with
# --callgrind, instructions per call; and the ratio of each benchmark to its floor (a benchmark
# named <name>Floor). Compare two summaries with scripts/bench-compare.py.
#
#   scripts/bench.sh [--out DIR] [--callgrind] [benchmark flags...]
#       --out DIR     where bench.txt and summary.json go (default build/bench-results)
#       --callgrind   also count instructions per call under callgrind (valgrind): a measure that
#                     a machine too busy for its times to be trusted still gives exactly. The forest
#                     program, whose loads take minutes under callgrind, is left out of it.
#   e.g. scripts/bench.sh --benchmark_filter=Translate
set -euo pipefail
cd "$(dirname "$0")/.."

out=build/bench-results
callgrind=0
flags=()
while [ $# -gt 0 ]; do
  case "$1" in
    --out) out=${2:?--out needs a directory}; shift 2 ;;
    --callgrind) callgrind=1; shift ;;
    -h|--help) sed -n '2,13p' "$0"; exit 0 ;;
    *) flags+=("$1"); shift ;;
  esac
done

scripts/install-deps.sh > /dev/null
build=build
cmake -S . -B "$build" -G Ninja -DCMAKE_BUILD_TYPE=RelWithDebInfo -DTAVIK_BUILD_BENCHMARKS=ON \
  > /dev/null
cmake --build "$build" > /dev/null

mkdir -p "$out"
rm -f "$out"/*.json "$out"/bench.txt
for program in "$build"/bench/*_bench; do
  name=$(basename "$program")
  echo "== $name" | tee -a "$out/bench.txt"
  "$program" --benchmark_repetitions=5 --benchmark_report_aggregates_only=true \
    --benchmark_out="$out/$name.json" --benchmark_out_format=json "${flags[@]}" \
    | tee -a "$out/bench.txt"
  if [ "$callgrind" = 1 ] && [ "$name" != tavik_forest_scale_bench ]; then
    work=$(mktemp -d)
    # The allocation counter zeroes callgrind's counts before each measured loop and dumps them
    # after it, naming the dump by the loop's iteration count.
    valgrind --tool=callgrind --callgrind-out-file="$work/callgrind.out" "$program" \
      --benchmark_min_time=0.05 --benchmark_out="$work/run.json" --benchmark_out_format=json \
      "${flags[@]}" > /dev/null 2>&1
    python3 scripts/bench-summary.py callgrind "$work/run.json" "$work"/callgrind.out.* \
      > "$out/$name.callgrind.json"
    rm -rf "$work"
  fi
done

python3 scripts/bench-summary.py summarize "$out" > "$out/summary.json"
echo "bench.sh: summary in $out/summary.json"
