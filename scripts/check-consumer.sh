#!/usr/bin/env bash
# Builds examples/consumer against an installed tree, through the CMake package and through
# pkg-config, and runs what it built.   scripts/check-consumer.sh [PREFIX]   (default build/install)
set -euo pipefail
cd "$(dirname "$0")/.."

prefix=$(realpath "${1:-build/install}")
if [ ! -f "$prefix/lib/cmake/tavik/tavikConfig.cmake" ]; then
  echo "check-consumer: no installed package under $prefix; run scripts/test.sh first" >&2
  exit 1
fi
out=build/consumer
cmake -S examples/consumer -B "$out" -G Ninja -DCMAKE_PREFIX_PATH="$prefix"
cmake --build "$out"
"$out/consumer_shared"
"$out/consumer_static"

# The same program through pkg-config, against the shared libraries.
export PKG_CONFIG_PATH="$prefix/lib/pkgconfig"
c++ -std=c++20 examples/consumer/consumer.cc -o "$out/consumer_pkgconfig" \
  $(pkg-config --cflags --libs tavik)
"$out/consumer_pkgconfig"
echo "check-consumer: the installed package works for a consumer"
