#include "tavik/iq/zel/translators/gamma_online_translator.h"

#include <algorithm>
#include <climits>
#include <cstdint>
#include <cstdlib>
#include <initializer_list>
#include <iterator>
#include <span>
#include <type_traits>
#include <utility>

#include "google/protobuf/arena.h"
#include "google/protobuf/repeated_field.h"
#include "tavik/base/status_macros.h"
#include "tavik/base/strings.h"
#include "tavik/base/trace.h"
#include "tavik/iq/zel/translators/internal/gamma_curves.h"
#include "tavik/iq/zel/translators/translator_table.h"
#include "tavik/iq/zel/translators/translator_util.h"
#include "tavik/iq/zel/zel_tuning_block.h"

namespace tavik {
namespace {

using ::tavik_registers::zel::g3aa::GammaLutValue;
using ::tavik_registers::zel::g3aa_generic::GammaConfigValue;
using ::vosbrine::zelmondrake::GammaTuning;
using Floats = ::google::protobuf::RepeatedField<float>;

// The ITP tables: 64 curve points and the last step, so a tuning gives 65 knots.
constexpr int kItpPoints = 64;
constexpr int kItpKnots = kItpPoints + 1;
// The curve handed back in force is sampled at 64 points, as the application gave its own.
constexpr int kResampledPoints = 64;
constexpr int64_t kItpOne = 16384;   // 1.0 in Q14.
constexpr int64_t kG3aaMax = 32767;  // The largest Q15 code; 1.0 does not fit.
constexpr int kG3aaLutSlots = std::extent_v<decltype(GammaLutValue::gamma_lut_values)>;

constexpr char kGammaSizeWrongText[] = "Gamma size is wrong: ";

// (i/64)^(1/2.2), i = 0..64, stored rounded to six decimals.
constexpr float kDefaultGammaCurve[kItpKnots] = {
    0.0f,      0.151011f, 0.206938f, 0.248818f, 0.283578f, 0.31385f,  0.340968f, 0.365717f,
    0.388602f, 0.409973f, 0.430085f, 0.449127f, 0.467246f, 0.484559f, 0.50116f,  0.517126f,
    0.532521f, 0.547399f, 0.561807f, 0.575786f, 0.589368f, 0.602584f, 0.615462f, 0.628024f,
    0.640292f, 0.652283f, 0.664016f, 0.675506f, 0.686765f, 0.697807f, 0.708644f, 0.719285f,
    0.72974f,  0.740019f, 0.750129f, 0.760078f, 0.769873f, 0.779521f, 0.789028f, 0.7984f,
    0.807641f, 0.816757f, 0.825752f, 0.834631f, 0.843399f, 0.852058f, 0.860613f, 0.869068f,
    0.877424f, 0.885687f, 0.893857f, 0.901939f, 0.909936f, 0.917848f, 0.92568f,  0.933433f,
    0.941109f, 0.948711f, 0.956241f, 0.9637f,   0.97109f,  0.978414f, 0.985672f, 0.992867f,
    1.0f};

// The Q14 code of an ITP table entry. The low 15 bits are kept before the limit, so that 2.0
// codes as 0 and most negative values as 16384: tables already on devices are reproduced bit for
// bit only in this order. The signed conversion saturates, as the device's does.
uint16_t ItpCode(float value) {
  const int64_t rounded = ToFixedPoint(value, 14, INT32_MIN, INT32_MAX);
  return static_cast<uint16_t>(std::min<uint64_t>(LowBits(rounded, 15), kItpOne));
}

// The Q15 code of a G3AA table entry: clamped to 0..1 first, and 1.0 limited to the largest code.
uint16_t G3aaCode(float value) {
  return static_cast<uint16_t>(ToFixedPoint(std::clamp(value, 0.0f, 1.0f), 15, 0, kG3aaMax));
}

std::span<const float> Knots(const Floats& values) {
  return {values.data(), static_cast<size_t>(values.size())};
}

// The failure of a sample whose bracket in the knot table `x` does not rise. Tested inline, as
// one status per sample would cost more than the search itself.
Status BracketFailure(const Floats& x, const KnotBracket& bracket) {
  const int upper = bracket.upper;
  return InvalidArgumentErrorBuilder()
         << StrCat("gamma_x[", upper, "] must be larger than [", upper - 1, "] in tuning data. ",
                   x.Get(upper), " ", x.Get(upper - 1));
}

// The curve value in `bracket`, clamped to 0..1.
float Interpolate(const Floats& y, const KnotBracket& bracket) {
  const float value =
      InterpolateKnots(bracket.weight_of_lower, y.Get(bracket.upper - 1), y.Get(bracket.upper));
  return std::clamp(value, 0.0f, 1.0f);
}

// The knots and every listed curve must be there for each bracket a sample can fall into.
Status CheckCurveLengths(const GammaTuning& tuning, std::initializer_list<const Floats*> curves) {
  const Floats& x = tuning.static_param().gamma_x();
  bool usable = x.size() >= 2;
  for (const Floats* curve : curves) usable = usable && curve->size() >= x.size();
  if (!usable) return InvalidArgumentError(StrCat(kGammaSizeWrongText, x.size()));
  return OkStatus();
}

// The translator's own copy of the tuning, so that nothing refers to the block after the call.
// On the tuning path the copy lives in an arena on the stack: a frame's copy of a tuning of the
// usual size then costs no heap allocation. The application's curve gives a tuning built on the
// heap, which is kept as it comes.
class LocalGammaTuning {
 public:
  LocalGammaTuning() : arena_(arena_block_, sizeof(arena_block_)) {}

