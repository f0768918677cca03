#include "tavik/iq/zel/translators/nsmix_online_translator.h"

#include <cstdint>
#include <initializer_list>

#include "google/protobuf/repeated_field.h"
#include "tavik/base/status_macros.h"
#include "tavik/base/trace.h"
#include "tavik/iq/zel/translators/translator_table.h"
#include "tavik/iq/zel/translators/translator_util.h"
#include "tavik/iq/zel/zel_tuning_block.h"

namespace tavik {
namespace {

namespace zm = ::vosbrine::zelmondrake;
using Floats = ::google::protobuf::RepeatedField<float>;

constexpr int kLimitCount = 4;
constexpr int kNoiseShapeCount = 3;
constexpr int kNoiseGainCount = 32;

constexpr uint32_t kRadialSharpConstant = 1112;
constexpr uint32_t kRadialNoiseConstant = 2048;
constexpr uint32_t kHighFrequencyDetectorConstant = 30;
// The radial noise power is signed: its code is moved down by half the 10-bit range.
constexpr int64_t kRadialNoiseOffset = 512;

// The abscissae of the B0 noise gain table. The last one breaks the rising run; the stage takes
// the table as it is.
constexpr uint16_t kNoiseGainX[kNoiseGainCount] = {
    0,   16,  32,  64,   96,   128,  160,  192,  224,  256,  320,  384,  448,  512,  576,  640,
    704, 768, 896, 1024, 1152, 1280, 1536, 1792, 2048, 2304, 2560, 2816, 3072, 3328, 3584, 512};

constexpr NsmixInput kDefaultInput = {vosbrine::SENSOR_TYPE_BAYER, 4032, 3024,
                                      DenoiseMode::kHighQuality};

// round(f x full_scale), limited to 0..full_scale.
int64_t Code(float value, int64_t full_scale) {
  return ToScaledCode(value, static_cast<float>(full_scale), 0, full_scale);
}

// The code of 1 - f: controls that the stage takes the other way round.
int64_t ComplementCode(float value, int64_t full_scale) { return Code(1.0f - value, full_scale); }

// Word 30. Returns a status as each step after the limits does.
Status SetTextureLimitInterpFactor(float factor, NsmixItpOutput& output) {
  TAVIK_SET_FIELD(output, texture_limit_func_interp_factor, Code(factor, 16));
  output.texture_limit_spare_0 = 0;
  output.texture_limit_spare_1 = 0;
  return OkStatus();
}

// Words 33 to 35: a gain (bits 16-26) and a threshold (bits 0-9) a word.
Status SetNoiseShapeGains(const Floats& gains, const Floats& thresholds, NsmixItpOutput& output) {
  TAVIK_RETURN_IF_ERROR(
      RequireSize(gains, kNoiseShapeCount, CountAfter("Noise shape gains number is wrong: ")));
  TAVIK_RETURN_IF_ERROR(RequireSize(thresholds, kNoiseShapeCount,
                                    CountAfter("Noise shape thresholdss number is wrong: ")));
  TAVIK_SET_FIELD(output, noise_shape_gain_0, Code(gains.Get(0), 1024));
  TAVIK_SET_FIELD(output, noise_shape_threshold_0, Code(thresholds.Get(0), 1023));
  TAVIK_SET_FIELD(output, noise_shape_gain_1, Code(gains.Get(1), 1024));
  TAVIK_SET_FIELD(output, noise_shape_threshold_1, Code(thresholds.Get(1), 1023));
  TAVIK_SET_FIELD(output, noise_shape_gain_2, Code(gains.Get(2), 1024));
  TAVIK_SET_FIELD(output, noise_shape_threshold_2, Code(thresholds.Get(2), 1023));
  return OkStatus();
}

// Words 36 and 37.
Status SetHighFrequencyDetector(float power, float threshold, NsmixItpOutput& output) {
  TAVIK_SET_FIELD(output, high_frequency_detector_power, Code(power, 1023));
  output.high_frequency_detector_constant = kHighFrequencyDetectorConstant;
  TAVIK_SET_FIELD(output, high_frequency_detector_threshold, Code(threshold, 511));
  output.high_frequency_detector_spare = 0;
  return OkStatus();
}

// Words 0 to 28, in word order.
void WriteBandWords(const zm::NsmixTuning& tuning, const NsmixInput& input,
                    NsmixItpOutput& output) {
  const zm::NsmixDynamicParam& d = tuning.dynamic_param();
  output.bypass = tuning.enable() ? 0 : 1;
  output.low_power = tuning.static_param().enable_low_power() ? 1 : 0;
  output.mono = input.sensor_type == vosbrine::SENSOR_TYPE_MONO ? 1 : 0;
  TAVIK_SET_FIELD(output, image_width, input.sensor_width);
  TAVIK_SET_FIELD(output, image_height, input.sensor_height);

  TAVIK_SET_FIELD(output, wide_edge_suppress_dark_pos, Code(d.wide_edge_suppress_dark_pos(), 1023));
  TAVIK_SET_FIELD(output, wide_edge_suppress_dark_neg, Code(d.wide_edge_suppress_dark_neg(), 1023));
  TAVIK_SET_FIELD(output, wide_edge_suppress_bright_pos,
                  Code(d.wide_edge_suppress_bright_pos(), 1023));
  TAVIK_SET_FIELD(output, wide_edge_suppress_bright_neg,
                  Code(d.wide_edge_suppress_bright_neg(), 1023));
  TAVIK_SET_FIELD(output, fine_edge_suppress_dark_pos, Code(d.fine_edge_suppress_dark_pos(), 1023));
  TAVIK_SET_FIELD(output, fine_edge_suppress_dark_neg, Code(d.fine_edge_suppress_dark_neg(), 1023));
  TAVIK_SET_FIELD(output, fine_edge_suppress_bright_pos,
                  Code(d.fine_edge_suppress_bright_pos(), 1023));
  TAVIK_SET_FIELD(output, fine_edge_suppress_bright_neg,
                  Code(d.fine_edge_suppress_bright_neg(), 1023));
  TAVIK_SET_FIELD(output, wide_texture_suppress_dark_pos,
                  Code(d.wide_texture_suppress_dark_pos(), 1023));
  TAVIK_SET_FIELD(output, wide_texture_suppress_dark_neg,
                  Code(d.wide_texture_suppress_dark_neg(), 1023));
  TAVIK_SET_FIELD(output, wide_texture_suppress_bright_pos,
                  Code(d.wide_texture_suppress_bright_pos(), 1023));
  TAVIK_SET_FIELD(output, wide_texture_suppress_bright_neg,
                  Code(d.wide_texture_suppress_bright_neg(), 1023));
  TAVIK_SET_FIELD(output, fine_texture_suppress_dark_pos,
                  Code(d.fine_texture_suppress_dark_pos(), 1023));
  TAVIK_SET_FIELD(output, fine_texture_suppress_dark_neg,
                  Code(d.fine_texture_suppress_dark_neg(), 1023));
  TAVIK_SET_FIELD(output, fine_texture_suppress_bright_pos,
                  Code(d.fine_texture_suppress_bright_pos(), 1023));
  TAVIK_SET_FIELD(output, fine_texture_suppress_bright_neg,
                  Code(d.fine_texture_suppress_bright_neg(), 1023));
  TAVIK_SET_FIELD(output, wide_edge_sharp_power_dark, Code(d.wide_edge_sharp_power_dark(), 1023));
  TAVIK_SET_FIELD(output, wide_edge_sharp_power_bright,
                  Code(d.wide_edge_sharp_power_bright(), 1023));
  TAVIK_SET_FIELD(output, fine_edge_sharp_power_dark, Code(d.fine_edge_sharp_power_dark(), 1023));
  TAVIK_SET_FIELD(output, fine_edge_sharp_power_bright,
                  Code(d.fine_edge_sharp_power_bright(), 1023));
  TAVIK_SET_FIELD(output, wide_texture_sharp_power_dark,
                  Code(d.wide_texture_sharp_power_dark(), 1023));
  TAVIK_SET_FIELD(output, wide_texture_sharp_power_bright,
                  Code(d.wide_texture_sharp_power_bright(), 1023));
  TAVIK_SET_FIELD(output, fine_texture_sharp_power_dark,
                  Code(d.fine_texture_sharp_power_dark(), 1023));
  TAVIK_SET_FIELD(output, fine_texture_sharp_power_bright,
                  Code(d.fine_texture_sharp_power_bright(), 1023));

  TAVIK_SET_FIELD(output, grass_texture_power, Code(d.grass_texture_power(), 255));
  TAVIK_SET_FIELD(output, local_contrast_power_dark, Code(d.local_contrast_power_dark(), 128));
  TAVIK_SET_FIELD(output, local_contrast_power_bright, Code(d.local_contrast_power_bright(), 128));
  output.local_contrast_power_spare = 0;

  TAVIK_SET_FIELD(output, fine_noise_extra_power_dark, Code(d.fine_noise_extra_power_dark(), 32));
  TAVIK_SET_FIELD(output, fine_noise_add_power_dark, Code(d.fine_noise_add_power_dark(), 32));
  output.fine_noise_power_spare = 0;
  TAVIK_SET_FIELD(output, fine_noise_add_despeckle_dark,
                  ComplementCode(d.fine_noise_add_despeckle_dark(), 2047));
  TAVIK_SET_FIELD(output, fine_noise_add_despeckle_bright,
                  ComplementCode(d.fine_noise_add_despeckle_bright(), 2047));
  TAVIK_SET_FIELD(output, wide_noise_extra_power_dark, Code(d.wide_noise_extra_power_dark(), 32));
  TAVIK_SET_FIELD(output, wide_noise_add_power_dark, Code(d.wide_noise_add_power_dark(), 32));
  output.wide_noise_power_spare = 0;
  TAVIK_SET_FIELD(output, wide_wide_noise_extra_power_dark,
                  Code(d.wide_wide_noise_extra_power_dark(), 32));
  TAVIK_SET_FIELD(output, wide_wide_noise_add_power_dark,
                  Code(d.wide_wide_noise_add_power_dark(), 32));
  output.wide_wide_noise_power_spare = 0;

  TAVIK_SET_FIELD(output, flat_region_sharp_suppress_extent_dark,
                  Code(d.flat_region_sharp_suppress_extent_dark(), 4094));
  TAVIK_SET_FIELD(output, flat_region_sharp_suppress_extent_bright,
                  Code(d.flat_region_sharp_suppress_extent_bright(), 4094));
  TAVIK_SET_FIELD(output, flat_region_noise_add_base_dark,
                  Code(d.flat_region_noise_add_base_dark(), 4096));
  TAVIK_SET_FIELD(output, flat_region_noise_add_base_bright,
                  Code(d.flat_region_noise_add_base_bright(), 4096));
  TAVIK_SET_FIELD(output, flat_region_sharp_suppress_dark,
                  ComplementCode(d.flat_region_sharp_suppress_dark(), 12));
  TAVIK_SET_FIELD(output, flat_region_sharp_suppress_bright,
                  ComplementCode(d.flat_region_sharp_suppress_bright(), 12));
  TAVIK_SET_FIELD(output, flat_region_noise_add_suppress_dark,
                  ComplementCode(d.flat_region_noise_add_suppress_dark(), 12));
  TAVIK_SET_FIELD(output, flat_region_noise_add_suppress_bright,
                  ComplementCode(d.flat_region_noise_add_suppress_bright(), 12));
  TAVIK_SET_FIELD(output, edge_antihalo_strength_hf, Code(d.edge_antihalo_strength_hf(), 511));
  TAVIK_SET_FIELD(output, edge_antihalo_extent_dark,
                  ComplementCode(d.edge_antihalo_extent_dark(), 255));
  TAVIK_SET_FIELD(output, edge_antihalo_extent_bright,
                  ComplementCode(d.edge_antihalo_extent_bright(), 255));
  TAVIK_SET_FIELD(output, edge_antihalo_strength_dark, Code(d.edge_antihalo_strength_dark(), 255));
  TAVIK_SET_FIELD(output, edge_antihalo_strength_bright,
                  Code(d.edge_antihalo_strength_bright(), 255));

  TAVIK_SET_FIELD(output, radial_sharp_power, Code(d.radial_sharp_power(), 1023));
  output.radial_sharp_constant = kRadialSharpConstant;
  TAVIK_SET_FIELD(output, radial_noise_add_power,
                  Code(d.radial_noise_add_power(), 1023) - kRadialNoiseOffset);
  output.radial_noise_constant = kRadialNoiseConstant;

  TAVIK_SET_FIELD(output, texture_only_suppress_dark_pos,
                  Code(d.texture_only_suppress_dark_pos(), 1023));
  TAVIK_SET_FIELD(output, texture_only_suppress_dark_neg,
                  Code(d.texture_only_suppress_dark_neg(), 1023));
  TAVIK_SET_FIELD(output, texture_only_suppress_bright_pos,
                  Code(d.texture_only_suppress_bright_pos(), 1023));
  TAVIK_SET_FIELD(output, texture_only_suppress_bright_neg,
                  Code(d.texture_only_suppress_bright_neg(), 1023));
  TAVIK_SET_FIELD(output, texture_only_sharp_power_dark,
                  Code(d.texture_only_sharp_power_dark(), 1023));
  TAVIK_SET_FIELD(output, texture_only_sharp_power_bright,
                  Code(d.texture_only_sharp_power_bright(), 1023));
}

// Words 31 and 32, after both lists are checked.
Status SetLimits(const zm::NsmixDynamicParam& d, NsmixItpOutput& output) {
  const Floats& edge = d.edge_limits();
  const Floats& texture = d.texture_limits();
  TAVIK_RETURN_IF_ERROR(
      RequireSize(edge, kLimitCount, CountAfter("Edge limit control number is wrong: ")));
  TAVIK_RETURN_IF_ERROR(
      RequireSize(texture, kLimitCount, CountAfter("Texture limit control number is wrong: ")));
  TAVIK_SET_FIELD(output, edge_limit_0, Code(edge.Get(0), 255));
  TAVIK_SET_FIELD(output, edge_limit_1, Code(edge.Get(1), 255));
  TAVIK_SET_FIELD(output, edge_limit_2, Code(edge.Get(2), 255));
  TAVIK_SET_FIELD(output, edge_limit_3, Code(edge.Get(3), 255));
  TAVIK_SET_FIELD(output, texture_limit_0, Code(texture.Get(0), 255));
  TAVIK_SET_FIELD(output, texture_limit_1, Code(texture.Get(1), 255));
  TAVIK_SET_FIELD(output, texture_limit_2, Code(texture.Get(2), 255));
  TAVIK_SET_FIELD(output, texture_limit_3, Code(texture.Get(3), 255));
  return OkStatus();
}

// Both steppings' translation, without the B0 table. Opens no trace: its callers do.
Status TranslateNsmixCommon(const TuningBlock& block, const NsmixInput& input,
                            NsmixItpOutput& output) {
  if (input.denoise_mode == DenoiseMode::kOff) {
    output.bypass = 1;
    return OkStatus();
  }
  TAVIK_ASSIGN_OR_RETURN(const zm::NsmixTuning* tuning, RequireTuning<zm::NsmixTuning>(block));
  TAVIK_RETURN_IF_ERROR(RequireDynamic(*tuning));
  TAVIK_RETURN_IF_ERROR(RequireStatic(*tuning));
  WriteBandWords(*tuning, input, output);

  const zm::NsmixDynamicParam& d = tuning->dynamic_param();
  TAVIK_RETURN_IF_ERROR(SetLimits(d, output));
  TAVIK_SET_FIELD(output, edge_limit_func_interp_factor,
                  Code(d.edge_limit_func_interp_factor(), 16));
  output.edge_limit_spare_0 = 0;
  output.edge_limit_spare_1 = 0;
  TAVIK_RETURN_IF_ERROR(SetTextureLimitInterpFactor(d.texture_limit_func_interp_factor(), output));
  TAVIK_RETURN_IF_ERROR(
      SetNoiseShapeGains(d.noise_shape_gains(), d.noise_shape_thresholds(), output));
  TAVIK_RETURN_IF_ERROR(SetHighFrequencyDetector(d.high_frequency_detector_power(),
                                                 d.high_frequency_detector_threshold(), output));
  return OkStatus();
}

void SetDefaultTuning(zm::NsmixTuning& tuning) {
  tuning.Clear();
  tuning.set_enable(true);
  tuning.mutable_static_param()->set_enable_low_power(false);
  zm::NsmixDynamicParam& d = *tuning.mutable_dynamic_param();
  d.set_texture_only_sharp_power_bright(0.00293f);
  d.set_texture_only_sharp_power_dark(0.02737f);
  d.set_texture_only_suppress_bright_pos(0.2737f);
  d.set_texture_only_suppress_bright_neg(0.2737f);
  d.set_texture_only_suppress_dark_pos(0.00391f);
  d.set_texture_only_suppress_dark_neg(0.00782f);
  d.set_fine_texture_sharp_power_bright(0.009775f);
  d.set_fine_texture_sharp_power_dark(0.034213f);
  d.set_fine_texture_suppress_bright_pos(0.05865f);
  d.set_fine_texture_suppress_bright_neg(0.05865f);
  d.set_fine_texture_suppress_dark_pos(0.01173f);
  d.set_fine_texture_suppress_dark_neg(0.01173f);
  d.set_fine_edge_sharp_power_bright(0.0215f);
  d.set_fine_edge_sharp_power_dark(0.10948f);
  d.set_fine_edge_suppress_bright_pos(0.9775f);
  d.set_fine_edge_suppress_bright_neg(0.73314f);
  d.set_fine_edge_suppress_dark_pos(0.09775f);
  d.set_fine_edge_suppress_dark_neg(0.1271f);
  d.set_wide_texture_sharp_power_bright(0.004888f);
  d.set_wide_texture_sharp_power_dark(0.02151f);
  d.set_wide_texture_suppress_bright_pos(0.0831f);
  d.set_wide_texture_suppress_bright_neg(0.0831f);
  d.set_wide_texture_suppress_dark_pos(0.01662f);
  d.set_wide_texture_suppress_dark_neg(0.01662f);
  d.set_wide_edge_sharp_power_bright(0.00391f);
  d.set_wide_edge_sharp_power_dark(0.01955f);
  d.set_wide_edge_suppress_bright_pos(0.3128f);
  d.set_wide_edge_suppress_bright_neg(0.1564f);
  d.set_wide_edge_suppress_dark_pos(0.03128f);
  d.set_wide_edge_suppress_dark_neg(0.06256f);
  d.set_edge_antihalo_strength_bright(0.03137f);
  d.set_edge_antihalo_strength_dark(0.1882f);
  d.set_edge_antihalo_extent_bright(0.7255f);
  d.set_edge_antihalo_extent_dark(0.945f);
  d.set_edge_antihalo_strength_hf(0.00783f);
  d.set_local_contrast_power_bright(0.10156f);
  d.set_local_contrast_power_dark(0.3125f);
  d.set_flat_region_sharp_suppress_bright(0.9167f);
  d.set_flat_region_sharp_suppress_dark(0.5f);
  d.set_flat_region_sharp_suppress_extent_bright(0.1038f);
  d.set_flat_region_sharp_suppress_extent_dark(0.02076f);
  d.set_radial_sharp_power(0.00293f);
  d.set_fine_noise_add_despeckle_bright(0.97800f);
  d.set_fine_noise_add_despeckle_dark(0.9609f);
  d.set_fine_noise_add_power_dark(0.4375f);
  d.set_fine_noise_extra_power_dark(0.15625f);
  d.set_wide_noise_add_power_dark(0.625f);
  d.set_wide_noise_extra_power_dark(0.21875f);
  d.set_wide_wide_noise_add_power_dark(0.6875f);
  d.set_wide_wide_noise_extra_power_dark(0.1875f);
  d.set_flat_region_noise_add_suppress_bright(0.83330f);
  d.set_flat_region_noise_add_suppress_dark(0.3333f);
  d.set_flat_region_noise_add_base_dark(0.8545f);
  d.set_radial_noise_add_power(0.5103f);
  d.set_flat_region_noise_add_base_bright(0.8545f);
  for (float limit : {0.1412f, 0.1255f, 0.1569f, 0.0941f}) d.add_edge_limits(limit);
  d.set_edge_limit_func_interp_factor(0.625f);
  for (float limit : {0.3137f, 0.1098f, 0.3137f, 0.098f}) d.add_texture_limits(limit);
  d.set_texture_limit_func_interp_factor(0.25f);
  for (float gain : {0.0293f, 0.0586f, 0.0635f}) d.add_noise_shape_gains(gain);
  for (float threshold : {0.0f, 0.0f, 0.0f}) d.add_noise_shape_thresholds(threshold);
  // grass_texture_power, the high-frequency detector and noise_gain_lut stay unset.
}

// The defaults' translation: the common one, under the A0 translator's trace.
Status TranslateDefaultTuning(const TuningBlock& block, NsmixItpOutput& output) {
  PerfTrace trace(kTranslatorTraceCategory, "TranslateNsmix");
  return TranslateNsmixCommon(block, kDefaultInput, output);
}

// The fixed words both steppings share, words 1 to 19.
void WriteCommonFixedOutput(NsmixItpFixedOutput& fixed) {
  uint32_t* words = fixed.words;
  WriteFixedBits(words[1], 0xF8000000, 0x01FFF3FF);
  WriteFixedBits(words[2], 0xFF0000E0, 0x00404006);
  for (int i = 3; i <= 6; ++i) WriteFixedBits(words[i], 0, 0);
  WriteFixedBits(words[7], 0xC000F000, 0x20000000);
  WriteFixedBits(words[8], 0xFC00FE00, 0x00C80064);
  WriteFixedBits(words[9], 0xF000F000, 0);
  WriteFixedBits(words[10], ~uint32_t{0xF0FFF}, 0x000A0FC8);
  WriteFixedBits(words[11], 0xC000C000, 0);
  WriteFixedBits(words[12], 0xF000F000, 0x01000100);
  WriteFixedBits(words[13], 0xF000C000, 0);
  WriteFixedBits(words[14], ~uint32_t{0x103FF}, 0x1E);
  WriteFixedBits(words[15], ~uint32_t{0xFF7}, 0xFE0);
  WriteFixedBits(words[16], ~uint32_t{0xF}, 9);
  WriteFixedBits(words[17], 0, 0x08080808);
  WriteFixedBits(words[18], ~uint32_t{0x1F}, 0);
  WriteFixedBits(words[19], ~uint32_t{0x3FFF}, 0);
}

void WriteA0FixedOutput(NsmixItpFixedOutput& fixed) {
  WriteFixedBits(fixed.words[0], 0xD0049248, 0x07606D37);
}

void WriteB0FixedOutput(NsmixItpFixedOutput& fixed) {
  WriteFixedBits(fixed.words[20], 0x90049248, 0x47606D37);
  for (int i = 0; i < kNoiseGainCount / 2; ++i) {
    const uint32_t pair = kNoiseGainX[2 * i] | (uint32_t{kNoiseGainX[2 * i + 1]} << 16);
    WriteFixedBits(fixed.words[21 + i], 0xF000F000, pair);
  }
  WriteFixedBits(fixed.words[37], ~uint32_t{0}, 1);
}

NsmixInput NsmixInputOf(const FrameFacts& facts) {
  // The stage's size fields are narrower than 16 bits anyway.
  return {facts.sensor_type, static_cast<uint16_t>(facts.bayer_width),
          static_cast<uint16_t>(facts.bayer_height), facts.denoise_mode};
}

}  // namespace

Status TranslateNsmix(const TuningBlock& block, const NsmixInput& input, NsmixItpOutput& output) {
  PerfTrace trace(kTranslatorTraceCategory, "TranslateNsmix");
  return TranslateNsmixCommon(block, input, output);
}

Status TranslateNsmixB0(const TuningBlock& block, const NsmixInput& input, NsmixItpOutput& output) {
  PerfTrace trace(kTranslatorTraceCategory, "TranslateNsmixB0");
  TAVIK_RETURN_IF_ERROR(TranslateNsmixCommon(block, input, output));
  // Read even when denoising is off, so a block of this type is needed then too.
  TAVIK_ASSIGN_OR_RETURN(const zm::NsmixTuning* tuning, RequireTuning<zm::NsmixTuning>(block));
  const Floats& lut = tuning->dynamic_param().noise_gain_lut();
  TAVIK_RETURN_IF_ERROR(
      RequireSize(lut, kNoiseGainCount, CountAfter("Noise gain lut size is wrong: ")));
  for (int i = 0; i < kNoiseGainCount; ++i) {
    output.noise_gain[i] = WithLowBits(output.noise_gain[i], 14, Code(lut.Get(i), 16383));
  }
  return OkStatus();
}

Status GetDefaultNsmix(NsmixItpOutput& output, NsmixItpFixedOutput& fixed) {
  return GetDefault(
      "GetDefaultNsmix", SetDefaultTuning,
      [&](const TuningBlock& block) { return TranslateDefaultTuning(block, output); },
      [&] {
        WriteCommonFixedOutput(fixed);
        WriteA0FixedOutput(fixed);
      });
}

// The default tuning has no noise gain table, so the B0 step is not run: the table stays as the
// caller left it.
Status GetDefaultNsmixB0(NsmixItpOutput& output, NsmixItpFixedOutput& fixed) {
  return GetDefault(
      "GetDefaultNsmixB0", SetDefaultTuning,
      [&](const TuningBlock& block) { return TranslateDefaultTuning(block, output); },
      [&] {
        WriteCommonFixedOutput(fixed);
        WriteB0FixedOutput(fixed);
      });
}

namespace translator_forms {

constexpr TranslatorForm kNsmix = MakeTranslatorForm<zm::NsmixTuning, NsmixItpOutput>(
    "TranslateNsmix (ITP)", [](const TranslatorFrame& frame, NsmixItpOutput& output) {
      return TranslateNsmix(frame.Block<zm::NsmixTuning>(), NsmixInputOf(frame.facts), output);
    });
constexpr TranslatorForm kNsmixB0 = MakeTranslatorForm<zm::NsmixTuning, NsmixItpOutput>(
    "TranslateNsmixB0 (ITP)", [](const TranslatorFrame& frame, NsmixItpOutput& output) {
      return TranslateNsmixB0(frame.Block<zm::NsmixTuning>(), NsmixInputOf(frame.facts), output);
    });

}  // namespace translator_forms
}  // namespace tavik
