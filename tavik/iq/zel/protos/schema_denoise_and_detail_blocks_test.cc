// Pins the schemas of the demosaic, HQDNS, noise filter, noise mix, sharpening, noise-add and Stk
// blocks: tuning files address their fields by name and by number.
#include <string>

#include "google/protobuf/descriptor.h"
#include "gtest/gtest.h"
#include "tavik/iq/testing/schema_testing.h"
#include "tavik/iq/zel/protos/dmsc_param.pb.h"
#include "tavik/iq/zel/protos/hqdns_param.pb.h"
#include "tavik/iq/zel/protos/nfltr_param.pb.h"
#include "tavik/iq/zel/protos/nsmix_param.pb.h"
#include "tavik/iq/zel/protos/sharp_param.pb.h"
#include "tavik/iq/zel/protos/snadd_param.pb.h"
#include "tavik/iq/zel/protos/stk_param.pb.h"

namespace {

using ::tavik::test::ExpectFields;
using ::tavik::test::ExpectPresence;
using ::tavik::test::ExpectReservedNumbers;
using ::tavik::test::kBool;
using ::tavik::test::kFloat;
using ::tavik::test::kInt32;
using ::tavik::test::kMessage;
using ::tavik::test::kRepeated;
using ::tavik::test::kSingular;

// Every block message holds its static and dynamic parameters as sub-messages whose presence the
// translators test, and a plain proto3 `enable` switch.
void ExpectBlockTuning(const google::protobuf::Descriptor* tuning, const std::string& static_type,
                       const std::string& dynamic_type) {
  ExpectFields(tuning, {
                           {"static_param", 1, kMessage, kSingular, static_type},
                           {"dynamic_param", 2, kMessage, kSingular, dynamic_type},
                           {"enable", 3, kBool},
                       });
  ExpectPresence(tuning, "static_param", true);
  ExpectPresence(tuning, "dynamic_param", true);
  ExpectPresence(tuning, "enable", false);
}

// ---- Demosaic ----

TEST(DmscSchemaTest, StaticParamDeprecatesEnableAndKeepsLowPower) {
  ExpectFields(vosbrine::zelmondrake::DmscStaticParam::descriptor(),
               {
                   {"enable", 1, kBool, kSingular, "", true},
                   {"enable_low_power", 2, kBool},
               });
}

TEST(DmscSchemaTest, DynamicParamDeclaresWeightsBeforeTheirLowerNumberedNeighbours) {
  ExpectFields(vosbrine::zelmondrake::DmscDynamicParam::descriptor(),
               {
                   {"hpf_power", 1, kFloat},
                   {"gradient_weight", 13, kFloat},
                   {"mono_weight", 14, kFloat},
                   {"diagonal_weight", 15, kFloat},
                   {"merge_dir_contrast_threshold", 2, kFloat},
                   {"desat_strength", 3, kFloat},
                   {"alias_detect_threshold", 4, kFloat},
                   {"desat_limit", 5, kFloat},
                   {"extract_sat_power", 6, kFloat},
                   {"green_detect_power", 7, kFloat},
                   {"extract_grid_hv", 8, kFloat},
                   {"extract_grid_hv_protect", 9, kFloat},
                   {"extract_dir_hv", 10, kFloat},
                   {"extract_dir_hv_threshold", 11, kFloat},
                   {"add_colors_saturation_power", 12, kFloat},
                   {"clean_f_gain_t_lh_pos", 16, kFloat},
                   {"clean_f_gain_t_lh_neg", 17, kFloat},
                   {"clean_f_gain_t_hl_pos", 18, kFloat},
                   {"clean_f_gain_t_hl_neg", 19, kFloat},
                   {"clean_f_gain_t_hh_pos", 20, kFloat},
                   {"clean_f_gain_t_hh_neg", 21, kFloat},
                   {"clean_f_gain_e_lh_pos", 22, kFloat},
                   {"clean_f_gain_e_lh_neg", 23, kFloat},
                   {"clean_f_gain_e_hl_pos", 24, kFloat},
                   {"clean_f_gain_e_hl_neg", 25, kFloat},
                   {"clean_f_gain_e_hh_pos", 26, kFloat},
                   {"clean_f_gain_e_hh_neg", 27, kFloat},
                   {"clean_f_thr_lh_pos", 28, kFloat},
                   {"clean_f_thr_lh_neg", 29, kFloat},
                   {"clean_f_thr_hl_pos", 30, kFloat},
                   {"clean_f_thr_hl_neg", 31, kFloat},
                   {"clean_f_thr_hh_pos", 32, kFloat},
                   {"clean_f_thr_hh_neg", 33, kFloat},
                   {"clean_f_gain_grid_dir", 34, kFloat},
                   {"edge_desat_fsharp_gain_p", 35, kFloat},
                   {"edge_desat_fsharp_gain_m", 36, kFloat},
                   {"edge_desat_fsharp_thres_p", 37, kFloat},
                   {"edge_desat_fsharp_thres_m", 38, kFloat},
                   {"edge_desat_ogsharp_gain_p", 39, kFloat},
                   {"edge_desat_ogsharp_gain_m", 40, kFloat},
                   {"edge_desat_ogsharp_thres_p", 41, kFloat},
                   {"edge_desat_ogsharp_thres_m", 42, kFloat},
                   {"edge_desat_limit_p", 43, kFloat},
                   {"edge_desat_limit_m", 44, kFloat},
                   {"edge_desat_red_preserve_gain", 45, kFloat},
               });
}

TEST(DmscSchemaTest, TuningHoldsStaticDynamicAndEnable) {
  ExpectBlockTuning(vosbrine::zelmondrake::DmscTuning::descriptor(),
                    "vosbrine.zelmondrake.DmscStaticParam",
                    "vosbrine.zelmondrake.DmscDynamicParam");
}

// ---- HQDNS ----

TEST(HqdnsSchemaTest, StaticParamDeprecatesEnableAndKeepsLowPower) {
  ExpectFields(vosbrine::zelmondrake::HqdnsStaticParam::descriptor(),
               {
                   {"enable", 1, kBool, kSingular, "", true},
                   {"enable_low_power", 2, kBool},
               });
}

TEST(HqdnsSchemaTest, DynamicParamHoldsStdTablesAndDeprecatedThresholds) {
  ExpectFields(vosbrine::zelmondrake::HqdnsDynamicParam::descriptor(),
               {
                   {"shading_param_a", 1, kFloat},
                   {"std_factor_r", 2, kFloat},
                   {"std_factor_g", 3, kFloat},
                   {"std_factor_b", 4, kFloat},
                   {"std_lut_y", 5, kFloat, kRepeated},
                   {"std_lut_c", 6, kFloat, kRepeated},
                   {"slope_est_support", 7, kFloat},
                   {"slope_thresh_high", 8, kFloat},
                   {"slope_thresh_low", 9, kFloat},
                   {"residual_coring_reduce", 10, kFloat},
                   {"residual_limit_reduce", 11, kFloat},
                   {"max_slope_high", 12, kFloat},
                   {"max_slope_low", 13, kFloat},
                   {"g_lpf_for_g_denoise", 14, kFloat},
                   {"g_lpf_for_rb_denoise", 15, kFloat},
                   {"rb_lpf_for_g_denoise", 16, kFloat},
                   {"rb_lpf_for_rb_denoise", 17, kFloat},
                   {"thres_low_g", 18, kFloat, kSingular, "", true},
                   {"thres_high_g", 19, kFloat, kSingular, "", true},
                   {"thres_low_r", 20, kFloat, kSingular, "", true},
                   {"thres_high_r", 21, kFloat, kSingular, "", true},
                   {"thres_low_b", 22, kFloat, kSingular, "", true},
                   {"thres_high_b", 23, kFloat, kSingular, "", true},
                   {"return_noise_g_factor", 24, kFloat},
                   {"return_noise_r_factor", 25, kFloat},
                   {"return_noise_b_factor", 26, kFloat},
                   {"return_noise_limit_g", 27, kFloat},
                   {"return_noise_limit_r", 28, kFloat},
                   {"return_noise_limit_b", 29, kFloat},
               });
}

TEST(HqdnsSchemaTest, TuningHoldsStaticDynamicAndEnable) {
  ExpectBlockTuning(vosbrine::zelmondrake::HqdnsTuning::descriptor(),
                    "vosbrine.zelmondrake.HqdnsStaticParam",
                    "vosbrine.zelmondrake.HqdnsDynamicParam");
}

// ---- Noise filter ----

TEST(NfltrSchemaTest, StaticParamHoldsOnlyDeprecatedEnable) {
  ExpectFields(vosbrine::zelmondrake::NfltrStaticParam::descriptor(),
               {
                   {"enable", 1, kBool, kSingular, "", true},
               });
}

TEST(NfltrSchemaTest, DynamicParamIsEmpty) {
  ExpectFields(vosbrine::zelmondrake::NfltrDynamicParam::descriptor(), {});
}

TEST(NfltrSchemaTest, TuningHoldsStaticDynamicAndEnable) {
  ExpectBlockTuning(vosbrine::zelmondrake::NfltrTuning::descriptor(),
                    "vosbrine.zelmondrake.NfltrStaticParam",
                    "vosbrine.zelmondrake.NfltrDynamicParam");
}

// ---- Noise mix ----

TEST(NsmixSchemaTest, StaticParamDeprecatesEnableAndKeepsLowPower) {
  ExpectFields(vosbrine::zelmondrake::NsmixStaticParam::descriptor(),
               {
                   {"enable", 1, kBool, kSingular, "", true},
                   {"enable_low_power", 2, kBool},
               });
}

TEST(NsmixSchemaTest, DynamicParamSkipsNumber45WithoutReservingIt) {
  const google::protobuf::Descriptor* dynamic =
      vosbrine::zelmondrake::NsmixDynamicParam::descriptor();
  ExpectFields(dynamic, {
                            {"texture_only_sharp_power_bright", 1, kFloat},
                            {"texture_only_sharp_power_dark", 2, kFloat},
                            {"texture_only_suppress_bright_pos", 3, kFloat},
                            {"texture_only_suppress_bright_neg", 4, kFloat},
                            {"texture_only_suppress_dark_pos", 5, kFloat},
                            {"texture_only_suppress_dark_neg", 6, kFloat},
                            {"fine_texture_sharp_power_bright", 7, kFloat},
                            {"fine_texture_sharp_power_dark", 8, kFloat},
                            {"fine_texture_suppress_bright_pos", 9, kFloat},
                            {"fine_texture_suppress_bright_neg", 10, kFloat},
                            {"fine_texture_suppress_dark_pos", 11, kFloat},
                            {"fine_texture_suppress_dark_neg", 12, kFloat},
                            {"fine_edge_sharp_power_bright", 13, kFloat},
                            {"fine_edge_sharp_power_dark", 14, kFloat},
                            {"fine_edge_suppress_bright_pos", 15, kFloat},
                            {"fine_edge_suppress_bright_neg", 16, kFloat},
                            {"fine_edge_suppress_dark_pos", 17, kFloat},
                            {"fine_edge_suppress_dark_neg", 18, kFloat},
                            {"wide_texture_sharp_power_bright", 19, kFloat},
                            {"wide_texture_sharp_power_dark", 20, kFloat},
                            {"wide_texture_suppress_bright_pos", 21, kFloat},
                            {"wide_texture_suppress_bright_neg", 22, kFloat},
                            {"wide_texture_suppress_dark_pos", 23, kFloat},
                            {"wide_texture_suppress_dark_neg", 24, kFloat},
                            {"wide_edge_sharp_power_bright", 25, kFloat},
                            {"wide_edge_sharp_power_dark", 26, kFloat},
                            {"wide_edge_suppress_bright_pos", 27, kFloat},
                            {"wide_edge_suppress_bright_neg", 28, kFloat},
                            {"wide_edge_suppress_dark_pos", 29, kFloat},
                            {"wide_edge_suppress_dark_neg", 30, kFloat},
                            {"edge_antihalo_strength_bright", 31, kFloat},
                            {"edge_antihalo_strength_dark", 32, kFloat},
                            {"edge_antihalo_extent_bright", 33, kFloat},
                            {"edge_antihalo_extent_dark", 34, kFloat},
                            {"edge_antihalo_strength_hf", 35, kFloat},
                            {"local_contrast_power_bright", 36, kFloat},
                            {"local_contrast_power_dark", 37, kFloat},
                            {"flat_region_sharp_suppress_bright", 38, kFloat},
                            {"flat_region_sharp_suppress_dark", 39, kFloat},
                            {"flat_region_sharp_suppress_extent_bright", 40, kFloat},
                            {"flat_region_sharp_suppress_extent_dark", 41, kFloat},
                            {"radial_sharp_power", 42, kFloat},
                            {"fine_noise_add_despeckle_bright", 43, kFloat},
                            {"fine_noise_add_despeckle_dark", 44, kFloat},
                            {"fine_noise_add_power_dark", 46, kFloat},
                            {"fine_noise_extra_power_dark", 47, kFloat},
                            {"wide_noise_add_power_dark", 48, kFloat},
                            {"wide_noise_extra_power_dark", 49, kFloat},
                            {"wide_wide_noise_add_power_dark", 50, kFloat},
                            {"wide_wide_noise_extra_power_dark", 51, kFloat},
                            {"flat_region_noise_add_suppress_bright", 52, kFloat},
                            {"flat_region_noise_add_suppress_dark", 53, kFloat},
                            {"flat_region_noise_add_base_dark", 54, kFloat},
                            {"radial_noise_add_power", 55, kFloat},
                            {"flat_region_noise_add_base_bright", 56, kFloat},
                            {"edge_limits", 57, kFloat, kRepeated},
                            {"edge_limit_func_interp_factor", 58, kFloat},
                            {"texture_limits", 59, kFloat, kRepeated},
                            {"texture_limit_func_interp_factor", 60, kFloat},
                            {"noise_shape_gains", 61, kFloat, kRepeated},
                            {"noise_shape_thresholds", 62, kFloat, kRepeated},
                            {"grass_texture_power", 63, kFloat},
                            {"high_frequency_detector_power", 64, kFloat},
                            {"high_frequency_detector_threshold", 65, kFloat},
                            {"noise_gain_lut", 66, kFloat, kRepeated},
                        });
  EXPECT_EQ(dynamic->FindFieldByNumber(45), nullptr);
  ExpectReservedNumbers(dynamic, {});
}

TEST(NsmixSchemaTest, TuningHoldsStaticDynamicAndEnable) {
  ExpectBlockTuning(vosbrine::zelmondrake::NsmixTuning::descriptor(),
                    "vosbrine.zelmondrake.NsmixStaticParam",
                    "vosbrine.zelmondrake.NsmixDynamicParam");
}

// ---- Sharpening ----

TEST(SharpSchemaTest, StaticParamDeprecatesEnableAndKeepsLowPower) {
  ExpectFields(vosbrine::zelmondrake::SharpStaticParam::descriptor(),
               {
                   {"enable", 1, kBool, kSingular, "", true},
                   {"enable_low_power", 2, kBool},
               });
}

TEST(SharpSchemaTest, DynamicParamHoldsThreeLocalContrastControls) {
  ExpectFields(vosbrine::zelmondrake::SharpDynamicParam::descriptor(),
               {
                   {"lc_threshold", 1, kFloat},
                   {"lc_suppression", 2, kFloat},
                   {"lc_power", 3, kFloat},
               });
}

TEST(SharpSchemaTest, TuningHoldsStaticDynamicAndEnable) {
  ExpectBlockTuning(vosbrine::zelmondrake::SharpTuning::descriptor(),
                    "vosbrine.zelmondrake.SharpStaticParam",
                    "vosbrine.zelmondrake.SharpDynamicParam");
}

// ---- Noise add ----

TEST(SnaddSchemaTest, StaticParamHoldsFaceBeautificationSwitches) {
  ExpectFields(vosbrine::zelmondrake::SnaddStaticParam::descriptor(),
               {
                   {"enable", 1, kBool, kSingular, "", true},
                   {"enable_low_power", 2, kBool},
                   {"enable_face_beautification", 3, kBool},
                   {"enable_face_beautification_sharp_level_control", 4, kBool},
                   {"enable_face_beautification_noise_level_control", 5, kBool},
                   {"enable_face_beautification_brightness_gain_control", 6, kBool},
                   {"face_brightness_gain_luminance_only", 7, kBool},
               });
}

TEST(SnaddSchemaTest, DynamicParamHoldsSkinSkyGrassAndFaceControls) {
  ExpectFields(vosbrine::zelmondrake::SnaddDynamicParam::descriptor(),
               {
                   {"extend_skin_map_by_texture_index", 1, kFloat},
                   {"extend_skin_map_by_edge_index", 2, kFloat},
                   {"extend_skin_b_map_by_texture_index", 3, kFloat},
                   {"extend_skin_b_map_by_edge_index", 4, kFloat},
                   {"skin_sharpening_reduction", 5, kFloat},
                   {"skin_noise_add_reduction", 6, kFloat},
                   {"skin_b_sharpening_reduction", 7, kFloat},
                   {"skin_b_noise_add_reduction", 8, kFloat},
                   {"extend_sky_map_by_texture_index", 9, kFloat},
                   {"extend_sky_map_by_edge_index", 10, kFloat},
                   {"sky_sharpening_reduction", 11, kFloat},
                   {"sky_noise_add_reduction", 12, kFloat},
                   {"extend_grass_map_by_texture_index", 13, kFloat},
                   {"extend_grass_map_by_edge_index", 14, kFloat},
                   {"grass_sharpening_power", 15, kFloat},
                   {"grass_noise_add_power", 16, kFloat},
                   {"radial_face_margin_gain_x", 17, kFloat},
                   {"radial_face_margin_gain_y", 18, kFloat},
                   {"radial_face_margin_width_ratio", 19, kFloat},
                   {"radial_face_margin_height_ratio", 20, kFloat},
                   {"face_sharp_level", 21, kFloat},
                   {"face_noise_level", 22, kFloat},
                   {"face_brightness_level", 23, kFloat},
                   {"face_brightness_gain", 24, kFloat},
               });
}

TEST(SnaddSchemaTest, TuningHoldsStaticDynamicAndEnable) {
  ExpectBlockTuning(vosbrine::zelmondrake::SnaddTuning::descriptor(),
                    "vosbrine.zelmondrake.SnaddStaticParam",
                    "vosbrine.zelmondrake.SnaddDynamicParam");
}

// ---- Stk ----

TEST(StkSchemaTest, StaticParamDeprecatesEnableAndKeepsPrePostGamma) {
  ExpectFields(vosbrine::zelmondrake::StkStaticParam::descriptor(),
               {
                   {"enable", 1, kBool, kSingular, "", true},
                   {"enable_prepostgamma", 2, kBool},
               });
}

TEST(StkSchemaTest, DynamicParamHoldsNoiseLevelsGammaTablesAndIntegerFilterLength) {
  ExpectFields(vosbrine::zelmondrake::StkDynamicParam::descriptor(),
               {
                   {"horizontal_nr_mid_freq", 1, kFloat, kRepeated},
                   {"horizontal_nr_low_freq", 2, kFloat, kRepeated},
                   {"horizontal_nr_lowest_freq", 3, kFloat, kRepeated},
                   {"vertical_nr", 4, kFloat, kRepeated},
                   {"y_addback_gain", 5, kFloat},
                   {"c_addback_gain", 6, kFloat},
                   {"hf_c_addback_weight", 7, kFloat},
                   {"radial_gain", 8, kFloat},
                   {"flat_ratio_from_center", 9, kFloat},
                   {"forward_gamma_table", 10, kFloat, kRepeated},
                   {"inverse_gamma_table", 11, kFloat, kRepeated},
                   {"y_horizontal_nr_emphasize", 12, kFloat},
                   {"lf_y_addback_coring_to_control_vertical_nr", 13, kFloat},
                   {"y_addback_th", 14, kFloat},
                   {"c_addback_th", 15, kFloat},
                   {"hf_y_addback_coring", 16, kFloat},
                   {"luma_based_nr_control", 17, kFloat, kRepeated},
                   {"horizontal_nr_low_freq_coring", 18, kFloat, kRepeated},
                   {"horizontal_nr_lowest_freq_coring", 19, kFloat, kRepeated},
                   {"vertical_nr_filter_length", 20, kInt32},
               });
}

TEST(StkSchemaTest, TuningHoldsStaticDynamicAndEnable) {
  ExpectBlockTuning(vosbrine::zelmondrake::StkTuning::descriptor(),
                    "vosbrine.zelmondrake.StkStaticParam", "vosbrine.zelmondrake.StkDynamicParam");
}

}  // namespace