  LocalGammaTuning(const LocalGammaTuning&) = delete;
  LocalGammaTuning& operator=(const LocalGammaTuning&) = delete;

  // The tuning that rules the frame: the block's, checked for both of its parts, or the one
  // sampled from the application's curve, in which case the block is not read.
  Status Obtain(const TuningBlock& block, const Tonemap& tonemap) {
    if (tonemap.mode != TonemapMode::kContrastCurve) {
      const GammaTuning* proto = GetTuningProto<GammaTuning>(block);
      if (proto == nullptr) return InvalidArgumentError(kInvalidTuningBlockText);
      GammaTuning* copy = google::protobuf::Arena::CreateMessage<GammaTuning>(&arena_);
      copy->CopyFrom(*proto);
      tuning_ = copy;
      if (!copy->has_dynamic_param()) return InvalidArgumentError(kNoRegionInfoText);
      if (!copy->has_static_param()) return InvalidArgumentError(kNoStaticInfoText);
      return OkStatus();
    }
    TAVIK_ASSIGN_OR_RETURN(GammaTuning generated,
                           gamma_internal::GenerateTuningParams(tonemap.curve));
    generated_.Swap(&generated);
    tuning_ = &generated_;
    return OkStatus();
  }

  const GammaTuning& tuning() const { return *tuning_; }

