// Defective pixel correction: finds and replaces stuck or noisy raw pixels. The IPP stage is told
// in detail (despeckling, directional thresholds and omnidirectional tolerances at five levels);
// the G3AA statistics stage derives its whole configuration from the single threshold
// `g3aa_dpc_threshold`.
#ifndef TAVIK_IQ_ZEL_TRANSLATORS_DPC_ONLINE_TRANSLATOR_H_
#define TAVIK_IQ_ZEL_TRANSLATORS_DPC_ONLINE_TRANSLATOR_H_

#include <cstddef>
#include <cstdint>

#include "tavik/base/status.h"
#include "tavik/base/tuning_block.h"
#include "tavik/iq/export.h"
#include "tavik/iq/protos/common.pb.h"
#include "tavik/iq/zel/protos/dpc_param.pb.h"
#include "tavik/iq/zel/translators/record_description.h"

namespace tavik_registers::zel::g3aa {

// The G3AA defective-pixel register: two 64-bit words and a 32-bit one. With T the tuning's
// threshold and U = 1 - T, the six codes are round(U x 38), round(T x 21), round(U x 6554),
// round(U x 4915), round(U x 19) and round(U x 32), each limited to 0 and its scale; the names
// say which. The `settings` fields hold constants of the stage, written by the default alone.
struct DpcConfigValue {
  // First word.
  uint64_t enable : 1;
  uint64_t settings_bit1 : 1;
  uint64_t pixel_order : 2;  // The G3AA code of the Bayer pattern.
  uint64_t settings : 46;    // Bits 4-49.
  uint64_t u_38 : 6;
  uint64_t t_21 : 6;
  uint64_t u_6554_lo : 2;  // The low two bits of a 16-bit code.
  // Second word.
  uint64_t u_6554_hi : 14;
  uint64_t u_4915 : 16;
  uint64_t u_19 : 6;
  uint64_t u_32 : 6;
  uint64_t settings_1 : 22;  // Bits 42-63.
  // Third word.
  uint32_t settings_2 : 10;
  uint32_t : 22;

  TAVIK_SPLIT_FIELD_ACCESSORS(uint32_t, U6554, SetU6554, u_6554)
};
static_assert(sizeof(DpcConfigValue) == 24);
TAVIK_DESCRIBE_RECORD(DpcConfigValue, 64, TAVIK_FIELD(enable), TAVIK_FIELD(settings_bit1),
                      TAVIK_FIELD(pixel_order), TAVIK_FIELD(settings), TAVIK_FIELD(u_38),
                      TAVIK_FIELD(t_21), TAVIK_SPLIT_FIELD(u_6554), TAVIK_FIELD(u_4915),
                      TAVIK_FIELD(u_19), TAVIK_FIELD(u_32), TAVIK_FIELD(settings_1),
                      TAVIK_FIELD(settings_2));

}  // namespace tavik_registers::zel::g3aa

