#include "tools/common/module_calibration_file.h"

#include <algorithm>
#include <sstream>
#include <string>
#include <vector>

#include "gmock/gmock.h"
#include "google/protobuf/text_format.h"
#include "gtest/gtest.h"
#include "tavik/base/testing/status_matchers.h"
#include "tavik/base/testing/temp_dir.h"
#include "tavik/iq/protos/golden_sensor_factory_calibration_data.pb.h"
#include "tavik/iq/protos/lsc_tables.pb.h"
#include "tavik/iq/protos/tuning_usecase.pb.h"
#include "tavik/iq/zel/protos/lsc_param.pb.h"
#include "tavik/iq/zel/protos/sensor_factory_calibration_data.pb.h"
#include "tavik/iq/zel/protos/tuning_tree_set.pb.h"
#include "tools/tavik-tune/eval.h"
#include "tools/tavik-tune/testing/testdata.h"

namespace tavik::tools {
namespace {

using ::google::protobuf::RepeatedField;
using ::tavik::test::IsOk;
using ::tavik::test::StatusIs;
using ::tavik::test::TempDir;
using ::tavik::tune::test::TestdataPath;
using ::testing::ElementsAre;
using ::testing::HasSubstr;
using ::testing::IsEmpty;
using ::testing::SizeIs;
using ::testing::StartsWith;
using ::vosbrine::LscTables;

TuningSensorKey Key(const std::string& sensor_name, int facing, int lens_type, int sensor_kind) {
  return TuningSensorKey{sensor_name, {facing, lens_type, sensor_kind}};
}

// =================================================================================================
// ReadModuleCalibrationFile
// =================================================================================================

TEST(ReadModuleCalibrationFileTest, ReadsEveryModuleUnderItsKey) {
  StatusOr<ModuleCalibrationMap> map =
      ReadModuleCalibrationFile(TestdataPath("calibration/three_modules.textproto"));
  ASSERT_THAT(map, IsOk());
  ASSERT_THAT(*map, SizeIs(3));

  const auto gn1 = map->find(Key("GN1", 0, 0, 0));
  ASSERT_NE(gn1, map->end());
  const tavik_api::LensShadingCalibrationData& data = gn1->second;
  EXPECT_EQ(data.width, 3);
  EXPECT_EQ(data.height, 2);
  EXPECT_THAT(data.grid_gain_r, ElementsAre(2.5f, 2.0f, 2.25f, 2.75f, 2.125f, 2.375f));
  EXPECT_THAT(data.grid_gain_gr, ElementsAre(1.5f, 1.25f, 1.375f, 1.625f, 1.3125f, 1.4375f));
  EXPECT_THAT(data.grid_gain_gb, ElementsAre(1.75f, 1.5f, 1.625f, 1.875f, 1.5625f, 1.6875f));
  EXPECT_THAT(data.grid_gain_b, ElementsAre(3.0f, 2.5f, 2.75f, 3.25f, 2.625f, 2.875f));
  EXPECT_EQ(data.full_width, 4080);
  EXPECT_EQ(data.full_height, 3072);
  EXPECT_EQ(data.crop_width, 4032);
  EXPECT_EQ(data.crop_height, 3024);
  EXPECT_EQ(data.crop_left, 24);
  EXPECT_EQ(data.crop_top, 24);

  const auto imx663 = map->find(Key("IMX663", 1, 0, 0));
  ASSERT_NE(imx663, map->end());
  EXPECT_EQ(imx663->second.width, 1);
  EXPECT_EQ(imx663->second.height, 1);
  EXPECT_THAT(imx663->second.grid_gain_r, ElementsAre(1.5f));
  EXPECT_THAT(imx663->second.grid_gain_gr, ElementsAre(1.25f));
  EXPECT_THAT(imx663->second.grid_gain_gb, ElementsAre(1.125f));
  EXPECT_THAT(imx663->second.grid_gain_b, ElementsAre(1.75f));
  EXPECT_EQ(imx663->second.full_width, 3280);
  EXPECT_EQ(imx663->second.full_height, 2464);
  EXPECT_EQ(imx663->second.crop_width, 3264);
  EXPECT_EQ(imx663->second.crop_height, 2448);
  EXPECT_EQ(imx663->second.crop_left, 8);
  EXPECT_EQ(imx663->second.crop_top, 6);

  // Same facing and lens type as the IMX663; the sensor kind is part of the key.
  const auto infrared = map->find(Key("OVM7251", 1, 0, 1));
  ASSERT_NE(infrared, map->end());
  EXPECT_THAT(infrared->second.grid_gain_b, ElementsAre(1.0625f));
  EXPECT_EQ(infrared->second.full_width, 640);
}

TEST(ReadModuleCalibrationFileTest, EmptyFileGivesAnEmptyMap) {
  TempDir dir;
  const std::string path = dir.WriteFile("empty.textproto", "# No modules.\n");
  StatusOr<ModuleCalibrationMap> map = ReadModuleCalibrationFile(path);
  ASSERT_THAT(map, IsOk());
  EXPECT_THAT(*map, IsEmpty());
}

TEST(ReadModuleCalibrationFileTest, BadValueNamesFileLineAndColumn) {
  // Line 5 is "  width: seventeen": the value starts in column 10.
  const std::string path = TestdataPath("calibration/not_a_number.textproto");
  EXPECT_THAT(ReadModuleCalibrationFile(path),
              StatusIs(StatusCode::kInvalidArgument, StartsWith(path + ":5:10: ")));
  EXPECT_THAT(ReadModuleCalibrationFile(path),
              StatusIs(StatusCode::kInvalidArgument, HasSubstr("seventeen")));
}

TEST(ReadModuleCalibrationFileTest, UnknownFieldNamesFileLineAndColumn) {
  // Line 5 is "    colour: 3". The parser finds out that the name is unknown when it has read it,
  // and reports the token after it: the colon, in column 11.
  const std::string path = TestdataPath("calibration/unknown_field.textproto");
  EXPECT_THAT(ReadModuleCalibrationFile(path),
              StatusIs(StatusCode::kInvalidArgument, StartsWith(path + ":5:11: ")));
  EXPECT_THAT(ReadModuleCalibrationFile(path),
              StatusIs(StatusCode::kInvalidArgument, HasSubstr("colour")));
}

TEST(ReadModuleCalibrationFileTest, TwoModulesWithOneKeyFail) {
  const std::string path = TestdataPath("calibration/duplicate_module.textproto");
  EXPECT_THAT(ReadModuleCalibrationFile(path),
              StatusIs(StatusCode::kInvalidArgument,
                       path + ": two modules of sensor GN1 facing 0 lens_type 0"));
}

TEST(ReadModuleCalibrationFileTest, MissingFileIsNotFound) {
  TempDir dir;
  const std::string path = dir.Path("absent.textproto");
  EXPECT_THAT(ReadModuleCalibrationFile(path),
              StatusIs(StatusCode::kNotFound, path + ": cannot open"));
}

// =================================================================================================
// tavik-tune eval --calibration
// =================================================================================================

using Plane = std::vector<float>;

RepeatedField<float>* MutablePlane(LscTables& tables, int plane) {
  switch (plane) {
    case 0:
      return tables.mutable_lsc_grid_gain_r();
    case 1:
      return tables.mutable_lsc_grid_gain_gr();
    case 2:
      return tables.mutable_lsc_grid_gain_gb();
    default:
      return tables.mutable_lsc_grid_gain_b();
  }
}

// A 33 by 25 shading table: `base` at (`row0`, `col0`), rising towards the corners.
LscTables Shading(float base, float strength, float row0, float col0) {
  LscTables tables;
  tables.set_width(33);
  tables.set_height(25);
  for (int plane = 0; plane < 4; ++plane) {
    for (int row = 0; row < 25; ++row) {
      for (int col = 0; col < 33; ++col) {
        const float x = (static_cast<float>(col) - col0) / 16.0f;
        const float y = (static_cast<float>(row) - row0) / 12.0f;
        MutablePlane(tables, plane)
            ->Add(base + (strength + 0.1f * static_cast<float>(plane)) * (x * x + y * y));
      }
    }
  }
  return tables;
}

// What calibration makes of `tuning` against a device measured flat at `device[plane]`, worked by
// hand in single precision: ((device peak / golden peak) * golden) / device * tuning, gain by
// gain; then, if the smallest gain (scan from 1.1) is below 1.0, every gain divided by it.
LscTables CalibrateByHand(const float device[4], const LscTables& golden, const LscTables& tuning) {
  LscTables result = tuning;
  LscTables golden_copy = golden;
  float smallest = 1.1f;
  for (int plane = 0; plane < 4; ++plane) {
    const RepeatedField<float>& g = *MutablePlane(golden_copy, plane);
    const float max_golden = *std::max_element(g.begin(), g.end());
    const float scale = device[plane] / max_golden;
    RepeatedField<float>* t = MutablePlane(result, plane);
    for (int i = 0; i < t->size(); ++i) {
      const float scaled_golden = scale * g.Get(i);
      const float ratio = scaled_golden / device[plane];
      t->Set(i, ratio * t->Get(i));
      smallest = std::min(smallest, t->Get(i));
    }
  }
  if (smallest < 1.0f) {
    for (int plane = 0; plane < 4; ++plane) {
      for (float& gain : *MutablePlane(result, plane)) gain = gain / smallest;
    }
  }
  return result;
}

// The text of one block in eval's output: what follows "# <name>\n" up to the next "# ".
std::string BlockText(const std::string& output, const std::string& name) {
  const std::string header = "# " + name + "\n";
  const size_t start = output.find(header);
  if (start == std::string::npos) return "";
  const size_t body = start + header.size();
  const size_t end = output.find("\n# ", body);
  return output.substr(body, end == std::string::npos ? std::string::npos : end + 1 - body);
}

// A GN1 viewfinder tuning with one shading leaf over 2000 to 3000 K, and the GN1 golden record.
class EvalCalibrationTest : public ::testing::Test {
 protected:
  void SetUp() override {
    vosbrine::zelmondrake::LscDynamicParam leaf;
    *leaf.mutable_lsc_tables() = TuningTables();
    vosbrine::TuningTree tree;
    tree.set_enable(true);
    tree.mutable_static_param()->PackFrom(vosbrine::zelmondrake::LscStaticParam());
    vosbrine::Level* level = tree.mutable_dynamic_top_level();
    level->set_type(vosbrine::Level::CCT);
    vosbrine::Node* node = level->add_nodes();
    node->set_lower(2000);
    node->set_upper(3000);
    node->mutable_dynamic_param()->PackFrom(leaf);
    vosbrine::zelmondrake::TuningTreeSet set;
    *set.mutable_lsc() = tree;

    vosbrine::TuningUsecaseData data;
    data.mutable_tuning_usecase()->set_camera_sensor(vosbrine::BRIMAL_REAR_GN1_NORMAL);
    data.mutable_tuning_usecase()->set_sensor_mode(vosbrine::FULL_4_3_FULL_15_30FPS);
    data.mutable_tuning_usecase()->set_camera_usecase(vosbrine::VIEWFINDER);
    data.mutable_tuning_tree_set()->PackFrom(set);
    directory_.WriteFile("gn1_viewfinder.binarypb", data.SerializeAsString());

    vosbrine::GoldenSensorFactoryCalibrationData golden;
    golden.set_camera_sensor(vosbrine::BRIMAL_REAR_GN1_NORMAL);
    vosbrine::zelmondrake::ZelSensorFactoryCalibrationData calibration;
    *calibration.mutable_lsc() = GoldenTables();
    golden.mutable_calibration_data()->PackFrom(calibration);
    directory_.WriteFile("gn1_golden_sensor_factory_calibration_data.binarypb",
                         golden.SerializeAsString());
  }

