#include "tavik/iq/zel/translators/dpc_online_translator.h"

#include <cstdint>
#include <initializer_list>

#include "google/protobuf/repeated_field.h"
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
using ::tavik_registers::zel::g3aa::DpcConfigValue;
using Floats = ::google::protobuf::RepeatedField<float>;

constexpr char kNullRegisterText[] = "G3AA algo params is null.";
// The G3AA stage's texts name the disparity block; tools that read the stage's logs match them
// as they stand.
constexpr char kNoStaticParamText[] = "DisparityTuning proto doesn't have static param!";
constexpr char kNoDynamicParamText[] = "DisparityTuning proto doesn't have dynamic param!";
constexpr char kSizeNotPositiveText[] = "bayer_width or bayer_height is not positive!";
constexpr char kLevelsSizeWrongText[] = "dpc size is wrong: ";

constexpr int kLevels = 5;

// The G3AA stage's constant settings, as images of the bits they occupy: bits 1-49 of the first
// word (which put 3 into the pixel order), bits 42-63 of the second, bits 0-9 of the third.
constexpr uint64_t kG3aaFirstWordSettings = 0x28004004000C;
constexpr uint64_t kG3aaSecondWordSettings = 0x1E0000000000000;
constexpr uint32_t kG3aaThirdWordSettings = 0x3F0;

constexpr DpcInput kDefaultInput = {
    vosbrine::RGGB, vosbrine::SENSOR_TYPE_BAYER, 10, 1.0f, 4032, 3024, 2};

void SetLevels(Floats& levels, std::initializer_list<float> values) {
  levels.Clear();
  levels.Add(values.begin(), values.end());
}

void SetDefaultTuning(zm::DpcTuning& tuning) {
  tuning.set_enable(true);
  tuning.mutable_static_param();
  zm::DpcDynamicParam& dynamic = *tuning.mutable_dynamic_param();
  dynamic.set_contrast_diff_factor(0.251969f);
  SetLevels(*dynamic.mutable_predespeckle_main_thresholds(),
            {0.029299f, 0.039065f, 0.053714f, 0.073247f, 0.097662f});
  SetLevels(*dynamic.mutable_direction_effective_thresholds(),
            {0.721569f, 0.752941f, 0.784314f, 0.862745f, 0.941176f});
  dynamic.set_max_mask_level(0.5f);
  SetLevels(*dynamic.mutable_dir_base_thresholds(),
            {0.013673f, 0.009766f, 0.023439f, 0.028322f, 0.033205f});
  SetLevels(*dynamic.mutable_omni_dynamic_threshold_weights(),
            {0.011231f, 0.013673f, 0.023439f, 0.033205f, 0.046878f});
  SetLevels(*dynamic.mutable_omni_std_thresholds(),
            {0.013673f, 0.023439f, 0.038088f, 0.062504f, 0.08106f});
  SetLevels(*dynamic.mutable_omni_tol_var_green_scales(),
            {0.188976f, 0.220472f, 0.251969f, 0.283465f, 0.314961f});
  SetLevels(*dynamic.mutable_omni_tol_var_rb_scales(),
            {0.188976f, 0.220472f, 0.251969f, 0.283465f, 0.314961f});
  dynamic.set_g3aa_dpc_threshold(0.0f);
}

DpcInput DpcInputOf(const FrameFacts& facts) {
  return {facts.bayer_pattern, facts.sensor_type,  facts.sensor_bit_depth, facts.digital_gain,
          facts.bayer_width,   facts.bayer_height, facts.dpc_mode};
}

// The five codes of a level list of full scale `scale` into a group of five fields.
template <typename Group>
void WriteLevels(const Floats& values, int64_t scale, Group& group) {
  TAVIK_SET_FIELD(group, level_0, ToScaledCode(values.Get(0), scale));
  TAVIK_SET_FIELD(group, level_1, ToScaledCode(values.Get(1), scale));
  TAVIK_SET_FIELD(group, level_2, ToScaledCode(values.Get(2), scale));
  TAVIK_SET_FIELD(group, level_3, ToScaledCode(values.Get(3), scale));
  TAVIK_SET_FIELD(group, level_4, ToScaledCode(values.Get(4), scale));
}

