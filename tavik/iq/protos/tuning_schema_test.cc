// Tuning files are written by other tools and read through reflection by field name, so the
// shared schemas are pinned here field by field: name, number, type, label and presence.
#include "gtest/gtest.h"
#include "tavik/iq/protos/camera_state.pb.h"
#include "tavik/iq/protos/common.pb.h"
#include "tavik/iq/protos/golden_sensor_factory_calibration_data.pb.h"
#include "tavik/iq/protos/lsc_tables.pb.h"
#include "tavik/iq/protos/tuning_tree.pb.h"
#include "tavik/iq/protos/tuning_usecase.pb.h"
#include "tavik/iq/testing/schema_testing.h"
#include "tavik/iq/zel/protos/sensor_factory_calibration_data.pb.h"

namespace {

using namespace tavik::test;  // NOLINT: the field-type constants.

TEST(TuningSchemaTest, TuningUsecaseDataHoldsKeyPackedTreeSetAndVersion) {
  ExpectFields(vosbrine::TuningUsecaseData::descriptor(),
               {{"tuning_usecase", 1, kMessage, kSingular, "vosbrine.TuningUsecase"},
                {"tuning_tree_set", 2, kMessage, kSingular, "google.protobuf.Any"},
                {"version", 3, kString}});
}

TEST(TuningSchemaTest, TuningUsecaseIsSensorModeAndUsecase) {
  ExpectFields(vosbrine::TuningUsecase::descriptor(),
               {{"camera_sensor", 1, kEnum, kSingular, "vosbrine.CameraSensor"},
                {"sensor_mode", 2, kEnum, kSingular, "vosbrine.SensorMode"},
                {"camera_usecase", 3, kEnum, kSingular, "vosbrine.CameraUsecase"}});
}

TEST(TuningSchemaTest, CameraSensorValues) {
  ExpectEnumValues(vosbrine::CameraSensor_descriptor(),
                   {{0, "INVALID_CAMERA_SENSOR"},
                    {1, "BRIMAL_REAR_IMX363_NORMAL"},
                    {2, "BRIMAL_REAR_IMX481_TELE"},
                    {3, "BRIMAL_FRONT_IMX520_NORMAL"},
                    {4, "BRIMAL_FRONT_OVM7251_IR"},
                    {5, "BRIMAL_FRONT_IMX355_NORMAL"},
                    {6, "BRIMAL_FRONT_IMX663_NORMAL"},
                    {7, "BRIMAL_REAR_GN1_NORMAL"},
                    {8, "BRIMAL_REAR_IMX386_WIDE"},
                    {9, "BRIMAL_REAR_IMX586_TELE"},
                    {10, "BRIMAL_SENSOR_BRINGUP"},
                    {11, "BRIMAL_REAR_GN1RM_VIRTUAL"},
                    {12, "BRIMAL_REAR_IMX481_WIDE"},
                    {13, "BRIMAL_FRONT_IMX663VIRTUAL_VIRTUAL"},
                    {14, "FENNELMOORE_SENSOR_BRINGUP"}});
}

TEST(TuningSchemaTest, SensorModeValuesInDeclarationOrderWithUnsortedNumbers) {
  ExpectEnumValues(vosbrine::SensorMode_descriptor(),
                   {{0, "INVALID_SENSOR_MODE"},
                    {1, "FULL_4_3_FULL_15_30FPS"},
                    {2, "FULL_16_9_2160P_30FPS"},
                    {3, "FULL_16_9_1080P_30FPS"},
                    {4, "FULL_16_9_1080P_30_60FPS"},
                    {11, "FULL_16_9_2160P_60FPS"},
                    {5, "FULL_16_9_1080P_60FPS"},
                    {6, "FULL_16_9_720P_30FPS"},
                    {21, "FULL_16_9_720P_15FPS"},
                    {22, "BINNING2X2_16_9_FULL_15FPS"},
                    {23, "BINNING2X2_16_9_FULL_30FPS"},
                    {18, "BINNING2X2_16_9_720P_15FPS"},
                    {12, "BINNING2X2_16_9_720P_30FPS"},
                    {17, "BINNING2X2_16_9_720P_240FPS"},
                    {13, "BINNING2X2_16_9_1080P_60FPS"},
                    {7, "BINNING2X2_16_9_1080P_90FPS"},
                    {8, "BINNING2X2_16_9_1080P_120FPS"},
                    {9, "BINNING2X2_16_9_1080P_240FPS"},
                    {10, "BINNING2X2_4_3_FULL_15_30FPS"},
                    {19, "BINNING2X2_16_9_1080P_30_60FPS"},
                    {24, "FULL_16_9_FULL_15FPS"},
                    {14, "FULL_16_9_FULL_30FPS"},
                    {20, "FULL_16_9_FULL_15_30FPS"},
                    {15, "FULL_16_9_FULL_30_60FPS"},
                    {16, "FULL_16_9_FULL_60FPS"}});
}

TEST(TuningSchemaTest, CameraUsecaseValues) {
  ExpectEnumValues(vosbrine::CameraUsecase_descriptor(),
                   {{0, "INVALID_CAMERA_USECASE"},
                    {1, "VIEWFINDER"},
                    {2, "VIEWFINDER_TORCH"},
                    {3, "VIEWFINDER_HDRNET"},
                    {4, "VIEWFINDER_HDRNET_TORCH"},
                    {5, "VIEWFINDER_NOCTARELLE"},
                    {6, "SNAPSHOT"},
                    {7, "SNAPSHOT_TORCH"},
                    {8, "VIDEO_VIEWFINDER"},
                    {9, "VIDEO_VIEWFINDER_TORCH"},
                    {10, "VIDEO_RECORDING"},
                    {11, "VIDEO_RECORDING_TORCH"},
                    {12, "VIDEO_LIVESHOT"},
                    {13, "VIDEO_LIVESHOT_TORCH"},
                    {14, "VIEWFINDER_3P"},
                    {15, "VIEWFINDER_TORCH_3P"},
                    {16, "VIEWFINDER_NOCTARELLE_3P"},
                    {17, "SNAPSHOT_3P"},
                    {18, "SNAPSHOT_TORCH_3P"},
                    {19, "VIDEO_VIEWFINDER_3P"},
                    {20, "VIDEO_VIEWFINDER_TORCH_3P"},
                    {21, "VIDEO_RECORDING_3P"},
                    {22, "VIDEO_RECORDING_TORCH_3P"},
                    {23, "VIDEO_LIVESHOT_3P"},
                    {24, "VIDEO_LIVESHOT_TORCH_3P"}});
}

TEST(TuningSchemaTest, TuningTreeHoldsPackedStaticParamTopLevelAndSwitch) {
  ExpectFields(vosbrine::TuningTree::descriptor(),
               {{"static_param", 1, kMessage, kSingular, "google.protobuf.Any"},
                {"dynamic_top_level", 2, kMessage, kSingular, "vosbrine.Level"},
                {"enable", 3, kBool}});
}

TEST(TuningSchemaTest, LevelHoldsTypeAndNodes) {
  ExpectFields(vosbrine::Level::descriptor(),
               {{"type", 1, kEnum, kSingular, "vosbrine.Level.Type"},
                {"nodes", 2, kMessage, kRepeated, "vosbrine.Node"}});
}

TEST(TuningSchemaTest, LevelTypeValues) {
  ExpectEnumValues(vosbrine::Level::Type_descriptor(),
                   {{0, "UNKNOWN"},
                    {1, "LED"},
                    {2, "CCT"},
                    {3, "BV"},
                    {4, "GAIN"},
                    {5, "EXP_RATIO"},
                    {6, "SCALER_RATIO"},
                    {7, "MIRED_CCT"},
                    {8, "PRE_SCALER_RATIO"},
                    {9, "FRAME_COUNT"},
                    {10, "EXPOSURE_TIME_MSECS"}});
}

TEST(TuningSchemaTest, LevelTypesSixAndSevenAreCrossedAgainstCoordinateFields) {
  const auto* coordinates = vosbrine::LevelCoordinates::descriptor();
  EXPECT_EQ(vosbrine::Level::SCALER_RATIO, 6);
  EXPECT_EQ(coordinates->FindFieldByName("scaler_ratio")->number(), 7);
  EXPECT_EQ(vosbrine::Level::MIRED_CCT, 7);
  EXPECT_EQ(coordinates->FindFieldByName("mired_cct")->number(), 6);
}

TEST(TuningSchemaTest, NodeIsARegionWithChildLevelOrLeafInOneof) {
  const auto* node = vosbrine::Node::descriptor();
  ExpectFields(node, {{"lower", 1, kFloat},
                      {"upper", 2, kFloat},
                      {"child_level", 3, kMessage, kSingular, "vosbrine.Level"},
                      {"dynamic_param", 4, kMessage, kSingular, "google.protobuf.Any"}});
  ASSERT_EQ(node->oneof_decl_count(), 1);
  const auto* child = node->oneof_decl(0);
  EXPECT_EQ(child->name(), "child");
  ASSERT_EQ(child->field_count(), 2);
  EXPECT_EQ(child->field(0)->name(), "child_level");
  EXPECT_EQ(child->field(1)->name(), "dynamic_param");
}

TEST(TuningSchemaTest, CameraStateIsProto2WithDeprecatedSensorConfig) {
  const auto* state = vosbrine::CameraState::descriptor();
  EXPECT_EQ(state->file()->syntax(), google::protobuf::FileDescriptor::SYNTAX_PROTO2);
  ExpectFields(state,
               {{"sensor_config", 1, kMessage, kSingular, "vosbrine.SensorConfig", true},
                {"level_coordinates", 2, kMessage, kSingular, "vosbrine.LevelCoordinates"}});
}

TEST(TuningSchemaTest, CameraStateImportsCommonPublicly) {
  const auto* file = vosbrine::CameraState::descriptor()->file();
  ASSERT_EQ(file->public_dependency_count(), 1);
  EXPECT_EQ(file->public_dependency(0)->name(), "tavik/iq/protos/common.proto");
}

TEST(TuningSchemaTest, LevelCoordinatesAreOptionalFloatsWithPresence) {
  const auto* coordinates = vosbrine::LevelCoordinates::descriptor();
  ExpectFields(coordinates, {{"led_influence", 1, kFloat},
                             {"cct", 2, kFloat},
                             {"bv", 3, kFloat},
                             {"real_gain", 4, kFloat},
                             {"exp_ratio", 5, kFloat},
                             {"mired_cct", 6, kFloat},
                             {"scaler_ratio", 7, kFloat},
                             {"pre_scaler_ratio", 8, kFloat},
                             {"frame_count", 9, kFloat},
                             {"exposure_time_msecs", 10, kFloat}});
  for (int i = 0; i < coordinates->field_count(); ++i) {
    ExpectPresence(coordinates, coordinates->field(i)->name(), true);
  }
}

TEST(TuningSchemaTest, UnsetLevelCoordinatesReadAsZero) {
  vosbrine::CameraState state;
  EXPECT_FALSE(state.has_level_coordinates());
  EXPECT_EQ(state.level_coordinates().cct(), 0.0f);
  EXPECT_EQ(state.level_coordinates().real_gain(), 0.0f);
  EXPECT_EQ(state.level_coordinates().frame_count(), 0.0f);
}

TEST(TuningSchemaTest, FrameCountIsAFloatCoordinate) {
  const auto* field = vosbrine::LevelCoordinates::descriptor()->FindFieldByName("frame_count");
  ASSERT_NE(field, nullptr);
  EXPECT_EQ(field->type(), kFloat);
}

TEST(TuningSchemaTest, ImageGeometryMessages) {
  ExpectFields(vosbrine::ImageResolution::descriptor(),
               {{"width", 1, kInt32}, {"height", 2, kInt32}});
  ExpectFields(vosbrine::Roi::descriptor(),
               {{"left", 1, kInt32}, {"top", 2, kInt32}, {"width", 3, kInt32},
                {"height", 4, kInt32}});
  ExpectFields(vosbrine::RoiList::descriptor(),
               {{"values", 1, kMessage, kRepeated, "vosbrine.Roi"}});
}

TEST(TuningSchemaTest, SensorConfigFields) {
  ExpectFields(vosbrine::SensorConfig::descriptor(),
               {{"bayer_pattern", 1, kEnum, kSingular, "vosbrine.BayerPattern"},
                {"sensor_width", 2, kInt32},
                {"sensor_height", 3, kInt32},
                {"bit_depth", 4, kInt32},
                {"sensor_type", 5, kEnum, kSingular, "vosbrine.SensorType"}});
}

TEST(TuningSchemaTest, BayerPatternValues) {
  ExpectEnumValues(vosbrine::BayerPattern_descriptor(),
                   {{0, "RGGB"}, {1, "BGGR"}, {2, "GRBG"}, {3, "GBRG"}});
}

TEST(TuningSchemaTest, SensorTypeValues) {
  ExpectEnumValues(vosbrine::SensorType_descriptor(), {{0, "INVALID_SENSOR_TYPE"},
                                                       {1, "SENSOR_TYPE_BAYER"},
                                                       {2, "SENSOR_TYPE_QUAD_BAYER"},
                                                       {3, "SENSOR_TYPE_MONO"}});
}

TEST(TuningSchemaTest, LscTablesHoldOneGridPerBayerChannel) {
  ExpectFields(vosbrine::LscTables::descriptor(),
               {{"width", 1, kInt32},
                {"height", 2, kInt32},
                {"lsc_grid_gain_r", 3, kFloat, kRepeated},
                {"lsc_grid_gain_gr", 4, kFloat, kRepeated},
                {"lsc_grid_gain_gb", 5, kFloat, kRepeated},
                {"lsc_grid_gain_b", 6, kFloat, kRepeated}});
}

TEST(TuningSchemaTest, LscCropInfoIsSixFloats) {
  ExpectFields(vosbrine::LscCropInfo::descriptor(), {{"width", 1, kFloat},
                                                     {"height", 2, kFloat},
                                                     {"margin_left", 3, kFloat},
                                                     {"margin_right", 4, kFloat},
                                                     {"margin_top", 5, kFloat},
                                                     {"margin_bottom", 6, kFloat}});
}

TEST(TuningSchemaTest, GoldenCalibrationNamesSensorAndPacksZelData) {
  ExpectFields(vosbrine::GoldenSensorFactoryCalibrationData::descriptor(),
               {{"camera_sensor", 1, kEnum, kSingular, "vosbrine.CameraSensor"},
                {"calibration_data", 2, kMessage, kSingular, "google.protobuf.Any"}});
  ExpectFields(vosbrine::zelmondrake::ZelSensorFactoryCalibrationData::descriptor(),
               {{"lsc", 1, kMessage, kSingular, "vosbrine.LscTables"}});
}

TEST(TuningSchemaTest, SharedFilesAreProto3ButCameraState) {
  using google::protobuf::FileDescriptor;
  for (const FileDescriptor* file :
       {vosbrine::TuningUsecaseData::descriptor()->file(),
        vosbrine::TuningTree::descriptor()->file(), vosbrine::Roi::descriptor()->file(),
        vosbrine::LscTables::descriptor()->file(),
        vosbrine::GoldenSensorFactoryCalibrationData::descriptor()->file(),
        vosbrine::zelmondrake::ZelSensorFactoryCalibrationData::descriptor()->file()}) {
    EXPECT_EQ(file->syntax(), FileDescriptor::SYNTAX_PROTO3) << file->name();
  }
}

TEST(TuningSchemaTest, KeyWithInvalidValuesIsAnOrdinaryMessage) {
  vosbrine::TuningUsecaseData data;
  data.mutable_tuning_usecase()->set_camera_sensor(vosbrine::INVALID_CAMERA_SENSOR);
  std::string bytes;
  ASSERT_TRUE(data.SerializeToString(&bytes));
  vosbrine::TuningUsecaseData parsed;
  ASSERT_TRUE(parsed.ParseFromString(bytes));
  EXPECT_EQ(vosbrine::CameraSensor_Name(parsed.tuning_usecase().camera_sensor()),
            "INVALID_CAMERA_SENSOR");
  EXPECT_EQ(parsed.version(), "");
}

}  // namespace
