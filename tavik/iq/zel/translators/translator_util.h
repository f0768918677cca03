// The frame every online translator shares: the stock failure texts and one-line checks, the shape
// of every GetDefault<Block>, the one fixed-point rounding, bit masking, the knot search of curves
// and lookup tables, and the colour-table word packing.
//
// A translator is a free function in namespace tavik:
//   Status Translate<Block>(const TuningBlock& block, const <Block>Input& input,
//                           <Block>Output& output);
// It opens PerfTrace(kTranslatorTraceCategory, "<its name>"), reads its message with
// RequireTuning<T>(block), checks it (RequireDynamic, RequireStatic, RequireSize, each taking the
// unit's own text where it has one, in the unit's own order), writes the bypass or enable bit,
// then converts each field with ToFixedPoint or ToScaledCode (or the documented exception) and
// stores it with TAVIK_SET_FIELD, which masks to the field's own width. Records are written field
// by field, so bits the caller set elsewhere survive. The normal path allocates nothing; texts are
// built only on failure.
#ifndef TAVIK_IQ_ZEL_TRANSLATORS_TRANSLATOR_UTIL_H_
#define TAVIK_IQ_ZEL_TRANSLATORS_TRANSLATOR_UTIL_H_

#include <algorithm>
#include <cmath>
#include <cstdint>
#include <span>
#include <string_view>

#include "tavik/base/status.h"
#include "tavik/base/strings.h"
#include "tavik/base/trace.h"
#include "tavik/base/tuning_block.h"
#include "tavik/iq/export.h"
#include "tavik/iq/zel/translators/record_description.h"
#include "tavik/iq/zel/zel_tuning_block.h"

