// HQDNS: the raw-domain denoiser. Its noise strength follows intensity (a standard-deviation table
// per colour class, on fixed abscissae, with the slope of each segment that the stage
// interpolates with), white balance (one factor per colour) and a radial shading model centred on
// the image. The translation needs the frame's geometry, pattern and white-balance gains; with
// denoising off the stage is bypassed whatever the tuning holds.
#ifndef TAVIK_IQ_ZEL_TRANSLATORS_HQDNS_ONLINE_TRANSLATOR_H_
#define TAVIK_IQ_ZEL_TRANSLATORS_HQDNS_ONLINE_TRANSLATOR_H_

#include <cstddef>
#include <cstdint>

#include "tavik/base/status.h"
#include "tavik/base/tuning_block.h"
#include "tavik/iq/export.h"
#include "tavik/iq/protos/common.pb.h"
#include "tavik/iq/zel/protos/hqdns_param.pb.h"
#include "tavik/iq/zel/translators/frame_modes.h"
#include "tavik/iq/zel/translators/record_description.h"
#include "tavik/iq/zel/translators/white_balance_config.h"

namespace tavik {

// Frame facts of the HQDNS stage.
struct HqdnsConfig {
  vosbrine::BayerPattern bayer_pattern = vosbrine::RGGB;
  vosbrine::SensorType sensor_type = vosbrine::INVALID_SENSOR_TYPE;
  // The image's size; 32 to 16383 pixels each way.
  const vosbrine::ImageResolution* image_resolution = nullptr;
  // Not read by the translation; recorded with it in debug dumps.
  float digital_gain = 0.0f;
  const tavik_api::WhiteBalanceConfig* wb = nullptr;
  // Off bypasses the stage without reading the tuning.
  DenoiseMode denoise_mode = DenoiseMode::kOff;
};

// The HQDNS stage's values. Each standard-deviation table has 8 knots: abscissae (constants of the
// stage, 0..4095), ordinates (Q12 of 0..1) and the signed slope of each segment (Q11 per unit of
// abscissa, two's complement; the last repeats the one before).
struct HqdnsOutput {
  // Word 0.
  uint32_t bypass : 1;
  uint32_t : 31;
  // Word 1.
  uint32_t low_power : 1;
  uint32_t : 31;
  // Word 2. fixed_a is a setting of the stage that no tuning drives.
  uint32_t fixed_a : 14;
  uint32_t mono : 1;
  uint32_t : 17;
  // Word 3. Minus half the image's size: the radial model's origin is the image centre.
  uint32_t neg_half_width : 15;
  uint32_t neg_half_height : 15;
  uint32_t : 2;
  // Word 4.
  uint32_t image_width : 14;
  uint32_t : 2;
  uint32_t image_height : 14;
  uint32_t : 2;
  // Word 5.
  uint32_t pixel_order : 2;
  uint32_t : 30;
  // Word 6. White-balance factors, Q4.
  uint32_t std_factor_g : 6;
  uint32_t : 2;
  uint32_t std_factor_r : 6;
  uint32_t : 2;
  uint32_t std_factor_b : 6;
  uint32_t : 10;
  // Word 7. size_class picks the radial model's scale from the image's smaller side.
  uint32_t radial_control : 28;
  uint32_t size_class : 3;
  uint32_t : 1;
  // Words 8 to 11: the shading coefficient, Q14, 17 bits of each word, the same in all four.
  uint32_t shading_a[4];
  // Word 12. fixed_b_0..2 are settings of the stage that no tuning drives.
  uint32_t : 4;
  uint32_t fixed_b_0 : 4;
  uint32_t fixed_b_1 : 4;
  uint32_t slope_est_support : 4;
  uint32_t fixed_b_2 : 4;
  uint32_t : 12;
  // Word 13.
  uint32_t slope_thresh_low : 10;
  uint32_t : 6;
  uint32_t slope_thresh_high : 10;
  uint32_t : 6;
  // Word 14.
  uint32_t residual_coring_reduce : 12;
  uint32_t : 20;
  // Word 15. The inverse is 8192 / residual_limit_reduce.
  uint32_t residual_limit_reduce : 12;
  uint32_t residual_limit_reduce_inverse : 14;
  uint32_t : 6;
  // Word 16.
  uint32_t max_slope_low : 10;
  uint32_t : 6;
  uint32_t max_slope_high : 10;
  uint32_t : 6;
  // Word 17. Filter selectors of the green denoise.
  uint32_t g_lpf_for_g : 3;
  uint32_t : 1;
  uint32_t rb_lpf_for_g : 3;
  uint32_t : 25;
  // Word 18. Filter selectors of the red and blue denoise.
  uint32_t g_lpf_for_rb : 3;
  uint32_t : 1;
  uint32_t rb_lpf_for_rb : 3;
  uint32_t : 25;
  // Words 19 to 21.
  uint32_t thres_low_g : 12;
  uint32_t : 4;
  uint32_t thres_high_g : 12;
  uint32_t : 4;
  uint32_t thres_low_r : 12;
  uint32_t : 4;
  uint32_t thres_high_r : 12;
  uint32_t : 4;
  uint32_t thres_low_b : 12;
  uint32_t : 4;
  uint32_t thres_high_b : 12;
  uint32_t : 4;
  // Words 22 to 24: red first, then green, then blue.
  uint32_t return_factor_r : 11;
  uint32_t return_limit_r : 12;
  uint32_t : 9;
  uint32_t return_factor_g : 11;
  uint32_t return_limit_g : 12;
  uint32_t : 9;
  uint32_t return_factor_b : 11;
  uint32_t return_limit_b : 12;
  uint32_t : 9;
  // The tables, 16 bits an entry.
  uint16_t std_lut_x_g[8];
  uint16_t std_lut_y_g[8];
  uint16_t std_slope_g[8];
  uint16_t std_lut_x_rb[8];
  uint16_t std_lut_y_rb[8];
  uint16_t std_slope_rb[8];
};
static_assert(sizeof(HqdnsOutput) == 196);
static_assert(offsetof(HqdnsOutput, shading_a) == 32);
static_assert(offsetof(HqdnsOutput, std_lut_x_g) == 100);
static_assert(offsetof(HqdnsOutput, std_lut_y_g) == 116);
static_assert(offsetof(HqdnsOutput, std_slope_g) == 132);
static_assert(offsetof(HqdnsOutput, std_lut_x_rb) == 148);
static_assert(offsetof(HqdnsOutput, std_lut_y_rb) == 164);
static_assert(offsetof(HqdnsOutput, std_slope_rb) == 180);
TAVIK_DESCRIBE_RECORD(
    HqdnsOutput, 32, TAVIK_FIELD(bypass), TAVIK_FIELD(low_power), TAVIK_FIELD(fixed_a),
    TAVIK_FIELD(mono), TAVIK_FIELD(neg_half_width), TAVIK_FIELD(neg_half_height),
    TAVIK_FIELD(image_width), TAVIK_FIELD(image_height), TAVIK_FIELD(pixel_order),
    TAVIK_FIELD(std_factor_g), TAVIK_FIELD(std_factor_r), TAVIK_FIELD(std_factor_b),
    TAVIK_FIELD(radial_control), TAVIK_FIELD(size_class), TAVIK_TABLE(shading_a, 17),
    TAVIK_FIELD(fixed_b_0), TAVIK_FIELD(fixed_b_1), TAVIK_FIELD(slope_est_support),
    TAVIK_FIELD(fixed_b_2), TAVIK_FIELD(slope_thresh_low), TAVIK_FIELD(slope_thresh_high),
    TAVIK_FIELD(residual_coring_reduce), TAVIK_FIELD(residual_limit_reduce),
    TAVIK_FIELD(residual_limit_reduce_inverse), TAVIK_FIELD(max_slope_low),
    TAVIK_FIELD(max_slope_high), TAVIK_FIELD(g_lpf_for_g), TAVIK_FIELD(rb_lpf_for_g),
    TAVIK_FIELD(g_lpf_for_rb), TAVIK_FIELD(rb_lpf_for_rb), TAVIK_FIELD(thres_low_g),
    TAVIK_FIELD(thres_high_g), TAVIK_FIELD(thres_low_r), TAVIK_FIELD(thres_high_r),
    TAVIK_FIELD(thres_low_b), TAVIK_FIELD(thres_high_b), TAVIK_FIELD(return_factor_r),
    TAVIK_FIELD(return_limit_r), TAVIK_FIELD(return_factor_g), TAVIK_FIELD(return_limit_g),
    TAVIK_FIELD(return_factor_b), TAVIK_FIELD(return_limit_b), TAVIK_TABLE(std_lut_x_g, 16),
    TAVIK_TABLE(std_lut_y_g, 16), TAVIK_TABLE(std_slope_g, 16), TAVIK_TABLE(std_lut_x_rb, 16),
    TAVIK_TABLE(std_lut_y_rb, 16), TAVIK_TABLE(std_slope_rb, 16));

// Settings of the HQDNS stage that no tuning drives, told by value word by word and written by
// GetDefaultHqdns alone. Words 8 and 9 belong to the steppings A0 and B0.
struct HqdnsFixedOutput {
  uint32_t words[24];
};
static_assert(sizeof(HqdnsFixedOutput) == 96);
TAVIK_DESCRIBE_RECORD(HqdnsFixedOutput, 32, TAVIK_TABLE(words, 32));

// Stepping A0. Fails on an image narrower or lower than 32 pixels (or above the stage's 16383)
// before writing anything; with denoising off, writes the geometry and bypass and succeeds
// without reading the tuning. Otherwise fails on a block of another type, a tuning without static
// or dynamic part, tables of other than 8 values, a missing white balance and a
// residual_limit_reduce below 1, leaving the fields written before the failure.
TAVIK_EXPORT Status TranslateHqdns(const TuningBlock& block, const HqdnsConfig& config,
                                   HqdnsOutput& output);
// Stepping B0: the same translation.
TAVIK_EXPORT Status TranslateHqdnsB0(const TuningBlock& block, const HqdnsConfig& config,
                                     HqdnsOutput& output);

// The values of a 4032 x 3024 RGGB image under the default tuning, and the fixed words; the two
// steppings differ in fixed word 8 (A0) or 9 (B0) alone.
TAVIK_EXPORT Status GetDefaultHqdns(HqdnsOutput& output, HqdnsFixedOutput& fixed);
TAVIK_EXPORT Status GetDefaultHqdnsB0(HqdnsOutput& output, HqdnsFixedOutput& fixed);

// The unit's rows of the translator table.
struct TranslatorForm;
namespace translator_forms {
extern const TranslatorForm kHqdns;
extern const TranslatorForm kHqdnsB0;
}  // namespace translator_forms

}  // namespace tavik

#endif  // TAVIK_IQ_ZEL_TRANSLATORS_HQDNS_ONLINE_TRANSLATOR_H_
