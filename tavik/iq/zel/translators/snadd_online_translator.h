// Snadd: the noise-add stage of the ITP block. It drives how sharpening and added noise treat
// skin, sky and grass (whose maps the Skind stage detects), and the face-beautification controls:
// for each of up to ten face regions of the frame, its rectangle, a margin rectangle around it
// with its grades, and sharpening, noise and brightness levels. With edge enhancement off the
// stage is bypassed.
#ifndef TAVIK_IQ_ZEL_TRANSLATORS_SNADD_ONLINE_TRANSLATOR_H_
#define TAVIK_IQ_ZEL_TRANSLATORS_SNADD_ONLINE_TRANSLATOR_H_

#include <cstddef>
#include <cstdint>
#include <span>

#include "tavik/base/status.h"
#include "tavik/base/tuning_block.h"
#include "tavik/iq/export.h"
#include "tavik/iq/protos/common.pb.h"
#include "tavik/iq/zel/protos/snadd_param.pb.h"
#include "tavik/iq/zel/translators/frame_modes.h"
#include "tavik/iq/zel/translators/record_description.h"

namespace tavik {

// The face regions the stage takes a frame. A caller pads the frame's faces to exactly this many
// regions with empty ones.
inline constexpr size_t kSnaddFaceRegionCount = 10;

// Frame facts of the noise-add stage.
struct SnaddInput {
  // In pixels of the image; exactly kSnaddFaceRegionCount, unused ones empty.
  std::span<const vosbrine::Roi> face_regions;
  const vosbrine::ImageResolution* image_resolution = nullptr;
};

// The noise-add stage's values. A tuning value in 0..1 is stored as round(value x full scale),
// limited to 0..full scale: 255 for the map extensions, 31 for reductions and powers. The
// *_fixed fields hold settings of the stage that no tuning drives; face_spare is cleared.
struct SnaddItpOutput {
  // Word 0.
  uint32_t bypass : 1;
  uint32_t : 31;
  // Word 1.
  uint32_t enable_low_power : 1;
  uint32_t : 31;
  // Word 2.
  uint32_t extend_skin_map_by_texture_index : 8;
  uint32_t skin_texture_fixed : 3;
  uint32_t : 5;
  uint32_t extend_skin_map_by_edge_index : 8;
  uint32_t skin_edge_fixed : 3;
  uint32_t : 5;
  // Word 3. The skin reductions are 0 while face beautification controls their level.
  uint32_t skin_sharpening_reduction : 6;
  uint32_t : 2;
  uint32_t skin_noise_add_reduction : 6;
  uint32_t : 2;
  uint32_t extend_skin_b_map_by_texture_index : 8;
  uint32_t skin_b_texture_fixed : 3;
  uint32_t : 5;
  // Word 4.
  uint32_t extend_skin_b_map_by_edge_index : 8;
  uint32_t skin_b_edge_fixed : 3;
  uint32_t : 5;
  uint32_t skin_b_sharpening_reduction : 6;
  uint32_t : 10;
  // Word 5.
  uint32_t skin_b_noise_add_reduction : 6;
  uint32_t : 26;
  // Word 6.
  uint32_t extend_sky_map_by_texture_index : 8;
  uint32_t sky_texture_fixed : 3;
  uint32_t : 5;
  uint32_t extend_sky_map_by_edge_index : 8;
  uint32_t : 3;
  uint32_t sky_edge_fixed : 1;
  uint32_t : 4;
  // Word 7.
  uint32_t sky_sharpening_reduction : 6;
  uint32_t : 2;
  uint32_t sky_noise_add_reduction : 6;
  uint32_t : 18;
  // Word 8. The texture index is stored as its complement, 1 - value.
  uint32_t extend_grass_map_by_texture_index : 8;
  uint32_t grass_texture_fixed : 3;
  uint32_t : 5;
  uint32_t extend_grass_map_by_edge_index : 8;
  uint32_t grass_edge_fixed : 3;
  uint32_t : 5;
  // Word 9.
  uint32_t grass_sharpening_power : 6;
  uint32_t : 2;
  uint32_t grass_noise_add_power : 6;
  uint32_t : 18;
  // Word 10. The face-beautification switches.
  uint32_t face_fixed : 17;
  uint32_t enable_face_beautification : 1;
  uint32_t enable_face_beautification_sharp_level_control : 1;
  uint32_t enable_face_beautification_noise_level_control : 1;
  uint32_t enable_face_beautification_brightness_gain_control : 1;
  uint32_t face_spare : 3;
  uint32_t face_brightness_gain_luminance_only : 1;
  uint32_t : 7;
  // The face regions (right = left + width, bottom = top + height), the margin rectangles around
  // them limited to the image, and the levels: sharpening and noise 0..64 (32 is neutral),
  // brightness 0..32.
  uint16_t face_region_left[kSnaddFaceRegionCount];
  uint16_t face_region_top[kSnaddFaceRegionCount];
  uint16_t face_region_right[kSnaddFaceRegionCount];
  uint16_t face_region_bottom[kSnaddFaceRegionCount];
  uint16_t face_margin_left[kSnaddFaceRegionCount];
  uint16_t face_margin_top[kSnaddFaceRegionCount];
  uint16_t face_margin_right[kSnaddFaceRegionCount];
  uint16_t face_margin_bottom[kSnaddFaceRegionCount];
  uint16_t face_sharp_levels[kSnaddFaceRegionCount];
  uint16_t face_noise_levels[kSnaddFaceRegionCount];
  uint16_t face_brightness_levels[kSnaddFaceRegionCount];
  // Q10, 0..1024.
  uint32_t face_brightness_gain_code : 11;
  uint32_t : 21;
  // How the margin grades towards the face, Q20 of 0..1.
  uint32_t face_margin_grade_x[kSnaddFaceRegionCount];
  uint32_t face_margin_grade_y[kSnaddFaceRegionCount];
};
static_assert(sizeof(SnaddItpOutput) == 348);
static_assert(offsetof(SnaddItpOutput, face_region_left) == 44);
static_assert(offsetof(SnaddItpOutput, face_region_top) == 64);
static_assert(offsetof(SnaddItpOutput, face_region_right) == 84);
static_assert(offsetof(SnaddItpOutput, face_region_bottom) == 104);
static_assert(offsetof(SnaddItpOutput, face_margin_left) == 124);
static_assert(offsetof(SnaddItpOutput, face_margin_top) == 144);
static_assert(offsetof(SnaddItpOutput, face_margin_right) == 164);
static_assert(offsetof(SnaddItpOutput, face_margin_bottom) == 184);
static_assert(offsetof(SnaddItpOutput, face_sharp_levels) == 204);
static_assert(offsetof(SnaddItpOutput, face_noise_levels) == 224);
static_assert(offsetof(SnaddItpOutput, face_brightness_levels) == 244);
static_assert(offsetof(SnaddItpOutput, face_margin_grade_x) == 268);
static_assert(offsetof(SnaddItpOutput, face_margin_grade_y) == 308);
TAVIK_DESCRIBE_RECORD(
    SnaddItpOutput, 32, TAVIK_FIELD(bypass), TAVIK_FIELD(enable_low_power),
    TAVIK_FIELD(extend_skin_map_by_texture_index), TAVIK_FIELD(skin_texture_fixed),
    TAVIK_FIELD(extend_skin_map_by_edge_index), TAVIK_FIELD(skin_edge_fixed),
    TAVIK_FIELD(skin_sharpening_reduction), TAVIK_FIELD(skin_noise_add_reduction),
    TAVIK_FIELD(extend_skin_b_map_by_texture_index), TAVIK_FIELD(skin_b_texture_fixed),
    TAVIK_FIELD(extend_skin_b_map_by_edge_index), TAVIK_FIELD(skin_b_edge_fixed),
    TAVIK_FIELD(skin_b_sharpening_reduction), TAVIK_FIELD(skin_b_noise_add_reduction),
    TAVIK_FIELD(extend_sky_map_by_texture_index), TAVIK_FIELD(sky_texture_fixed),
    TAVIK_FIELD(extend_sky_map_by_edge_index), TAVIK_FIELD(sky_edge_fixed),
    TAVIK_FIELD(sky_sharpening_reduction), TAVIK_FIELD(sky_noise_add_reduction),
    TAVIK_FIELD(extend_grass_map_by_texture_index), TAVIK_FIELD(grass_texture_fixed),
    TAVIK_FIELD(extend_grass_map_by_edge_index), TAVIK_FIELD(grass_edge_fixed),
    TAVIK_FIELD(grass_sharpening_power), TAVIK_FIELD(grass_noise_add_power),
    TAVIK_FIELD(face_fixed), TAVIK_FIELD(enable_face_beautification),
    TAVIK_FIELD(enable_face_beautification_sharp_level_control),
    TAVIK_FIELD(enable_face_beautification_noise_level_control),
    TAVIK_FIELD(enable_face_beautification_brightness_gain_control), TAVIK_FIELD(face_spare),
    TAVIK_FIELD(face_brightness_gain_luminance_only), TAVIK_TABLE(face_region_left, 16),
    TAVIK_TABLE(face_region_top, 16), TAVIK_TABLE(face_region_right, 16),
    TAVIK_TABLE(face_region_bottom, 16), TAVIK_TABLE(face_margin_left, 16),
    TAVIK_TABLE(face_margin_top, 16), TAVIK_TABLE(face_margin_right, 16),
    TAVIK_TABLE(face_margin_bottom, 16), TAVIK_TABLE(face_sharp_levels, 16),
    TAVIK_TABLE(face_noise_levels, 16), TAVIK_TABLE(face_brightness_levels, 16),
    TAVIK_FIELD(face_brightness_gain_code), TAVIK_TABLE(face_margin_grade_x, 32),
    TAVIK_TABLE(face_margin_grade_y, 32));

// Settings of the noise-add stage that no tuning drives, told by value word by word and written
// by GetDefaultSnadd alone.
struct SnaddItpFixedOutput {
  uint32_t words[34];
};
static_assert(sizeof(SnaddItpFixedOutput) == 136);
TAVIK_DESCRIBE_RECORD(SnaddItpFixedOutput, 32, TAVIK_TABLE(words, 32));

// The input comes first, unlike the other translators. With edge enhancement off, sets bypass
// alone and succeeds without reading anything else. Otherwise fails, writing nothing, on no face
// regions, no image resolution, a block of another type and a tuning without dynamic or static
// part; and, after the words, the rectangles and the grades, on other than ten face regions.
TAVIK_EXPORT Status TranslateSnadd(const SnaddInput& input, const TuningBlock& block,
                                   SnaddItpOutput& output, EdgeMode edge_mode);

// The values of the default tuning for ten empty regions of a 4032 x 3024 image, and the fixed
// words.
TAVIK_EXPORT Status GetDefaultSnadd(SnaddItpOutput& output, SnaddItpFixedOutput& fixed);

// The unit's row of the translator table.
struct TranslatorForm;
namespace translator_forms {
extern const TranslatorForm kSnadd;
}  // namespace translator_forms

}  // namespace tavik

#endif  // TAVIK_IQ_ZEL_TRANSLATORS_SNADD_ONLINE_TRANSLATOR_H_
