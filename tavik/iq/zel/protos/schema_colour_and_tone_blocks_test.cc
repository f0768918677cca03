// Pins the schemas of the colour and tone blocks (Prc, Skind, Edgedet, Gamma, Clut and the
// RGB-YUV conversion) by descriptor: tuning files are read by field name and written by number.
#include <string>

#include "gtest/gtest.h"
#include "tavik/iq/testing/schema_testing.h"
#include "tavik/iq/zel/protos/clut_param.pb.h"
#include "tavik/iq/zel/protos/edgedet_param.pb.h"
#include "tavik/iq/zel/protos/gamma_param.pb.h"
#include "tavik/iq/zel/protos/prc_param.pb.h"
#include "tavik/iq/zel/protos/rgb_yuv_conversion_param.pb.h"
#include "tavik/iq/zel/protos/skind_param.pb.h"

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

// Every block message has the same three fields; only the two submessage types differ.
void ExpectBlockShape(const google::protobuf::Descriptor* tuning, const std::string& static_type,
                      const std::string& dynamic_type) {
  ExpectFields(tuning, {{"static_param", 1, kMessage, kSingular, static_type},
                        {"dynamic_param", 2, kMessage, kSingular, dynamic_type},
                        {"enable", 3, kBool}});
}

TEST(PrcSchemaTest, StaticParamHoldsOnlyTheDeprecatedEnable) {
  ExpectFields(vosbrine::zelmondrake::PrcStaticParam::descriptor(),
               {{"enable", 1, kBool, kSingular, "", true}});
}

TEST(PrcSchemaTest, DynamicParamHoldsFifteenRegionLists) {
  ExpectFields(vosbrine::zelmondrake::PrcDynamicParam::descriptor(),
               {{"outer_hue_low", 1, kFloat, kRepeated},
                {"outer_hue_high", 2, kFloat, kRepeated},
                {"outer_sat_low", 3, kFloat, kRepeated},
                {"outer_sat_high", 4, kFloat, kRepeated},
                {"outer_val_low", 5, kFloat, kRepeated},
                {"outer_val_high", 6, kFloat, kRepeated},
                {"inner_distance_hue_low", 7, kFloat, kRepeated},
                {"inner_distance_hue_high", 8, kFloat, kRepeated},
                {"inner_distance_sat_low", 9, kFloat, kRepeated},
                {"inner_distance_sat_high", 10, kFloat, kRepeated},
                {"inner_distance_val_low", 11, kFloat, kRepeated},
                {"inner_distance_val_high", 12, kFloat, kRepeated},
                {"shift_vector_hue", 13, kFloat, kRepeated},
                {"shift_vector_sat", 14, kFloat, kRepeated},
                {"shift_vector_val", 15, kFloat, kRepeated}});
}

TEST(PrcSchemaTest, TuningHasTheBlockShape) {
  ExpectBlockShape(vosbrine::zelmondrake::PrcTuning::descriptor(),
                   "vosbrine.zelmondrake.PrcStaticParam", "vosbrine.zelmondrake.PrcDynamicParam");
}

TEST(SkindSchemaTest, StaticParamHoldsLowPowerAndOneSwitchPerClass) {
  ExpectFields(vosbrine::zelmondrake::SkindStaticParam::descriptor(),
               {{"enable", 1, kBool, kSingular, "", true},
                {"enable_low_power", 2, kBool},
                {"enable_skin", 3, kBool},
                {"enable_skin_b", 4, kBool},
                {"enable_sky", 5, kBool},
                {"enable_grass", 6, kBool},
                {"enable_extra", 7, kBool}});
}