namespace tavik {

inline constexpr char kOutputIsNullText[] = "Output is null pointer!";
inline constexpr char kInvalidTuningBlockText[] = "Invalid TuningBlock!";
inline constexpr char kNoRegionInfoText[] = "Tuning data doesn't have region info.";
inline constexpr char kNoStaticInfoText[] = "Tuning data doesn't have static info.";

// Checks of a translator's arguments, one line each: they return OK or the failure with the
// unit's text, so that a unit keeps its own order of checks without if/return blocks.

// The block's message, or "Invalid TuningBlock!" (after GetTuningProto's line naming the types).
template <typename T>
StatusOr<const T*> RequireTuning(const TuningBlock& block,
                                 const char* text = kInvalidTuningBlockText) {
  const T* tuning = GetTuningProto<T>(block);
  if (tuning == nullptr) return InvalidArgumentError(text);
  return tuning;
}

// The message's dynamic part ("region info").
template <typename T>
Status RequireDynamic(const T& tuning, const char* text = kNoRegionInfoText) {
  if (!tuning.has_dynamic_param()) return InvalidArgumentError(text);
  return OkStatus();
}

// The message's static part.
template <typename T>
Status RequireStatic(const T& tuning, const char* text = kNoStaticInfoText) {
  if (!tuning.has_static_param()) return InvalidArgumentError(text);
  return OkStatus();
}

// A register record handed over by pointer.
template <typename Record>
Status RequireOutput(const Record* output) {
  if (output == nullptr) return InvalidArgumentError(kOutputIsNullText);
  return OkStatus();
}

// A failure text that ends with the count found: CountAfter("Noise gain lut size is wrong: ").
struct CountAfter {
  const char* prefix;
};

// A list of exactly `expected` entries (a repeated field, or anything with size()).
template <typename List>
Status RequireSize(const List& list, int expected, const char* text) {
  if (static_cast<int>(list.size()) != expected) return InvalidArgumentError(text);
  return OkStatus();
}
template <typename List>
Status RequireSize(const List& list, int expected, CountAfter text) {
  if (static_cast<int>(list.size()) != expected) {
    return InvalidArgumentError(StrCat(text.prefix, list.size()));
  }
  return OkStatus();
}

// The usual checks of a tuning message, in the usual order: a message at all ("Invalid
// TuningBlock!"), its dynamic part ("... region info."), its static part ("... static info.").
template <typename T>
Status CheckTuning(const T* tuning) {
  if (tuning == nullptr) return InvalidArgumentError(kInvalidTuningBlockText);
  if (Status status = RequireDynamic(*tuning); !status.ok()) return status;
  return RequireStatic(*tuning);
}

// The shape of every GetDefault<Block>: opens its trace, fills a block on the stack with the
// unit's default tuning, runs the unit's own translation of it (so that default values follow
// from the same formulas), and only on success writes the fixed record's constants.
//
//   Status GetDefaultFoo(FooOutput& output, FooFixedOutput& fixed) {
//     return GetDefault("GetDefaultFoo", SetDefaultTuning,
//                       [&](const TuningBlock& block) {
//                         return TranslateFoo(block, kDefaultInput, output);
//                       },
//                       [&] { WriteFixedOutput(fixed); });
//   }
struct NoFixedOutput {
  void operator()() const {}
};
template <typename Tuning, typename Translate, typename WriteFixed = NoFixedOutput>
Status GetDefault(std::string_view trace_name, void (*set_default_tuning)(Tuning&),
                  Translate&& translate, WriteFixed&& write_fixed = {}) {
  PerfTrace trace(kTranslatorTraceCategory, trace_name);
  ZelTuningBlock<Tuning> block;
  set_default_tuning(block.message);
  Status status = translate(static_cast<const TuningBlock&>(block));
  if (!status.ok()) return status;
  write_fixed();
  return OkStatus();
}

// Rounds half away from zero (2.5 -> 3, -2.5 -> -3).
inline float RoundHalfAwayFromZero(float value) { return std::round(value); }

// `value` rounded half away from zero and limited to [min, max]; NaN gives `min`. The one
// rounding of every code: ToFixedPoint and ToScaledCode below are this, and a field whose formula
// is more than a product (an offset added, a quotient, a logarithm) computes its value in single
// precision, in the formula's own order, and hands it here.
TAVIK_EXPORT int64_t RoundAndLimit(float value, int64_t min, int64_t max);

// The fixed-point code of `value` with `fractional_bits` fractional bits: value * 2^n in single
// precision, rounded half away from zero, limited to [min, max]. NaN gives `min`.
TAVIK_EXPORT int64_t ToFixedPoint(float value, int fractional_bits, int64_t min, int64_t max);

// The code of `value` on a full scale that is not a power of two (a 12-bit threshold of scale
// 4095, a weight of scale 127, 0..1 onto 0..1023): value * full_scale in single precision,
// rounded half away from zero, limited to [min, max], or to [0, full_scale] in the short form.
// NaN gives the lower limit.
inline int64_t ToScaledCode(float value, float full_scale, int64_t min, int64_t max) {
  return RoundAndLimit(value * full_scale, min, max);
}
inline int64_t ToScaledCode(float value, int64_t full_scale) {
  return ToScaledCode(value, static_cast<float>(full_scale), 0, full_scale);
}

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

// `value` rounded half away from zero, then wrapped as TruncateWrapping does: for fields that are
// rounded and then masked to their width rather than clamped.
inline int64_t RoundWrapping(float value) { return TruncateWrapping(RoundHalfAwayFromZero(value)); }

// `entry` with its low `width` bits replaced by those of `code`: a table entry narrower than its
// element type is written so that the element's spare bits survive, as a bit-field would.
template <typename Entry>
constexpr Entry WithLowBits(Entry entry, int width, uint64_t code) {
  const uint64_t mask = LowBits(-1, width);
  return static_cast<Entry>((static_cast<uint64_t>(entry) & ~mask) | (code & mask));
}

// A constant of a fixed record, told as a keep mask and a value that is or-ed in: the bits of
// `keep` stay as the caller left them, the others are cleared, then `value` is or-ed in (a value
// may set kept bits: a keep mask of all ones ors a flag into whatever was there).
constexpr void WriteFixedBits(uint32_t& word, uint32_t keep, uint32_t value) {
  word = (word & keep) | value;
}

// Where a sample falls in a rising knot table: between knots `upper` - 1 and `upper`, with the
// weight of the lower knot (below 0 or above 1 beyond the table's ends). `rises` is false when
// those two knots do not rise, which the caller reports in its own words.
struct KnotBracket {
  int upper = 1;
  float weight_of_lower = 0.0f;
  bool rises = true;
};

// Brackets a run of rising samples in a knot table of at least two knots, searching forward from
// where the previous sample was found: the upper knot is the first knot not below the sample (a
// binary lower bound), or the first or last bracket for samples beyond the ends. Curves, tone maps
// and lookup tables are all sampled this way.
class KnotCursor {
 public:
  explicit KnotCursor(std::span<const float> knots) : knots_(knots) {}

  KnotBracket Find(float sample) {
    const auto found = std::lower_bound(knots_.begin() + start_, knots_.end(), sample);
    start_ = static_cast<size_t>(found - knots_.begin());
    const size_t upper = start_ == 0 ? 1 : start_ == knots_.size() ? knots_.size() - 1 : start_;
    const float x1 = knots_[upper];
    const float x0 = knots_[upper - 1];
    KnotBracket bracket;
    bracket.upper = static_cast<int>(upper);
    bracket.rises = x1 > x0;
    if (bracket.rises) bracket.weight_of_lower = (x1 - sample) / (x1 - x0);
    return bracket;
  }

 private:
  std::span<const float> knots_;
  size_t start_ = 0;
};

// The value between two knots' values, by the weight of the lower one:
// weight * lower + (1 - weight) * upper, in single precision in that order.
inline float InterpolateKnots(float weight_of_lower, float lower, float upper) {
  return weight_of_lower * lower + (1.0f - weight_of_lower) * upper;
}

// One colour-table entry of three components of nominally 10 bits, at most one of them wider:
// the layout is chosen by which one overflows and announced in the top bits. `a` stands high,
// `b` in the middle, `c` low.
TAVIK_EXPORT uint32_t ClutPacking(uint16_t a, uint16_t b, uint16_t c);

}  // namespace tavik

#endif  // TAVIK_IQ_ZEL_TRANSLATORS_TRANSLATOR_UTIL_H_