// Pixel order, the frame's size twice with the fixed fields of its words, and the sensor mode: the
// stage takes them whether or not it runs.
void WriteFrameFields(const DpcInput& input, DpcIppOutput& output) {
  ipp_pixel_order_internal::WriteIppPixelOrderWord(output, input.bayer_pattern);
  output.geometry_bit0 = 0;
  TAVIK_SET_FIELD(output, bayer_width_a, input.bayer_width);
  TAVIK_SET_FIELD(output, bayer_height_a, input.bayer_height);
  output.geometry_mode = 1;
  output.geometry_low = 0;
  TAVIK_SET_FIELD(output, bayer_width_b, input.bayer_width);
  TAVIK_SET_FIELD(output, bayer_height_b, input.bayer_height);
  output.geometry_bit16 = 0;
  output.geometry_bit20 = 0;
  output.sensor_mode = input.sensor_type == vosbrine::SENSOR_TYPE_MONO ? 3 : 1;
}

bool LevelListsHaveFiveValues(const zm::DpcDynamicParam& dynamic) {
  for (const Floats* levels :
       {&dynamic.predespeckle_main_thresholds(), &dynamic.direction_effective_thresholds(),
        &dynamic.dir_base_thresholds(), &dynamic.omni_dynamic_threshold_weights(),
        &dynamic.omni_std_thresholds(), &dynamic.omni_tol_var_green_scales(),
        &dynamic.omni_tol_var_rb_scales()}) {
    if (levels->size() != kLevels) return false;
  }
  return true;
}

void WriteG3aaSettings(DpcConfigValue& output) {
  output.settings_bit1 = (kG3aaFirstWordSettings >> 1) & 1;
  output.pixel_order = (kG3aaFirstWordSettings >> 2) & 3;
  TAVIK_SET_FIELD(output, settings, kG3aaFirstWordSettings >> 4);
  TAVIK_SET_FIELD(output, settings_1, kG3aaSecondWordSettings >> 42);
  TAVIK_SET_FIELD(output, settings_2, kG3aaThirdWordSettings);
}

}  // namespace

Status TranslateDpc(const TuningBlock& block, const DpcInput& input, DpcIppOutput& output) {
  PerfTrace trace(kTranslatorTraceCategory, "TranslateDpc");
  WriteFrameFields(input, output);
  if (input.dpc_mode == 0) {
    output.bypass = 1;
    output.bypass_1 = 1;
    return OkStatus();
  }
  TAVIK_ASSIGN_OR_RETURN(const zm::DpcTuning* tuning, RequireTuning<zm::DpcTuning>(block));
  TAVIK_RETURN_IF_ERROR(RequireDynamic(*tuning));
  TAVIK_RETURN_IF_ERROR(RequireStatic(*tuning));

  const uint32_t bypass = tuning->enable() ? 0 : 1;
  output.bypass = bypass;
  output.bypass_1 = bypass;
  const zm::DpcDynamicParam& dynamic = tuning->dynamic_param();
  const int64_t contrast_diff_factor = ToScaledCode(dynamic.contrast_diff_factor(), 127);
  TAVIK_SET_FIELD(output, contrast_diff_factor_0, contrast_diff_factor);
  TAVIK_SET_FIELD(output, contrast_diff_factor_1, contrast_diff_factor);
  TAVIK_SET_FIELD(output, max_mask_level, ToScaledCode(dynamic.max_mask_level(), 4));

  if (!LevelListsHaveFiveValues(dynamic)) {
    return InvalidArgumentErrorBuilder() << kLevelsSizeWrongText << dynamic.DebugString();
  }
  WriteLevels(dynamic.predespeckle_main_thresholds(), 16383, output.predespeckle_main_thresholds);
  WriteLevels(dynamic.direction_effective_thresholds(), 255, output.direction_effective_thresholds);
  WriteLevels(dynamic.omni_std_thresholds(), 16383, output.omni_std_thresholds);
  WriteLevels(dynamic.omni_dynamic_threshold_weights(), 16383,
              output.omni_dynamic_threshold_weights);
  WriteLevels(dynamic.omni_tol_var_green_scales(), 127, output.omni_tol_var_green_scales);
  WriteLevels(dynamic.omni_tol_var_rb_scales(), 127, output.omni_tol_var_rb_scales);
  WriteLevels(dynamic.dir_base_thresholds(), 16383, output.dir_base_thresholds);
  return OkStatus();
}