TEST(SkindSchemaTest, DynamicParamHoldsNineRangesForEachOfFiveClasses) {
  ExpectFields(vosbrine::zelmondrake::SkindDynamicParam::descriptor(),
               {{"skin_hue_min", 1, kFloat},
                {"skin_hue_max", 2, kFloat},
                {"skin_sat_min", 3, kFloat},
                {"skin_sat_max", 4, kFloat},
                {"skin_val_min", 5, kFloat},
                {"skin_val_max", 6, kFloat},
                {"skin_hue_smooth_shift", 7, kFloat},
                {"skin_sat_smooth_shift", 8, kFloat},
                {"skin_val_smooth_shift", 9, kFloat},
                {"skin_b_hue_min", 10, kFloat},
                {"skin_b_hue_max", 11, kFloat},
                {"skin_b_sat_min", 12, kFloat},
                {"skin_b_sat_max", 13, kFloat},
                {"skin_b_val_min", 14, kFloat},
                {"skin_b_val_max", 15, kFloat},
                {"skin_b_hue_smooth_shift", 16, kFloat},
                {"skin_b_sat_smooth_shift", 17, kFloat},
                {"skin_b_val_smooth_shift", 18, kFloat},
                {"sky_hue_min", 19, kFloat},
                {"sky_hue_max", 20, kFloat},
                {"sky_sat_min", 21, kFloat},
                {"sky_sat_max", 22, kFloat},
                {"sky_val_min", 23, kFloat},
                {"sky_val_max", 24, kFloat},
                {"sky_hue_smooth_shift", 25, kFloat},
                {"sky_sat_smooth_shift", 26, kFloat},
                {"sky_val_smooth_shift", 27, kFloat},
                {"grass_hue_min", 28, kFloat},
                {"grass_hue_max", 29, kFloat},
                {"grass_sat_min", 30, kFloat},
                {"grass_sat_max", 31, kFloat},
                {"grass_val_min", 32, kFloat},
                {"grass_val_max", 33, kFloat},
                {"grass_hue_smooth_shift", 34, kFloat},
                {"grass_sat_smooth_shift", 35, kFloat},
                {"grass_val_smooth_shift", 36, kFloat},
                {"extra_hue_min", 37, kFloat},
                {"extra_hue_max", 38, kFloat},
                {"extra_sat_min", 39, kFloat},
                {"extra_sat_max", 40, kFloat},
                {"extra_val_min", 41, kFloat},
                {"extra_val_max", 42, kFloat},
                {"extra_hue_smooth_shift", 43, kFloat},
                {"extra_sat_smooth_shift", 44, kFloat},
                {"extra_val_smooth_shift", 45, kFloat}});
  // Plain scalars: an unset range reads as 0.
  ExpectPresence(vosbrine::zelmondrake::SkindDynamicParam::descriptor(), "skin_hue_min", false);
}

TEST(SkindSchemaTest, TuningHasTheBlockShape) {
  ExpectBlockShape(vosbrine::zelmondrake::SkindTuning::descriptor(),
                   "vosbrine.zelmondrake.SkindStaticParam",
                   "vosbrine.zelmondrake.SkindDynamicParam");
}

TEST(EdgedetSchemaTest, StaticParamHoldsOnlySwitches) {
  ExpectFields(vosbrine::zelmondrake::EdgedetStaticParam::descriptor(),
               {{"enable", 1, kBool, kSingular, "", true}, {"enable_low_power", 2, kBool}});
}

TEST(EdgedetSchemaTest, DynamicParamHasNoFields) {
  ExpectFields(vosbrine::zelmondrake::EdgedetDynamicParam::descriptor(), {});
}

TEST(EdgedetSchemaTest, TuningHasTheBlockShapeWithTrackedDynamicParam) {
  const google::protobuf::Descriptor* tuning = vosbrine::zelmondrake::EdgedetTuning::descriptor();
  ExpectBlockShape(tuning, "vosbrine.zelmondrake.EdgedetStaticParam",
                   "vosbrine.zelmondrake.EdgedetDynamicParam");
  // An empty dynamic_param must still be told apart from a missing one.
  ExpectPresence(tuning, "dynamic_param", true);
}

