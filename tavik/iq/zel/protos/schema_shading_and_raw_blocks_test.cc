// Pins the schemas of the shading blocks, the shading debug file and the raw-domain blocks (black
// level, disparity, defective pixels, sensor gamma) by descriptor.

#include "gtest/gtest.h"
#include "tavik/iq/testing/schema_testing.h"
#include "tavik/iq/zel/protos/blc_param.pb.h"
#include "tavik/iq/zel/protos/disparity_param.pb.h"
#include "tavik/iq/zel/protos/dpc_param.pb.h"
#include "tavik/iq/zel/protos/lsc_param.pb.h"
#include "tavik/iq/zel/protos/lsc_stats_param.pb.h"
#include "tavik/iq/zel/protos/sensor_gamma_param.pb.h"
#include "tavik/iq/zel/protos/vorel_debug_param.pb.h"

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
using ::tavik::test::kUint32;

namespace zel = ::vosbrine::zelmondrake;

constexpr char kPackage[] = "vosbrine.zelmondrake";

// --- Shading debug file ---

TEST(VorelDebugSchemaTest, DebugParametersOverrideEstimatorSwitchesThresholdsAndTables) {
  ExpectFields(zel::DebugParameters::descriptor(),
               {
                   {"enable_vorel", 1, kBool},
                   {"enable_alsc", 2, kBool},
                   {"filter_residuals", 3, kBool},
                   {"enable_temporal_filter", 4, kBool},
                   {"gradient_threshold", 5, kFloat},
                   {"limiter_threshold", 6, kFloat},
                   {"prj_delta_threshold", 7, kFloat},
                   {"tint_update_gain", 8, kFloat},
                   {"tint_visualization_gain", 9, kFloat},
                   {"base_tables", 10, kMessage, kSingular, "vosbrine.LscTables"},
                   {"sat_ratio_threshold", 11, kFloat},
               });
}

TEST(VorelDebugSchemaTest, DebugParametersScalarsTrackPresenceSoOnlySetFieldsOverride) {
  const auto* descriptor = zel::DebugParameters::descriptor();
  for (int i = 0; i < descriptor->field_count(); ++i) {
    ExpectPresence(descriptor, descriptor->field(i)->name(), true);
  }
}

TEST(VorelDebugSchemaTest, DebugConfigHoldsParameterSetsDurationsAndDumpCounter) {
  const auto* config = zel::VorelDebugConfig::descriptor();
  ExpectFields(config, {
                           {"debug_parameters", 1, kMessage, kRepeated,
                            "vosbrine.zelmondrake.DebugParameters"},
                           {"duration_frames", 2, kUint32, kRepeated},
                           {"dump_counter", 3, kInt32},
                       });
  ExpectPresence(config, "dump_counter", true);
  EXPECT_EQ(config->file()->package(), kPackage);
}

// --- Lens shading ---

TEST(LscSchemaTest, TuningHoldsStaticDynamicAndEnable) {
  ExpectFields(
      zel::LscTuning::descriptor(),
      {
          {"static_param", 1, kMessage, kSingular, "vosbrine.zelmondrake.LscStaticParam"},
          {"dynamic_param", 2, kMessage, kSingular, "vosbrine.zelmondrake.LscDynamicParam"},
          {"enable", 3, kBool},
      });
  EXPECT_EQ(zel::LscTuning::descriptor()->file()->package(), kPackage);
}

TEST(LscSchemaTest, StaticParamKeepsDeprecatedGoldenDataInItsTableOrder) {
  ExpectFields(
      zel::LscStaticParam::descriptor(),
      {
          {"enable_vorel", 2, kBool},
          {"vorel_static_param", 3, kMessage, kSingular, "vosbrine.zelmondrake.VorelStaticParam"},
          {"golden_eeprom_data", 6, kMessage, kSingular, "vosbrine.LscTables", true},
          {"enable_alsc", 8, kBool},
      });
}

TEST(LscSchemaTest, StaticParamReservesRetiredNumbers) {
  ExpectReservedNumbers(zel::LscStaticParam::descriptor(), {1, 4, 5, 7});
}

TEST(LscSchemaTest, StaticParamScalarsHaveNoPresence) {
  ExpectPresence(zel::LscStaticParam::descriptor(), "enable_vorel", false);
  ExpectPresence(zel::LscStaticParam::descriptor(), "enable_alsc", false);
}

