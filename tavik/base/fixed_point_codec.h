// A signed fixed-point format of m integer and n fractional bits, and the encoding of a
// magnitude into it.
#ifndef TAVIK_BASE_FIXED_POINT_CODEC_H_
#define TAVIK_BASE_FIXED_POINT_CODEC_H_

#include <cstdint>

namespace tavik {

class QCodec {
 public:
  // Fatal unless m >= 0, n >= 0 and m + n + 1 <= 64 (a sign bit included).
  QCodec(int m, int n);

  // The code of |value|: rounded half away from zero at n fractional bits and saturated to the
  // largest magnitude of the format, 2^(m + n) - 1. NaN codes as 0. The sign is the caller's.
  uint64_t Encode(double value) const;

  int integer_bits() const { return m_; }
  int fractional_bits() const { return n_; }

 private:
  int m_;
  int n_;
};

}  // namespace tavik

#endif  // TAVIK_BASE_FIXED_POINT_CODEC_H_
