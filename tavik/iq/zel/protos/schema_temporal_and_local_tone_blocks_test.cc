// Pins the schemas of the temporal noise reducer, its sharpener and the local tone mapping blocks.
#include "gtest/gtest.h"
#include "tavik/iq/testing/schema_testing.h"
#include "tavik/iq/zel/protos/gtnr_param.pb.h"
#include "tavik/iq/zel/protos/gtnr_sharpener_param.pb.h"
#include "tavik/iq/zel/protos/ltm_delta_y_param.pb.h"
#include "tavik/iq/zel/protos/ltm_param.pb.h"

namespace {

using ::tavik::test::ExpectEnumValues;
using ::tavik::test::ExpectFields;
using ::tavik::test::ExpectPresence;
using ::tavik::test::kBool;
using ::tavik::test::kEnum;
using ::tavik::test::kFloat;
using ::tavik::test::kInt32;
using ::tavik::test::kMessage;
using ::tavik::test::kRepeated;
using ::tavik::test::kSingular;

constexpr bool kDeprecated = true;

TEST(GtnrSchemaTest, StaticParamHoldsPyramidAlignAndMergeSwitches) {
  ExpectFields(vosbrine::zelmondrake::GtnrStaticParam::descriptor(),
               {
                   {"enable", 1, kBool, kSingular, "", kDeprecated},
                   {"enable_inpainting", 2, kBool},
                   {"enable_zero_motion_vector_check", 3, kBool},
                   {"num_pyramid_levels", 4, kInt32},
                   {"enable_luma_levels", 5, kBool, kRepeated},
                   {"enable_mvlpf", 6, kBool},
                   {"enable_low_power", 7, kBool},
                   {"enable_large_tile_height", 8, kBool},
               });
}

TEST(GtnrSchemaTest, DynamicParamDeclaresEighteenFieldsInBlockOrder) {
  ExpectFields(vosbrine::zelmondrake::GtnrDynamicParam::descriptor(),
               {
                   {"min_curr_weights", 1, kFloat, kRepeated},
                   {"c_middle", 2, kFloat},
                   {"noise_factors", 3, kFloat, kRepeated},
                   {"chroma_min_curr_weight", 4, kFloat},
                   {"chroma_noise_factor", 5, kFloat},
                   {"alignment_error_multiplier", 6, kFloat},
                   {"aliasing_flat_shift_threshold", 7, kFloat},
                   {"valid_gradient_intensity", 8, kFloat},
                   {"matching_error_weighting", 9, kFloat},
                   {"motion_sigmoid_slope_denominator", 10, kFloat},
                   {"motion_penalty_strength", 11, kFloat},
                   {"motion_sigmoid_theta", 17, kFloat},
                   {"zero_motion_vector_sensitivity", 18, kFloat},
                   {"noise_scale", 12, kFloat},
                   {"noise_scale_gains", 13, kFloat, kRepeated},
                   {"radial_gain", 16, kFloat},
                   {"mvlpf_strength", 14, kFloat},
                   {"mvlpf_diff_thresholds", 15, kFloat, kRepeated},
               });
}

TEST(GtnrSchemaTest, TuningHoldsStaticDynamicAndEnable) {
  ExpectFields(
      vosbrine::zelmondrake::GtnrTuning::descriptor(),
      {
          {"static_param", 1, kMessage, kSingular, "vosbrine.zelmondrake.GtnrStaticParam"},
          {"dynamic_param", 2, kMessage, kSingular, "vosbrine.zelmondrake.GtnrDynamicParam"},
          {"enable", 3, kBool},
      });
}

TEST(TemporalAndLocalToneSchemaTest, FilesAreProto3) {
  for (const auto* file : {vosbrine::zelmondrake::GtnrTuning::descriptor()->file(),
                           vosbrine::zelmondrake::GtnrSharpenerTuning::descriptor()->file(),
                           vosbrine::zelmondrake::LtmTuning::descriptor()->file(),
                           vosbrine::zelmondrake::LtmDeltaYTuning::descriptor()->file()}) {
    EXPECT_EQ(file->syntax(), google::protobuf::FileDescriptor::SYNTAX_PROTO3) << file->name();
  }
}

TEST(GtnrSchemaTest, ScalarsHaveNoPresence) {
  ExpectPresence(vosbrine::zelmondrake::GtnrStaticParam::descriptor(), "num_pyramid_levels", false);
  ExpectPresence(vosbrine::zelmondrake::GtnrDynamicParam::descriptor(), "radial_gain", false);
  ExpectPresence(vosbrine::zelmondrake::GtnrTuning::descriptor(), "dynamic_param", true);
}

TEST(GtnrSharpenerSchemaTest, StaticParamHoldsLowPowerAndSoftClipSwitch) {
  ExpectFields(vosbrine::zelmondrake::GtnrSharpenerStaticParam::descriptor(),
               {
                   {"enable", 1, kBool, kSingular, "", kDeprecated},
                   {"enable_low_power", 2, kBool},
                   {"select_ink_mode_disable_soft_clip", 3, kInt32},
               });
}

TEST(GtnrSharpenerSchemaTest, DynamicParamHoldsPerLevelLutsAndDeprecatedIntegerCurves) {
  ExpectFields(vosbrine::zelmondrake::GtnrSharpenerDynamicParam::descriptor(),
               {
                   {"sharpening_strengths", 1, kFloat, kRepeated, "", kDeprecated},
                   {"soft_clip_strength", 2, kFloat},
                   {"noise_model_lut_level_1_y", 3, kFloat, kRepeated},
                   {"noise_model_lut_level_2_y", 4, kFloat, kRepeated},
                   {"noise_model_lut_level_3_y", 5, kFloat, kRepeated},
                   {"noise_model_radial_gain_lut_level_1", 6, kFloat, kRepeated},
                   {"noise_model_radial_gain_lut_level_2", 7, kFloat, kRepeated},
                   {"noise_model_radial_gain_lut_level_3", 8, kFloat, kRepeated},
                   {"noise_model_luma_strengths", 9, kFloat, kRepeated},
                   {"radial_sharpening_gain_lut_level_1", 10, kFloat, kRepeated},
                   {"radial_sharpening_gain_lut_level_2", 11, kFloat, kRepeated},
                   {"radial_sharpening_gain_lut_level_3", 12, kFloat, kRepeated},
                   {"curve_lut_spec_1", 13, kInt32, kRepeated, "", kDeprecated},
                   {"curve_lut_spec_2", 14, kInt32, kRepeated, "", kDeprecated},
                   {"curve_lut_spec_3", 15, kInt32, kRepeated, "", kDeprecated},
                   {"curve_lut_spec_l1", 16, kFloat, kRepeated},
                   {"curve_lut_spec_l2", 17, kFloat, kRepeated},
                   {"curve_lut_spec_l3", 18, kFloat, kRepeated},
               });
}

TEST(GtnrSharpenerSchemaTest, TuningHoldsStaticDynamicAndEnable) {
  ExpectFields(
      vosbrine::zelmondrake::GtnrSharpenerTuning::descriptor(),
      {
          {"static_param", 1, kMessage, kSingular, "vosbrine.zelmondrake.GtnrSharpenerStaticParam"},
          {"dynamic_param", 2, kMessage, kSingular,
           "vosbrine.zelmondrake.GtnrSharpenerDynamicParam"},
          {"enable", 3, kBool},
      });
}

TEST(LtmSchemaTest, StaticParamHoldsOnlyTheDeprecatedEnable) {
  ExpectFields(vosbrine::zelmondrake::LtmStaticParam::descriptor(),
               {
                   {"enable", 1, kBool, kSingular, "", kDeprecated},
               });
}

TEST(LtmSchemaTest, DynamicParamHoldsThreeFilterStrengths) {
  ExpectFields(vosbrine::zelmondrake::LtmDynamicParam::descriptor(),
               {
                   {"short_tet_filter_strength", 1, kFloat},
                   {"long_tet_filter_strength", 2, kFloat},
                   {"grid_filter_strength", 3, kFloat},
               });
}

TEST(LtmSchemaTest, TuningHoldsStaticDynamicAndEnable) {
  ExpectFields(
      vosbrine::zelmondrake::LtmTuning::descriptor(),
      {
          {"static_param", 1, kMessage, kSingular, "vosbrine.zelmondrake.LtmStaticParam"},
          {"dynamic_param", 2, kMessage, kSingular, "vosbrine.zelmondrake.LtmDynamicParam"},
          {"enable", 3, kBool},
      });
}

TEST(LtmDeltaYSchemaTest, StaticParamHoldsLutSizeAndTwoNestedEnums) {
  ExpectFields(vosbrine::zelmondrake::LtmDeltaYStaticParam::descriptor(),
               {
                   {"lut_size", 1, kInt32},
                   {"input_space", 2, kEnum, kSingular,
                    "vosbrine.zelmondrake.LtmDeltaYStaticParam.InputSpace"},
                   {"post_ltm_curve", 3, kEnum, kSingular,
                    "vosbrine.zelmondrake.LtmDeltaYStaticParam.PostLtmCurve"},
               });
}

TEST(LtmDeltaYSchemaTest, InputSpaceIsGamma22OrLinear) {
  ExpectEnumValues(vosbrine::zelmondrake::LtmDeltaYStaticParam::InputSpace_descriptor(),
                   {{0, "INPUTSPACE_UNSPECIFIED"}, {1, "GAMMA22"}, {2, "LINEAR"}});
}

TEST(LtmDeltaYSchemaTest, PostLtmCurveIsGamma22OrSaturation) {
  ExpectEnumValues(
      vosbrine::zelmondrake::LtmDeltaYStaticParam::PostLtmCurve_descriptor(),
      {{0, "POSTLTMCURVE_UNSPECIFIED"}, {1, "GAMMA22_CURVE"}, {2, "SATURATION_CURVE"}});
}

TEST(LtmDeltaYSchemaTest, DynamicParamHoldsTheCubicLut) {
  ExpectFields(vosbrine::zelmondrake::LtmDeltaYDynamicParam::descriptor(),
               {
                   {"lut", 1, kFloat, kRepeated},
               });
}

TEST(LtmDeltaYSchemaTest, TuningHoldsStaticDynamicAndEnable) {
  ExpectFields(
      vosbrine::zelmondrake::LtmDeltaYTuning::descriptor(),
      {
          {"static_param", 1, kMessage, kSingular, "vosbrine.zelmondrake.LtmDeltaYStaticParam"},
          {"dynamic_param", 2, kMessage, kSingular, "vosbrine.zelmondrake.LtmDeltaYDynamicParam"},
          {"enable", 3, kBool},
      });
}

}  // namespace
