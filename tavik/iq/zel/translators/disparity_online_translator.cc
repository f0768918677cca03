#include "tavik/iq/zel/translators/disparity_online_translator.h"

#include <cstdint>

#include "tavik/base/status_macros.h"
#include "tavik/base/trace.h"
#include "tavik/iq/zel/translators/bayer_pattern_util.h"
#include "tavik/iq/zel/translators/internal/ipp_pixel_order.h"
#include "tavik/iq/zel/translators/translator_table.h"
#include "tavik/iq/zel/translators/translator_util.h"
#include "tavik/iq/zel/zel_tuning_block.h"

namespace tavik {
namespace {

namespace zm = ::vosbrine::zelmondrake;
using ::tavik_registers::zel::g3aa::GreenImbalanceLutValue;
using ::tavik_registers::zel::g3aa_generic::GreenImbalanceConfigValue;

constexpr char kNoStaticParamText[] = "DisparityTuning proto doesn't have static param!";
constexpr char kNoDynamicParamText[] = "DisparityTuning proto doesn't have dynamic param!";
constexpr char kSizeNotPositiveText[] = "bayer_width or bayer_height is not positive!";

// Full scales of the IPP codes.
constexpr int64_t kThresholdScale = 4095;
constexpr int64_t kRadialScale = 255;

// The G3AA table: 65 entries whose two values rise linearly with the entry's index over 65 steps,
// so that the last entry stands at 64/65 of the full scale. Each value stays one below its scale.
constexpr float kG3aaSteps = 65.0f;
constexpr float kG3aaSlopeScale = 32767.0f;
constexpr int64_t kG3aaSlopeMax = 32766;
constexpr float kG3aaThresholdScale = 15.0f;
constexpr int64_t kG3aaThresholdMax = 14;

constexpr DisparityInput kDefaultInput = {
    vosbrine::RGGB, vosbrine::SENSOR_TYPE_BAYER, 10, 1.0f, 4032, 3024};

void SetDefaultTuning(zm::DisparityTuning& tuning) {
  tuning.set_enable(true);
  zm::DisparityStaticParam& static_param = *tuning.mutable_static_param();
  static_param.set_enable_5x7(true);
  static_param.set_enable_slope_estimation(true);
  static_param.set_max_slope_allowed_low(0.046875f);
  static_param.set_max_slope_allowed_high(0.046875f);
  zm::DisparityDynamicParam& dynamic = *tuning.mutable_dynamic_param();
  dynamic.set_disparity_threshold_low(0.062515f);
  dynamic.set_disparity_threshold_high(0.062515f);
  dynamic.set_slope_threshold_low(0.002442f);
  dynamic.set_slope_threshold_high(0.002442f);
  dynamic.set_radial_power(0.12549f);
  dynamic.set_radial_limit(0.039216f);
}

DisparityInput DisparityInputOf(const FrameFacts& facts) {
  return {facts.bayer_pattern, facts.sensor_type, facts.sensor_bit_depth,
          facts.digital_gain,  facts.bayer_width, facts.bayer_height};
}

void WriteFixedOutput(DisparityIppFixedOutput& fixed) { fixed = DisparityIppFixedOutput{}; }

}  // namespace

Status TranslateDisparity(const TuningBlock& block, const DisparityInput& input,
                          DisparityIppOutput& output) {
  PerfTrace trace(kTranslatorTraceCategory, "TranslateDisparity");
  TAVIK_ASSIGN_OR_RETURN(const zm::DisparityTuning* tuning,
                         RequireTuning<zm::DisparityTuning>(block));
  TAVIK_RETURN_IF_ERROR(RequireDynamic(*tuning));
  TAVIK_RETURN_IF_ERROR(RequireStatic(*tuning));

  // Only the enable bits depend on whether the block is enabled: a disabled stage keeps its
  // thresholds, so that switching it back on needs no new translation.
  const uint32_t enable = tuning->enable() ? 1 : 0;
  output.bypass = enable ^ 1;
  output.enable = enable;
  output.control = 0x1D0;
  output.sensor_mode = input.sensor_type == vosbrine::SENSOR_TYPE_MONO ? 3 : 2;
  ipp_pixel_order_internal::WriteIppPixelOrderWord(output, input.bayer_pattern);

  const zm::DisparityStaticParam& static_param = tuning->static_param();
  output.enable_correction = enable;
  output.enable_5x7 = static_param.enable_5x7() ? 1 : 0;
  output.enable_slope_estimation = static_param.enable_slope_estimation() ? 1 : 0;
  output.correction_mode = 3;

  const zm::DisparityDynamicParam& dynamic = tuning->dynamic_param();
  TAVIK_SET_FIELD(output, disparity_threshold_low,
                  ToScaledCode(dynamic.disparity_threshold_low(), kThresholdScale));
  TAVIK_SET_FIELD(output, disparity_threshold_high,
                  ToScaledCode(dynamic.disparity_threshold_high(), kThresholdScale));
  TAVIK_SET_FIELD(output, max_slope_allowed_low,
                  ToScaledCode(static_param.max_slope_allowed_low(), kThresholdScale));
  TAVIK_SET_FIELD(output, max_slope_allowed_high,
                  ToScaledCode(static_param.max_slope_allowed_high(), kThresholdScale));
  TAVIK_SET_FIELD(output, slope_threshold_low,
                  ToScaledCode(dynamic.slope_threshold_low(), kThresholdScale));
  TAVIK_SET_FIELD(output, slope_threshold_high,
                  ToScaledCode(dynamic.slope_threshold_high(), kThresholdScale));
  TAVIK_SET_FIELD(output, radial_power, ToScaledCode(dynamic.radial_power(), kRadialScale));
  TAVIK_SET_FIELD(output, radial_limit, ToScaledCode(dynamic.radial_limit(), kRadialScale));
  TAVIK_SET_FIELD(output, bayer_width, input.bayer_width);
  TAVIK_SET_FIELD(output, bayer_height, input.bayer_height);
  return OkStatus();
}

Status TranslateDisparity(const TuningBlock& block, const DisparityInput& input,
                          GreenImbalanceConfigValue& config, GreenImbalanceLutValue& lut) {
  PerfTrace trace(kTranslatorTraceCategory, "TranslateDisparity");
  TAVIK_ASSIGN_OR_RETURN(const zm::DisparityTuning* tuning,
                         RequireTuning<zm::DisparityTuning>(block));
  TAVIK_RETURN_IF_ERROR(RequireStatic(*tuning, kNoStaticParamText));
  // A disabled stage reads nothing of the dynamic part.
  if (tuning->enable()) {
    TAVIK_RETURN_IF_ERROR(RequireDynamic(*tuning, kNoDynamicParamText));
  }
  // One positive side is enough.
  if (input.bayer_width < 1 && input.bayer_height < 1) {
    return InvalidArgumentError(kSizeNotPositiveText);
  }

  config.enable = tuning->enable() ? 1 : 0;
  if (!tuning->enable()) return OkStatus();
  TAVIK_SET_FIELD(config, pixel_order, GetG3aaPixelOrder(input.bayer_pattern));
  TAVIK_SET_FIELD(config, half_width, input.bayer_width / 2);
  TAVIK_SET_FIELD(config, half_height, input.bayer_height / 2);

  const float max_slope = tuning->static_param().max_slope_allowed_low();
  const float threshold = tuning->dynamic_param().disparity_threshold_low();
  for (int k = 0; k < GreenImbalanceLutValue::kEntries; ++k) {
    const float step = static_cast<float>(k);
    const float slope = max_slope * step * kG3aaSlopeScale / kG3aaSteps;
    const float limit = threshold * step * kG3aaThresholdScale / kG3aaSteps;
    lut.lut[GreenImbalanceLutValue::SlopeSlot(k)] =
        static_cast<uint32_t>(RoundAndLimit(slope, 0, kG3aaSlopeMax));
    lut.lut[GreenImbalanceLutValue::ThresholdSlot(k)] =
        static_cast<uint32_t>(RoundAndLimit(limit, 0, kG3aaThresholdMax));
  }
  return OkStatus();
}

Status GetDefaultDisparity(DisparityIppOutput& output, DisparityIppFixedOutput& fixed) {
  return GetDefault(
      "GetDefaultDisparity", SetDefaultTuning,
      [&](const TuningBlock& block) { return TranslateDisparity(block, kDefaultInput, output); },
      [&] { WriteFixedOutput(fixed); });
}

Status GetDefaultDisparity(GreenImbalanceConfigValue& config, GreenImbalanceLutValue& lut) {
  return GetDefault("GetDefaultDisparity", SetDefaultTuning, [&](const TuningBlock& block) {
    return TranslateDisparity(block, kDefaultInput, config, lut);
  });
}

namespace translator_forms {

constexpr TranslatorForm kDisparityIpp =
    MakeTranslatorForm<zm::DisparityTuning, DisparityIppOutput>(
        "TranslateDisparity (IPP)", [](const TranslatorFrame& frame, DisparityIppOutput& output) {
          return TranslateDisparity(frame.Block<zm::DisparityTuning>(),
                                    DisparityInputOf(frame.facts), output);
        });
constexpr TranslatorForm kDisparityG3aa =
    MakeTranslatorForm<zm::DisparityTuning, GreenImbalanceConfigValue, GreenImbalanceLutValue>(
        "TranslateDisparity (G3AA)",
        [](const TranslatorFrame& frame, GreenImbalanceConfigValue& config,
           GreenImbalanceLutValue& lut) {
          return TranslateDisparity(frame.Block<zm::DisparityTuning>(),
                                    DisparityInputOf(frame.facts), config, lut);
        });

}  // namespace translator_forms
}  // namespace tavik
