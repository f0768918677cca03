// Demosaic: the ITP stage that rebuilds full-colour pixels from the Bayer mosaic, with
// directional interpolation, alias desaturation and edge cleaning. Its translation is field
// writing alone: 45 tuning values, each to its own field at its own full scale, and the frame's
// pattern and width.
#ifndef TAVIK_IQ_ZEL_TRANSLATORS_DMSC_ONLINE_TRANSLATOR_H_
#define TAVIK_IQ_ZEL_TRANSLATORS_DMSC_ONLINE_TRANSLATOR_H_

#include <cstddef>
#include <cstdint>

#include "tavik/base/status.h"
#include "tavik/base/tuning_block.h"
#include "tavik/iq/export.h"
#include "tavik/iq/protos/common.pb.h"
#include "tavik/iq/zel/protos/dmsc_param.pb.h"
#include "tavik/iq/zel/translators/record_description.h"

namespace tavik {

// Frame facts of the demosaic stage.
struct DmscInput {
  vosbrine::BayerPattern bayer_pattern = vosbrine::RGGB;
  vosbrine::SensorType sensor_type = vosbrine::INVALID_SENSOR_TYPE;
  int32_t bayer_width = 0;
};

// The stage's values, 31 words. Each tuned field is round(value x full scale), limited to 0 and
// the full scale: 31 for hpf_power, 127 for the weights and desat_strength, 256 for
// merge_dir_contrast_threshold (9 bits), 16 for desat_limit, 255 for the 8-bit fields, 1023 for
// the 10-bit gains, 4095 for the 12-bit thresholds, 4096 for the edge desaturation limits
// (13 bits). The `_mode` fields are constants of the stage.
struct DmscOutput {
  // Word 0.
  uint32_t bypass : 1;
  uint32_t : 31;
  // Word 1.
  uint32_t enable_low_power : 1;
  uint32_t : 31;
  // Word 2.
  uint32_t mono_sensor : 1;
  uint32_t : 31;
  // Word 3.
  uint32_t hpf_power : 5;
  uint32_t : 27;
  // Word 4.
  uint32_t gradient_weight : 7;
  uint32_t : 1;
  uint32_t mono_weight : 7;
  uint32_t : 1;
  uint32_t diagonal_weight : 7;
  uint32_t : 1;
  uint32_t weight_mode : 4;  // 6.
  uint32_t : 4;
  // Word 5.
  uint32_t merge_dir_contrast_threshold : 9;
  uint32_t : 7;
  uint32_t merge_dir_mode : 8;  // 8.
  uint32_t : 8;
  // Word 6.
  uint32_t desat_strength : 7;
  uint32_t : 9;
  uint32_t alias_detect_threshold : 12;
  uint32_t : 4;
  // Word 7.
  uint32_t desat_limit : 5;
  uint32_t : 27;
  // Word 8. The two mode fields put 0x80 into bits 8-15, but for bit 11, which is not the
  // stage's to set.
  uint32_t extract_sat_power : 8;
  uint32_t extract_mode_low : 3;  // 0.
  uint32_t : 1;
  uint32_t extract_mode_high : 4;  // 8.
  uint32_t : 16;
  // Word 9, whole.
  uint32_t green_detect_power;
  // Word 10.
  uint32_t extract_grid_hv : 8;
  uint32_t extract_grid_hv_protect : 8;
  uint32_t extract_dir_hv : 8;
  uint32_t : 8;
  // Word 11.
  uint32_t extract_dir_hv_threshold : 12;
  uint32_t : 20;
  // Word 12.
  uint32_t add_colors_saturation_power : 8;
  uint32_t add_colors_mode : 16;  // 2.
  uint32_t : 8;
  // Word 13.
  uint32_t clean_f_gain_t_lh_pos : 10;
  uint32_t : 6;
  uint32_t clean_f_gain_t_lh_neg : 10;
  uint32_t : 6;
  // Word 14.
  uint32_t clean_f_gain_t_hl_pos : 10;
  uint32_t : 6;
  uint32_t clean_f_gain_t_hl_neg : 10;
  uint32_t : 6;
  // Word 15.
  uint32_t clean_f_gain_t_hh_pos : 10;
  uint32_t : 6;
  uint32_t clean_f_gain_t_hh_neg : 10;
  uint32_t : 6;
  // Word 16.
  uint32_t clean_f_gain_e_lh_pos : 10;
  uint32_t : 6;
  uint32_t clean_f_gain_e_lh_neg : 10;
  uint32_t : 6;
  // Word 17.
  uint32_t clean_f_gain_e_hl_pos : 10;
  uint32_t : 6;
  uint32_t clean_f_gain_e_hl_neg : 10;
  uint32_t : 6;
  // Word 18.
  uint32_t clean_f_gain_e_hh_pos : 10;
  uint32_t : 6;
  uint32_t clean_f_gain_e_hh_neg : 10;
  uint32_t : 6;
  // Word 19.
  uint32_t clean_f_thr_lh_pos : 12;
  uint32_t : 4;
  uint32_t clean_f_thr_lh_neg : 12;
  uint32_t : 4;
  // Word 20.
  uint32_t clean_f_thr_hl_pos : 12;
  uint32_t : 4;
  uint32_t clean_f_thr_hl_neg : 12;
  uint32_t : 4;
  // Word 21.
  uint32_t clean_f_thr_hh_pos : 12;
  uint32_t : 4;
  uint32_t clean_f_thr_hh_neg : 12;
  uint32_t : 4;  // Word 22.
  uint32_t clean_f_gain_grid_dir : 10;
  uint32_t : 22;
  // Word 23.
  uint32_t edge_desat_fsharp_gain_p : 10;
  uint32_t : 6;
  uint32_t edge_desat_fsharp_gain_m : 10;
  uint32_t : 6;
  // Word 24.
  uint32_t edge_desat_fsharp_thres_p : 12;
  uint32_t : 4;
  uint32_t edge_desat_fsharp_thres_m : 12;
  uint32_t : 4;
  // Word 25.
  uint32_t edge_desat_ogsharp_gain_p : 10;
  uint32_t : 6;
  uint32_t edge_desat_ogsharp_gain_m : 10;
  uint32_t : 6;
  // Word 26.
  uint32_t edge_desat_ogsharp_thres_p : 12;
  uint32_t : 4;
  uint32_t edge_desat_ogsharp_thres_m : 12;
  uint32_t : 4;
  // Word 27.
  uint32_t edge_desat_limit_p : 13;
  uint32_t : 3;
  uint32_t edge_desat_limit_m : 13;
  uint32_t : 3;
  // Word 28.
  uint32_t edge_desat_red_preserve_gain : 10;
  uint32_t : 22;
  // Word 29.
  uint32_t pixel_order : 2;
  uint32_t : 30;
  // Word 30.
  uint32_t bayer_width : 15;
  uint32_t : 17;
};
static_assert(sizeof(DmscOutput) == 31 * 4);
static_assert(offsetof(DmscOutput, green_detect_power) == 9 * 4);
TAVIK_DESCRIBE_RECORD(
    DmscOutput, 32, TAVIK_FIELD(bypass), TAVIK_FIELD(enable_low_power), TAVIK_FIELD(mono_sensor),
    TAVIK_FIELD(hpf_power), TAVIK_FIELD(gradient_weight), TAVIK_FIELD(mono_weight),
    TAVIK_FIELD(diagonal_weight), TAVIK_FIELD(weight_mode),
    TAVIK_FIELD(merge_dir_contrast_threshold), TAVIK_FIELD(merge_dir_mode),
    TAVIK_FIELD(desat_strength), TAVIK_FIELD(alias_detect_threshold), TAVIK_FIELD(desat_limit),
    TAVIK_FIELD(extract_sat_power), TAVIK_FIELD(extract_mode_low), TAVIK_FIELD(extract_mode_high),
    TAVIK_FIELD(green_detect_power), TAVIK_FIELD(extract_grid_hv),
    TAVIK_FIELD(extract_grid_hv_protect), TAVIK_FIELD(extract_dir_hv),
    TAVIK_FIELD(extract_dir_hv_threshold), TAVIK_FIELD(add_colors_saturation_power),
    TAVIK_FIELD(add_colors_mode), TAVIK_FIELD(clean_f_gain_t_lh_pos),
    TAVIK_FIELD(clean_f_gain_t_lh_neg), TAVIK_FIELD(clean_f_gain_t_hl_pos),
    TAVIK_FIELD(clean_f_gain_t_hl_neg), TAVIK_FIELD(clean_f_gain_t_hh_pos),
    TAVIK_FIELD(clean_f_gain_t_hh_neg), TAVIK_FIELD(clean_f_gain_e_lh_pos),
    TAVIK_FIELD(clean_f_gain_e_lh_neg), TAVIK_FIELD(clean_f_gain_e_hl_pos),
    TAVIK_FIELD(clean_f_gain_e_hl_neg), TAVIK_FIELD(clean_f_gain_e_hh_pos),
    TAVIK_FIELD(clean_f_gain_e_hh_neg), TAVIK_FIELD(clean_f_thr_lh_pos),
    TAVIK_FIELD(clean_f_thr_lh_neg), TAVIK_FIELD(clean_f_thr_hl_pos),
    TAVIK_FIELD(clean_f_thr_hl_neg), TAVIK_FIELD(clean_f_thr_hh_pos),
    TAVIK_FIELD(clean_f_thr_hh_neg), TAVIK_FIELD(clean_f_gain_grid_dir),
    TAVIK_FIELD(edge_desat_fsharp_gain_p), TAVIK_FIELD(edge_desat_fsharp_gain_m),
    TAVIK_FIELD(edge_desat_fsharp_thres_p), TAVIK_FIELD(edge_desat_fsharp_thres_m),
    TAVIK_FIELD(edge_desat_ogsharp_gain_p), TAVIK_FIELD(edge_desat_ogsharp_gain_m),
    TAVIK_FIELD(edge_desat_ogsharp_thres_p), TAVIK_FIELD(edge_desat_ogsharp_thres_m),
    TAVIK_FIELD(edge_desat_limit_p), TAVIK_FIELD(edge_desat_limit_m),
    TAVIK_FIELD(edge_desat_red_preserve_gain), TAVIK_FIELD(pixel_order), TAVIK_FIELD(bayer_width));

// The stage's settings that no tuning drives, written by GetDefaultDmsc alone: further words of
// the stage, zero in every configuration; their meaning is the stage's own.
struct DmscFixedOutput {
  uint32_t reserved[4];
};
static_assert(sizeof(DmscFixedOutput) == 16);
TAVIK_DESCRIBE_RECORD(DmscFixedOutput, 32, TAVIK_TABLE(reserved, 32));

// Fails on a block of another type ("Invalid TuningBlock!"), a tuning without a dynamic part
// (region info) or without a static part (static info), before anything is written.
TAVIK_EXPORT Status TranslateDmsc(const TuningBlock& block, const DmscInput& input,
                                  DmscOutput& output);

// The values of the default tuning for an RGGB Bayer frame 4032 wide; also writes the whole fixed
// record, on success only.
TAVIK_EXPORT Status GetDefaultDmsc(DmscOutput& output, DmscFixedOutput& fixed);

// The unit's row of the translator table.
struct TranslatorForm;
namespace translator_forms {
extern const TranslatorForm kDmsc;
}  // namespace translator_forms

}  // namespace tavik

#endif  // TAVIK_IQ_ZEL_TRANSLATORS_DMSC_ONLINE_TRANSLATOR_H_
