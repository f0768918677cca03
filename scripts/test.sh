#!/usr/bin/env bash
# Installs what is missing, builds everything and runs every test; then installs the result into
# <build dir>/install, where examples/consumer finds it.
#
#   scripts/test.sh                      build/ : the normal build, tests, install
#   scripts/test.sh --sanitize address   build-asan/ : AddressSanitizer + UndefinedBehaviorSanitizer
#   scripts/test.sh --sanitize thread    build-tsan/ : ThreadSanitizer, on the tests of the code
#                                        that threads share (the platform and the controller)
set -euo pipefail
cd "$(dirname "$0")/.."

sanitize=""
while [ $# -gt 0 ]; do
  case "$1" in
    --sanitize) sanitize=${2:?--sanitize needs address or thread}; shift 2 ;;
    -h|--help) sed -n '2,9p' "$0"; exit 0 ;;
    *) echo "scripts/test.sh: unknown argument '$1'" >&2; exit 2 ;;
  esac
done

scripts/install-deps.sh

case "$sanitize" in
  "") build=build; benchmarks=ON ;;
  address) build=build-asan; benchmarks=OFF ;;
  thread) build=build-tsan; benchmarks=OFF ;;
  *) echo "scripts/test.sh: --sanitize takes address or thread" >&2; exit 2 ;;
esac

# Line tables only (-g1): enough for sanitizer reports and backtraces, and much quicker to build
# than full debug information. Sanitizer builds optimise less, which builds quicker still.
# Warnings are errors in the normal build; sanitizer builds instrument code in ways that give the
# optimiser's flow warnings false positives, so they report warnings without stopping.
optimization=-O2
werror=ON
if [ -n "$sanitize" ]; then optimization=-O1; werror=OFF; fi
cmake -S . -B "$build" -G Ninja -DCMAKE_BUILD_TYPE=RelWithDebInfo \
  -DCMAKE_CXX_FLAGS_RELWITHDEBINFO="$optimization -g1 -DNDEBUG" -DTAVIK_WERROR="$werror" \
  -DTAVIK_SANITIZE="$sanitize" -DTAVIK_BUILD_BENCHMARKS="$benchmarks" \
  -DCMAKE_INSTALL_PREFIX="$PWD/$build/install"
targets=()
if [ "$sanitize" = thread ]; then
  targets=(--target tavik_base_test tavik_iq_concurrency_test tavik_sample_tuning)
fi
cmake --build "$build" "${targets[@]}"

export ASAN_OPTIONS=${ASAN_OPTIONS:-detect_leaks=1:abort_on_error=1}
export UBSAN_OPTIONS=${UBSAN_OPTIONS:-print_stacktrace=1:halt_on_error=1}
export TSAN_OPTIONS=${TSAN_OPTIONS:-halt_on_error=1:second_deadlock_stack=1}
if [ "$sanitize" = thread ]; then
  ctest --test-dir "$build" --output-on-failure --parallel "$(nproc)" \
    --tests-regex '^(tavik_base_test|tavik_iq_concurrency_test)\.'
else
  ctest --test-dir "$build" --output-on-failure --parallel "$(nproc)"
fi

if [ -z "$sanitize" ]; then
  cmake --install "$build" > /dev/null
  echo "test.sh: installed into $build/install"
fi
