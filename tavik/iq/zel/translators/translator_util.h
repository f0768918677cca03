// What every online translator shares: the stock failure texts, the checks of a tuning message,
// the one fixed-point rounding, bit masking, and the colour-table word packing.
//
// A translator is a free function in namespace tavik:
//   Status Translate<Block>(const TuningBlock& block, const <Block>Input& input,
//                           <Block>Output& output);
// It opens PerfTrace(kTranslatorTraceCategory, "<its name>"), reads its message with
// GetTuningProto<T>(block), checks it (CheckTuning below, or the unit's own order), writes the
// bypass or enable bit, then converts each field with ToFixedPoint (or the documented exception)
// into the record's bit fields. Records are written field by field, so bits the caller set
// elsewhere survive. The normal path allocates nothing; texts are built only on failure.
#ifndef TAVIK_IQ_ZEL_TRANSLATORS_TRANSLATOR_UTIL_H_
#define TAVIK_IQ_ZEL_TRANSLATORS_TRANSLATOR_UTIL_H_

#include <cmath>
#include <cstdint>

#include "tavik/base/status.h"
#include "tavik/iq/export.h"

namespace tavik {

inline constexpr char kOutputIsNullText[] = "Output is null pointer!";
inline constexpr char kInvalidTuningBlockText[] = "Invalid TuningBlock!";
inline constexpr char kNoRegionInfoText[] = "Tuning data doesn't have region info.";
inline constexpr char kNoStaticInfoText[] = "Tuning data doesn't have static info.";

// The usual checks of a tuning message, in the usual order: a message at all ("Invalid
// TuningBlock!"), its dynamic part ("... region info."), its static part ("... static info.").
template <typename T>
Status CheckTuning(const T* tuning) {
  if (tuning == nullptr) return InvalidArgumentError(kInvalidTuningBlockText);
  if (!tuning->has_dynamic_param()) return InvalidArgumentError(kNoRegionInfoText);
  if (!tuning->has_static_param()) return InvalidArgumentError(kNoStaticInfoText);
  return OkStatus();
}

// Rounds half away from zero (2.5 -> 3, -2.5 -> -3).
inline float RoundHalfAwayFromZero(float value) { return std::round(value); }

// The fixed-point code of `value` with `fractional_bits` fractional bits: value * 2^n in single
// precision, rounded half away from zero, limited to [min, max]. NaN gives `min`.
TAVIK_EXPORT int64_t ToFixedPoint(float value, int fractional_bits, int64_t min, int64_t max);

// The low `width` bits of `value`, two's complement for negative values.
constexpr uint64_t LowBits(int64_t value, int width) {
  return static_cast<uint64_t>(value) & ((width >= 64 ? 0 : (uint64_t{1} << width)) - 1);
}

// The integer part of `value` (truncated toward zero) as a 64-bit two's-complement word, wrapped
// modulo 2^64; NaN and infinities give 0. For fields that take the low bits of a value, masked
// rather than clamped: any float reaches the mask without an out-of-range conversion.
TAVIK_EXPORT int64_t TruncateWrapping(double value);

// `value` truncated toward zero and limited to [0, 2^32 - 1], NaN giving 0: the saturating
// float-to-unsigned conversion of the device's CPU, for fields truncated to an unsigned integer.
TAVIK_EXPORT uint32_t TruncateToUint32(double value);

// One colour-table entry of three components of nominally 10 bits, at most one of them wider:
// the layout is chosen by which one overflows and announced in the top bits. `a` stands high,
// `b` in the middle, `c` low.
TAVIK_EXPORT uint32_t ClutPacking(uint16_t a, uint16_t b, uint16_t c);

}  // namespace tavik

#endif  // TAVIK_IQ_ZEL_TRANSLATORS_TRANSLATOR_UTIL_H_