Status TranslateDpc(const TuningBlock& block, const DpcInput& input, DpcConfigValue* output) {
  PerfTrace trace(kTranslatorTraceCategory, "TranslateDpc");
  if (output == nullptr) return InvalidArgumentError(kNullRegisterText);
  TAVIK_SET_FIELD(*output, pixel_order, GetG3aaPixelOrder(input.bayer_pattern));
  if (input.dpc_mode == 0) {
    output->enable = 0;
    return OkStatus();
  }
  TAVIK_ASSIGN_OR_RETURN(const zm::DpcTuning* tuning, RequireTuning<zm::DpcTuning>(block));
  TAVIK_RETURN_IF_ERROR(RequireStatic(*tuning, kNoStaticParamText));
  TAVIK_RETURN_IF_ERROR(RequireDynamic(*tuning, kNoDynamicParamText));
  // One positive side is enough.
  if (input.bayer_width < 1 && input.bayer_height < 1) {
    return InvalidArgumentError(kSizeNotPositiveText);
  }

  // Every code but one falls as the threshold rises.
  const float threshold = tuning->dynamic_param().g3aa_dpc_threshold();
  const float rest = 1.0f - threshold;
  output->enable = tuning->enable() ? 1 : 0;
  TAVIK_SET_FIELD(*output, u_38, ToScaledCode(rest, 38));
  TAVIK_SET_FIELD(*output, t_21, ToScaledCode(threshold, 21));
  output->SetU6554(static_cast<uint64_t>(ToScaledCode(rest, 6554)));
  TAVIK_SET_FIELD(*output, u_4915, ToScaledCode(rest, 4915));
  TAVIK_SET_FIELD(*output, u_19, ToScaledCode(rest, 19));
  TAVIK_SET_FIELD(*output, u_32, ToScaledCode(rest, 32));
  return OkStatus();
}

Status GetDefaultDpc(DpcIppOutput& output, DpcIppFixedOutput& fixed) {
  return GetDefault(
      "GetDefaultDpc", SetDefaultTuning,
      [&](const TuningBlock& block) { return TranslateDpc(block, kDefaultInput, output); },
      [&] { fixed = DpcIppFixedOutput{}; });
}

Status GetDefaultDpc(DpcConfigValue* output) {
  return GetDefault(
      "GetDefaultDpc", SetDefaultTuning,
      [&](const TuningBlock& block) -> Status {
        TAVIK_RETURN_IF_ERROR(RequireOutput(output));
        return TranslateDpc(block, kDefaultInput, output);
      },
      [&] { WriteG3aaSettings(*output); });
}

namespace translator_forms {

// Both stages take the frame's pixel order (and the IPP stage its geometry and sensor mode)
// before the tuning.
constexpr std::string_view kIppFrameFields[] = {
    "pixel_order",    "order_bit4",     "order_bit8",     "order_bit12",   "geometry_bit0",
    "bayer_width_a",  "bayer_height_a", "geometry_mode",  "geometry_low",  "bayer_width_b",
    "bayer_height_b", "geometry_bit16", "geometry_bit20", "sensor_mode"};
constexpr std::string_view kG3aaFrameFields[] = {"pixel_order"};

constexpr TranslatorForm kDpcIpp =
    MakeTranslatorForm<zm::DpcTuning, DpcIppOutput>(
        "TranslateDpc (IPP)",
        [](const TranslatorFrame& frame, DpcIppOutput& output) {
          return TranslateDpc(frame.Block<zm::DpcTuning>(), DpcInputOf(frame.facts), output);
        })
        .WritingBeforeTuning(kIppFrameFields);
constexpr TranslatorForm kDpcG3aa =
    MakeTranslatorForm<zm::DpcTuning, DpcConfigValue>(
        "TranslateDpc (G3AA)",
        [](const TranslatorFrame& frame, DpcConfigValue& output) {
          return TranslateDpc(frame.Block<zm::DpcTuning>(), DpcInputOf(frame.facts), &output);
        })
        .WritingBeforeTuning(kG3aaFrameFields);

}  // namespace translator_forms
}  // namespace tavik