  static LscTables TuningTables() { return Shading(1.0f, 1.4f, 12.0f, 16.0f); }
  static LscTables GoldenTables() { return Shading(1.0f, 1.2f, 11.5f, 16.5f); }

  // Runs eval of the shading block at 2500 K with `extra` arguments.
  Status Eval(const std::vector<std::string>& extra, std::string* output) {
    std::vector<std::string> args = {directory_.path(),
                                     "--sensor",
                                     "BRIMAL_REAR_GN1_NORMAL",
                                     "--mode",
                                     "FULL_4_3_FULL_15_30FPS",
                                     "--usecase",
                                     "VIEWFINDER",
                                     "--cct",
                                     "2500",
                                     "--block",
                                     "lsc"};
    args.insert(args.end(), extra.begin(), extra.end());
    StatusOr<tune::EvalRequest> request = tune::ParseEvalArgs(args);
    if (!request.ok()) return request.status();
    std::ostringstream out;
    const Status status = tune::RunEval(*request, out);
    *output = out.str();
    return status;
  }

  static LscTables ShownTables(const std::string& output) {
    vosbrine::zelmondrake::LscTuning lsc;
    EXPECT_TRUE(google::protobuf::TextFormat::ParseFromString(BlockText(output, "LscTuning"), &lsc))
        << output;
    return lsc.dynamic_param().lsc_tables();
  }