TEST(LscSchemaTest, DynamicParamHoldsBaseTablesAndEstimatorThresholds) {
  ExpectFields(
      zel::LscDynamicParam::descriptor(),
      {
          {"lsc_tables", 1, kMessage, kSingular, "vosbrine.LscTables"},
          {"vorel_dynamic_param", 2, kMessage, kSingular, "vosbrine.zelmondrake.VorelDynamicParam"},
      });
}

TEST(LscSchemaTest, VorelDynamicParamHoldsFourInterpolatedThresholds) {
  ExpectFields(zel::VorelDynamicParam::descriptor(), {
                                                         {"gradient_threshold", 1, kFloat},
                                                         {"limiter_threshold", 2, kFloat},
                                                         {"prj_delta_threshold", 3, kFloat},
                                                         {"tint_update_gain", 4, kFloat},
                                                     });
}

TEST(LscSchemaTest, VorelTablesHoldSizeAndTwoTintProfiles) {
  ExpectFields(zel::VorelTables::descriptor(), {
                                                   {"width", 1, kInt32},
                                                   {"height", 2, kInt32},
                                                   {"tint_profile_u", 3, kFloat, kRepeated},
                                                   {"tint_profile_v", 4, kFloat, kRepeated},
                                               });
}

TEST(LscSchemaTest, VorelStaticParamHoldsTablesFiltersAndLevelThresholds) {
  ExpectFields(zel::VorelStaticParam::descriptor(),
               {
                   {"vorel_tables", 1, kMessage, kSingular, "vosbrine.zelmondrake.VorelTables"},
                   {"filter_residuals", 2, kBool},
                   {"enable_temporal_filter", 3, kBool},
                   {"min_level_threshold", 4, kFloat},
                   {"max_level_threshold", 5, kFloat},
                   {"sat_ratio_threshold", 6, kFloat},
               });
}

// --- Shading statistics ---

TEST(LscStatsSchemaTest, TuningHoldsStaticDynamicAndEnable) {
  ExpectFields(
      zel::LscStatsTuning::descriptor(),
      {
          {"static_param", 1, kMessage, kSingular, "vosbrine.zelmondrake.LscStatsStaticParam"},
          {"dynamic_param", 2, kMessage, kSingular, "vosbrine.zelmondrake.LscStatsDynamicParam"},
          {"enable", 3, kBool},
      });
  EXPECT_EQ(zel::LscStatsTuning::descriptor()->file()->package(), kPackage);
}

TEST(LscStatsSchemaTest, StaticParamHoldsDarkAndSaturationThresholds) {
  ExpectFields(zel::LscStatsStaticParam::descriptor(),
               {
                   {"lsc_stats_dark_threshold", 1, kInt32},
                   {"lsc_stats_saturation_threshold", 2, kInt32},
               });
}

TEST(LscStatsSchemaTest, DynamicParamIsEmpty) {
  ExpectFields(zel::LscStatsDynamicParam::descriptor(), {});
}

// --- Black level ---

TEST(BlcSchemaTest, StaticParamHoldsOnlyDeprecatedEnable) {
  ExpectFields(zel::BlcStaticParam::descriptor(), {{"enable", 1, kBool, kSingular, "", true}});
}

TEST(BlcSchemaTest, DynamicParamHoldsFourOffsetLists) {
  ExpectFields(zel::BlcDynamicParam::descriptor(), {
                                                       {"offsets_r", 1, kFloat, kRepeated},
                                                       {"offsets_gr", 2, kFloat, kRepeated},
                                                       {"offsets_gb", 3, kFloat, kRepeated},
                                                       {"offsets_b", 4, kFloat, kRepeated},
                                                   });
}

TEST(BlcSchemaTest, TuningHoldsStaticDynamicAndEnable) {
  ExpectFields(
      zel::BlcTuning::descriptor(),
      {
          {"static_param", 1, kMessage, kSingular, "vosbrine.zelmondrake.BlcStaticParam"},
          {"dynamic_param", 2, kMessage, kSingular, "vosbrine.zelmondrake.BlcDynamicParam"},
          {"enable", 3, kBool},
      });
  ExpectPresence(zel::BlcTuning::descriptor(), "enable", false);
  EXPECT_EQ(zel::BlcTuning::descriptor()->file()->package(), kPackage);
}

