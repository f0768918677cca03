#include "tavik/iq/zel/translators/hqdns_online_translator.h"

#include <algorithm>
#include <cstdint>
#include <iterator>
#include <string_view>

#include "google/protobuf/repeated_field.h"
#include "tavik/base/status_macros.h"
#include "tavik/base/trace.h"
#include "tavik/iq/zel/translators/bayer_pattern_util.h"
#include "tavik/iq/zel/translators/internal/hqdns_std_lut.h"
#include "tavik/iq/zel/translators/translator_table.h"
#include "tavik/iq/zel/translators/translator_util.h"
#include "tavik/iq/zel/zel_tuning_block.h"

namespace tavik {
namespace {

namespace zm = ::vosbrine::zelmondrake;
using Floats = ::google::protobuf::RepeatedField<float>;
using hqdns_internal::kStdLutSize;
using hqdns_internal::kStdLutX;

// This unit words the missing dynamic part as "dynamic info", not "region info".
constexpr char kNoDynamicInfoText[] = "Tuning data doesn't have dynamic info.";

// The stage's image-size fields hold 14 bits; the radial model needs some room to work in.
constexpr int32_t kMinImageSide = 32;
constexpr int32_t kMaxImageSide = 16383;

constexpr uint32_t kRadialControl = 0x1000400;

// The radial model's scale is chosen by the image's smaller side: the first bound not below it.
constexpr int32_t kSizeClassBounds[] = {486, 686, 972, 1374, 1944, 2748, 3888, 5498};
constexpr uint32_t kLargestSizeClass = 7;

// The standard-deviation ordinates are Q12 of 0..1 in 16-bit entries.
constexpr float kStdLutScale = 4095.0f;
constexpr int64_t kStdLutMax = 4095;

// The stage multiplies by 8192 / residual_limit_reduce rather than dividing by it.
constexpr float kResidualInverseNumerator = 8192.0f;

// Step 1: the geometry, before anything else and whatever the tuning holds.
Status WriteGeometry(const HqdnsConfig& config, HqdnsOutput& output) {
  if (config.image_resolution == nullptr) {
    return InvalidArgumentError("Config data doesn't have image_resolution.");
  }
  const int32_t width = config.image_resolution->width();
  const int32_t height = config.image_resolution->height();
  if (width < kMinImageSide || height < kMinImageSide) {
    return InvalidArgumentError("Invalid resolution parameters.");
  }
  if (width > kMaxImageSide || height > kMaxImageSide) {
    return InvalidArgumentErrorBuilder() << "Image resolution exceeds the stage's " << kMaxImageSide
                                         << " pixels: " << width << "x" << height;
  }
  output.mono = config.sensor_type == vosbrine::SENSOR_TYPE_MONO ? 1 : 0;
  output.pixel_order = vosbrine::GetMainIspPixelOrder(config.bayer_pattern);
  TAVIK_SET_FIELD(output, neg_half_width, -(width / 2));
  TAVIK_SET_FIELD(output, neg_half_height, -(height / 2));
  TAVIK_SET_FIELD(output, image_width, width);
  TAVIK_SET_FIELD(output, image_height, height);
  output.radial_control = kRadialControl;

  // Step 2. A side above every bound would be class 8, which the field clamps to 7.
  const int32_t smaller = std::min(width, height);
  const auto* bound =
      std::lower_bound(std::begin(kSizeClassBounds), std::end(kSizeClassBounds), smaller);
  output.size_class =
      std::min(static_cast<uint32_t>(bound - std::begin(kSizeClassBounds)), kLargestSizeClass);
  return OkStatus();
}

// Steps 7 and 8: one table's abscissae and ordinates.
Status SetStdLut(const Floats& values, uint16_t (&x)[kStdLutSize], uint16_t (&y)[kStdLutSize]) {
  TAVIK_RETURN_IF_ERROR(RequireSize(values, kStdLutSize, "Invalid input lut size"));
  std::copy(std::begin(kStdLutX), std::end(kStdLutX), std::begin(x));
  for (int i = 0; i < kStdLutSize; ++i) {
    y[i] = static_cast<uint16_t>(ToScaledCode(values.Get(i), kStdLutScale, 0, kStdLutMax));
  }
  return OkStatus();
}

// One table's slopes, from its own entries.
Status SetTableSlope(const uint16_t (&x)[kStdLutSize], const uint16_t (&y)[kStdLutSize],
                     uint16_t (&slope)[kStdLutSize], const char* invalid_text) {
  for (int i = 0; i < kStdLutSize - 1; ++i) {
    const int32_t dx = static_cast<int32_t>(x[i + 1]) - static_cast<int32_t>(x[i]);
    if (dx < 1) return InvalidArgumentError(invalid_text);
    const float dy =
        static_cast<float>(static_cast<int32_t>(y[i + 1]) - static_cast<int32_t>(y[i]));
    slope[i] =
        static_cast<uint16_t>(LowBits(RoundWrapping(dy * 2048.0f / static_cast<float>(dx)), 16));
  }
  slope[kStdLutSize - 1] = slope[kStdLutSize - 2];
  return OkStatus();
}

// A white-balance product in Q4: truncated, then limited to the field's 0..63.
uint32_t StdFactorCode(float value) { return std::min<uint32_t>(TruncateToUint32(value), 63); }

Status SetStdFactor(const zm::HqdnsTuning& tuning, const tavik_api::WhiteBalanceConfig* wb,
                    HqdnsOutput& output) {
  if (wb == nullptr) return InvalidArgumentError("Config data doesn't have WB info.");
  TAVIK_RETURN_IF_ERROR(RequireDynamic(tuning, kNoDynamicInfoText));
  const zm::HqdnsDynamicParam& dynamic = tuning.dynamic_param();
  output.std_factor_r = StdFactorCode(wb->r * dynamic.std_factor_r() * 16.0f);
  output.std_factor_g = StdFactorCode(dynamic.std_factor_g() * ((wb->gr + wb->gb) * 0.5f) * 16.0f);
  output.std_factor_b = StdFactorCode(wb->b * dynamic.std_factor_b() * 16.0f);
  return OkStatus();
}

Status SetFineTuneParameters(const zm::HqdnsDynamicParam& dynamic, HqdnsOutput& output) {
  const float residual_limit_reduce = dynamic.residual_limit_reduce();
  // Written so that NaN passes, as the stage has always taken it.
  if (residual_limit_reduce < 1.0f) {
    return InvalidArgumentError("residual_limit_reduce is invalid.");
  }
  // Rounded and masked to each field's width, not clamped.
  TAVIK_SET_FIELD(output, slope_est_support, RoundWrapping(dynamic.slope_est_support()));
  TAVIK_SET_FIELD(output, slope_thresh_low, RoundWrapping(dynamic.slope_thresh_low()));
  TAVIK_SET_FIELD(output, slope_thresh_high, RoundWrapping(dynamic.slope_thresh_high()));
  TAVIK_SET_FIELD(output, residual_coring_reduce, RoundWrapping(dynamic.residual_coring_reduce()));
  TAVIK_SET_FIELD(output, residual_limit_reduce, RoundWrapping(residual_limit_reduce));
  TAVIK_SET_FIELD(output, residual_limit_reduce_inverse,
                  RoundWrapping(kResidualInverseNumerator / residual_limit_reduce));
  TAVIK_SET_FIELD(output, max_slope_low, RoundWrapping(dynamic.max_slope_low()));
  TAVIK_SET_FIELD(output, max_slope_high, RoundWrapping(dynamic.max_slope_high()));
  TAVIK_SET_FIELD(output, g_lpf_for_g, RoundWrapping(dynamic.g_lpf_for_g_denoise()));
  TAVIK_SET_FIELD(output, rb_lpf_for_g, RoundWrapping(dynamic.rb_lpf_for_g_denoise()));
  TAVIK_SET_FIELD(output, g_lpf_for_rb, RoundWrapping(dynamic.g_lpf_for_rb_denoise()));
  TAVIK_SET_FIELD(output, rb_lpf_for_rb, RoundWrapping(dynamic.rb_lpf_for_rb_denoise()));
  // Deprecated in the schema, yet the stage still takes them.
#pragma GCC diagnostic push
#pragma GCC diagnostic ignored "-Wdeprecated-declarations"
  TAVIK_SET_FIELD(output, thres_low_g, RoundWrapping(dynamic.thres_low_g()));
  TAVIK_SET_FIELD(output, thres_high_g, RoundWrapping(dynamic.thres_high_g()));
  TAVIK_SET_FIELD(output, thres_low_r, RoundWrapping(dynamic.thres_low_r()));
  TAVIK_SET_FIELD(output, thres_high_r, RoundWrapping(dynamic.thres_high_r()));
  TAVIK_SET_FIELD(output, thres_low_b, RoundWrapping(dynamic.thres_low_b()));
  TAVIK_SET_FIELD(output, thres_high_b, RoundWrapping(dynamic.thres_high_b()));
#pragma GCC diagnostic pop
  // The noise given back is truncated, not rounded.
  TAVIK_SET_FIELD(output, return_factor_r, TruncateWrapping(dynamic.return_noise_r_factor()));
  TAVIK_SET_FIELD(output, return_limit_r, TruncateWrapping(dynamic.return_noise_limit_r()));
  TAVIK_SET_FIELD(output, return_factor_g, TruncateWrapping(dynamic.return_noise_g_factor()));
  TAVIK_SET_FIELD(output, return_limit_g, TruncateWrapping(dynamic.return_noise_limit_g()));
  TAVIK_SET_FIELD(output, return_factor_b, TruncateWrapping(dynamic.return_noise_b_factor()));
  TAVIK_SET_FIELD(output, return_limit_b, TruncateWrapping(dynamic.return_noise_limit_b()));
  return OkStatus();
}

// Both steppings translate alike; only their traces differ.
Status TranslateHqdnsCommon(const TuningBlock& block, const HqdnsConfig& config,
                            HqdnsOutput& output) {
  TAVIK_RETURN_IF_ERROR(WriteGeometry(config, output));
  if (config.denoise_mode == DenoiseMode::kOff) {
    output.bypass = 1;
    return OkStatus();
  }
  TAVIK_ASSIGN_OR_RETURN(const zm::HqdnsTuning* tuning, RequireTuning<zm::HqdnsTuning>(block));
  TAVIK_RETURN_IF_ERROR(RequireStatic(*tuning));
  output.bypass = tuning->enable() ? 0 : 1;
  output.low_power = tuning->static_param().enable_low_power() ? 1 : 0;
  TAVIK_RETURN_IF_ERROR(RequireDynamic(*tuning, kNoDynamicInfoText));
  const zm::HqdnsDynamicParam& dynamic = tuning->dynamic_param();

  // Truncated, not rounded, then limited to the 17-bit field.
  const uint32_t shading_a =
      std::min<uint32_t>(TruncateToUint32(dynamic.shading_param_a() * 16384.0f), 131071);
  for (uint32_t& word : output.shading_a) word = WithLowBits(word, 17, shading_a);

  TAVIK_RETURN_IF_ERROR(SetStdLut(dynamic.std_lut_y(), output.std_lut_x_g, output.std_lut_y_g));
  TAVIK_RETURN_IF_ERROR(SetStdLut(dynamic.std_lut_c(), output.std_lut_x_rb, output.std_lut_y_rb));
  TAVIK_RETURN_IF_ERROR(hqdns_internal::SetStdSlope(output));
  TAVIK_RETURN_IF_ERROR(SetStdFactor(*tuning, config.wb, output));
  TAVIK_RETURN_IF_ERROR(SetFineTuneParameters(dynamic, output));
  return OkStatus();
}

// The default column: what the default tuning gives for a 4032 x 3024 RGGB Bayer image. Written
// from constants rather than translated: a pipeline is configured before any frame, so there is
// no white balance yet for the factors to follow.
void WriteDefaultOutput(HqdnsOutput& output) {
  constexpr uint16_t kDefaultStdLutY[kStdLutSize] = {2, 6, 8, 11, 16, 20, 28, 39};
  constexpr uint16_t kDefaultStdSlope[kStdLutSize] = {128, 64, 48, 27, 21, 16, 11, 11};
  output.bypass = 0;
  output.low_power = 0;
  output.fixed_a = 16367;
  output.mono = 0;
  TAVIK_SET_FIELD(output, neg_half_width, -2016);
  TAVIK_SET_FIELD(output, neg_half_height, -1512);
  output.image_width = 4032;
  output.image_height = 3024;
  output.pixel_order = 1;
  output.std_factor_g = 16;
  output.std_factor_r = 22;
  output.std_factor_b = 22;
  output.radial_control = kRadialControl;
  output.size_class = 6;
  for (uint32_t& word : output.shading_a) word = WithLowBits(word, 17, 40000);
  output.fixed_b_0 = 8;
  output.fixed_b_1 = 8;
  output.slope_est_support = 8;
  output.fixed_b_2 = 8;
  output.slope_thresh_low = 128;
  output.slope_thresh_high = 64;
  output.residual_coring_reduce = 16;
  output.residual_limit_reduce = 128;
  output.residual_limit_reduce_inverse = 64;
  output.max_slope_low = 0;
  output.max_slope_high = 0;
  output.g_lpf_for_g = 3;
  output.rb_lpf_for_g = 4;
  output.g_lpf_for_rb = 4;
  output.rb_lpf_for_rb = 4;
  output.thres_low_g = 19;
  output.thres_high_g = 16;
  output.thres_low_r = 77;
  output.thres_high_r = 64;
  output.thres_low_b = 77;
  output.thres_high_b = 64;
  output.return_factor_r = 16;
  output.return_limit_r = 64;
  output.return_factor_g = 16;
  output.return_limit_g = 64;
  output.return_factor_b = 16;
  output.return_limit_b = 64;
  std::copy(std::begin(kStdLutX), std::end(kStdLutX), std::begin(output.std_lut_x_g));
  std::copy(std::begin(kDefaultStdLutY), std::end(kDefaultStdLutY), std::begin(output.std_lut_y_g));
  std::copy(std::begin(kDefaultStdSlope), std::end(kDefaultStdSlope),
            std::begin(output.std_slope_g));
  std::copy(std::begin(kStdLutX), std::end(kStdLutX), std::begin(output.std_lut_x_rb));
  std::copy(std::begin(kDefaultStdLutY), std::end(kDefaultStdLutY),
            std::begin(output.std_lut_y_rb));
  std::copy(std::begin(kDefaultStdSlope), std::end(kDefaultStdSlope),
            std::begin(output.std_slope_rb));
}

// The fixed words both steppings share (all but words 8 and 9).
void WriteCommonFixedOutput(HqdnsFixedOutput& fixed) {
  uint32_t* words = fixed.words;
  WriteFixedBits(words[0], 0, 0xBBBBBBBB);
  WriteFixedBits(words[1], 0, 0xBBBBBBBB);
  WriteFixedBits(words[2], 0xFFFFC008, 0x511);
  WriteFixedBits(words[3], 0xFFFFFFC0, 0x26);
  WriteFixedBits(words[4], 0xFF00E0E0, 0x281212);
  WriteFixedBits(words[5], 0xFF00E0E0, 0x3F0909);
  WriteFixedBits(words[6], ~uint32_t{0x1FFF}, 0xA);
  WriteFixedBits(words[7], ~uint32_t{0x3FFFFFF}, 0x55500B);
  for (int i = 10; i <= 13; ++i) WriteFixedBits(words[i], ~uint32_t{0x1FFFF}, 0x4000);
  for (int i = 14; i <= 15; ++i) WriteFixedBits(words[i], ~uint32_t{0x1FFFF}, 0x1E460);
  WriteFixedBits(words[16], ~uint32_t{0x3FF}, 0x1C4);
  WriteFixedBits(words[17], ~uint32_t{0}, 0xF);
  WriteFixedBits(words[18], ~uint32_t{0}, 0x1FF);
  WriteFixedBits(words[19], 0, 0xFF03FF);
  WriteFixedBits(words[20], 0, 0xFF03FF);
  WriteFixedBits(words[21], 0, 0x3F00FF);
  WriteFixedBits(words[22], 0, 0xF00FF);
  WriteFixedBits(words[23], 0, 15);
}

Status GetDefaultHqdnsCommon(HqdnsOutput& output, HqdnsFixedOutput& fixed) {
  WriteDefaultOutput(output);
  WriteCommonFixedOutput(fixed);
  return OkStatus();
}

// The frame's facts as the stage takes them; `resolution` and `wb` hold what the config points to.
HqdnsConfig HqdnsConfigOf(const FrameFacts& facts, vosbrine::ImageResolution& resolution) {
  resolution.set_width(facts.bayer_width);
  resolution.set_height(facts.bayer_height);
  HqdnsConfig config;
  config.bayer_pattern = facts.bayer_pattern;
  config.sensor_type = facts.sensor_type;
  config.image_resolution = &resolution;
  config.digital_gain = facts.digital_gain;
  config.wb = &facts.white_balance;
  config.denoise_mode = facts.denoise_mode;
  return config;
}

}  // namespace

namespace hqdns_internal {

Status SetStdSlope(HqdnsOutput& output) {
  TAVIK_RETURN_IF_ERROR(SetTableSlope(output.std_lut_x_g, output.std_lut_y_g, output.std_slope_g,
                                      "std_lut_x_g is invalid."));
  TAVIK_RETURN_IF_ERROR(SetTableSlope(output.std_lut_x_rb, output.std_lut_y_rb, output.std_slope_rb,
                                      "std_lut_x_rb is invalid."));
  return OkStatus();
}

}  // namespace hqdns_internal

Status TranslateHqdns(const TuningBlock& block, const HqdnsConfig& config, HqdnsOutput& output) {
  PerfTrace trace(kTranslatorTraceCategory, "TranslateHqdns");
  return TranslateHqdnsCommon(block, config, output);
}

Status TranslateHqdnsB0(const TuningBlock& block, const HqdnsConfig& config, HqdnsOutput& output) {
  PerfTrace trace(kTranslatorTraceCategory, "TranslateHqdnsB0");
  return TranslateHqdnsCommon(block, config, output);
}

Status GetDefaultHqdns(HqdnsOutput& output, HqdnsFixedOutput& fixed) {
  PerfTrace trace(kTranslatorTraceCategory, "GetDefaultHqdns");
  TAVIK_RETURN_IF_ERROR(GetDefaultHqdnsCommon(output, fixed));
  WriteFixedBits(fixed.words[8], ~uint32_t{0xFFFFFFF}, 0x204000);
  return OkStatus();
}

Status GetDefaultHqdnsB0(HqdnsOutput& output, HqdnsFixedOutput& fixed) {
  PerfTrace trace(kTranslatorTraceCategory, "GetDefaultHqdnsB0");
  TAVIK_RETURN_IF_ERROR(GetDefaultHqdnsCommon(output, fixed));
  WriteFixedBits(fixed.words[9], ~uint32_t{0x1FFFFFFF}, 0x10204000);
  return OkStatus();
}

namespace translator_forms {

// The geometry is programmed before the tuning is read, so a refused block leaves it written.
constexpr std::string_view kHqdnsGeometry[] = {
    "mono",        "pixel_order",  "neg_half_width", "neg_half_height",
    "image_width", "image_height", "radial_control", "size_class"};

constexpr TranslatorForm kHqdns =
    MakeTranslatorForm<zm::HqdnsTuning, HqdnsOutput>(
        "TranslateHqdns (HQDNS)",
        [](const TranslatorFrame& frame, HqdnsOutput& output) {
          vosbrine::ImageResolution resolution;
          return TranslateHqdns(frame.Block<zm::HqdnsTuning>(),
                                HqdnsConfigOf(frame.facts, resolution), output);
        })
        .WritingBeforeTuning(kHqdnsGeometry);
constexpr TranslatorForm kHqdnsB0 =
    MakeTranslatorForm<zm::HqdnsTuning, HqdnsOutput>(
        "TranslateHqdnsB0 (HQDNS)",
        [](const TranslatorFrame& frame, HqdnsOutput& output) {
          vosbrine::ImageResolution resolution;
          return TranslateHqdnsB0(frame.Block<zm::HqdnsTuning>(),
                                  HqdnsConfigOf(frame.facts, resolution), output);
        })
        .WritingBeforeTuning(kHqdnsGeometry);

}  // namespace translator_forms
}  // namespace tavik
