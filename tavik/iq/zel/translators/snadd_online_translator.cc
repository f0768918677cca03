#include "tavik/iq/zel/translators/snadd_online_translator.h"

#include <algorithm>
#include <cstdint>
#include <span>

#include "tavik/base/status_macros.h"
#include "tavik/base/trace.h"
#include "tavik/iq/zel/translators/translator_table.h"
#include "tavik/iq/zel/translators/translator_util.h"
#include "tavik/iq/zel/zel_tuning_block.h"

namespace tavik {
namespace {

namespace zm = ::vosbrine::zelmondrake;
using Regions = std::span<const vosbrine::Roi>;

// Fixed bits of the output words, or-ed in.
constexpr uint32_t kMapExtensionFixed = 7;
constexpr uint32_t kSkyEdgeFixed = 1;
constexpr uint32_t kFaceFixed = 0x37BD;

constexpr int64_t kMarginGradeMax = 0xFFFFF;  // 1.0 in Q20, less one.
constexpr int64_t kFaceLevelMax = 64;
constexpr int64_t kFaceBrightnessLevelMax = 32;
constexpr int64_t kFaceBrightnessGainMax = 1024;

// round(value x full_scale), limited to 0..full_scale.
int64_t Code(float value, int64_t full_scale) {
  return ToScaledCode(value, static_cast<float>(full_scale), 0, full_scale);
}

// A position in the image: rounded, limited to 0..`size`, in the 16 bits of its entry.
uint16_t ImageCoordinate(float value, int32_t size) {
  return static_cast<uint16_t>(LowBits(ToScaledCode(value, 1.0f, 0, std::max(size, 0)), 16));
}

// A region's own coordinates, in the 16 bits of their entries.
uint16_t RegionCoordinate(int64_t value) { return static_cast<uint16_t>(LowBits(value, 16)); }

// Words 0 to 10 but word 10's fixed bits, in word order.
void WriteWords(const zm::SnaddTuning& tuning, SnaddItpOutput& output) {
  const zm::SnaddStaticParam& s = tuning.static_param();
  const zm::SnaddDynamicParam& d = tuning.dynamic_param();
  output.bypass = tuning.enable() ? 0 : 1;
  output.enable_low_power = s.enable_low_power() ? 1 : 0;

  TAVIK_SET_FIELD(output, extend_skin_map_by_texture_index,
                  Code(d.extend_skin_map_by_texture_index(), 255));
  output.skin_texture_fixed = kMapExtensionFixed;
  TAVIK_SET_FIELD(output, extend_skin_map_by_edge_index,
                  Code(d.extend_skin_map_by_edge_index(), 255));
  output.skin_edge_fixed = kMapExtensionFixed;

  // Face beautification sets the faces' own levels instead of the skin reductions.
  TAVIK_SET_FIELD(output, skin_sharpening_reduction,
                  s.enable_face_beautification_sharp_level_control()
                      ? 0
                      : Code(d.skin_sharpening_reduction(), 31));
  TAVIK_SET_FIELD(output, skin_noise_add_reduction,
                  s.enable_face_beautification_noise_level_control()
                      ? 0
                      : Code(d.skin_noise_add_reduction(), 31));
  TAVIK_SET_FIELD(output, extend_skin_b_map_by_texture_index,
                  Code(d.extend_skin_b_map_by_texture_index(), 255));
  output.skin_b_texture_fixed = kMapExtensionFixed;
  TAVIK_SET_FIELD(output, extend_skin_b_map_by_edge_index,
                  Code(d.extend_skin_b_map_by_edge_index(), 255));
  output.skin_b_edge_fixed = kMapExtensionFixed;
  TAVIK_SET_FIELD(output, skin_b_sharpening_reduction, Code(d.skin_b_sharpening_reduction(), 31));
  TAVIK_SET_FIELD(output, skin_b_noise_add_reduction, Code(d.skin_b_noise_add_reduction(), 31));

  TAVIK_SET_FIELD(output, extend_sky_map_by_texture_index,
                  Code(d.extend_sky_map_by_texture_index(), 255));
  output.sky_texture_fixed = kMapExtensionFixed;
  TAVIK_SET_FIELD(output, extend_sky_map_by_edge_index,
                  Code(d.extend_sky_map_by_edge_index(), 255));
  output.sky_edge_fixed = kSkyEdgeFixed;
  TAVIK_SET_FIELD(output, sky_sharpening_reduction, Code(d.sky_sharpening_reduction(), 31));
  TAVIK_SET_FIELD(output, sky_noise_add_reduction, Code(d.sky_noise_add_reduction(), 31));

  // The stage takes this one index the other way round.
  TAVIK_SET_FIELD(output, extend_grass_map_by_texture_index,
                  Code(1.0f - d.extend_grass_map_by_texture_index(), 255));
  output.grass_texture_fixed = kMapExtensionFixed;
  TAVIK_SET_FIELD(output, extend_grass_map_by_edge_index,
                  Code(d.extend_grass_map_by_edge_index(), 255));
  output.grass_edge_fixed = kMapExtensionFixed;
  TAVIK_SET_FIELD(output, grass_sharpening_power, Code(d.grass_sharpening_power(), 31));
  TAVIK_SET_FIELD(output, grass_noise_add_power, Code(d.grass_noise_add_power(), 31));

  output.enable_face_beautification = s.enable_face_beautification() ? 1 : 0;
  output.enable_face_beautification_sharp_level_control =
      s.enable_face_beautification_sharp_level_control() ? 1 : 0;
  output.enable_face_beautification_noise_level_control =
      s.enable_face_beautification_noise_level_control() ? 1 : 0;
  output.enable_face_beautification_brightness_gain_control =
      s.enable_face_beautification_brightness_gain_control() ? 1 : 0;
  output.face_brightness_gain_luminance_only = s.face_brightness_gain_luminance_only() ? 1 : 0;
}

// The first ten regions as the span holds them; entries beyond the span are 0.
void SetFaceRegions(Regions regions, SnaddItpOutput& output) {
  for (size_t i = 0; i < kSnaddFaceRegionCount; ++i) {
    if (i < regions.size()) {
      const vosbrine::Roi& region = regions[i];
      output.face_region_left[i] = RegionCoordinate(region.left());
      output.face_region_top[i] = RegionCoordinate(region.top());
      output.face_region_right[i] = RegionCoordinate(int64_t{region.left()} + region.width());
      output.face_region_bottom[i] = RegionCoordinate(int64_t{region.top()} + region.height());
    } else {
      output.face_region_left[i] = 0;
      output.face_region_top[i] = 0;
      output.face_region_right[i] = 0;
      output.face_region_bottom[i] = 0;
    }
  }
}

Status SetRadialFaceMarginInvsGrades(float gain_x, float gain_y, SnaddItpOutput& output) {
  const auto grade_x = static_cast<uint32_t>(ToScaledCode(gain_x, 1048575.0f, 0, kMarginGradeMax));
  const auto grade_y = static_cast<uint32_t>(ToScaledCode(gain_y, 1048575.0f, 0, kMarginGradeMax));
  std::fill(std::begin(output.face_margin_grade_x), std::end(output.face_margin_grade_x), grade_x);
  std::fill(std::begin(output.face_margin_grade_y), std::end(output.face_margin_grade_y), grade_y);
  return OkStatus();
}

// Each region widened by its own size times the ratios, limited to the image.
Status SetRadialFaceMarginRoiRegions(Regions regions, const vosbrine::ImageResolution& resolution,
                                     float width_ratio, float height_ratio,
                                     SnaddItpOutput& output) {
  if (regions.size() != kSnaddFaceRegionCount) {
    return InvalidArgumentError("Face region lengths are wrong.");
  }
  for (size_t i = 0; i < kSnaddFaceRegionCount; ++i) {
    const vosbrine::Roi& region = regions[i];
    const float margin_x = static_cast<float>(region.width()) * width_ratio;
    const float margin_y = static_cast<float>(region.height()) * height_ratio;
    const auto right = static_cast<float>(int64_t{region.width()} + region.left());
    const auto bottom = static_cast<float>(int64_t{region.height()} + region.top());
    output.face_margin_left[i] =
        ImageCoordinate(static_cast<float>(region.left()) - margin_x, resolution.width());
    output.face_margin_right[i] = ImageCoordinate(margin_x + right, resolution.width());
    output.face_margin_top[i] =
        ImageCoordinate(static_cast<float>(region.top()) - margin_y, resolution.height());
    output.face_margin_bottom[i] = ImageCoordinate(margin_y + bottom, resolution.height());
  }
  return OkStatus();
}

// One level for all faces. Sharpening and noise are centred on 0.5 (code 32).
Status SetFaceControls(float sharp_level, float noise_level, float brightness_level,
                       SnaddItpOutput& output) {
  const auto sharp =
      static_cast<uint16_t>(ToScaledCode(sharp_level - 0.5f, 64.0f, 0, kFaceLevelMax));
  const auto noise =
      static_cast<uint16_t>(ToScaledCode(noise_level - 0.5f, 64.0f, 0, kFaceLevelMax));
  const auto brightness =
      static_cast<uint16_t>(ToScaledCode(brightness_level, 32.0f, 0, kFaceBrightnessLevelMax));
  std::fill(std::begin(output.face_sharp_levels), std::end(output.face_sharp_levels), sharp);
  std::fill(std::begin(output.face_noise_levels), std::end(output.face_noise_levels), noise);
  std::fill(std::begin(output.face_brightness_levels), std::end(output.face_brightness_levels),
            brightness);
  return OkStatus();
}

// The schema's defaults: every switch off but the stage's own.
void SetDefaultTuning(zm::SnaddTuning& tuning) {
  tuning.Clear();
  tuning.set_enable(true);
  tuning.mutable_static_param();
  zm::SnaddDynamicParam& d = *tuning.mutable_dynamic_param();
  d.set_extend_skin_map_by_texture_index(0.2039f);
  d.set_extend_skin_map_by_edge_index(0.62745f);
  d.set_extend_skin_b_map_by_texture_index(0.03922f);
  d.set_extend_skin_b_map_by_edge_index(0.47843f);
  d.set_skin_sharpening_reduction(0.3871f);
  d.set_skin_noise_add_reduction(0.19355f);
  d.set_skin_b_sharpening_reduction(0.3871f);
  d.set_skin_b_noise_add_reduction(0.19355f);
  d.set_extend_sky_map_by_texture_index(0.3804f);
  d.set_extend_sky_map_by_edge_index(0.75686f);
  d.set_sky_sharpening_reduction(0.2903f);
  d.set_sky_noise_add_reduction(0.2903f);
  d.set_extend_grass_map_by_texture_index(0.89412f);
  d.set_extend_grass_map_by_edge_index(0.29412f);
  d.set_grass_sharpening_power(0.32258f);
  d.set_grass_noise_add_power(0.2258f);
  d.set_radial_face_margin_gain_x(0.0f);
  d.set_radial_face_margin_gain_y(0.0f);
  d.set_radial_face_margin_width_ratio(0.2f);
  d.set_radial_face_margin_height_ratio(0.3f);
  d.set_face_sharp_level(0.0f);
  d.set_face_noise_level(0.0f);
  d.set_face_brightness_level(0.0f);
  d.set_face_brightness_gain(0.25f);
}

void WriteFixedOutput(SnaddItpFixedOutput& fixed) {
  uint32_t* words = fixed.words;
  WriteFixedBits(words[0], ~uint32_t{0x3FF}, 384);
  WriteFixedBits(words[1], ~uint32_t{0x1F}, 0);
  WriteFixedBits(words[2], ~uint32_t{0xFFF}, 0x800);
  WriteFixedBits(words[3], ~uint32_t{0xFFF}, 0);
  WriteFixedBits(words[4], ~uint32_t{0x3F}, 4);
  WriteFixedBits(words[5], ~uint32_t{0x1FF}, 0);
  WriteFixedBits(words[6], ~uint32_t{0x3FF}, 0x3BE);
  WriteFixedBits(words[7], 0, 0x114B2540);
  WriteFixedBits(words[8], ~uint32_t{0x3F3F}, (3u << 8) | 2u);
  WriteFixedBits(words[9], ~uint32_t{0x7}, 1);
  WriteFixedBits(words[10], ~uint32_t{0x7FF}, 0);
  WriteFixedBits(words[12], ~uint32_t{0x3FFFFFF}, 0);
  WriteFixedBits(words[13], ~uint32_t{0xFFF}, 1);
  for (int i = 14; i <= 33; ++i) WriteFixedBits(words[i], 0, 0);
}

// The frame's faces as the stage takes them: padded to ten with empty regions, or the first ten
// where the frame has more. `regions` and `resolution` hold what the input points to.
SnaddInput SnaddInputOf(const FrameFacts& facts, vosbrine::Roi (&regions)[kSnaddFaceRegionCount],
                        vosbrine::ImageResolution& resolution) {
  const size_t count = std::min(facts.face_regions.size(), kSnaddFaceRegionCount);
  for (size_t i = 0; i < count; ++i) regions[i] = facts.face_regions[i];
  resolution.set_width(facts.image_width);
  resolution.set_height(facts.image_height);
  return {regions, &resolution};
}

}  // namespace

Status TranslateSnadd(const SnaddInput& input, const TuningBlock& block, SnaddItpOutput& output,
                      EdgeMode edge_mode) {
  PerfTrace trace(kTranslatorTraceCategory, "TranslateSnadd");
  if (edge_mode == EdgeMode::kOff) {
    output.bypass = 1;
    return OkStatus();
  }
  // A frame with edge enhancement on always passes its regions, if only empty ones.
  if (input.face_regions.empty()) return InvalidArgumentError("Input face regions is null.");
  if (input.image_resolution == nullptr) {
    return InvalidArgumentError("Input image resolution is null.");
  }
  TAVIK_ASSIGN_OR_RETURN(const zm::SnaddTuning* tuning, RequireTuning<zm::SnaddTuning>(block));
  TAVIK_RETURN_IF_ERROR(RequireDynamic(*tuning));
  TAVIK_RETURN_IF_ERROR(RequireStatic(*tuning));

  const zm::SnaddDynamicParam& d = tuning->dynamic_param();
  WriteWords(*tuning, output);
  SetFaceRegions(input.face_regions, output);
  TAVIK_RETURN_IF_ERROR(SetRadialFaceMarginInvsGrades(d.radial_face_margin_gain_x(),
                                                      d.radial_face_margin_gain_y(), output));
  TAVIK_RETURN_IF_ERROR(SetRadialFaceMarginRoiRegions(input.face_regions, *input.image_resolution,
                                                      d.radial_face_margin_width_ratio(),
                                                      d.radial_face_margin_height_ratio(), output));
  TAVIK_RETURN_IF_ERROR(SetFaceControls(d.face_sharp_level(), d.face_noise_level(),
                                        d.face_brightness_level(), output));
  TAVIK_SET_FIELD(output, face_brightness_gain_code,
                  Code(d.face_brightness_gain(), kFaceBrightnessGainMax));
  // Last, over whatever the caller left in these bits.
  output.face_fixed = kFaceFixed;
  output.face_spare = 0;
  return OkStatus();
}

Status GetDefaultSnadd(SnaddItpOutput& output, SnaddItpFixedOutput& fixed) {
  return GetDefault(
      "GetDefaultSnadd", SetDefaultTuning,
      [&](const TuningBlock& block) {
        const vosbrine::Roi regions[kSnaddFaceRegionCount];
        vosbrine::ImageResolution resolution;
        resolution.set_width(4032);
        resolution.set_height(3024);
        return TranslateSnadd({regions, &resolution}, block, output, EdgeMode::kHighQuality);
      },
      [&] { WriteFixedOutput(fixed); });
}

namespace translator_forms {

constexpr TranslatorForm kSnadd = MakeTranslatorForm<zm::SnaddTuning, SnaddItpOutput>(
    "TranslateSnadd (ITP)", [](const TranslatorFrame& frame, SnaddItpOutput& output) {
      vosbrine::Roi regions[kSnaddFaceRegionCount];
      vosbrine::ImageResolution resolution;
      return TranslateSnadd(SnaddInputOf(frame.facts, regions, resolution),
                            frame.Block<zm::SnaddTuning>(), output, frame.facts.edge_mode);
    });

}  // namespace translator_forms
}  // namespace tavik
