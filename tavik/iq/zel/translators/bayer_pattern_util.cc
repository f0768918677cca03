#include "tavik/iq/zel/translators/bayer_pattern_util.h"

#include <array>

#include "tavik/base/logging.h"

namespace vosbrine {
namespace {

// Indexed by the BayerPattern value: RGGB, BGGR, GRBG, GBRG.
constexpr std::array<uint32_t, 4> kMainIspPixelOrder = {1, 2, 0, 3};
constexpr std::array<uint32_t, 4> kSarkonPixelOrder = {0, 3, 1, 2};

uint32_t LookUp(const std::array<uint32_t, 4>& table, BayerPattern pattern) {
  const int index = static_cast<int>(pattern);
  if (index < 0 || index >= static_cast<int>(table.size())) {
    TAVIK_LOG(ERROR) << "Invalid bayer_pattern: " << BayerPattern_Name(pattern);
    return 0;
  }
  return table[index];
}

}  // namespace

uint32_t GetMainIspPixelOrder(BayerPattern pattern) {
  return LookUp(kMainIspPixelOrder, pattern);
}

uint32_t GetSarkonPixelOrder(BayerPattern pattern) { return LookUp(kSarkonPixelOrder, pattern); }

}  // namespace vosbrine

namespace tavik {

uint32_t GetG3aaPixelOrder(vosbrine::BayerPattern pattern) {
  return vosbrine::GetSarkonPixelOrder(pattern);
}

}  // namespace tavik
