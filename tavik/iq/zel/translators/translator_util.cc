#include "tavik/iq/zel/translators/translator_util.h"

#include <cmath>

namespace tavik {

int64_t ToFixedPoint(float value, int fractional_bits, int64_t min, int64_t max) {
  return ToScaledCode(value, std::ldexp(1.0f, fractional_bits), min, max);
}

int64_t ToScaledCode(float value, float full_scale, int64_t min, int64_t max) {
  const float scaled = RoundHalfAwayFromZero(value * full_scale);
  // Compared as floats first, so that a value beyond int64's range never reaches a conversion.
  if (!(scaled > static_cast<float>(min))) return min;
  if (!(scaled < static_cast<float>(max))) return max;
  const int64_t code = static_cast<int64_t>(scaled);
  return code < min ? min : code > max ? max : code;
}

int64_t TruncateWrapping(double value) {
  if (!std::isfinite(value)) return 0;
  // fmod is exact, so the remainder is the wrapped value itself, of magnitude below 2^64, and
  // converts to uint64 without loss; a negative one wraps by unsigned negation.
  constexpr double kTwoToThe64 = 18446744073709551616.0;
  const double remainder = std::fmod(std::trunc(value), kTwoToThe64);
  const uint64_t word = remainder < 0 ? uint64_t{0} - static_cast<uint64_t>(-remainder)
                                      : static_cast<uint64_t>(remainder);
  return static_cast<int64_t>(word);
}

uint32_t TruncateToUint32(double value) {
  if (!(value > 0)) return 0;
  if (value >= 4294967295.0) return 0xFFFFFFFFu;
  return static_cast<uint32_t>(value);
}

uint32_t ClutPacking(uint16_t a, uint16_t b, uint16_t c) {
  const uint32_t high = a;
  const uint32_t middle = b;
  const uint32_t low = c;
  if (high > 1023) return 0xA0000000u | ((high & 0x7F) << 22) | (middle << 11) | low;
  if (middle < 1024 && low < 1024) return (high << 20) | (middle << 10) | low;
  if (middle < 1024) return 0xE0000000u | ((low & 0x7F) << 22) | (high << 11) | middle;
  // The middle component's mask is one bit wider than the others'; the decoder expects it so.
  return 0xC0000000u | ((middle & 0xFF) << 22) | (high << 11) | low;
}

}  // namespace tavik