TEST(GammaSchemaTest, StaticParamHoldsTheKnotAbscissae) {
  ExpectFields(vosbrine::zelmondrake::GammaStaticParam::descriptor(),
               {{"enable", 1, kBool, kSingular, "", true}, {"gamma_x", 2, kFloat, kRepeated}});
}

TEST(GammaSchemaTest, DynamicParamHoldsOneCurvePerChannel) {
  ExpectFields(vosbrine::zelmondrake::GammaDynamicParam::descriptor(),
               {{"gamma_r", 1, kFloat, kRepeated},
                {"gamma_g", 2, kFloat, kRepeated},
                {"gamma_b", 3, kFloat, kRepeated}});
}

TEST(GammaSchemaTest, TuningHasTheBlockShape) {
  ExpectBlockShape(vosbrine::zelmondrake::GammaTuning::descriptor(),
                   "vosbrine.zelmondrake.GammaStaticParam",
                   "vosbrine.zelmondrake.GammaDynamicParam");
}

TEST(ClutSchemaTest, StaticParamHoldsMatrixAndInputLuts) {
  ExpectFields(
      vosbrine::zelmondrake::ClutStaticParam::descriptor(),
      {{"enable", 1, kBool, kSingular, "", true},
       {"yuv2rgb", 2, kMessage, kSingular, "vosbrine.zelmondrake.ClutStaticParam.YuvToRgb"},
       {"input_lut", 3, kMessage, kRepeated, "vosbrine.zelmondrake.ClutStaticParam.InputLut"}});
}

TEST(ClutSchemaTest, YuvToRgbHoldsSwitchAndMatrix) {
  ExpectFields(vosbrine::zelmondrake::ClutStaticParam::YuvToRgb::descriptor(),
               {{"enable", 1, kBool}, {"matrix", 2, kFloat, kRepeated}});
}

TEST(ClutSchemaTest, InputLutHoldsSwitchChannelAndTable) {
  ExpectFields(vosbrine::zelmondrake::ClutStaticParam::InputLut::descriptor(),
               {{"enable", 1, kBool}, {"channel_index", 2, kInt32}, {"lut", 3, kFloat, kRepeated}});
}

TEST(ClutSchemaTest, DynamicParamHoldsUvTablesFromNumberTwo) {
  const google::protobuf::Descriptor* dynamic =
      vosbrine::zelmondrake::ClutDynamicParam::descriptor();
  ExpectFields(dynamic, {{"lut_u", 2, kFloat, kRepeated}, {"lut_v", 3, kFloat, kRepeated}});
  // Number 1 is merely unused, not reserved.
  ExpectReservedNumbers(dynamic, {});
}

TEST(ClutSchemaTest, TuningHasTheBlockShape) {
  ExpectBlockShape(vosbrine::zelmondrake::ClutTuning::descriptor(),
                   "vosbrine.zelmondrake.ClutStaticParam", "vosbrine.zelmondrake.ClutDynamicParam");
}

TEST(RgbYuvConversionSchemaTest, StaticParamHoldsBothMatricesAndOffsets) {
  ExpectFields(vosbrine::zelmondrake::RgbYuvConversionStaticParam::descriptor(),
               {{"enable", 1, kBool, kSingular, "", true},
                {"rgb2yuv_coefficients", 2, kFloat, kRepeated},
                {"rgb2yuv_offsets", 3, kFloat, kRepeated},
                {"yuv2rgb_coefficients", 4, kFloat, kRepeated}});
}

TEST(RgbYuvConversionSchemaTest, DynamicParamHasNoFields) {
  ExpectFields(vosbrine::zelmondrake::RgbYuvConversionDynamicParam::descriptor(), {});
}

TEST(RgbYuvConversionSchemaTest, TuningHasTheBlockShape) {
  ExpectBlockShape(vosbrine::zelmondrake::RgbYuvConversionTuning::descriptor(),
                   "vosbrine.zelmondrake.RgbYuvConversionStaticParam",
                   "vosbrine.zelmondrake.RgbYuvConversionDynamicParam");
}

}  // namespace
