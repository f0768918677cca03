#!/usr/bin/env bash
# Runs one libFuzzer target for a while:  scripts/fuzz.sh NAME SECONDS [libFuzzer flags...]
# Builds the fuzz tree with clang 14 (ASan + UBSan) in build-fuzz/ when needed. Seeds come from
# fuzz/corpus/NAME and, for the targets that read tuning files, from the sample tuning set; what
# the run finds new goes to build-fuzz/corpus/NAME, crashes to build-fuzz/artifacts/.
set -euo pipefail
cd "$(dirname "$0")/.."

if [ $# -lt 2 ]; then
  echo "usage: scripts/fuzz.sh NAME SECONDS [libFuzzer flags...]" >&2
  ls fuzz/*_fuzzer.cc 2>/dev/null | sed 's|fuzz/\(.*\)\.cc|  \1|' >&2
  exit 2
fi
name=$1
seconds=$2
shift 2

scripts/install-deps.sh
build=build-fuzz
if [ ! -f "$build/build.ninja" ]; then
  CXX=clang++-14 CC=clang-14 cmake -S . -B "$build" -G Ninja -DCMAKE_BUILD_TYPE=RelWithDebInfo \
    -DTAVIK_BUILD_FUZZERS=ON -DTAVIK_BUILD_TESTS=OFF -DTAVIK_BUILD_BENCHMARKS=OFF
fi
cmake --build "$build" --target "$name" tavik_sample_tuning

corpus="$build/corpus/$name"
mkdir -p "$corpus" "$build/artifacts"
seeds=()
if [ -d "fuzz/corpus/$name" ]; then seeds+=("fuzz/corpus/$name"); fi
case "$name" in
  provider_load_fuzzer|tuning_usecase_data_fuzzer) seeds+=("$build/share/tavik/tuning") ;;
  translator_table_fuzzer)
    cmake --build "$build" --target make_translator_seeds
    "$build/fuzz/make_translator_seeds" "$build/share/tavik/tuning" "$build/seeds/$name"
    seeds+=("$build/seeds/$name") ;;
esac
"$build/fuzz/$name" "$corpus" "${seeds[@]}" -max_total_time="$seconds" \
  -artifact_prefix="$build/artifacts/" -print_final_stats=1 "$@"