 private:
  // Room for a 65-knot tuning and the arena's own bookkeeping, with a margin.
  alignas(16) char arena_block_[4096];
  google::protobuf::Arena arena_;
  GammaTuning generated_;
  const GammaTuning* tuning_ = nullptr;
};

// Writes the 65 codes of one table: 64 points and, for now, the code of entry 64 in the last slot.
void EncodeTable(const Floats& values, uint16_t (&points)[kItpPoints], uint16_t& last) {
  for (int i = 0; i < kItpPoints; ++i) points[i] = ItpCode(values.Get(i));
  last = ItpCode(values.Get(kItpPoints));
}

// The signed last step of an encoded table.
int32_t LastStep(const uint16_t (&points)[kItpPoints], uint16_t last) {
  return static_cast<int32_t>(last) - static_cast<int32_t>(points[kItpPoints - 1]);
}

uint16_t LimitedMagnitude(int32_t step) {
  return static_cast<uint16_t>(std::min<int64_t>(std::abs(step), kItpOne));
}

// The defaults' request: the tuning rules, with an empty curve.
Tonemap TuningTonemap() {
  Tonemap tonemap;
  tonemap.mode = TonemapMode::kHighQuality;
  return tonemap;
}

// The frame's request as far as its facts tell it: who rules the curve. An application curve is
// not one of a frame's facts, so the table runs the application's mode with an empty curve.
Tonemap TonemapOf(const FrameFacts& facts) {
  Tonemap tonemap;
  tonemap.mode = facts.tonemap_mode;
  return tonemap;
}

}  // namespace

namespace gamma_internal {

// clang-format off
const float kG3aaGammaKnots[kG3aaGammaKnotCount] = {
    // Steps of 1/256 up to 0.125 (indices 0..32).
    0.0f, 0.003906f, 0.007812f, 0.011719f, 0.015625f, 0.019531f, 0.023438f, 0.027344f, 0.03125f,
    0.035156f, 0.039062f, 0.042969f, 0.046875f, 0.050781f, 0.054688f, 0.058594f, 0.0625f,
    0.066406f, 0.070312f, 0.074219f, 0.078125f, 0.082031f, 0.085938f, 0.089844f, 0.09375f,
    0.097656f, 0.101562f, 0.105469f, 0.109375f, 0.113281f, 0.117188f, 0.121094f, 0.125f,
    // Steps of 1/128 up to 0.25 (33..48).
    0.132812f, 0.140625f, 0.148438f, 0.15625f, 0.164062f, 0.171875f, 0.179688f, 0.1875f,
    0.195312f, 0.203125f, 0.210938f, 0.21875f, 0.226562f, 0.234375f, 0.242188f, 0.25f,
    // Steps of 1/64 up to 0.5 (49..64).
    0.265625f, 0.28125f, 0.296875f, 0.3125f, 0.328125f, 0.34375f, 0.359375f, 0.375f,
    0.390625f, 0.40625f, 0.421875f, 0.4375f, 0.453125f, 0.46875f, 0.484375f, 0.5f,
    // Steps of 1/32 up to 1.0 (65..80).
    0.53125f, 0.5625f, 0.59375f, 0.625f, 0.65625f, 0.6875f, 0.71875f, 0.75f,
    0.78125f, 0.8125f, 0.84375f, 0.875f, 0.90625f, 0.9375f, 0.96875f, 1.0f};
// clang-format on

StatusOr<GammaTuning> GenerateTuningParams(const TonemapCurve& curve) {
  if (curve.red.size() < 2 || curve.green.size() < 2 || curve.blue.size() < 2) {
    return InvalidArgumentErrorBuilder() << "Tone map curve should have at least 2 data!";
  }

  GammaTuning tuning;
  tuning.set_enable(true);
  Floats* gamma_x = tuning.mutable_static_param()->mutable_gamma_x();
  gamma_x->Resize(kItpKnots, 1.0f);
  auto* dynamic_param = tuning.mutable_dynamic_param();

  struct Channel {
    const char* name;  // The first piece of the failure text.
    const TonemapCurve::Points& points;
    Floats* samples;
    int segment;  // Runs forward only, from one sample to the next.
  };
  Channel channels[] = {
      {"tonemap_curve.red[", curve.red, dynamic_param->mutable_gamma_r(), 0},
      {"tonemap_curve.green[", curve.green, dynamic_param->mutable_gamma_g(), 0},
      {"tonemap_curve.blue[", curve.blue, dynamic_param->mutable_gamma_b(), 0},
  };
  for (Channel& channel : channels) channel.samples->Resize(kItpKnots, 1.0f);

  for (int i = 0; i < kItpKnots; ++i) {
    // Divided by 65, not 64: the last knot is 64/65 and the curve is never sampled at 1.0. Tables
    // already on devices are reproduced only with this spacing, so it stays.
    const float x = static_cast<float>(i) / 65.0f;
    gamma_x->Set(i, x);
    for (Channel& channel : channels) {
      const TonemapCurve::Points& points = channel.points;
      const int last = static_cast<int>(points.size()) - 1;
      int segment = channel.segment;
      if (x < points[0].x) {
        segment = 0;
      } else if (x > points[last].x) {
        segment = last;
      } else {
        for (int k = channel.segment; k < last; ++k) {
          if (x >= points[k].x && x <= points[k + 1].x) {
            segment = k;
            break;
          }
        }
      }
      if (segment == last) segment = last - 1;
      channel.segment = segment;

      // Samples beyond the curve's span extrapolate from the end segment, then clamp.
      const float x0 = points[segment].x;
      const float y0 = points[segment].y;
      const float x1 = points[segment + 1].x;
      const float y1 = points[segment + 1].y;
      if (x1 <= x0) {
        return InvalidArgumentErrorBuilder()
               << StrCat(channel.name, segment + 1, "].x must be larger than [", segment,
                         "].x in tuning data. ", x1, " ", x0);
      }
      const float t = (x1 - x) / (x1 - x0);
      const float y = InterpolateKnots(t, y0, y1);
      channel.samples->Set(i, std::clamp(y, 0.0f, 1.0f));
    }
  }
  return tuning;
}

StatusOr<TonemapCurve> ResampleTonemap(const GammaTuning& tuning, int sample_count) {
  const Floats& x = tuning.static_param().gamma_x();
  const Floats& r = tuning.dynamic_param().gamma_r();
  const Floats& g = tuning.dynamic_param().gamma_g();
  const Floats& b = tuning.dynamic_param().gamma_b();
  TAVIK_RETURN_IF_ERROR(CheckCurveLengths(tuning, {&r, &g, &b}));

  TonemapCurve curve;
  const size_t count = sample_count > 0 ? static_cast<size_t>(sample_count) : 0;
  curve.red.reserve(count);
  curve.green.reserve(count);
  curve.blue.reserve(count);
  KnotCursor cursor(Knots(x));
  const float last = static_cast<float>(sample_count - 1);
  for (int i = 0; i < sample_count; ++i) {
    const float sample = static_cast<float>(i) / last;
    const KnotBracket bracket = cursor.Find(sample);
    if (!bracket.rises) return BracketFailure(x, bracket);
    curve.red.push_back({sample, Interpolate(r, bracket)});
    curve.green.push_back({sample, Interpolate(g, bracket)});
    curve.blue.push_back({sample, Interpolate(b, bracket)});
  }
  return curve;
}

void SetDefaultTuning(GammaTuning& tuning) {
  tuning.Clear();
  tuning.set_enable(true);
  Floats* gamma_x = tuning.mutable_static_param()->mutable_gamma_x();
  gamma_x->Reserve(kItpKnots);
  for (int i = 0; i < kItpKnots; ++i) gamma_x->Add(static_cast<float>(i) / 64.0f);
  auto* dynamic_param = tuning.mutable_dynamic_param();
  for (Floats* curve : {dynamic_param->mutable_gamma_r(), dynamic_param->mutable_gamma_g(),
                        dynamic_param->mutable_gamma_b()}) {
    curve->Add(std::begin(kDefaultGammaCurve), std::end(kDefaultGammaCurve));
  }
}

}  // namespace gamma_internal

Status TranslateGamma(const TuningBlock& block, const Tonemap& tonemap, GammaItpOutput& output,
                      TonemapCurve& curve) {
  PerfTrace trace(kTranslatorTraceCategory, "TranslateGamma");
  LocalGammaTuning local;
  TAVIK_RETURN_IF_ERROR(local.Obtain(block, tonemap));
  const GammaTuning& tuning = local.tuning();
  const Floats& x = tuning.static_param().gamma_x();
  const Floats& r = tuning.dynamic_param().gamma_r();
  const Floats& g = tuning.dynamic_param().gamma_g();
  const Floats& b = tuning.dynamic_param().gamma_b();

  if (tonemap.mode != TonemapMode::kContrastCurve) {
    // The message names the knots' count whichever list is short.
    if (r.size() != kItpKnots || g.size() != kItpKnots || b.size() != kItpKnots ||
        x.size() != kItpKnots) {
      return InvalidArgumentError(StrCat(kGammaSizeWrongText, x.size()));
    }
    TAVIK_ASSIGN_OR_RETURN(curve, gamma_internal::ResampleTonemap(tuning, kResampledPoints));
  } else if (&curve != &tonemap.curve) {
    curve.red = tonemap.curve.red;
    curve.green = tonemap.curve.green;
    curve.blue = tonemap.curve.blue;
  }

  output.bypass = tuning.enable() ? 0 : 1;
  EncodeTable(x, output.gamma_x, output.gamma_x_last_step);
  EncodeTable(r, output.gamma_r, output.gamma_r_last_step);
  EncodeTable(g, output.gamma_g, output.gamma_g_last_step);
  EncodeTable(b, output.gamma_b, output.gamma_b_last_step);

  const int32_t step_r = LastStep(output.gamma_r, output.gamma_r_last_step);
  const int32_t step_g = LastStep(output.gamma_g, output.gamma_g_last_step);
  const int32_t step_b = LastStep(output.gamma_b, output.gamma_b_last_step);
  output.gamma_r_last_negative = step_r < 0 ? 1 : 0;
  output.gamma_g_last_negative = step_g < 0 ? 1 : 0;
  output.gamma_b_last_negative = step_b < 0 ? 1 : 0;

  const int32_t step_x = LastStep(output.gamma_x, output.gamma_x_last_step);
  if (step_x < 0) return InvalidArgumentError("Last gamma_x can't be negative!");
  output.gamma_r_last_step = LimitedMagnitude(step_r);
  output.gamma_g_last_step = LimitedMagnitude(step_g);
  output.gamma_b_last_step = LimitedMagnitude(step_b);
  output.gamma_x_last_step = LimitedMagnitude(step_x);
  return OkStatus();
}

Status TranslateGamma(const TuningBlock& block, const Tonemap& tonemap, GammaConfigValue& config,
                      GammaLutValue& lut) {
  PerfTrace trace(kTranslatorTraceCategory, "TranslateGamma");
  LocalGammaTuning local;
  TAVIK_RETURN_IF_ERROR(local.Obtain(block, tonemap));
  const GammaTuning& tuning = local.tuning();

  config.enable = tuning.enable() ? 1 : 0;
  if (!tuning.enable()) return OkStatus();
  if (!tuning.has_dynamic_param()) return InvalidArgumentError(kNoRegionInfoText);

  std::fill(std::begin(lut.gamma_lut_values), std::end(lut.gamma_lut_values), uint16_t{0});
  // The stage has a single curve, and it is green's.
  const Floats& x = tuning.static_param().gamma_x();
  const Floats& g = tuning.dynamic_param().gamma_g();
  TAVIK_RETURN_IF_ERROR(CheckCurveLengths(tuning, {&g}));
  KnotCursor cursor(Knots(x));
  for (int i = 0; i < gamma_internal::kG3aaGammaKnotCount; ++i) {
    const KnotBracket bracket = cursor.Find(gamma_internal::kG3aaGammaKnots[i]);
    if (!bracket.rises) return BracketFailure(x, bracket);
    lut.gamma_lut_values[i] = G3aaCode(Interpolate(g, bracket));
  }
  static_assert(gamma_internal::kG3aaGammaKnotCount <= kG3aaLutSlots);
  return OkStatus();
}

Status GetDefaultGamma(GammaItpOutput& output, GammaItpFixedOutput& fixed) {
  // The fixed fields are cleared first, whatever the translation gives; the record's other bits
  // stay as they were.
  fixed.flag = 0;
  fixed.value_0 = 0;
  fixed.value_1 = 0;
  return GetDefault("GetDefaultGamma", gamma_internal::SetDefaultTuning,
                    [&](const TuningBlock& block) {
                      TonemapCurve discarded;
                      return TranslateGamma(block, TuningTonemap(), output, discarded);
                    });
}

Status GetDefaultGamma(GammaConfigValue& config, GammaLutValue& lut) {
  return GetDefault("GetDefaultGamma", gamma_internal::SetDefaultTuning,
                    [&](const TuningBlock& block) {
                      return TranslateGamma(block, TuningTonemap(), config, lut);
                    });
}

namespace translator_forms {

constexpr TranslatorForm kGammaItp = MakeTranslatorForm<GammaTuning, GammaItpOutput>(
    "TranslateGamma (ITP)", [](const TranslatorFrame& frame, GammaItpOutput& output) {
      // The curve handed back is the caller's business; the tools and the table keep none.
      TonemapCurve curve;
      return TranslateGamma(frame.Block<GammaTuning>(), TonemapOf(frame.facts), output, curve);
    });
constexpr TranslatorForm kGammaG3aa =
    MakeTranslatorForm<GammaTuning, GammaConfigValue, GammaLutValue>(
        "TranslateGamma (G3AA)",
        [](const TranslatorFrame& frame, GammaConfigValue& config, GammaLutValue& lut) {
          return TranslateGamma(frame.Block<GammaTuning>(), TonemapOf(frame.facts), config, lut);
        });

}  // namespace translator_forms
}  // namespace tavik
