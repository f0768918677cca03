#!/usr/bin/env bash
# Draws the pictures of the README with tavik-tune plot, from the sample tuning set, into
# docs/pictures/ (or the directory given): white balance along colour temperature, the shading
# tables of one module as calibrated on the device, and the gamma curves.
#
#   scripts/pictures.sh [DIR]
set -euo pipefail
cd "$(dirname "$0")/.."

out=${1:-docs/pictures}
scripts/install-deps.sh > /dev/null
build=build
cmake -S . -B "$build" -G Ninja -DCMAKE_BUILD_TYPE=RelWithDebInfo > /dev/null
cmake --build "$build" --target tavik-tune tavik_sample_tuning > /dev/null
mkdir -p "$out"

tune="$build/tools/tavik-tune"
tuning="$build/share/tavik/tuning"
rear=(--sensor BRIMAL_REAR_GN1_NORMAL --mode FULL_4_3_FULL_15_30FPS --usecase VIEWFINDER)
size=(--width 800 --height 480)

set -x
"$tune" plot sweep "$tuning" "${rear[@]}" --gain 6 --block WbTuning --field wb_gains \
  --along cct "${size[@]}" -o "$out/wb_along_cct.png"
"$tune" plot shading "$tuning" "${rear[@]}" --cct 4750 \
  --calibration "$build/share/tavik/device/brimal_rear_gn1_normal_unit_0042.textproto" \
  --width 800 --height 600 -o "$out/lsc_calibrated.png"
"$tune" plot curves "$tuning" "${rear[@]}" --cct 4750 --gain 6 "${size[@]}" \
  -o "$out/gamma_curves.png"
