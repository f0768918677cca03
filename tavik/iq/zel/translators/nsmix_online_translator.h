// Nsmix: the noise mix of the ITP block, which recombines the frequency bands of the image after
// denoising. For bright and dark areas apart it sets how much texture and edge detail is sharpened
// and how much suppressed, how much synthetic noise is added back, and how all that fades in flat
// regions and towards the corners. Stepping B0 adds a 32-point noise gain table; with denoising
// off the stage is bypassed.
#ifndef TAVIK_IQ_ZEL_TRANSLATORS_NSMIX_ONLINE_TRANSLATOR_H_
#define TAVIK_IQ_ZEL_TRANSLATORS_NSMIX_ONLINE_TRANSLATOR_H_

#include <cstddef>
#include <cstdint>

#include "tavik/base/status.h"
#include "tavik/base/tuning_block.h"
#include "tavik/iq/export.h"
#include "tavik/iq/protos/common.pb.h"
#include "tavik/iq/zel/protos/nsmix_param.pb.h"
#include "tavik/iq/zel/translators/frame_modes.h"
#include "tavik/iq/zel/translators/record_description.h"

namespace tavik {

// Frame facts of the noise mix.
struct NsmixInput {
  vosbrine::SensorType sensor_type = vosbrine::INVALID_SENSOR_TYPE;
  uint16_t sensor_width = 0;
  uint16_t sensor_height = 0;
  // Off bypasses the stage without reading the tuning.
  DenoiseMode denoise_mode = DenoiseMode::kOff;
};

// The noise mix's values. A tuning value f in 0..1 is stored as round(f x full scale), limited to
// the field's range; a "pair" word holds two such codes of full scale 1023, in bits 0-9 and 16-25.
// The *_spare fields are cleared by the translation.
struct NsmixItpOutput {
  // Word 0.
  uint32_t bypass : 1;
  uint32_t : 31;
  // Word 1.
  uint32_t low_power : 1;
  uint32_t mono : 1;
  uint32_t : 30;
  // Word 2. The sensor's size, masked to 15 bits.
  uint32_t image_width : 15;
  uint32_t : 1;
  uint32_t image_height : 15;
  uint32_t : 1;
  // Word 3.
  uint32_t wide_edge_suppress_dark_pos : 10;
  uint32_t : 6;
  uint32_t wide_edge_suppress_dark_neg : 10;
  uint32_t : 6;
  // Word 4.
  uint32_t wide_edge_suppress_bright_pos : 10;
  uint32_t : 6;
  uint32_t wide_edge_suppress_bright_neg : 10;
  uint32_t : 6;
  // Word 5.
  uint32_t fine_edge_suppress_dark_pos : 10;
  uint32_t : 6;
  uint32_t fine_edge_suppress_dark_neg : 10;
  uint32_t : 6;
  // Word 6.
  uint32_t fine_edge_suppress_bright_pos : 10;
  uint32_t : 6;
  uint32_t fine_edge_suppress_bright_neg : 10;
  uint32_t : 6;
  // Word 7.
  uint32_t wide_texture_suppress_dark_pos : 10;
  uint32_t : 6;
  uint32_t wide_texture_suppress_dark_neg : 10;
  uint32_t : 6;
  // Word 8.
  uint32_t wide_texture_suppress_bright_pos : 10;
  uint32_t : 6;
  uint32_t wide_texture_suppress_bright_neg : 10;
  uint32_t : 6;
  // Word 9.
  uint32_t fine_texture_suppress_dark_pos : 10;
  uint32_t : 6;
  uint32_t fine_texture_suppress_dark_neg : 10;
  uint32_t : 6;
  // Word 10.
  uint32_t fine_texture_suppress_bright_pos : 10;
  uint32_t : 6;
  uint32_t fine_texture_suppress_bright_neg : 10;
  uint32_t : 6;
  // Word 11.
  uint32_t wide_edge_sharp_power_dark : 10;
  uint32_t : 6;
  uint32_t wide_edge_sharp_power_bright : 10;
  uint32_t : 6;
  // Word 12.
  uint32_t fine_edge_sharp_power_dark : 10;
  uint32_t : 6;
  uint32_t fine_edge_sharp_power_bright : 10;
  uint32_t : 6;
  // Word 13.
  uint32_t wide_texture_sharp_power_dark : 10;
  uint32_t : 6;
  uint32_t wide_texture_sharp_power_bright : 10;
  uint32_t : 6;
  // Word 14.
  uint32_t fine_texture_sharp_power_dark : 10;
  uint32_t : 6;
  uint32_t fine_texture_sharp_power_bright : 10;
  uint32_t : 6;
  // Word 15.
  uint32_t grass_texture_power : 8;
  uint32_t local_contrast_power_dark : 8;
  uint32_t local_contrast_power_bright : 8;
  uint32_t local_contrast_power_spare : 1;
  uint32_t : 7;
  // Word 16.
  uint32_t fine_noise_extra_power_dark : 6;
  uint32_t : 2;
  uint32_t fine_noise_add_power_dark : 6;
  uint32_t : 2;
  uint32_t fine_noise_power_spare : 6;
  uint32_t : 10;
  // Word 17. Despeckling is stored as its complement.
  uint32_t fine_noise_add_despeckle_dark : 11;
  uint32_t : 5;
  uint32_t fine_noise_add_despeckle_bright : 11;
  uint32_t : 5;
  // Word 18.
  uint32_t wide_noise_extra_power_dark : 6;
  uint32_t : 2;
  uint32_t wide_noise_add_power_dark : 6;
  uint32_t : 2;
  uint32_t wide_noise_power_spare : 6;
  uint32_t : 10;
  // Word 19.
  uint32_t wide_wide_noise_extra_power_dark : 6;
  uint32_t : 2;
  uint32_t wide_wide_noise_add_power_dark : 6;
  uint32_t : 2;
  uint32_t wide_wide_noise_power_spare : 6;
  uint32_t : 10;
  // Word 20.
  uint32_t flat_region_sharp_suppress_extent_dark : 12;
  uint32_t : 4;
  uint32_t flat_region_sharp_suppress_extent_bright : 12;
  uint32_t : 4;
  // Word 21. 1.0 is 4096, which needs the 13th bit.
  uint32_t flat_region_noise_add_base_dark : 13;
  uint32_t : 3;
  uint32_t flat_region_noise_add_base_bright : 13;
  uint32_t : 3;
  // Word 22. The four suppressions are stored as complements.
  uint32_t flat_region_sharp_suppress_dark : 4;
  uint32_t flat_region_sharp_suppress_bright : 4;
  uint32_t flat_region_noise_add_suppress_dark : 4;
  uint32_t flat_region_noise_add_suppress_bright : 4;
  uint32_t edge_antihalo_strength_hf : 9;
  uint32_t : 7;
  // Word 23. The extents are stored as complements.
  uint32_t edge_antihalo_extent_dark : 8;
  uint32_t edge_antihalo_extent_bright : 8;
  uint32_t edge_antihalo_strength_dark : 8;
  uint32_t edge_antihalo_strength_bright : 8;
  // Word 24.
  uint32_t radial_sharp_power : 10;
  uint32_t : 6;
  uint32_t radial_sharp_constant : 14;
  uint32_t : 2;
  // Word 25. The power is signed, -512 to 511.
  uint32_t radial_noise_add_power : 10;
  uint32_t : 6;
  uint32_t radial_noise_constant : 12;
  uint32_t : 4;
  // Word 26.
  uint32_t texture_only_suppress_dark_pos : 10;
  uint32_t : 6;
  uint32_t texture_only_suppress_dark_neg : 10;
  uint32_t : 6;
  // Word 27.
  uint32_t texture_only_suppress_bright_pos : 10;
  uint32_t : 6;
  uint32_t texture_only_suppress_bright_neg : 10;
  uint32_t : 6;
  // Word 28.
  uint32_t texture_only_sharp_power_dark : 10;
  uint32_t : 6;
  uint32_t texture_only_sharp_power_bright : 10;
  uint32_t : 6;
  // Word 29.
  uint32_t edge_limit_func_interp_factor : 5;
  uint32_t : 11;
  uint32_t edge_limit_spare_0 : 5;
  uint32_t : 3;
  uint32_t edge_limit_spare_1 : 5;
  uint32_t : 3;
  // Word 30.
  uint32_t texture_limit_func_interp_factor : 5;
  uint32_t : 11;
  uint32_t texture_limit_spare_0 : 5;
  uint32_t : 3;
  uint32_t texture_limit_spare_1 : 5;
  uint32_t : 3;
  // Word 31. Elements 1 and 2 stand crosswise: 0, 2, 1, 3 from the low byte.
  uint32_t edge_limit_0 : 8;
  uint32_t edge_limit_2 : 8;
  uint32_t edge_limit_1 : 8;
  uint32_t edge_limit_3 : 8;
  // Word 32. Likewise.
  uint32_t texture_limit_0 : 8;
  uint32_t texture_limit_2 : 8;
  uint32_t texture_limit_1 : 8;
  uint32_t texture_limit_3 : 8;
  // Words 33 to 35. A gain of 1.0 is 1024, 11 bits.
  uint32_t noise_shape_threshold_0 : 10;
  uint32_t : 6;
  uint32_t noise_shape_gain_0 : 11;
  uint32_t : 5;
  // Word 34.
  uint32_t noise_shape_threshold_1 : 10;
  uint32_t : 6;
  uint32_t noise_shape_gain_1 : 11;
  uint32_t : 5;
  // Word 35.
  uint32_t noise_shape_threshold_2 : 10;
  uint32_t : 6;
  uint32_t noise_shape_gain_2 : 11;
  uint32_t : 5;
  // Word 36.
  uint32_t high_frequency_detector_constant : 9;
  uint32_t : 7;
  uint32_t high_frequency_detector_power : 10;
  uint32_t : 6;
  // Word 37.
  uint32_t high_frequency_detector_threshold : 9;
  uint32_t : 7;
  uint32_t high_frequency_detector_spare : 9;
  uint32_t : 7;
  // Words 38 to 53, stepping B0 only: the noise gain table, two 14-bit entries a word, the even
  // entry low.
  uint16_t noise_gain[32];
};
static_assert(sizeof(NsmixItpOutput) == 216);
static_assert(offsetof(NsmixItpOutput, noise_gain) == 152);
TAVIK_DESCRIBE_RECORD(
    NsmixItpOutput, 32, TAVIK_FIELD(bypass), TAVIK_FIELD(low_power), TAVIK_FIELD(mono),
    TAVIK_FIELD(image_width), TAVIK_FIELD(image_height), TAVIK_FIELD(wide_edge_suppress_dark_pos),
    TAVIK_FIELD(wide_edge_suppress_dark_neg), TAVIK_FIELD(wide_edge_suppress_bright_pos),
    TAVIK_FIELD(wide_edge_suppress_bright_neg), TAVIK_FIELD(fine_edge_suppress_dark_pos),
    TAVIK_FIELD(fine_edge_suppress_dark_neg), TAVIK_FIELD(fine_edge_suppress_bright_pos),
    TAVIK_FIELD(fine_edge_suppress_bright_neg), TAVIK_FIELD(wide_texture_suppress_dark_pos),
    TAVIK_FIELD(wide_texture_suppress_dark_neg), TAVIK_FIELD(wide_texture_suppress_bright_pos),
    TAVIK_FIELD(wide_texture_suppress_bright_neg), TAVIK_FIELD(fine_texture_suppress_dark_pos),
    TAVIK_FIELD(fine_texture_suppress_dark_neg), TAVIK_FIELD(fine_texture_suppress_bright_pos),
    TAVIK_FIELD(fine_texture_suppress_bright_neg), TAVIK_FIELD(wide_edge_sharp_power_dark),
    TAVIK_FIELD(wide_edge_sharp_power_bright), TAVIK_FIELD(fine_edge_sharp_power_dark),
    TAVIK_FIELD(fine_edge_sharp_power_bright), TAVIK_FIELD(wide_texture_sharp_power_dark),
    TAVIK_FIELD(wide_texture_sharp_power_bright), TAVIK_FIELD(fine_texture_sharp_power_dark),
    TAVIK_FIELD(fine_texture_sharp_power_bright), TAVIK_FIELD(grass_texture_power),
    TAVIK_FIELD(local_contrast_power_dark), TAVIK_FIELD(local_contrast_power_bright),
    TAVIK_FIELD(local_contrast_power_spare), TAVIK_FIELD(fine_noise_extra_power_dark),
    TAVIK_FIELD(fine_noise_add_power_dark), TAVIK_FIELD(fine_noise_power_spare),
    TAVIK_FIELD(fine_noise_add_despeckle_dark), TAVIK_FIELD(fine_noise_add_despeckle_bright),
    TAVIK_FIELD(wide_noise_extra_power_dark), TAVIK_FIELD(wide_noise_add_power_dark),
    TAVIK_FIELD(wide_noise_power_spare), TAVIK_FIELD(wide_wide_noise_extra_power_dark),
    TAVIK_FIELD(wide_wide_noise_add_power_dark), TAVIK_FIELD(wide_wide_noise_power_spare),
    TAVIK_FIELD(flat_region_sharp_suppress_extent_dark),
    TAVIK_FIELD(flat_region_sharp_suppress_extent_bright),
    TAVIK_FIELD(flat_region_noise_add_base_dark), TAVIK_FIELD(flat_region_noise_add_base_bright),
    TAVIK_FIELD(flat_region_sharp_suppress_dark), TAVIK_FIELD(flat_region_sharp_suppress_bright),
    TAVIK_FIELD(flat_region_noise_add_suppress_dark),
    TAVIK_FIELD(flat_region_noise_add_suppress_bright), TAVIK_FIELD(edge_antihalo_strength_hf),
    TAVIK_FIELD(edge_antihalo_extent_dark), TAVIK_FIELD(edge_antihalo_extent_bright),
    TAVIK_FIELD(edge_antihalo_strength_dark), TAVIK_FIELD(edge_antihalo_strength_bright),
    TAVIK_FIELD(radial_sharp_power), TAVIK_FIELD(radial_sharp_constant),
    TAVIK_FIELD(radial_noise_add_power), TAVIK_FIELD(radial_noise_constant),
    TAVIK_FIELD(texture_only_suppress_dark_pos), TAVIK_FIELD(texture_only_suppress_dark_neg),
    TAVIK_FIELD(texture_only_suppress_bright_pos), TAVIK_FIELD(texture_only_suppress_bright_neg),
    TAVIK_FIELD(texture_only_sharp_power_dark), TAVIK_FIELD(texture_only_sharp_power_bright),
    TAVIK_FIELD(edge_limit_func_interp_factor), TAVIK_FIELD(edge_limit_spare_0),
    TAVIK_FIELD(edge_limit_spare_1), TAVIK_FIELD(texture_limit_func_interp_factor),
    TAVIK_FIELD(texture_limit_spare_0), TAVIK_FIELD(texture_limit_spare_1),
    TAVIK_FIELD(edge_limit_0), TAVIK_FIELD(edge_limit_2), TAVIK_FIELD(edge_limit_1),
    TAVIK_FIELD(edge_limit_3), TAVIK_FIELD(texture_limit_0), TAVIK_FIELD(texture_limit_2),
    TAVIK_FIELD(texture_limit_1), TAVIK_FIELD(texture_limit_3),
    TAVIK_FIELD(noise_shape_threshold_0), TAVIK_FIELD(noise_shape_gain_0),
    TAVIK_FIELD(noise_shape_threshold_1), TAVIK_FIELD(noise_shape_gain_1),
    TAVIK_FIELD(noise_shape_threshold_2), TAVIK_FIELD(noise_shape_gain_2),
    TAVIK_FIELD(high_frequency_detector_constant), TAVIK_FIELD(high_frequency_detector_power),
    TAVIK_FIELD(high_frequency_detector_threshold), TAVIK_FIELD(high_frequency_detector_spare),
    TAVIK_TABLE(noise_gain, 14));

// Settings of the noise mix that no tuning drives, told by value word by word and written by the
// GetDefault forms alone. Word 0 belongs to stepping A0; words 20 to 37 to stepping B0, of which
// words 21 to 36 hold the abscissae of the noise gain table, two 12-bit entries a word.
struct NsmixItpFixedOutput {
  uint32_t words[38];
};
static_assert(sizeof(NsmixItpFixedOutput) == 152);
TAVIK_DESCRIBE_RECORD(NsmixItpFixedOutput, 32, TAVIK_TABLE(words, 32));

// Stepping A0. With denoising off, sets bypass alone and succeeds without reading the tuning.
// Otherwise fails on a block of another type and a tuning without dynamic or static part (writing
// nothing), and on limit or noise shape lists of the wrong length (after the words before them).
TAVIK_EXPORT Status TranslateNsmix(const TuningBlock& block, const NsmixInput& input,
                                   NsmixItpOutput& output);
// Stepping B0: the A0 translation, then the noise gain table (exactly 32 values), which is read
// even with denoising off.
TAVIK_EXPORT Status TranslateNsmixB0(const TuningBlock& block, const NsmixInput& input,
                                     NsmixItpOutput& output);

// The values of the default tuning for a 4032 x 3024 Bayer sensor, and the fixed words of each
// stepping. The B0 form leaves the noise gain table as it was.
TAVIK_EXPORT Status GetDefaultNsmix(NsmixItpOutput& output, NsmixItpFixedOutput& fixed);
TAVIK_EXPORT Status GetDefaultNsmixB0(NsmixItpOutput& output, NsmixItpFixedOutput& fixed);

// The unit's rows of the translator table.
struct TranslatorForm;
namespace translator_forms {
extern const TranslatorForm kNsmix;
extern const TranslatorForm kNsmixB0;
}  // namespace translator_forms

}  // namespace tavik

#endif  // TAVIK_IQ_ZEL_TRANSLATORS_NSMIX_ONLINE_TRANSLATOR_H_
