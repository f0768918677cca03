#!/usr/bin/env bash
# The main job on the sample tuning set: builds what is needed, runs a simulated camera session
# of the built-in scenario through the tuning controller and prints its summary; then shows what
# the tuning tool sees in the set: the forest's keys, a lint pass, and a few blocks evaluated for
# a rear-camera frame between two tuned regions, translated to hardware values.
set -euo pipefail
cd "$(dirname "$0")/.."

scripts/install-deps.sh > /dev/null
build=build
cmake -S . -B "$build" -G Ninja -DCMAKE_BUILD_TYPE=RelWithDebInfo > /dev/null
cmake --build "$build" --target tavik-sim tavik-tune tavik_sample_tuning > /dev/null

echo "== A simulated camera session: the built-in scenario through the controller"
"$build/tools/tavik-sim"
echo

tune="$build/tools/tavik-tune"
tuning="$build/share/tavik/tuning"

echo "== Keys of the sample tuning set ($tuning)"
"$tune" keys "$tuning"
echo
echo "== Lint"
"$tune" lint "$tuning" && echo "no findings"
echo
echo "== Rear camera viewfinder at 4750 K, gain 6: white balance, and black level with the"
echo "   hardware values of its translators at digital gain 2"
"$tune" eval "$tuning" --sensor BRIMAL_REAR_GN1_NORMAL --mode FULL_4_3_FULL_15_30FPS \
  --usecase VIEWFINDER --cct 4750 --gain 6 --block WbTuning --block BlcTuning \
  --translate --digital-gain 2
echo
echo "== A use case with no file of its own falls back to the nearest key"
"$tune" eval "$tuning" --sensor BRIMAL_REAR_GN1_NORMAL --mode FULL_4_3_FULL_15_30FPS \
  --usecase VIDEO_RECORDING --cct 4200 --gain 6 --block WbTuning | sed -n 1p