namespace tavik {

// Frame facts of the defective-pixel stages.
struct DpcInput {
  vosbrine::BayerPattern bayer_pattern = vosbrine::RGGB;
  vosbrine::SensorType sensor_type = vosbrine::INVALID_SENSOR_TYPE;
  int32_t sensor_bit_depth = 0;
  float digital_gain = 0.0f;
  int32_t bayer_width = 0;
  int32_t bayer_height = 0;
  // 0 switches the stage off; the defaults pass 2.
  int32_t dpc_mode = 0;
};

// Five levels of 14-bit codes of full scale 16383, two to a word.
struct DpcLevels14 {
  uint32_t level_0 : 14;
  uint32_t : 2;
  uint32_t level_1 : 14;
  uint32_t : 2;
  uint32_t level_2 : 14;
  uint32_t : 2;
  uint32_t level_3 : 14;
  uint32_t : 2;
  uint32_t level_4 : 14;
  uint32_t : 18;
};
static_assert(sizeof(DpcLevels14) == 12);

// Five levels of 7-bit codes of full scale 127, one to a byte.
struct DpcLevels7 {
  uint32_t level_0 : 7;
  uint32_t : 1;
  uint32_t level_1 : 7;
  uint32_t : 1;
  uint32_t level_2 : 7;
  uint32_t : 1;
  uint32_t level_3 : 7;
  uint32_t : 1;
  uint32_t level_4 : 7;
  uint32_t : 25;
};
static_assert(sizeof(DpcLevels7) == 8);

// Five levels of 8-bit codes of full scale 255: four bytes, then a whole word for the fifth.
struct DpcLevels8 {
  uint32_t level_0 : 8;
  uint32_t level_1 : 8;
  uint32_t level_2 : 8;
  uint32_t level_3 : 8;
  uint32_t level_4;
};
static_assert(sizeof(DpcLevels8) == 8);

// The IPP stage's values, 28 words.
struct DpcIppOutput {
  // Word 0: two bypass bits, both the inverse of the block's enable.
  uint32_t bypass : 1;
  uint32_t : 3;
  uint32_t bypass_1 : 1;
  uint32_t : 27;
  // Word 1: the pixel order, with the fixed bits of its word.
  uint32_t pixel_order : 2;
  uint32_t : 2;
  uint32_t order_bit4 : 1;  // Set.
  uint32_t : 3;
  uint32_t order_bit8 : 1;  // Cleared.
  uint32_t : 3;
  uint32_t order_bit12 : 1;  // Cleared.
  uint32_t : 19;
  // Words 2 and 3: the same code of full scale 127 in both.
  uint32_t contrast_diff_factor_0 : 7;
  uint32_t : 25;
  uint32_t contrast_diff_factor_1 : 7;
  uint32_t : 25;
  // Word 4. Full scale 4.
  uint32_t max_mask_level : 3;
  uint32_t : 29;
  // Words 5 to 8: the frame's size, twice, with the fixed fields of their words.
  uint32_t geometry_bit0 : 1;  // Cleared.
  uint32_t : 15;
  uint32_t bayer_width_a : 15;
  uint32_t : 1;
  uint32_t bayer_height_a : 15;
  uint32_t : 1;
  uint32_t geometry_mode : 6;  // 1.
  uint32_t : 10;
  uint32_t geometry_low : 14;  // Cleared.
  uint32_t : 2;
  uint32_t bayer_width_b : 15;
  uint32_t : 1;
  uint32_t bayer_height_b : 15;
  uint32_t : 1;
  uint32_t geometry_bit16 : 1;  // Cleared.
  uint32_t : 3;
  uint32_t geometry_bit20 : 1;  // Cleared.
  uint32_t : 11;
  // Words 9 to 26.
  DpcLevels14 predespeckle_main_thresholds;
  DpcLevels8 direction_effective_thresholds;
  DpcLevels14 omni_std_thresholds;
  DpcLevels14 omni_dynamic_threshold_weights;
  DpcLevels7 omni_tol_var_green_scales;
  DpcLevels7 omni_tol_var_rb_scales;
  DpcLevels14 dir_base_thresholds;
  // Word 27. 3 for a mono sensor, else 1.
  uint32_t sensor_mode : 2;
  uint32_t : 30;
};
static_assert(sizeof(DpcIppOutput) == 28 * 4);
static_assert(offsetof(DpcIppOutput, predespeckle_main_thresholds) == 9 * 4);
static_assert(offsetof(DpcIppOutput, direction_effective_thresholds) == 12 * 4);
static_assert(offsetof(DpcIppOutput, omni_std_thresholds) == 14 * 4);
static_assert(offsetof(DpcIppOutput, omni_dynamic_threshold_weights) == 17 * 4);
static_assert(offsetof(DpcIppOutput, omni_tol_var_green_scales) == 20 * 4);
static_assert(offsetof(DpcIppOutput, omni_tol_var_rb_scales) == 22 * 4);
static_assert(offsetof(DpcIppOutput, dir_base_thresholds) == 24 * 4);

#define TAVIK_DPC_LEVELS_(group)                                                      \
  TAVIK_FIELD(group.level_0), TAVIK_FIELD(group.level_1), TAVIK_FIELD(group.level_2), \
      TAVIK_FIELD(group.level_3), TAVIK_FIELD(group.level_4)
TAVIK_DESCRIBE_RECORD(
    DpcIppOutput, 32, TAVIK_FIELD(bypass), TAVIK_FIELD(bypass_1), TAVIK_FIELD(pixel_order),
    TAVIK_FIELD(order_bit4), TAVIK_FIELD(order_bit8), TAVIK_FIELD(order_bit12),
    TAVIK_FIELD(contrast_diff_factor_0), TAVIK_FIELD(contrast_diff_factor_1),
    TAVIK_FIELD(max_mask_level), TAVIK_FIELD(geometry_bit0), TAVIK_FIELD(bayer_width_a),
    TAVIK_FIELD(bayer_height_a), TAVIK_FIELD(geometry_mode), TAVIK_FIELD(geometry_low),
    TAVIK_FIELD(bayer_width_b), TAVIK_FIELD(bayer_height_b), TAVIK_FIELD(geometry_bit16),
    TAVIK_FIELD(geometry_bit20), TAVIK_DPC_LEVELS_(predespeckle_main_thresholds),
    TAVIK_DPC_LEVELS_(direction_effective_thresholds), TAVIK_DPC_LEVELS_(omni_std_thresholds),
    TAVIK_DPC_LEVELS_(omni_dynamic_threshold_weights), TAVIK_DPC_LEVELS_(omni_tol_var_green_scales),
    TAVIK_DPC_LEVELS_(omni_tol_var_rb_scales), TAVIK_DPC_LEVELS_(dir_base_thresholds),
    TAVIK_FIELD(sensor_mode));
#undef TAVIK_DPC_LEVELS_

// The IPP stage's settings that no tuning drives, written by GetDefaultDpc alone: further words
// of the stage, zero in every configuration; their meaning is the stage's own.
struct DpcIppFixedOutput {
  uint32_t reserved[4];
};
static_assert(sizeof(DpcIppFixedOutput) == 16);
TAVIK_DESCRIBE_RECORD(DpcIppFixedOutput, 32, TAVIK_TABLE(reserved, 32));

// IPP. Writes the pixel order, the geometry and the sensor mode first, whatever follows; with
// `dpc_mode` 0 it then sets both bypass bits without reading the tuning. Fails on an empty tuning,
// and (after the bypass bits and words 2 to 4 are written) on a level list of other than five
// values, with the whole dynamic part's text.
TAVIK_EXPORT Status TranslateDpc(const TuningBlock& block, const DpcInput& input,
                                 DpcIppOutput& output);

// G3AA. Writes the pixel order first; with `dpc_mode` 0 it then clears the enable bit without
// reading the tuning. Fails on a null register ("G3AA algo params is null."), an empty tuning
// (texts that name the disparity block, as the stage's have always done) and a frame with
// neither side positive.
TAVIK_EXPORT Status TranslateDpc(const TuningBlock& block, const DpcInput& input,
                                 tavik_registers::zel::g3aa::DpcConfigValue* output);

// The values of the default tuning for an RGGB 10-bit Bayer frame of 4032 by 3024 in mode 2; the
// IPP form also writes the whole fixed record, the G3AA form the stage's constant settings, on
// success only.
TAVIK_EXPORT Status GetDefaultDpc(DpcIppOutput& output, DpcIppFixedOutput& fixed);
TAVIK_EXPORT Status GetDefaultDpc(tavik_registers::zel::g3aa::DpcConfigValue* output);

// The unit's rows of the translator table.
struct TranslatorForm;
namespace translator_forms {
extern const TranslatorForm kDpcIpp;
extern const TranslatorForm kDpcG3aa;
}  // namespace translator_forms

}  // namespace tavik

#endif  // TAVIK_IQ_ZEL_TRANSLATORS_DPC_ONLINE_TRANSLATOR_H_