  TempDir directory_;
};

TEST_F(EvalCalibrationTest, WithoutCalibrationTheTablesAreAsWritten) {
  std::string output;
  ASSERT_THAT(Eval({}, &output), IsOk());
  EXPECT_EQ(ShownTables(output).SerializeAsString(), TuningTables().SerializeAsString());
}

TEST_F(EvalCalibrationTest, CalibrationFileIsAppliedToTheShadingTables) {
  std::string output;
  ASSERT_THAT(
      Eval({"--calibration", TestdataPath("calibration/gn1_flat.textproto"), "--device", "brimal"},
           &output),
      IsOk());
  // The module is flat at 1.5, 1.25, 1.25 and 1.75 per channel, and stays so on the tuning grid.
  const float device[4] = {1.5f, 1.25f, 1.25f, 1.75f};
  const LscTables expected = CalibrateByHand(device, GoldenTables(), TuningTables());
  ASSERT_NE(expected.SerializeAsString(), TuningTables().SerializeAsString());
  const LscTables shown = ShownTables(output);
  EXPECT_EQ(shown.width(), 33);
  EXPECT_EQ(shown.height(), 25);
  EXPECT_EQ(shown.SerializeAsString(), expected.SerializeAsString())
      << "expected:\n"
      << expected.ShortDebugString() << "\nshown:\n"
      << shown.ShortDebugString();
}

TEST_F(EvalCalibrationTest, DeviceNameDecidesTheSensorOfEachModule) {
  // On "fennelmoore" the module would be FENNELMOORE_REAR_GN1_NORMAL, which no sensor row names.
  const std::string path = TestdataPath("calibration/gn1_flat.textproto");
  std::string output;
  EXPECT_THAT(Eval({"--calibration", path, "--device", "fennelmoore"}, &output),
              StatusIs(StatusCode::kInvalidArgument,
                       path + ": no module of a known sensor with a usable grid"));
}

TEST_F(EvalCalibrationTest, CalibrationWithoutAKnownSensorFails) {
  const std::string path = TestdataPath("calibration/unsupported_module.textproto");
  std::string output;
  EXPECT_THAT(Eval({"--calibration", path}, &output),
              StatusIs(StatusCode::kInvalidArgument,
                       path + ": no module of a known sensor with a usable grid"));
}

TEST_F(EvalCalibrationTest, UnreadableCalibrationFileFails) {
  TempDir dir;
  const std::string missing = dir.Path("absent.textproto");
  std::string output;
  EXPECT_THAT(Eval({"--calibration", missing}, &output),
              StatusIs(StatusCode::kNotFound, missing + ": cannot open"));
  const std::string bad = TestdataPath("calibration/not_a_number.textproto");
  EXPECT_THAT(Eval({"--calibration", bad}, &output),
              StatusIs(StatusCode::kInvalidArgument, StartsWith(bad + ":5:10: ")));
}

TEST(EvalSampleCalibrationTest, SampleUnitReshapesTheSampleShadingAndKeepsGainsAtLeastOne) {
  // The sample GN1 viewfinder tuning and golden record, with the sample unit's measurement.
  TempDir directory;
  const std::string sample = "../../../tuning/";
  tune::test::CompileTestdata(directory,
                              sample + "brimal_rear_gn1_normal_full_4_3_full_15_30fps_viewfinder");
  tune::test::CompileTestdata(
      directory, sample + "brimal_rear_gn1_normal_golden_sensor_factory_calibration_data");
  const std::vector<std::string> args = {directory.path(),
                                         "--sensor",
                                         "BRIMAL_REAR_GN1_NORMAL",
                                         "--mode",
                                         "FULL_4_3_FULL_15_30FPS",
                                         "--usecase",
                                         "VIEWFINDER",
                                         "--cct",
                                         "2500",
                                         "--block",
                                         "lsc"};
  std::vector<std::string> calibrated_args = args;
  calibrated_args.insert(
      calibrated_args.end(),
      {"--calibration", TestdataPath(sample + "device/brimal_rear_gn1_normal_unit_0042.textproto"),
       "--device", "brimal"});
  std::vector<LscTables> tables;
  for (const std::vector<std::string>& each : {args, calibrated_args}) {
    StatusOr<tune::EvalRequest> request = tune::ParseEvalArgs(each);
    ASSERT_THAT(request, IsOk());
    std::ostringstream out;
    ASSERT_THAT(tune::RunEval(*request, out), IsOk());
    vosbrine::zelmondrake::LscTuning lsc;
    ASSERT_TRUE(
        google::protobuf::TextFormat::ParseFromString(BlockText(out.str(), "LscTuning"), &lsc));
    tables.push_back(lsc.dynamic_param().lsc_tables());
  }
  const LscTables& plain = tables[0];
  LscTables calibrated = tables[1];
  ASSERT_EQ(calibrated.width(), 33);
  ASSERT_EQ(calibrated.height(), 25);
  for (int plane = 0; plane < 4; ++plane) {
    const RepeatedField<float>& gains = *MutablePlane(calibrated, plane);
    ASSERT_THAT(gains, SizeIs(825));
    for (float gain : gains) EXPECT_GE(gain, 1.0f) << "plane " << plane;
  }
  EXPECT_NE(plain.SerializeAsString(), calibrated.SerializeAsString());
}

TEST(EvalCalibrationArgsTest, CalibrationAndDeviceAreParsed) {
  StatusOr<tune::EvalRequest> request = tune::ParseEvalArgs(
      {"dir", "--sensor", "BRIMAL_REAR_GN1_NORMAL", "--mode", "FULL_4_3_FULL_15_30FPS", "--usecase",
       "VIEWFINDER", "--calibration", "unit.textproto", "--device", "fennelmoore"});
  ASSERT_THAT(request, IsOk());
  EXPECT_EQ(request->calibration_path, "unit.textproto");
  EXPECT_EQ(request->device_name, "fennelmoore");

  request = tune::ParseEvalArgs({"dir", "--sensor", "BRIMAL_REAR_GN1_NORMAL", "--mode",
                                 "FULL_4_3_FULL_15_30FPS", "--usecase", "VIEWFINDER"});
  ASSERT_THAT(request, IsOk());
  EXPECT_EQ(request->calibration_path, "");
  EXPECT_EQ(request->device_name, "");
}

}  // namespace
}  // namespace tavik::tools
