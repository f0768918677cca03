#include "tavik/iq/zel/translators/dmsc_online_translator.h"

#include <cstdint>

#include "tavik/base/status_macros.h"
#include "tavik/base/trace.h"
#include "tavik/iq/zel/translators/bayer_pattern_util.h"
#include "tavik/iq/zel/translators/translator_table.h"
#include "tavik/iq/zel/translators/translator_util.h"
#include "tavik/iq/zel/zel_tuning_block.h"

namespace tavik {
namespace {

namespace zm = ::vosbrine::zelmondrake;

constexpr DmscInput kDefaultInput = {vosbrine::RGGB, vosbrine::SENSOR_TYPE_BAYER, 4032};

void SetDefaultTuning(zm::DmscTuning& tuning) {
  tuning.set_enable(true);
  tuning.mutable_static_param()->set_enable_low_power(false);
  zm::DmscDynamicParam& d = *tuning.mutable_dynamic_param();
  d.set_hpf_power(0.3226f);
  d.set_merge_dir_contrast_threshold(0.0625f);
  d.set_desat_strength(0.5039f);
  d.set_alias_detect_threshold(0.0049f);
  d.set_desat_limit(0.5f);
  d.set_extract_sat_power(0.0784f);
  d.set_green_detect_power(0.0471f);
  d.set_extract_grid_hv(0.1569f);
  d.set_extract_grid_hv_protect(0.1961f);
  d.set_extract_dir_hv(0.0236f);
  d.set_extract_dir_hv_threshold(0.0049f);
  d.set_add_colors_saturation_power(0.1255f);
  d.set_gradient_weight(0.5039f);
  d.set_mono_weight(0.126f);
  d.set_diagonal_weight(0.0f);
  d.set_clean_f_gain_t_lh_pos(0.2502f);
  d.set_clean_f_gain_t_lh_neg(0.2502f);
  d.set_clean_f_gain_t_hl_pos(0.2502f);
  d.set_clean_f_gain_t_hl_neg(0.2502f);
  d.set_clean_f_gain_t_hh_pos(0.2502f);
  d.set_clean_f_gain_t_hh_neg(0.2502f);
  d.set_clean_f_gain_e_lh_pos(0.2502f);
  d.set_clean_f_gain_e_lh_neg(0.2502f);
  d.set_clean_f_gain_e_hl_pos(0.2502f);
  d.set_clean_f_gain_e_hl_neg(0.2502f);
  d.set_clean_f_gain_e_hh_pos(0.2502f);
  d.set_clean_f_gain_e_hh_neg(0.2502f);
  d.set_clean_f_thr_lh_pos(0.0625f);
  d.set_clean_f_thr_lh_neg(0.0625f);
  d.set_clean_f_thr_hl_pos(0.0625f);
  d.set_clean_f_thr_hl_neg(0.0625f);
  d.set_clean_f_thr_hh_pos(0.0625f);
  d.set_clean_f_thr_hh_neg(0.0625f);
  d.set_clean_f_gain_grid_dir(0.2502f);
  d.set_edge_desat_fsharp_gain_p(0.1877f);
  d.set_edge_desat_fsharp_gain_m(0.1877f);
  d.set_edge_desat_fsharp_thres_p(0.0156f);
  d.set_edge_desat_fsharp_thres_m(0.0156f);
  d.set_edge_desat_ogsharp_gain_p(0.1877f);
  d.set_edge_desat_ogsharp_gain_m(0.1877f);
  d.set_edge_desat_ogsharp_thres_p(0.0156f);
  d.set_edge_desat_ogsharp_thres_m(0.0156f);
  d.set_edge_desat_limit_p(0.03125f);
  d.set_edge_desat_limit_m(0.75f);
  d.set_edge_desat_red_preserve_gain(0.2502f);
}

DmscInput DmscInputOf(const FrameFacts& facts) {
  return {facts.bayer_pattern, facts.sensor_type, facts.bayer_width};
}

}  // namespace

Status TranslateDmsc(const TuningBlock& block, const DmscInput& input, DmscOutput& output) {
  PerfTrace trace(kTranslatorTraceCategory, "TranslateDmsc");
  // A block of another type is the caller's mistake, but it is refused, not read, as everywhere.
  TAVIK_ASSIGN_OR_RETURN(const zm::DmscTuning* tuning, RequireTuning<zm::DmscTuning>(block));
  TAVIK_RETURN_IF_ERROR(RequireDynamic(*tuning));
  TAVIK_RETURN_IF_ERROR(RequireStatic(*tuning));

  output.bypass = tuning->enable() ? 0 : 1;
  output.enable_low_power = tuning->static_param().enable_low_power() ? 1 : 0;
  output.mono_sensor = input.sensor_type == vosbrine::SENSOR_TYPE_MONO ? 1 : 0;

  const zm::DmscDynamicParam& d = tuning->dynamic_param();
  TAVIK_SET_FIELD(output, hpf_power, ToScaledCode(d.hpf_power(), 31));
  TAVIK_SET_FIELD(output, gradient_weight, ToScaledCode(d.gradient_weight(), 127));
  TAVIK_SET_FIELD(output, mono_weight, ToScaledCode(d.mono_weight(), 127));
  TAVIK_SET_FIELD(output, diagonal_weight, ToScaledCode(d.diagonal_weight(), 127));
  output.weight_mode = 6;
  TAVIK_SET_FIELD(output, merge_dir_contrast_threshold,
                  ToScaledCode(d.merge_dir_contrast_threshold(), 256));
  output.merge_dir_mode = 8;
  TAVIK_SET_FIELD(output, desat_strength, ToScaledCode(d.desat_strength(), 127));
  TAVIK_SET_FIELD(output, alias_detect_threshold, ToScaledCode(d.alias_detect_threshold(), 4095));
  TAVIK_SET_FIELD(output, desat_limit, ToScaledCode(d.desat_limit(), 16));
  TAVIK_SET_FIELD(output, extract_sat_power, ToScaledCode(d.extract_sat_power(), 255));
  output.extract_mode_low = 0;
  output.extract_mode_high = 8;
  TAVIK_SET_FIELD(output, green_detect_power, ToScaledCode(d.green_detect_power(), 255));
  TAVIK_SET_FIELD(output, extract_grid_hv, ToScaledCode(d.extract_grid_hv(), 255));
  TAVIK_SET_FIELD(output, extract_grid_hv_protect, ToScaledCode(d.extract_grid_hv_protect(), 255));
  TAVIK_SET_FIELD(output, extract_dir_hv, ToScaledCode(d.extract_dir_hv(), 255));
  TAVIK_SET_FIELD(output, extract_dir_hv_threshold,
                  ToScaledCode(d.extract_dir_hv_threshold(), 4095));
  TAVIK_SET_FIELD(output, add_colors_saturation_power,
                  ToScaledCode(d.add_colors_saturation_power(), 255));
  output.add_colors_mode = 2;

  TAVIK_SET_FIELD(output, clean_f_gain_t_lh_pos, ToScaledCode(d.clean_f_gain_t_lh_pos(), 1023));
  TAVIK_SET_FIELD(output, clean_f_gain_t_lh_neg, ToScaledCode(d.clean_f_gain_t_lh_neg(), 1023));
  TAVIK_SET_FIELD(output, clean_f_gain_t_hl_pos, ToScaledCode(d.clean_f_gain_t_hl_pos(), 1023));
  TAVIK_SET_FIELD(output, clean_f_gain_t_hl_neg, ToScaledCode(d.clean_f_gain_t_hl_neg(), 1023));
  TAVIK_SET_FIELD(output, clean_f_gain_t_hh_pos, ToScaledCode(d.clean_f_gain_t_hh_pos(), 1023));
  TAVIK_SET_FIELD(output, clean_f_gain_t_hh_neg, ToScaledCode(d.clean_f_gain_t_hh_neg(), 1023));
  TAVIK_SET_FIELD(output, clean_f_gain_e_lh_pos, ToScaledCode(d.clean_f_gain_e_lh_pos(), 1023));
  TAVIK_SET_FIELD(output, clean_f_gain_e_lh_neg, ToScaledCode(d.clean_f_gain_e_lh_neg(), 1023));
  TAVIK_SET_FIELD(output, clean_f_gain_e_hl_pos, ToScaledCode(d.clean_f_gain_e_hl_pos(), 1023));
  TAVIK_SET_FIELD(output, clean_f_gain_e_hl_neg, ToScaledCode(d.clean_f_gain_e_hl_neg(), 1023));
  TAVIK_SET_FIELD(output, clean_f_gain_e_hh_pos, ToScaledCode(d.clean_f_gain_e_hh_pos(), 1023));
  TAVIK_SET_FIELD(output, clean_f_gain_e_hh_neg, ToScaledCode(d.clean_f_gain_e_hh_neg(), 1023));
  TAVIK_SET_FIELD(output, clean_f_thr_lh_pos, ToScaledCode(d.clean_f_thr_lh_pos(), 4095));
  TAVIK_SET_FIELD(output, clean_f_thr_lh_neg, ToScaledCode(d.clean_f_thr_lh_neg(), 4095));
  TAVIK_SET_FIELD(output, clean_f_thr_hl_pos, ToScaledCode(d.clean_f_thr_hl_pos(), 4095));
  TAVIK_SET_FIELD(output, clean_f_thr_hl_neg, ToScaledCode(d.clean_f_thr_hl_neg(), 4095));
  TAVIK_SET_FIELD(output, clean_f_thr_hh_pos, ToScaledCode(d.clean_f_thr_hh_pos(), 4095));
  TAVIK_SET_FIELD(output, clean_f_thr_hh_neg, ToScaledCode(d.clean_f_thr_hh_neg(), 4095));
  TAVIK_SET_FIELD(output, clean_f_gain_grid_dir, ToScaledCode(d.clean_f_gain_grid_dir(), 1023));

  TAVIK_SET_FIELD(output, edge_desat_fsharp_gain_p,
                  ToScaledCode(d.edge_desat_fsharp_gain_p(), 1023));
  TAVIK_SET_FIELD(output, edge_desat_fsharp_gain_m,
                  ToScaledCode(d.edge_desat_fsharp_gain_m(), 1023));
  TAVIK_SET_FIELD(output, edge_desat_fsharp_thres_p,
                  ToScaledCode(d.edge_desat_fsharp_thres_p(), 4095));
  TAVIK_SET_FIELD(output, edge_desat_fsharp_thres_m,
                  ToScaledCode(d.edge_desat_fsharp_thres_m(), 4095));
  TAVIK_SET_FIELD(output, edge_desat_ogsharp_gain_p,
                  ToScaledCode(d.edge_desat_ogsharp_gain_p(), 1023));
  TAVIK_SET_FIELD(output, edge_desat_ogsharp_gain_m,
                  ToScaledCode(d.edge_desat_ogsharp_gain_m(), 1023));
  TAVIK_SET_FIELD(output, edge_desat_ogsharp_thres_p,
                  ToScaledCode(d.edge_desat_ogsharp_thres_p(), 4095));
  TAVIK_SET_FIELD(output, edge_desat_ogsharp_thres_m,
                  ToScaledCode(d.edge_desat_ogsharp_thres_m(), 4095));
  TAVIK_SET_FIELD(output, edge_desat_limit_p, ToScaledCode(d.edge_desat_limit_p(), 4096));
  TAVIK_SET_FIELD(output, edge_desat_limit_m, ToScaledCode(d.edge_desat_limit_m(), 4096));
  TAVIK_SET_FIELD(output, edge_desat_red_preserve_gain,
                  ToScaledCode(d.edge_desat_red_preserve_gain(), 1023));

  TAVIK_SET_FIELD(output, pixel_order, vosbrine::GetMainIspPixelOrder(input.bayer_pattern));
  TAVIK_SET_FIELD(output, bayer_width, input.bayer_width);
  return OkStatus();
}

Status GetDefaultDmsc(DmscOutput& output, DmscFixedOutput& fixed) {
  return GetDefault(
      "GetDefaultDmsc", SetDefaultTuning,
      [&](const TuningBlock& block) { return TranslateDmsc(block, kDefaultInput, output); },
      [&] { fixed = DmscFixedOutput{}; });
}

namespace translator_forms {

constexpr TranslatorForm kDmsc = MakeTranslatorForm<zm::DmscTuning, DmscOutput>(
    "TranslateDmsc (DMSC)", [](const TranslatorFrame& frame, DmscOutput& output) {
      return TranslateDmsc(frame.Block<zm::DmscTuning>(), DmscInputOf(frame.facts), output);
    });

}  // namespace translator_forms
}  // namespace tavik
