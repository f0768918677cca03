#!/usr/bin/env bash
# The main job on the sample tuning set: builds what is needed, then shows the default use case's
# tuning as the tuning tool reads it.
set -euo pipefail
cd "$(dirname "$0")/.."

scripts/install-deps.sh > /dev/null
build=build
cmake -S . -B "$build" -G Ninja -DCMAKE_BUILD_TYPE=RelWithDebInfo > /dev/null
cmake --build "$build" --target tavik-tune tavik_sample_tuning > /dev/null

tuning="$build/share/tavik/tuning"
echo "Sample tuning set ($tuning):"
ls -1 "$tuning"/*.binarypb | sed 's|^|  |'
echo
default="$tuning/brimal_sensor_bringup_full_4_3_full_15_30fps_viewfinder.binarypb"
echo "Default use case, as tavik-tune prints it:"
"$build/tools/tavik-tune" print "$default"
