#include "tavik/iq/zel/translators/prc_online_translator.h"

#include <cmath>
#include <cstdint>
#include <utility>

#include "google/protobuf/repeated_field.h"
#include "tavik/base/status_macros.h"
#include "tavik/base/strings.h"
#include "tavik/base/trace.h"
#include "tavik/iq/zel/translators/translator_table.h"
#include "tavik/iq/zel/translators/translator_util.h"
#include "tavik/iq/zel/zel_tuning_block.h"

namespace tavik {
namespace {

namespace zm = ::vosbrine::zelmondrake;
using ::tavik_registers::zel::itp::PrcConfigurationValue;
using Floats = ::google::protobuf::RepeatedField<float>;

// Hue is in degrees, saturation and value in 0..1; the stage's full scales follow. The high bounds
// are offset by 2, so that a region's upper bound stays above its lower one.
constexpr float kDegrees = 360.0f;
constexpr int64_t kHueScale = 49151;
constexpr int64_t kSatValScale = 16381;
constexpr float kHighBoundOffset = 2.0f;
constexpr int64_t kHighBoundMin = 2;
constexpr float kInnerHueScale = 24575.0f;
constexpr float kInnerSatValScale = 8191.0f;
constexpr int64_t kShiftCountMax = 15;
constexpr int64_t kShiftHueMax = 24575;
constexpr int64_t kShiftSatValMax = 8191;

uint16_t OuterHueLow(float degrees) {
  return static_cast<uint16_t>(
      RoundAndLimit(degrees * static_cast<float>(kHueScale) / kDegrees, 0, kHueScale));
}
uint16_t OuterHueHigh(float degrees) {
  return static_cast<uint16_t>(
      RoundAndLimit(degrees * static_cast<float>(kHueScale) / kDegrees + kHighBoundOffset,
                    kHighBoundMin, kHueScale + kHighBoundMin));
}
uint16_t OuterLow(float fraction) {
  return static_cast<uint16_t>(ToScaledCode(fraction, kSatValScale));
}
uint16_t OuterHigh(float fraction) {
  return static_cast<uint16_t>(
      RoundAndLimit(fraction * static_cast<float>(kSatValScale) + kHighBoundOffset, kHighBoundMin,
                    kSatValScale + kHighBoundMin));
}
// Inner distances are shift counts: the nearest power of two of the distance in the stage's
// units. No distance at all is count 0.
uint16_t InnerHue(float degrees) {
  if (degrees == 0.0f) return 0;
  return static_cast<uint16_t>(
      RoundAndLimit(std::log2(degrees * kInnerHueScale / kDegrees), 0, kShiftCountMax));
}
uint16_t InnerSatVal(float fraction) {
  if (fraction == 0.0f) return 0;
  return static_cast<uint16_t>(
      RoundAndLimit(std::log2(fraction * kInnerSatValScale), 0, kShiftCountMax));
}
int16_t ShiftHue(float degrees) {
  const float scaled = degrees * kInnerHueScale;
  return static_cast<int16_t>(
      RoundAndLimit((scaled + scaled) / kDegrees, -kShiftHueMax, kShiftHueMax));
}
int16_t ShiftSatVal(float fraction) {
  return static_cast<int16_t>(
      RoundAndLimit(2.0f * (fraction * kInnerSatValScale), -kShiftSatValMax, kShiftSatValMax));
}

template <typename Code, typename Encode>
void EncodeRegions(const Floats& values, Code (&codes)[kPrcRegions], Encode encode) {
  for (int i = 0; i < kPrcRegions; ++i) codes[i] = encode(values.Get(i));
}

// The stage reads 20 values of every list; a shorter list is refused by name.
Status CheckListSizes(const zm::PrcDynamicParam& d) {
  const std::pair<const char*, const Floats*> lists[] = {
      {"outer_hue_low", &d.outer_hue_low()},
      {"outer_hue_high", &d.outer_hue_high()},
      {"outer_sat_low", &d.outer_sat_low()},
      {"outer_sat_high", &d.outer_sat_high()},
      {"outer_val_low", &d.outer_val_low()},
      {"outer_val_high", &d.outer_val_high()},
      {"inner_distance_hue_low", &d.inner_distance_hue_low()},
      {"inner_distance_hue_high", &d.inner_distance_hue_high()},
      {"inner_distance_sat_low", &d.inner_distance_sat_low()},
      {"inner_distance_sat_high", &d.inner_distance_sat_high()},
      {"inner_distance_val_low", &d.inner_distance_val_low()},
      {"inner_distance_val_high", &d.inner_distance_val_high()},
      {"shift_vector_hue", &d.shift_vector_hue()},
      {"shift_vector_sat", &d.shift_vector_sat()},
      {"shift_vector_val", &d.shift_vector_val()},
  };
  for (const auto& [name, list] : lists) {
    if (list->size() < kPrcRegions) {
      return InvalidArgumentError(StrCat(name, " size is wrong: ", list->size()));
    }
  }
  return OkStatus();
}

// Enabled off, every region all zero.
void SetDefaultTuning(zm::PrcTuning& tuning) {
  tuning.set_enable(false);
  tuning.mutable_static_param();
  zm::PrcDynamicParam& d = *tuning.mutable_dynamic_param();
  for (Floats* list :
       {d.mutable_outer_hue_low(), d.mutable_outer_hue_high(), d.mutable_outer_sat_low(),
        d.mutable_outer_sat_high(), d.mutable_outer_val_low(), d.mutable_outer_val_high(),
        d.mutable_inner_distance_hue_low(), d.mutable_inner_distance_hue_high(),
        d.mutable_inner_distance_sat_low(), d.mutable_inner_distance_sat_high(),
        d.mutable_inner_distance_val_low(), d.mutable_inner_distance_val_high(),
        d.mutable_shift_vector_hue(), d.mutable_shift_vector_sat(), d.mutable_shift_vector_val()}) {
    list->Resize(kPrcRegions, 0.0f);
  }
}

}  // namespace

Status TranslatePrc(const TuningBlock& block, PrcOutput& output, TonemapMode tonemap_mode) {
  PerfTrace trace(kTranslatorTraceCategory, "TranslatePrc");
  // The application's tone curve takes the whole colour path; regional corrections would fight it.
  if (tonemap_mode == TonemapMode::kContrastCurve) {
    output.bypass = 1;
    return OkStatus();
  }
  TAVIK_ASSIGN_OR_RETURN(const zm::PrcTuning* tuning, RequireTuning<zm::PrcTuning>(block));
  TAVIK_RETURN_IF_ERROR(RequireDynamic(*tuning));
  TAVIK_RETURN_IF_ERROR(RequireStatic(*tuning));
  const zm::PrcDynamicParam& d = tuning->dynamic_param();
  TAVIK_RETURN_IF_ERROR(CheckListSizes(d));

  output.bypass = tuning->enable() ? 0 : 1;
  EncodeRegions(d.outer_hue_low(), output.outer_hue_low, OuterHueLow);
  EncodeRegions(d.outer_hue_high(), output.outer_hue_high, OuterHueHigh);
  EncodeRegions(d.outer_sat_low(), output.outer_sat_low, OuterLow);
  EncodeRegions(d.outer_sat_high(), output.outer_sat_high, OuterHigh);
  EncodeRegions(d.outer_val_low(), output.outer_val_low, OuterLow);
  EncodeRegions(d.outer_val_high(), output.outer_val_high, OuterHigh);
  EncodeRegions(d.inner_distance_hue_low(), output.inner_distance_hue_low, InnerHue);
  EncodeRegions(d.inner_distance_hue_high(), output.inner_distance_hue_high, InnerHue);
  EncodeRegions(d.inner_distance_sat_low(), output.inner_distance_sat_low, InnerSatVal);
  EncodeRegions(d.inner_distance_sat_high(), output.inner_distance_sat_high, InnerSatVal);
  EncodeRegions(d.inner_distance_val_low(), output.inner_distance_val_low, InnerSatVal);
  EncodeRegions(d.inner_distance_val_high(), output.inner_distance_val_high, InnerSatVal);
  EncodeRegions(d.shift_vector_hue(), output.shift_vector_hue, ShiftHue);
  EncodeRegions(d.shift_vector_sat(), output.shift_vector_sat, ShiftSatVal);
  EncodeRegions(d.shift_vector_val(), output.shift_vector_val, ShiftSatVal);
  return OkStatus();
}

Status GetDefaultPrc(PrcOutput& output, PrcConfigurationValue* config) {
  return GetDefault(
      "GetDefaultPrc", SetDefaultTuning,
      [&](const TuningBlock& block) -> Status {
        TAVIK_RETURN_IF_ERROR(RequireOutput(config));
        return TranslatePrc(block, output, TonemapMode::kHighQuality);
      },
      [&] { config->settings = 0; });
}

namespace translator_forms {

constexpr TranslatorForm kPrc = MakeTranslatorForm<zm::PrcTuning, PrcOutput>(
    "TranslatePrc (ITP)", [](const TranslatorFrame& frame, PrcOutput& output) {
      return TranslatePrc(frame.Block<zm::PrcTuning>(), output, frame.facts.tonemap_mode);
    });

}  // namespace translator_forms
}  // namespace tavik
