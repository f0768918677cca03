// Codes of a Bayer pattern in the pixel-order fields of the hardware stages.
#ifndef TAVIK_IQ_ZEL_TRANSLATORS_BAYER_PATTERN_UTIL_H_
#define TAVIK_IQ_ZEL_TRANSLATORS_BAYER_PATTERN_UTIL_H_

#include <cstdint>

#include "tavik/iq/export.h"
#include "tavik/iq/protos/common.pb.h"

namespace vosbrine {

// The main ISP's code: RGGB 1, BGGR 2, GRBG 0, GBRG 3. An unknown pattern logs
// "Invalid bayer_pattern: " and gives 0.
TAVIK_EXPORT uint32_t GetMainIspPixelOrder(BayerPattern pattern);

// The GTNR pyramid stage's code: RGGB 0, BGGR 3, GRBG 1, GBRG 2. An unknown pattern logs and
// gives 0.
TAVIK_EXPORT uint32_t GetSarkonPixelOrder(BayerPattern pattern);

}  // namespace vosbrine

namespace tavik {

// The G3AA stages' code, equal to the GTNR one. An unknown pattern logs and gives 0.
TAVIK_EXPORT uint32_t GetG3aaPixelOrder(vosbrine::BayerPattern pattern);

}  // namespace tavik

#endif  // TAVIK_IQ_ZEL_TRANSLATORS_BAYER_PATTERN_UTIL_H_