// --- Disparity ---

TEST(DisparitySchemaTest, StaticParamHoldsSwitchesAndSlopeLimits) {
  ExpectFields(zel::DisparityStaticParam::descriptor(),
               {
                   {"enable", 1, kBool, kSingular, "", true},
                   {"enable_5x7", 2, kBool},
                   {"enable_slope_estimation", 3, kBool},
                   {"max_slope_allowed_low", 4, kFloat},
                   {"max_slope_allowed_high", 5, kFloat},
               });
}

TEST(DisparitySchemaTest, DynamicParamHoldsThresholdsAndRadialTerms) {
  ExpectFields(zel::DisparityDynamicParam::descriptor(),
               {
                   {"disparity_threshold_low", 1, kFloat},
                   {"disparity_threshold_high", 2, kFloat},
                   {"slope_threshold_low", 3, kFloat},
                   {"slope_threshold_high", 4, kFloat},
                   {"radial_power", 5, kFloat},
                   {"radial_limit", 6, kFloat},
               });
}

TEST(DisparitySchemaTest, TuningHoldsStaticDynamicAndEnable) {
  ExpectFields(
      zel::DisparityTuning::descriptor(),
      {
          {"static_param", 1, kMessage, kSingular, "vosbrine.zelmondrake.DisparityStaticParam"},
          {"dynamic_param", 2, kMessage, kSingular, "vosbrine.zelmondrake.DisparityDynamicParam"},
          {"enable", 3, kBool},
      });
  EXPECT_EQ(zel::DisparityTuning::descriptor()->file()->package(), kPackage);
}

// --- Defective pixel correction ---

TEST(DpcSchemaTest, StaticParamHoldsOnlyDeprecatedEnable) {
  ExpectFields(zel::DpcStaticParam::descriptor(), {{"enable", 1, kBool, kSingular, "", true}});
}

TEST(DpcSchemaTest, DynamicParamHoldsSevenLevelListsAndThreeScalars) {
  ExpectFields(zel::DpcDynamicParam::descriptor(),
               {
                   {"contrast_diff_factor", 1, kFloat},
                   {"predespeckle_main_thresholds", 2, kFloat, kRepeated},
                   {"direction_effective_thresholds", 3, kFloat, kRepeated},
                   {"max_mask_level", 4, kFloat},
                   {"dir_base_thresholds", 5, kFloat, kRepeated},
                   {"omni_dynamic_threshold_weights", 6, kFloat, kRepeated},
                   {"omni_std_thresholds", 7, kFloat, kRepeated},
                   {"omni_tol_var_green_scales", 8, kFloat, kRepeated},
                   {"omni_tol_var_rb_scales", 9, kFloat, kRepeated},
                   {"g3aa_dpc_threshold", 10, kFloat},
               });
}

TEST(DpcSchemaTest, TuningHoldsStaticDynamicAndEnable) {
  ExpectFields(
      zel::DpcTuning::descriptor(),
      {
          {"static_param", 1, kMessage, kSingular, "vosbrine.zelmondrake.DpcStaticParam"},
          {"dynamic_param", 2, kMessage, kSingular, "vosbrine.zelmondrake.DpcDynamicParam"},
          {"enable", 3, kBool},
      });
  EXPECT_EQ(zel::DpcTuning::descriptor()->file()->package(), kPackage);
}

// --- Sensor gamma ---

TEST(SensorGammaSchemaTest, StaticParamIsEmpty) {
  ExpectFields(zel::SensorGammaStaticParam::descriptor(), {});
}

TEST(SensorGammaSchemaTest, DynamicParamHoldsTheCurve) {
  ExpectFields(zel::SensorGammaDynamicParam::descriptor(), {{"gamma_y", 1, kFloat, kRepeated}});
}

TEST(SensorGammaSchemaTest, TuningHoldsStaticDynamicAndEnable) {
  ExpectFields(
      zel::SensorGammaTuning::descriptor(),
      {
          {"static_param", 1, kMessage, kSingular, "vosbrine.zelmondrake.SensorGammaStaticParam"},
          {"dynamic_param", 2, kMessage, kSingular, "vosbrine.zelmondrake.SensorGammaDynamicParam"},
          {"enable", 3, kBool},
      });
  EXPECT_EQ(zel::SensorGammaTuning::descriptor()->file()->package(), kPackage);
}

}  // namespace
