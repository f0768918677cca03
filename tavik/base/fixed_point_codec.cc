#include "tavik/base/fixed_point_codec.h"

#include <cmath>

#include "tavik/base/logging.h"

namespace tavik {

QCodec::QCodec(int m, int n) : m_(m), n_(n) {
  TAVIK_CHECK_GE(m_, 0);
  TAVIK_CHECK_GE(n_, 0);
  TAVIK_CHECK_LE(m_ + n_ + 1, 64);
}

uint64_t QCodec::Encode(double value) const {
  const double magnitude = std::fabs(value);
  if (std::isnan(magnitude)) return 0;
  const uint64_t largest = (uint64_t{1} << (m_ + n_)) - 1;
  const double scaled = std::round(std::ldexp(magnitude, n_));
  if (scaled >= static_cast<double>(largest)) return largest;
  return static_cast<uint64_t>(scaled);
}

}  // namespace tavik
