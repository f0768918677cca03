// The standard-deviation tables of the HQDNS stage: their constant abscissae and the slopes that
// the stage interpolates with. Shared by the translator and its test, which pins the slope rule
// on tables that the translator itself never writes.
#ifndef TAVIK_IQ_ZEL_TRANSLATORS_INTERNAL_HQDNS_STD_LUT_H_
#define TAVIK_IQ_ZEL_TRANSLATORS_INTERNAL_HQDNS_STD_LUT_H_

#include <cstdint>

#include "tavik/base/status.h"
#include "tavik/iq/zel/translators/hqdns_online_translator.h"

namespace tavik::hqdns_internal {

inline constexpr int kStdLutSize = 8;

// The abscissae of both tables, in the stage's 12-bit intensity.
inline constexpr uint16_t kStdLutX[kStdLutSize] = {0, 64, 128, 256, 640, 1024, 2048, 4095};

// Writes std_slope_g and std_slope_rb from the abscissae and ordinates already in `output`:
// slope[i] = round((y[i+1] - y[i]) x 2048 / (x[i+1] - x[i])) in single precision, as 16-bit two's
// complement, and slope[7] = slope[6]. Abscissae that do not rise give "std_lut_x_g is invalid."
// or "std_lut_x_rb is invalid.".
Status SetStdSlope(HqdnsOutput& output);

}  // namespace tavik::hqdns_internal

#endif  // TAVIK_IQ_ZEL_TRANSLATORS_INTERNAL_HQDNS_STD_LUT_H_
