#include "tavik/iq/zel/translators/sensor_gamma_online_translator.h"

#include <algorithm>
#include <array>
#include <climits>
#include <cstdint>
#include <span>

#include "google/protobuf/repeated_field.h"
#include "tavik/base/logging.h"
#include "tavik/base/status_macros.h"
#include "tavik/base/trace.h"
#include "tavik/iq/zel/translators/bayer_pattern_util.h"
#include "tavik/iq/zel/translators/translator_table.h"
#include "tavik/iq/zel/translators/translator_util.h"
#include "tavik/iq/zel/zel_tuning_block.h"

namespace tavik {
namespace {

namespace zm = ::vosbrine::zelmondrake;
using ::tavik_registers::zel::g3aa::LinearizationLutValue;
using ::tavik_registers::zel::g3aa_generic::LinearizationConfigValue;

constexpr int kPoints = 129;
constexpr int kIppPoints = 128;  // The last point is told as a step from point 127.
constexpr int64_t kIppMax = 32767;
constexpr int64_t kG3aaMax = 32768;  // 1.0 in Q15: the stage's codes reach it.

constexpr char kCurveSizeWrongText[] =
    "Gamma y size is wrong! can't be converted to hardware lut: ";
constexpr char kLinearFallbackText[] =
    "Sensor Gamma doesn't have dynamic parameters. Set it to linear.";

// The identity curve: i / 128 at point i. It stands in for a tuning without a dynamic part, and
// it is the default tuning's curve.
constexpr std::array<float, kPoints> kLinearCurve = [] {
  std::array<float, kPoints> curve{};
  for (int i = 0; i < kPoints; ++i) curve[i] = static_cast<float>(i) / 128.0f;
  return curve;
}();

std::span<const float> Points(const google::protobuf::RepeatedField<float>& values) {
  return {values.data(), static_cast<size_t>(values.size())};
}

// The curve of the tuning, or null where it has no dynamic part. A curve of other than 129
// points fails.
StatusOr<const google::protobuf::RepeatedField<float>*> TuningCurve(
    const zm::SensorGammaTuning& tuning) {
  if (!tuning.has_dynamic_param()) return nullptr;
  const google::protobuf::RepeatedField<float>& curve = tuning.dynamic_param().gamma_y();
  TAVIK_RETURN_IF_ERROR(RequireSize(curve, kPoints, CountAfter(kCurveSizeWrongText)));
  return &curve;
}

// Points 0 to 127 of `curve` as Q14 codes.
void WriteIppCodes(std::span<const float> curve, SensorGammaIppOutput& output) {
  for (int i = 0; i < kIppPoints; ++i) {
    output.gamma_lut[i] = static_cast<uint16_t>(ToFixedPoint(curve[i], 14, 0, kIppMax));
  }
}

// The step from point 127 to a tuning's last point: falls to 0 where the curve falls.
uint16_t IppLastDelta(float last_point, uint16_t code_127) {
  const int64_t last = ToFixedPoint(last_point, 14, INT32_MIN, INT32_MAX);
  return static_cast<uint16_t>(std::clamp<int64_t>(last - code_127, 0, kIppMax));
}

// The step of the linear stand-in: up to 1.0 from point 127.
uint16_t LinearLastDelta(uint16_t code_127) {
  return static_cast<uint16_t>(std::max<int32_t>(code_127, 16384) - code_127);
}

void WriteLinearIppCurve(SensorGammaIppOutput& output) {
  WriteIppCodes(kLinearCurve, output);
  output.last_delta = LinearLastDelta(output.gamma_lut[kIppPoints - 1]);
}

void WriteG3aaCurve(std::span<const float> curve, LinearizationLutValue& lut) {
  for (int i = 0; i < kPoints; ++i) {
    const auto code = static_cast<uint16_t>(ToFixedPoint(curve[i], 15, 0, kG3aaMax));
    std::fill_n(lut.lut + i * LinearizationLutValue::kChannels, LinearizationLutValue::kChannels,
                code);
  }
}

void SetDefaultTuning(zm::SensorGammaTuning& tuning) {
  tuning.set_enable(true);
  tuning.mutable_dynamic_param()->mutable_gamma_y()->Add(kLinearCurve.begin(), kLinearCurve.end());
}

void WriteFixedOutput(SensorGammaIppFixedOutput& fixed) {
  fixed = SensorGammaIppFixedOutput{};
  fixed.value_0 = 0x400;
  fixed.value_1 = 0x400;
  SensorGammaIppOutput linear{};
  WriteLinearIppCurve(linear);
  std::copy(std::begin(linear.gamma_lut), std::end(linear.gamma_lut), fixed.gamma_lut);
  fixed.last_delta = linear.last_delta;
}

}  // namespace

Status TranslateSensorGammaPro(const TuningBlock& block, SensorGammaIppOutput& output,
                               TonemapMode tonemap_mode) {
  PerfTrace trace(kTranslatorTraceCategory, "TranslateSensorGammaPro");
  // The application's tone curve takes the whole tone path, the sensor's linearization included.
  if (tonemap_mode == TonemapMode::kContrastCurve) {
    output.bypass = 1;
    return OkStatus();
  }
  TAVIK_ASSIGN_OR_RETURN(const zm::SensorGammaTuning* tuning,
                         RequireTuning<zm::SensorGammaTuning>(block));
  output.bypass = tuning->enable() ? 0 : 1;
  if (!tuning->enable()) return OkStatus();

  TAVIK_ASSIGN_OR_RETURN(const google::protobuf::RepeatedField<float>* curve, TuningCurve(*tuning));
  if (curve == nullptr) {
    WriteLinearIppCurve(output);
    TAVIK_LOG_EVERY_N_SEC(WARNING, 5) << kLinearFallbackText;
    return OkStatus();
  }
  WriteIppCodes(Points(*curve), output);
  output.last_delta = IppLastDelta(curve->Get(kPoints - 1), output.gamma_lut[kIppPoints - 1]);
  return OkStatus();
}

Status TranslateSensorGamma(const TuningBlock& block, vosbrine::BayerPattern bayer_pattern,
                            LinearizationConfigValue& config, LinearizationLutValue& lut,
                            TonemapMode tonemap_mode) {
  PerfTrace trace(kTranslatorTraceCategory, "TranslateSensorGamma");
  TAVIK_ASSIGN_OR_RETURN(const zm::SensorGammaTuning* tuning,
                         RequireTuning<zm::SensorGammaTuning>(block));
  if (tonemap_mode == TonemapMode::kContrastCurve) {
    config.enable = 0;
    return OkStatus();
  }
  config.enable = tuning->enable() ? 1 : 0;
  if (!tuning->enable()) return OkStatus();
  TAVIK_SET_FIELD(config, pixel_order, GetG3aaPixelOrder(bayer_pattern));

  TAVIK_ASSIGN_OR_RETURN(const google::protobuf::RepeatedField<float>* curve, TuningCurve(*tuning));
  if (curve == nullptr) {
    WriteG3aaCurve(kLinearCurve, lut);
    TAVIK_LOG_EVERY_N_SEC(WARNING, 5) << kLinearFallbackText;
    return OkStatus();
  }
  WriteG3aaCurve(Points(*curve), lut);
  return OkStatus();
}

Status GetDefaultSensorGammaPro(SensorGammaIppOutput& output, SensorGammaIppFixedOutput& fixed) {
  return GetDefault(
      "GetDefaultSensorGammaPro", SetDefaultTuning,
      [&](const TuningBlock& block) {
        return TranslateSensorGammaPro(block, output, TonemapMode::kHighQuality);
      },
      [&] { WriteFixedOutput(fixed); });
}

Status GetDefaultSensorGamma(LinearizationConfigValue& config, LinearizationLutValue& lut) {
  return GetDefault("GetDefaultSensorGamma", SetDefaultTuning, [&](const TuningBlock& block) {
    return TranslateSensorGamma(block, vosbrine::RGGB, config, lut, TonemapMode::kHighQuality);
  });
}

namespace translator_forms {

constexpr TranslatorForm kSensorGammaProIpp =
    MakeTranslatorForm<zm::SensorGammaTuning, SensorGammaIppOutput>(
        "TranslateSensorGammaPro (IPP)",
        [](const TranslatorFrame& frame, SensorGammaIppOutput& output) {
          return TranslateSensorGammaPro(frame.Block<zm::SensorGammaTuning>(), output,
                                         frame.facts.tonemap_mode);
        });
constexpr TranslatorForm kSensorGammaG3aa =
    MakeTranslatorForm<zm::SensorGammaTuning, LinearizationConfigValue, LinearizationLutValue>(
        "TranslateSensorGamma (G3AA)",
        [](const TranslatorFrame& frame, LinearizationConfigValue& config,
           LinearizationLutValue& lut) {
          return TranslateSensorGamma(frame.Block<zm::SensorGammaTuning>(),
                                      frame.facts.bayer_pattern, config, lut,
                                      frame.facts.tonemap_mode);
        });

}  // namespace translator_forms
}  // namespace tavik
