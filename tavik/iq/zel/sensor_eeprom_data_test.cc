#include "tavik/iq/zel/sensor_eeprom_data.h"

#include <algorithm>
#include <filesystem>
#include <fstream>
#include <memory>
#include <sstream>
#include <string>
#include <utility>
#include <vector>

#include "gmock/gmock.h"
#include "gtest/gtest.h"
#include "tavik/base/camera_types.h"
#include "tavik/base/testing/log_capture.h"
#include "tavik/base/testing/status_matchers.h"
#include "tavik/base/testing/temp_dir.h"
#include "tavik/iq/protos/golden_sensor_factory_calibration_data.pb.h"
#include "tavik/iq/protos/lsc_tables.pb.h"
#include "tavik/iq/protos/tuning_tree.pb.h"
#include "tavik/iq/protos/tuning_usecase.pb.h"
#include "tavik/iq/testing/tuning_builders.h"
#include "tavik/iq/zel/protos/lsc_param.pb.h"
#include "tavik/iq/zel/protos/sensor_factory_calibration_data.pb.h"
#include "tavik/iq/zel/protos/tuning_tree_set.pb.h"
#include "tavik/iq/zel/protos/wb_param.pb.h"
#include "tavik/iq/zel/tuning_provider.h"

namespace tavik {
namespace {

using ::google::protobuf::Any;
using ::google::protobuf::RepeatedField;
using ::tavik::test::ChildNode;
using ::tavik::test::IsOk;
using ::tavik::test::LeafNode;
using ::tavik::test::MakeLevel;
using ::tavik::test::MakeTree;
using ::tavik::test::MakeUsecase;
using ::tavik::test::MakeUsecaseData;
using ::tavik::test::ProtoEquals;
using ::tavik::test::ScopedDeviceRoot;
using ::tavik::test::ScopedLogCapture;
using ::tavik::test::StatusIs;
using ::tavik::test::TempDir;
using ::tavik::test::WriteBinarypb;
using ::testing::ElementsAre;
using ::testing::HasSubstr;
using ::testing::IsEmpty;
using ::testing::SizeIs;
using ::vosbrine::GoldenSensorFactoryCalibrationData;
using ::vosbrine::Level;
using ::vosbrine::LscTables;
using ::vosbrine::SensorEepromData;
using ::vosbrine::SensorEepromDataMap;
using ::vosbrine::TuningTree;
using ::vosbrine::TuningUsecase;
using ::vosbrine::zelmondrake::LscDynamicParam;
using ::vosbrine::zelmondrake::LscStaticParam;
using ::vosbrine::zelmondrake::TuningProvider;
using ::vosbrine::zelmondrake::TuningTreeSet;
using ::vosbrine::zelmondrake::WbDynamicParam;
using ::vosbrine::zelmondrake::WbStaticParam;
using ::vosbrine::zelmondrake::ZelSensorEepromData;
using ::vosbrine::zelmondrake::ZelSensorFactoryCalibrationData;

using CalibrationMap = FlatHashMap<TuningSensorKey, tavik_api::LensShadingCalibrationData>;

constexpr android::base::LogSeverity kInfo = android::base::INFO;
constexpr android::base::LogSeverity kWarning = android::base::WARNING;
constexpr android::base::LogSeverity kError = android::base::ERROR;
constexpr StatusCode kInvalidArgument = StatusCode::kInvalidArgument;

constexpr long kGn1 = vosbrine::BRIMAL_REAR_GN1_NORMAL;
constexpr long kImx663 = vosbrine::BRIMAL_FRONT_IMX663_NORMAL;
constexpr char kGoldenMarker[] = "golden_sensor_factory_calibration_data";
constexpr char kGn1DumpPath[] = "/data/vendor/camera/BRIMAL_REAR_GN1_NORMAL_lsc_eeprom.txt";

// --- Tables
// ----------------------------------------------------------------------------------------

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

Plane GetPlane(const LscTables& tables, int plane) {
  const RepeatedField<float>& field = plane == 0   ? tables.lsc_grid_gain_r()
                                      : plane == 1 ? tables.lsc_grid_gain_gr()
                                      : plane == 2 ? tables.lsc_grid_gain_gb()
                                                   : tables.lsc_grid_gain_b();
  return Plane(field.begin(), field.end());
}

// Each node of each plane holds `gain(plane, row, col)`.
template <typename Gain>
LscTables TablesOf(int width, int height, Gain gain) {
  LscTables tables;
  tables.set_width(width);
  tables.set_height(height);
  for (int plane = 0; plane < 4; ++plane) {
    RepeatedField<float>* field = MutablePlane(tables, plane);
    for (int row = 0; row < height; ++row) {
      for (int col = 0; col < width; ++col) field->Add(gain(plane, row, col));
    }
  }
  return tables;
}

// A 33 by 25 shading table: `base` at (`row0`, `col0`), rising by `strength` (a little more per
// plane) towards the corners.
LscTables Shading(float base, float strength, float row0, float col0) {
  return TablesOf(33, 25, [=](int plane, int row, int col) {
    const float x = (static_cast<float>(col) - col0) / 16.0f;
    const float y = (static_cast<float>(row) - row0) / 12.0f;
    return base + (strength + 0.1f * static_cast<float>(plane)) * (x * x + y * y);
  });
}

// A table whose four planes are flat at the given gains.
LscTables Flat(int width, int height, float r, float gr, float gb, float b) {
  const float gains[4] = {r, gr, gb, b};
  return TablesOf(width, height, [&gains](int plane, int, int) { return gains[plane]; });
}

// What calibration makes of `tuning`, worked by hand in single precision: each plane scaled by
// ((device peak / golden peak) * golden) / device, gain by gain; then, if the smallest gain of
// the four planes (the scan starting at 1.1) lies below 1.0, all gains divided by it.
LscTables CalibrateByHand(const LscTables& device, const LscTables& golden,
                          const LscTables& tuning) {
  LscTables result = tuning;
  float smallest = 1.1f;
  for (int plane = 0; plane < 4; ++plane) {
    const Plane d = GetPlane(device, plane);
    const Plane g = GetPlane(golden, plane);
    float max_device = 0.0f;
    float max_golden = 0.0f;
    for (size_t i = 0; i < d.size(); ++i) {
      max_device = std::max(max_device, d[i]);
      max_golden = std::max(max_golden, g[i]);
    }
    const float scale = max_device / max_golden;
    RepeatedField<float>* t = MutablePlane(result, plane);
    for (int i = 0; i < t->size(); ++i) {
      const float scaled_golden = scale * g[i];
      const float ratio = scaled_golden / d[i];
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

// --- Tuning data
// -----------------------------------------------------------------------------------

TuningUsecase Gn1Viewfinder() {
  return MakeUsecase(vosbrine::BRIMAL_REAR_GN1_NORMAL, vosbrine::FULL_4_3_FULL_15_30FPS,
                     vosbrine::VIEWFINDER);
}

TuningUsecase Gn1Snapshot() {
  return MakeUsecase(vosbrine::BRIMAL_REAR_GN1_NORMAL, vosbrine::FULL_4_3_FULL_15_30FPS,
                     vosbrine::SNAPSHOT);
}

TuningUsecase Imx663Viewfinder() {
  return MakeUsecase(vosbrine::BRIMAL_FRONT_IMX663_NORMAL, vosbrine::FULL_4_3_FULL_15_30FPS,
                     vosbrine::VIEWFINDER);
}

LscDynamicParam LscLeaf(const LscTables& tables, float gradient_threshold) {
  LscDynamicParam param;
  *param.mutable_lsc_tables() = tables;
  param.mutable_vorel_dynamic_param()->set_gradient_threshold(gradient_threshold);
  return param;
}

LscStaticParam LscStatic() {
  LscStaticParam param;
  param.set_enable_vorel(true);
  return param;
}

// Shading trees of three leaves, depth first: a CCT level whose first region splits by BV into
// leaves 0 and 1, and whose second region is leaf 2.
TuningTree ThreeLeafLscTree(const google::protobuf::Message& leaf0,
                            const google::protobuf::Message& leaf1,
                            const google::protobuf::Message& leaf2) {
  Level bv = MakeLevel(Level::BV, {LeafNode(0, 5, leaf0), LeafNode(8, 12, leaf1)});
  return MakeTree(
      true, LscStatic(),
      MakeLevel(Level::CCT, {ChildNode(2000, 3000, std::move(bv)), LeafNode(5000, 6000, leaf2)}));
}

// The tuning tables of the three leaves.
const std::vector<LscTables>& LeafTables() {
  static const auto* const tables = new std::vector<LscTables>{Shading(1.0f, 1.4f, 12.0f, 16.0f),
                                                               Shading(1.05f, 1.1f, 11.0f, 17.0f),
                                                               Shading(0.95f, 1.6f, 13.0f, 15.0f)};
  return *tables;
}

// A tree set with a three-leaf shading tree and a white-balance tree.
TuningTreeSet TreeSetWithShading(const std::vector<LscTables>& leaves) {
  TuningTreeSet set;
  *set.mutable_lsc() = ThreeLeafLscTree(LscLeaf(leaves[0], 0.25f), LscLeaf(leaves[1], 0.5f),
                                        LscLeaf(leaves[2], 0.75f));
  WbDynamicParam wb;
  wb.add_wb_gains(2.0f);
  *set.mutable_wb() = MakeTree(true, WbStaticParam(), MakeLevel(Level::CCT, {LeafNode(0, 1, wb)}));
  return set;
}

// The measurements. The device's centre sits to the right of the golden one's, and it falls off
// more.
LscTables DeviceTables() { return Shading(1.0f, 1.5f, 12.0f, 17.5f); }
LscTables Gn1GoldenTables() { return Shading(1.0f, 1.3f, 12.0f, 16.0f); }
LscTables Imx663GoldenTables() { return Shading(1.0f, 0.9f, 10.0f, 14.0f); }

GoldenSensorFactoryCalibrationData Golden(vosbrine::CameraSensor sensor, const LscTables& lsc) {
  GoldenSensorFactoryCalibrationData golden;
  golden.set_camera_sensor(sensor);
  ZelSensorFactoryCalibrationData data;
  *data.mutable_lsc() = lsc;
  golden.mutable_calibration_data()->PackFrom(data);
  return golden;
}

std::unique_ptr<const SensorEepromData> DeviceData(const LscTables& tables) {
  return std::make_unique<const ZelSensorEepromData>(tables);
}

// The leaves of a shading tree, depth first in node order, by a walk of this test's own.
void CollectLeaves(const Level& level, std::vector<Any>* leaves) {
  for (const vosbrine::Node& node : level.nodes()) {
    if (node.has_child_level()) {
      CollectLeaves(node.child_level(), leaves);
    } else if (node.has_dynamic_param()) {
      leaves->push_back(node.dynamic_param());
    }
  }
}

std::vector<LscDynamicParam> LscLeaves(const TuningTreeSet& set) {
  std::vector<Any> anys;
  CollectLeaves(set.lsc().dynamic_top_level(), &anys);
  std::vector<LscDynamicParam> leaves;
  for (const Any& any : anys) {
    LscDynamicParam param;
    EXPECT_TRUE(any.UnpackTo(&param)) << any.type_url();
    leaves.push_back(param);
  }
  return leaves;
}

std::string Summary(int tuning_found, int tuning_parsed, int golden_found, int golden_parsed,
                    int calibrated) {
  std::ostringstream line;
  line << "Tuning binarypb found: " << tuning_found << " Tuning binarypb parsed: " << tuning_parsed
       << " Golden data binarypb found: " << golden_found
       << " Golden data binarypb parsed: " << golden_parsed
       << " Calibration applied: " << calibrated;
  return line.str();
}

// --- Calibration data from the service
// -------------------------------------------------------------

TuningSensorKey Key(const std::string& sensor_name, int facing, int lens_type = 0,
                    int sensor_kind = 0) {
  return TuningSensorKey{sensor_name, {facing, lens_type, sensor_kind}};
}

// A module's measurement with the four planes flat, over the 4032 by 3024 area centred in a
// 4080 by 3072 sensor.
tavik_api::LensShadingCalibrationData FlatModule(int width, int height, float r, float gr, float gb,
                                                 float b) {
  tavik_api::LensShadingCalibrationData data;
  data.width = width;
  data.height = height;
  const size_t nodes = static_cast<size_t>(width) * height;
  data.grid_gain_r.assign(nodes, r);
  data.grid_gain_gr.assign(nodes, gr);
  data.grid_gain_gb.assign(nodes, gb);
  data.grid_gain_b.assign(nodes, b);
  data.full_width = 4080;
  data.full_height = 3072;
  data.crop_width = 4032;
  data.crop_height = 3024;
  data.crop_left = 24;
  data.crop_top = 24;
  return data;
}

const LscTables* EepromTables(const vosbrine::SensorEepromDataMap& map, long sensor) {
  const auto entry = map.find(sensor);
  if (entry == map.end()) return nullptr;
  const auto* data = dynamic_cast<const ZelSensorEepromData*>(entry->second.get());
  EXPECT_NE(data, nullptr) << "not a ZelSensorEepromData";
  return data == nullptr ? nullptr : &data->lsc_tables;
}

std::string ReadFile(const std::string& path) {
  std::ifstream in(path, std::ios::binary);
  std::ostringstream text;
  text << in.rdbuf();
  return text.str();
}

// "name: [v, v, ... v]\n", `count` times `value`, as the short form of a repeated field prints.
std::string ShortRepeated(const std::string& name, const std::string& value, int count) {
  std::string line = name + ": [";
  for (int i = 0; i < count; ++i) line += (i == 0 ? "" : ", ") + value;
  return line + "]\n";
}

// =================================================================================================
// BuildTuningEepromData
// =================================================================================================

TEST(ZelSensorEepromDataTest, HoldsItsTablesAndIsASensorEepromData) {
  const LscTables tables = DeviceTables();
  const std::unique_ptr<const SensorEepromData> data = DeviceData(tables);
  const auto* zel = dynamic_cast<const ZelSensorEepromData*>(data.get());
  ASSERT_NE(zel, nullptr);
  EXPECT_TRUE(ProtoEquals(tables, zel->lsc_tables));
}

TEST(BuildTuningEepromDataTest, ResizesTheCoveredAreaToTheTuningGrid) {
  // A 5 by 4 grid over a 400 by 400 sensor, of which it covers 200 by 200 from (50, 50). The
  // margins are 50 left, 400 - 50 - 200 = 150 right, 50 top, 400 - 50 - 200 = 150 bottom: the
  // 33 output columns run from 50 * 4 / 400 = 0.5 to (50 + 200) * 4 / 400 = 2.5 input nodes in
  // steps of 1/16, the 25 rows from 50 * 3 / 400 = 0.375 to 250 * 3 / 400 = 1.875, also in steps
  // of 1/16: all positions are exact.
  const LscTables grid = TablesOf(5, 4, [](int plane, int row, int col) {
    return 1.0f + static_cast<float>(col * col) * 0.125f + static_cast<float>(row) * 0.25f +
           static_cast<float>(row * col) * 0.0625f + 0.5f * static_cast<float>(plane);
  });
  tavik_api::LensShadingCalibrationData data;
  data.width = 5;
  data.height = 4;
  data.grid_gain_r = GetPlane(grid, 0);
  data.grid_gain_gr = GetPlane(grid, 1);
  data.grid_gain_gb = GetPlane(grid, 2);
  data.grid_gain_b = GetPlane(grid, 3);
  data.full_width = 400;
  data.full_height = 400;
  data.crop_width = 200;
  data.crop_height = 200;
  data.crop_left = 50;
  data.crop_top = 50;
  CalibrationMap calibration;
  calibration.emplace(Key("GN1", 0), data);

  const std::shared_ptr<SensorEepromDataMap> eeprom =
      BuildTuningEepromData("brimal", calibration, /*dump=*/false);
  ASSERT_NE(eeprom, nullptr);
  ASSERT_THAT(*eeprom, SizeIs(1));
  const LscTables* resized = EepromTables(*eeprom, kGn1);
  ASSERT_NE(resized, nullptr);
  ASSERT_EQ(resized->width(), 33);
  ASSERT_EQ(resized->height(), 25);

  auto at = [&grid](int plane, int row, int col) {
    return GetPlane(grid, plane)[static_cast<size_t>(row) * 5 + col];
  };
  for (int plane = 0; plane < 4; ++plane) {
    const Plane actual = GetPlane(*resized, plane);
    ASSERT_EQ(actual.size(), 825u);
    for (int i = 0; i < 25; ++i) {
      for (int j = 0; j < 33; ++j) {
        const float row_position = 0.375f + 0.0625f * static_cast<float>(i);
        const float col_position = 0.5f + 0.0625f * static_cast<float>(j);
        const int row = static_cast<int>(row_position);
        const int col = static_cast<int>(col_position);
        const float row_fraction = row_position - static_cast<float>(row);
        const float col_fraction = col_position - static_cast<float>(col);
        const float a = at(plane, row, col);
        const float b = at(plane, row, col + 1);
        const float c = at(plane, row + 1, col);
        const float d = at(plane, row + 1, col + 1);
        const float top = a + (b - a) * col_fraction;
        const float bottom = c + (d - c) * col_fraction;
        ASSERT_EQ(actual[i * 33 + j], top + row_fraction * (bottom - top))
            << "plane " << plane << " (" << i << ", " << j << ")";
      }
    }
  }
  // Red's last node, by hand: row 1.875, column 2.5. a = in(1, 2) = 1.875, b = in(1, 3) = 2.5625,
  // c = in(2, 2) = 2.25, d = in(2, 3) = 3.0; top = 2.21875, bottom = 2.625,
  // value = 2.21875 + 0.875 * 0.40625 = 2.57421875.
  EXPECT_EQ(resized->lsc_grid_gain_r(824), 2.57421875f);
  // Its first: row 0.375, column 0.5. a = 1.0, b = 1.125, c = 1.25, d = 1.4375; top = 1.0625,
  // bottom = 1.34375, value = 1.0625 + 0.375 * 0.28125 = 1.16796875.
  EXPECT_EQ(resized->lsc_grid_gain_r(0), 1.16796875f);
}

TEST(BuildTuningEepromDataTest, ResultIsKeyedByTheNumericSensor) {
  CalibrationMap calibration;
  calibration.emplace(Key("GN1", 0), FlatModule(17, 13, 1.5f, 1.25f, 1.25f, 1.75f));
  calibration.emplace(Key("IMX663", 1), FlatModule(17, 13, 2.0f, 1.5f, 1.5f, 2.5f));
  const std::shared_ptr<SensorEepromDataMap> eeprom =
      BuildTuningEepromData("brimal", calibration, /*dump=*/false);
  ASSERT_NE(eeprom, nullptr);
  ASSERT_THAT(*eeprom, SizeIs(2));
  ASSERT_NE(EepromTables(*eeprom, 7), nullptr);
  ASSERT_NE(EepromTables(*eeprom, 6), nullptr);
  // Flat planes stay flat through the resize, exactly.
  EXPECT_TRUE(ProtoEquals(Flat(33, 25, 1.5f, 1.25f, 1.25f, 1.75f), *EepromTables(*eeprom, 7)));
  EXPECT_TRUE(ProtoEquals(Flat(33, 25, 2.0f, 1.5f, 1.5f, 2.5f), *EepromTables(*eeprom, 6)));
}

// The only test of this file that skips a module for its sensor, so that the rate-limited line
// "<name> is not supported." (once per 5 s for its call site in the process) is seen here.
TEST(BuildTuningEepromDataTest, UnsupportedModuleIsSkippedWithALineAndTheOthersLoad) {
  // Lens type 3 has no row in the sensor enum. (It is refused before any name is looked up, so
  // that the converter's own rate-limited warning for unknown names is left to its own tests.)
  CalibrationMap calibration;
  calibration.emplace(Key("IMX481", 0, /*lens_type=*/3),
                      FlatModule(17, 13, 3.0f, 3.0f, 3.0f, 3.0f));
  calibration.emplace(Key("GN1", 0), FlatModule(17, 13, 1.5f, 1.25f, 1.25f, 1.75f));
  ScopedLogCapture capture;
  const std::shared_ptr<SensorEepromDataMap> eeprom =
      BuildTuningEepromData("brimal", calibration, /*dump=*/false);
  ASSERT_NE(eeprom, nullptr);
  ASSERT_THAT(*eeprom, SizeIs(1));
  ASSERT_NE(EepromTables(*eeprom, kGn1), nullptr);
  EXPECT_TRUE(ProtoEquals(Flat(33, 25, 1.5f, 1.25f, 1.25f, 1.75f), *EepromTables(*eeprom, kGn1)));
  EXPECT_THAT(capture.messages(kWarning), ElementsAre("IMX481 is not supported."));
}

// The only test of this file whose module fails the resize, so that the rate-limited line
// "<name> lsc calibration data resize failed." is seen here.
TEST(BuildTuningEepromDataTest, MarginsAreCountedInIntegersBeforeTheyBecomeFloats) {
  // A sensor 2^24 + 1 pixels wide, of which the grid covers the first pixel. In integers the
  // right margin is 16777217 - 0 - 1 = 16777216, and the frame width becomes 16777216 as a float:
  // no pixel is left and the resize fails. (In floats the right margin would be
  // 16777216 - 0 - 1 = 16777215, leaving exactly one pixel, and the resize would pass.)
  tavik_api::LensShadingCalibrationData narrow = FlatModule(3, 3, 1.5f, 1.5f, 1.5f, 1.5f);
  narrow.full_width = 16777217;
  narrow.crop_left = 0;
  narrow.crop_width = 1;
  CalibrationMap calibration;
  calibration.emplace(Key("GN1", 0), narrow);
  calibration.emplace(Key("IMX663", 1), FlatModule(17, 13, 2.0f, 1.5f, 1.5f, 2.5f));
  ScopedLogCapture capture;
  const std::shared_ptr<SensorEepromDataMap> eeprom =
      BuildTuningEepromData("brimal", calibration, /*dump=*/false);
  ASSERT_NE(eeprom, nullptr);
  ASSERT_THAT(*eeprom, SizeIs(1));
  EXPECT_NE(EepromTables(*eeprom, kImx663), nullptr);
  EXPECT_THAT(capture.messages(kWarning), ElementsAre("GN1 lsc calibration data resize failed."));
}

// The only test of this file that yields no data, so that the rate-limited line
// "BuildTuningEepromData: No eeprom data available" is seen here.
TEST(BuildTuningEepromDataTest, NoModuleGivesNullWithALine) {
  ScopedLogCapture capture;
  EXPECT_EQ(BuildTuningEepromData("brimal", CalibrationMap(), /*dump=*/true), nullptr);
  EXPECT_THAT(capture.messages(kWarning),
              ElementsAre("BuildTuningEepromData: No eeprom data available"));
  EXPECT_THAT(capture.messages(kInfo), IsEmpty());
}

TEST(BuildTuningEepromDataTest, TwoModulesOfOneSensorKeepTheFirstInMapOrder) {
  // Front facings 1 and 2 both name BRIMAL_FRONT_IMX663_NORMAL.
  CalibrationMap calibration;
  calibration.emplace(Key("IMX663", 1), FlatModule(17, 13, 1.5f, 1.5f, 1.5f, 1.5f));
  calibration.emplace(Key("IMX663", 2), FlatModule(17, 13, 2.5f, 2.5f, 2.5f, 2.5f));
  const float first_gain = calibration.begin()->first.module_spec.facing == 1 ? 1.5f : 2.5f;

  const std::shared_ptr<SensorEepromDataMap> eeprom =
      BuildTuningEepromData("brimal", calibration, /*dump=*/false);
  ASSERT_NE(eeprom, nullptr);
  ASSERT_THAT(*eeprom, SizeIs(1));
  ASSERT_NE(EepromTables(*eeprom, kImx663), nullptr);
  EXPECT_TRUE(ProtoEquals(Flat(33, 25, first_gain, first_gain, first_gain, first_gain),
                          *EepromTables(*eeprom, kImx663)));
}

// --- The dump file
// ---------------------------------------------------------------------------------

class BuildTuningEepromDataDumpTest : public ::testing::Test {
 protected:
  std::string DumpDirectory() const { return root_.path() + "/data/vendor/camera"; }
  void MakeDumpDirectory() const { std::filesystem::create_directories(DumpDirectory()); }

  ScopedDeviceRoot root_;
};

TEST_F(BuildTuningEepromDataDumpTest, WritesBothTablesInShortTextForm) {
  MakeDumpDirectory();
  CalibrationMap calibration;
  calibration.emplace(Key("GN1", 0), FlatModule(3, 2, 1.5f, 1.25f, 1.75f, 2.0f));
  ScopedLogCapture capture;
  const std::shared_ptr<SensorEepromDataMap> eeprom =
      BuildTuningEepromData("brimal", calibration, /*dump=*/true);
  ASSERT_NE(eeprom, nullptr);
  EXPECT_THAT(capture.messages(kInfo),
              ElementsAre(std::string("Trying to dump ") + kGn1DumpPath,
                          std::string("Finished dumping: ") + kGn1DumpPath));

  const std::string expected =
      "# calibration_lsc_tables.\n"
      "width: 3\n"
      "height: 2\n" +
      ShortRepeated("lsc_grid_gain_r", "1.5", 6) + ShortRepeated("lsc_grid_gain_gr", "1.25", 6) +
      ShortRepeated("lsc_grid_gain_gb", "1.75", 6) + ShortRepeated("lsc_grid_gain_b", "2", 6) +
      "\n"
      "# resized_lsc_tables.\n"
      "width: 33\n"
      "height: 25\n" +
      ShortRepeated("lsc_grid_gain_r", "1.5", 825) +
      ShortRepeated("lsc_grid_gain_gr", "1.25", 825) +
      ShortRepeated("lsc_grid_gain_gb", "1.75", 825) + ShortRepeated("lsc_grid_gain_b", "2", 825) +
      "\n";
  EXPECT_EQ(ReadFile(DumpDirectory() + "/BRIMAL_REAR_GN1_NORMAL_lsc_eeprom.txt"), expected);
}

TEST_F(BuildTuningEepromDataDumpTest, OverwritesAnOlderFile) {
  MakeDumpDirectory();
  const std::string path = DumpDirectory() + "/BRIMAL_REAR_GN1_NORMAL_lsc_eeprom.txt";
  { std::ofstream(path) << std::string(100000, 'x'); }
  CalibrationMap calibration;
  calibration.emplace(Key("GN1", 0), FlatModule(3, 2, 1.5f, 1.25f, 1.75f, 2.0f));
  ASSERT_NE(BuildTuningEepromData("brimal", calibration, /*dump=*/true), nullptr);
  const std::string text = ReadFile(path);
  EXPECT_EQ(text.rfind("# calibration_lsc_tables.\n", 0), 0u);
  EXPECT_EQ(text.find('x'), std::string::npos);
}

TEST_F(BuildTuningEepromDataDumpTest, EachSensorHasItsOwnFile) {
  MakeDumpDirectory();
  CalibrationMap calibration;
  calibration.emplace(Key("GN1", 0), FlatModule(3, 2, 1.5f, 1.25f, 1.75f, 2.0f));
  calibration.emplace(Key("IMX663", 1), FlatModule(3, 2, 2.5f, 2.25f, 2.75f, 3.0f));
  ScopedLogCapture capture;
  ASSERT_NE(BuildTuningEepromData("brimal", calibration, /*dump=*/true), nullptr);
  EXPECT_THAT(ReadFile(DumpDirectory() + "/BRIMAL_REAR_GN1_NORMAL_lsc_eeprom.txt"),
              HasSubstr(ShortRepeated("lsc_grid_gain_r", "1.5", 825)));
  EXPECT_THAT(ReadFile(DumpDirectory() + "/BRIMAL_FRONT_IMX663_NORMAL_lsc_eeprom.txt"),
              HasSubstr(ShortRepeated("lsc_grid_gain_r", "2.5", 825)));
  EXPECT_THAT(capture.messages(kInfo), SizeIs(4));
}

TEST_F(BuildTuningEepromDataDumpTest, TwoModulesOfOneSensorLeaveTheFileOfTheLastInMapOrder) {
  // Each module is dumped before it is offered to the map: the map keeps the first, the file
  // holds the last.
  MakeDumpDirectory();
  CalibrationMap calibration;
  calibration.emplace(Key("IMX663", 1), FlatModule(3, 3, 1.5f, 1.5f, 1.5f, 1.5f));
  calibration.emplace(Key("IMX663", 3), FlatModule(3, 3, 2.5f, 2.5f, 2.5f, 2.5f));
  std::vector<std::string> gains_in_map_order;
  for (const auto& [key, data] : calibration) {
    gains_in_map_order.push_back(key.module_spec.facing == 1 ? "1.5" : "2.5");
  }
  const std::shared_ptr<SensorEepromDataMap> eeprom =
      BuildTuningEepromData("brimal", calibration, /*dump=*/true);
  ASSERT_NE(eeprom, nullptr);
  ASSERT_NE(EepromTables(*eeprom, kImx663), nullptr);
  EXPECT_EQ(EepromTables(*eeprom, kImx663)->lsc_grid_gain_r(0),
            gains_in_map_order.front() == "1.5" ? 1.5f : 2.5f);
  EXPECT_THAT(ReadFile(DumpDirectory() + "/BRIMAL_FRONT_IMX663_NORMAL_lsc_eeprom.txt"),
              HasSubstr(ShortRepeated("lsc_grid_gain_r", gains_in_map_order.back(), 825)));
}

TEST_F(BuildTuningEepromDataDumpTest, UnwritableDirectoryChangesNothingButTheMissingFile) {
  CalibrationMap calibration;
  calibration.emplace(Key("GN1", 0), FlatModule(17, 13, 1.5f, 1.25f, 1.75f, 2.0f));
  calibration.emplace(Key("IMX663", 1), FlatModule(17, 13, 2.5f, 2.25f, 2.75f, 3.0f));
  const std::shared_ptr<SensorEepromDataMap> without_dump =
      BuildTuningEepromData("brimal", calibration, /*dump=*/false);
  ASSERT_NE(without_dump, nullptr);

  // First no directory at all, then a plain file where the directory should be.
  for (const bool file_in_the_way : {false, true}) {
    SCOPED_TRACE(file_in_the_way ? "a file in the way" : "no directory");
    if (file_in_the_way) {
      std::filesystem::create_directories(root_.path() + "/data/vendor");
      std::ofstream(DumpDirectory()) << "not a directory";
    }
    ScopedLogCapture capture;
    const std::shared_ptr<SensorEepromDataMap> with_dump =
        BuildTuningEepromData("brimal", calibration, /*dump=*/true);
    ASSERT_NE(with_dump, nullptr);
    ASSERT_THAT(*with_dump, SizeIs(2));
    for (const long sensor : {kGn1, kImx663}) {
      ASSERT_NE(EepromTables(*with_dump, sensor), nullptr);
      EXPECT_TRUE(
          ProtoEquals(*EepromTables(*without_dump, sensor), *EepromTables(*with_dump, sensor)));
    }
    // Tried, silently given up, and the run went on.
    std::vector<std::string> info = capture.messages(kInfo);
    EXPECT_THAT(info, SizeIs(2));
    for (const std::string& line : info) EXPECT_EQ(line.rfind("Trying to dump ", 0), 0u) << line;
    EXPECT_THAT(capture.messages(kWarning), IsEmpty());
    EXPECT_THAT(capture.messages(kError), IsEmpty());
    EXPECT_FALSE(std::filesystem::is_directory(DumpDirectory()));
  }
}

TEST_F(BuildTuningEepromDataDumpTest, NoDumpWritesNoFileAndNoLine) {
  MakeDumpDirectory();
  CalibrationMap calibration;
  calibration.emplace(Key("GN1", 0), FlatModule(3, 2, 1.5f, 1.25f, 1.75f, 2.0f));
  ScopedLogCapture capture;
  ASSERT_NE(BuildTuningEepromData("brimal", calibration, /*dump=*/false), nullptr);
  EXPECT_TRUE(std::filesystem::is_empty(DumpDirectory()));
  EXPECT_THAT(capture.messages(kInfo), IsEmpty());
}

// =================================================================================================
// TuningProvider::ApplySensorEepromCalibration
// =================================================================================================

class ApplySensorEepromCalibrationTest : public ::testing::Test {
 protected:
  void SetUp() override {
    const std::string path =
        WriteBinarypb(dir_, "gn1.binarypb", MakeUsecaseData(Gn1Viewfinder(), TuningTreeSet()));
    StatusOr<std::unique_ptr<TuningProvider>> provider = TuningProvider::Create({path}, nullptr);
    ASSERT_THAT(provider, IsOk());
    provider_ = std::move(provider).value();
  }

  Status Apply(const std::unique_ptr<const SensorEepromData>& device,
               const GoldenSensorFactoryCalibrationData& golden, TuningTreeSet* set) const {
    return provider_->ApplySensorEepromCalibration(device, golden, set);
  }

  TempDir dir_;
  std::unique_ptr<TuningProvider> provider_;
};

TEST_F(ApplySensorEepromCalibrationTest, RewritesEveryLeafWithItsCalibratedTables) {
  const TuningTreeSet before = TreeSetWithShading(LeafTables());
  TuningTreeSet set = before;
  ASSERT_THAT(Apply(DeviceData(DeviceTables()),
                    Golden(vosbrine::BRIMAL_REAR_GN1_NORMAL, Gn1GoldenTables()), &set),
              IsOk());
  const std::vector<LscDynamicParam> leaves = LscLeaves(set);
  ASSERT_THAT(leaves, SizeIs(3));
  const float thresholds[3] = {0.25f, 0.5f, 0.75f};
  for (int i = 0; i < 3; ++i) {
    SCOPED_TRACE("leaf " + std::to_string(i));
    const LscTables expected = CalibrateByHand(DeviceTables(), Gn1GoldenTables(), LeafTables()[i]);
    EXPECT_FALSE(ProtoEquals(LeafTables()[i], expected)) << "the data of this test must change";
    EXPECT_TRUE(ProtoEquals(expected, leaves[i].lsc_tables()));
    EXPECT_EQ(leaves[i].vorel_dynamic_param().gradient_threshold(), thresholds[i]);
  }
  // The rest of the set is as it was: the tree's switch, static part, levels, and other trees.
  TuningTreeSet rest = set;
  TuningTreeSet rest_before = before;
  for (TuningTreeSet* s : {&rest, &rest_before}) {
    Level* top = s->mutable_lsc()->mutable_dynamic_top_level();
    top->mutable_nodes(0)->mutable_child_level()->mutable_nodes(0)->clear_dynamic_param();
    top->mutable_nodes(0)->mutable_child_level()->mutable_nodes(1)->clear_dynamic_param();
    top->mutable_nodes(1)->clear_dynamic_param();
  }
  EXPECT_TRUE(ProtoEquals(rest_before, rest));
}

TEST_F(ApplySensorEepromCalibrationTest, NullTreeSetFails) {
  EXPECT_THAT(Apply(DeviceData(DeviceTables()),
                    Golden(vosbrine::BRIMAL_REAR_GN1_NORMAL, Gn1GoldenTables()), nullptr),
              StatusIs(kInvalidArgument, "tuning_tree_set is nullptr."));
  // Checked before the device data.
  EXPECT_THAT(Apply(nullptr, Golden(vosbrine::BRIMAL_REAR_GN1_NORMAL, Gn1GoldenTables()), nullptr),
              StatusIs(kInvalidArgument, "tuning_tree_set is nullptr."));
}

class OtherEepromData : public SensorEepromData {};

TEST_F(ApplySensorEepromCalibrationTest, MissingOrForeignDeviceDataFails) {
  const GoldenSensorFactoryCalibrationData golden =
      Golden(vosbrine::BRIMAL_REAR_GN1_NORMAL, Gn1GoldenTables());
  const TuningTreeSet before = TreeSetWithShading(LeafTables());
  std::vector<std::unique_ptr<const SensorEepromData>> devices;
  devices.push_back(nullptr);
  devices.push_back(std::make_unique<const SensorEepromData>());
  devices.push_back(std::make_unique<const OtherEepromData>());
  for (const std::unique_ptr<const SensorEepromData>& device : devices) {
    TuningTreeSet set = before;
    EXPECT_THAT(Apply(device, golden, &set),
                StatusIs(kInvalidArgument, "Invalid eeprom_data type."));
    EXPECT_TRUE(ProtoEquals(before, set));
  }
  // Checked before the shading tree.
  TuningTreeSet no_lsc;
  EXPECT_THAT(Apply(nullptr, golden, &no_lsc),
              StatusIs(kInvalidArgument, "Invalid eeprom_data type."));
}

TEST_F(ApplySensorEepromCalibrationTest, EmptyDeviceTablesPassTheInitializationCheck) {
  // Proto3 tables are always initialized: empty device tables get as far as the first leaf,
  // whose planes they don't match.
  const std::unique_ptr<const SensorEepromData> empty = DeviceData(LscTables());
  const GoldenSensorFactoryCalibrationData golden =
      Golden(vosbrine::BRIMAL_REAR_GN1_NORMAL, Gn1GoldenTables());
  TuningTreeSet set = TreeSetWithShading(LeafTables());
  EXPECT_THAT(Apply(empty, golden, &set), StatusIs(kInvalidArgument, "grid_gain size mismatch."));

  TuningTreeSet no_leaves;
  no_leaves.mutable_lsc()->set_enable(true);
  EXPECT_THAT(Apply(empty, golden, &no_leaves), IsOk());
}

TEST_F(ApplySensorEepromCalibrationTest, SetWithoutAShadingTreeFails) {
  TuningTreeSet set;
  WbDynamicParam wb;
  wb.add_wb_gains(2.0f);
  *set.mutable_wb() = MakeTree(true, WbStaticParam(), MakeLevel(Level::CCT, {LeafNode(0, 1, wb)}));
  const TuningTreeSet before = set;
  EXPECT_THAT(Apply(DeviceData(DeviceTables()),
                    Golden(vosbrine::BRIMAL_REAR_GN1_NORMAL, Gn1GoldenTables()), &set),
              StatusIs(kInvalidArgument, "zel_tuning_tree_set does not have lsc tuning tree."));
  EXPECT_TRUE(ProtoEquals(before, set));
  // Checked before the golden record is read.
  GoldenSensorFactoryCalibrationData unreadable;
  unreadable.mutable_calibration_data()->PackFrom(DeviceTables());
  EXPECT_THAT(Apply(DeviceData(DeviceTables()), unreadable, &set),
              StatusIs(kInvalidArgument, "zel_tuning_tree_set does not have lsc tuning tree."));
}

TEST_F(ApplySensorEepromCalibrationTest, ShadingTreeWithoutLevelsGainsAnEmptyTopLevel) {
  TuningTreeSet set;
  set.mutable_lsc()->set_enable(true);
  ASSERT_FALSE(set.lsc().has_dynamic_top_level());
  EXPECT_THAT(Apply(DeviceData(DeviceTables()),
                    Golden(vosbrine::BRIMAL_REAR_GN1_NORMAL, Gn1GoldenTables()), &set),
              IsOk());
  EXPECT_TRUE(set.lsc().has_dynamic_top_level());
  EXPECT_THAT(set.lsc().dynamic_top_level().nodes(), IsEmpty());
}

TEST_F(ApplySensorEepromCalibrationTest, UnreadableGoldenRecordFailsEvenWithoutLeaves) {
  GoldenSensorFactoryCalibrationData unreadable;
  unreadable.set_camera_sensor(vosbrine::BRIMAL_REAR_GN1_NORMAL);
  unreadable.mutable_calibration_data()->PackFrom(Gn1GoldenTables());  // Not the record's type.

  TuningTreeSet no_leaves;
  no_leaves.mutable_lsc()->set_enable(true);
  EXPECT_THAT(Apply(DeviceData(DeviceTables()), unreadable, &no_leaves),
              StatusIs(StatusCode::kInternal, "Failed to unpack golden factory calibration data."));

  const TuningTreeSet before = TreeSetWithShading(LeafTables());
  TuningTreeSet set = before;
  EXPECT_THAT(Apply(DeviceData(DeviceTables()), unreadable, &set),
              StatusIs(StatusCode::kInternal, "Failed to unpack golden factory calibration data."));
  EXPECT_TRUE(ProtoEquals(before, set));
}

TEST_F(ApplySensorEepromCalibrationTest, GoldenRecordWithoutTablesReadsAsEmptyTables) {
  GoldenSensorFactoryCalibrationData golden;
  golden.set_camera_sensor(vosbrine::BRIMAL_REAR_GN1_NORMAL);
  golden.mutable_calibration_data()->PackFrom(ZelSensorFactoryCalibrationData());
  const TuningTreeSet before = TreeSetWithShading(LeafTables());
  TuningTreeSet set = before;
  EXPECT_THAT(Apply(DeviceData(DeviceTables()), golden, &set),
              StatusIs(kInvalidArgument, "grid_gain size mismatch."));
  EXPECT_TRUE(ProtoEquals(before, set));
}

TEST_F(ApplySensorEepromCalibrationTest, LeafOfAnotherTypeStopsTheRewrite) {
  // Depth first: leaf 0 is done, leaf 1 (a white-balance leaf) stops the loop, leaf 2 is not
  // reached.
  WbDynamicParam wb;
  wb.add_wb_gains(2.0f);
  TuningTreeSet set;
  *set.mutable_lsc() =
      ThreeLeafLscTree(LscLeaf(LeafTables()[0], 0.25f), wb, LscLeaf(LeafTables()[2], 0.75f));
  EXPECT_THAT(Apply(DeviceData(DeviceTables()),
                    Golden(vosbrine::BRIMAL_REAR_GN1_NORMAL, Gn1GoldenTables()), &set),
              StatusIs(kInvalidArgument, "Cannot unpack to lsc_dynamic_param."));
  const Level& top = set.lsc().dynamic_top_level();
  LscDynamicParam first;
  ASSERT_TRUE(top.nodes(0).child_level().nodes(0).dynamic_param().UnpackTo(&first));
  EXPECT_TRUE(ProtoEquals(CalibrateByHand(DeviceTables(), Gn1GoldenTables(), LeafTables()[0]),
                          first.lsc_tables()));
  WbDynamicParam second;
  ASSERT_TRUE(top.nodes(0).child_level().nodes(1).dynamic_param().UnpackTo(&second));
  EXPECT_TRUE(ProtoEquals(wb, second));
  LscDynamicParam third;
  ASSERT_TRUE(top.nodes(1).dynamic_param().UnpackTo(&third));
  EXPECT_TRUE(ProtoEquals(LeafTables()[2], third.lsc_tables()));
}

TEST_F(ApplySensorEepromCalibrationTest, FailingLeafStopsTheRewriteDepthFirst) {
  // Leaf 1 (second depth first, inside the first region's child level) has a short red plane.
  // Leaf 0 stays calibrated; leaf 1 is not written back, although its blue, Gb and Gr planes
  // were scaled before red failed; leaf 2 (the top level's second region) is not reached.
  std::vector<LscTables> tables = LeafTables();
  tables[1].mutable_lsc_grid_gain_r()->RemoveLast();
  const TuningTreeSet before = TreeSetWithShading(tables);
  TuningTreeSet set = before;
  EXPECT_THAT(Apply(DeviceData(DeviceTables()),
                    Golden(vosbrine::BRIMAL_REAR_GN1_NORMAL, Gn1GoldenTables()), &set),
              StatusIs(kInvalidArgument, "grid_gain size mismatch."));
  const std::vector<LscDynamicParam> leaves = LscLeaves(set);
  ASSERT_THAT(leaves, SizeIs(3));
  EXPECT_TRUE(ProtoEquals(CalibrateByHand(DeviceTables(), Gn1GoldenTables(), tables[0]),
                          leaves[0].lsc_tables()));
  EXPECT_TRUE(ProtoEquals(tables[1], leaves[1].lsc_tables()));
  EXPECT_TRUE(ProtoEquals(tables[2], leaves[2].lsc_tables()));
}

// =================================================================================================
// Load with calibration
// =================================================================================================

class CalibratedLoadTest : public ::testing::Test {
 protected:
  std::string WriteTuning(const std::string& name, const TuningUsecase& usecase,
                          const TuningTreeSet& set) {
    return WriteBinarypb(dir_, name + ".binarypb", MakeUsecaseData(usecase, set));
  }

  std::string WriteGolden(const std::string& name, vosbrine::CameraSensor sensor,
                          const LscTables& tables) {
    return WriteBinarypb(dir_, name + "_" + kGoldenMarker + ".binarypb", Golden(sensor, tables));
  }

  static TuningTreeSet Loaded(const TuningProvider& provider, const TuningUsecase& usecase) {
    const google::protobuf::Message* message = provider.GetTuningTreeSet(usecase, false);
    TuningTreeSet set;
    EXPECT_NE(message, nullptr);
    if (message != nullptr) {
      EXPECT_TRUE(set.ParseFromString(message->SerializeAsString()));
    }
    return set;
  }

  static SensorEepromDataMap Gn1Device() {
    SensorEepromDataMap map;
    map.emplace(kGn1, DeviceData(DeviceTables()));
    return map;
  }

  TempDir dir_;
};

TEST_F(CalibratedLoadTest, EveryLeafOfEachFileWithDeviceAndGoldenDataIsCalibrated) {
  // Two GN1 files and one IMX663 file; golden records of both sensors, device data of GN1 only.
  const TuningTreeSet gn1_set = TreeSetWithShading(LeafTables());
  std::vector<LscTables> snapshot_tables = {LeafTables()[2], LeafTables()[0], LeafTables()[1]};
  const TuningTreeSet snapshot_set = TreeSetWithShading(snapshot_tables);
  const TuningTreeSet imx663_set = TreeSetWithShading(LeafTables());
  const std::vector<std::string> paths = {
      WriteGolden("gn1", vosbrine::BRIMAL_REAR_GN1_NORMAL, Gn1GoldenTables()),
      WriteGolden("imx663", vosbrine::BRIMAL_FRONT_IMX663_NORMAL, Imx663GoldenTables()),
      WriteTuning("gn1_viewfinder", Gn1Viewfinder(), gn1_set),
      WriteTuning("gn1_snapshot", Gn1Snapshot(), snapshot_set),
      WriteTuning("imx663_viewfinder", Imx663Viewfinder(), imx663_set),
  };
  const SensorEepromDataMap eeprom = Gn1Device();
  ScopedLogCapture capture;
  StatusOr<std::unique_ptr<TuningProvider>> provider = TuningProvider::Create(paths, &eeprom);
  ASSERT_THAT(provider, IsOk());
  EXPECT_THAT(capture.messages(kInfo), ElementsAre(Summary(3, 3, 2, 2, 2)));

  for (const auto& [usecase, tables] :
       {std::pair{Gn1Viewfinder(), LeafTables()}, std::pair{Gn1Snapshot(), snapshot_tables}}) {
    SCOPED_TRACE(usecase.ShortDebugString());
    const std::vector<LscDynamicParam> leaves = LscLeaves(Loaded(**provider, usecase));
    ASSERT_THAT(leaves, SizeIs(3));
    for (size_t i = 0; i < 3; ++i) {
      EXPECT_TRUE(ProtoEquals(CalibrateByHand(DeviceTables(), Gn1GoldenTables(), tables[i]),
                              leaves[i].lsc_tables()))
          << "leaf " << i;
    }
  }
  // No device data for IMX663: its file is as written.
  EXPECT_TRUE(ProtoEquals(imx663_set, Loaded(**provider, Imx663Viewfinder())));
}

TEST_F(CalibratedLoadTest, GoldenRecordOfAnotherSensorIsNotApplied) {
  const TuningTreeSet set = TreeSetWithShading(LeafTables());
  const std::vector<std::string> paths = {
      WriteGolden("imx663", vosbrine::BRIMAL_FRONT_IMX663_NORMAL, Imx663GoldenTables()),
      WriteTuning("gn1_viewfinder", Gn1Viewfinder(), set),
  };
  const SensorEepromDataMap eeprom = Gn1Device();
  ScopedLogCapture capture;
  StatusOr<std::unique_ptr<TuningProvider>> provider = TuningProvider::Create(paths, &eeprom);
  ASSERT_THAT(provider, IsOk());
  EXPECT_THAT(capture.messages(kInfo), ElementsAre(Summary(1, 1, 1, 1, 0)));
  EXPECT_TRUE(ProtoEquals(set, Loaded(**provider, Gn1Viewfinder())));
}

TEST_F(CalibratedLoadTest, GoldenRecordIsChosenByItsSensorWhateverItsPlace) {
  const std::vector<std::string> paths = {
      WriteGolden("a", vosbrine::BRIMAL_FRONT_IMX663_NORMAL, Imx663GoldenTables()),
      WriteGolden("b", vosbrine::BRIMAL_REAR_GN1_NORMAL, Gn1GoldenTables()),
      WriteTuning("gn1_viewfinder", Gn1Viewfinder(), TreeSetWithShading(LeafTables())),
  };
  const SensorEepromDataMap eeprom = Gn1Device();
  StatusOr<std::unique_ptr<TuningProvider>> provider = TuningProvider::Create(paths, &eeprom);
  ASSERT_THAT(provider, IsOk());
  const std::vector<LscDynamicParam> leaves = LscLeaves(Loaded(**provider, Gn1Viewfinder()));
  ASSERT_THAT(leaves, SizeIs(3));
  for (size_t i = 0; i < 3; ++i) {
    EXPECT_TRUE(ProtoEquals(CalibrateByHand(DeviceTables(), Gn1GoldenTables(), LeafTables()[i]),
                            leaves[i].lsc_tables()))
        << "leaf " << i;
  }
}

TEST_F(CalibratedLoadTest, DeviceDataOfAnotherSensorIsNotApplied) {
  const TuningTreeSet set = TreeSetWithShading(LeafTables());
  const std::vector<std::string> paths = {
      WriteGolden("gn1", vosbrine::BRIMAL_REAR_GN1_NORMAL, Gn1GoldenTables()),
      WriteTuning("gn1_viewfinder", Gn1Viewfinder(), set),
  };
  SensorEepromDataMap eeprom;
  eeprom.emplace(kImx663, DeviceData(DeviceTables()));
  ScopedLogCapture capture;
  StatusOr<std::unique_ptr<TuningProvider>> provider = TuningProvider::Create(paths, &eeprom);
  ASSERT_THAT(provider, IsOk());
  EXPECT_THAT(capture.messages(kInfo), ElementsAre(Summary(1, 1, 1, 1, 0)));
  EXPECT_TRUE(ProtoEquals(set, Loaded(**provider, Gn1Viewfinder())));
}

TEST_F(CalibratedLoadTest, FailedCalibrationIsLoggedAndTheFileKeepsItsLeavesDoneBeforeIt) {
  std::vector<LscTables> tables = LeafTables();
  tables[1].mutable_lsc_grid_gain_b()->RemoveLast();
  const std::vector<std::string> paths = {
      WriteGolden("gn1", vosbrine::BRIMAL_REAR_GN1_NORMAL, Gn1GoldenTables()),
      WriteTuning("gn1_viewfinder", Gn1Viewfinder(), TreeSetWithShading(tables)),
  };
  const SensorEepromDataMap eeprom = Gn1Device();
  ScopedLogCapture capture;
  StatusOr<std::unique_ptr<TuningProvider>> provider = TuningProvider::Create(paths, &eeprom);
  ASSERT_THAT(provider, IsOk());
  EXPECT_THAT(capture.messages(kError), ElementsAre("grid_gain size mismatch."));
  EXPECT_THAT(capture.messages(kInfo), ElementsAre(Summary(1, 1, 1, 1, 0)));
  const std::vector<LscDynamicParam> leaves = LscLeaves(Loaded(**provider, Gn1Viewfinder()));
  ASSERT_THAT(leaves, SizeIs(3));
  EXPECT_TRUE(ProtoEquals(CalibrateByHand(DeviceTables(), Gn1GoldenTables(), tables[0]),
                          leaves[0].lsc_tables()));
  EXPECT_TRUE(ProtoEquals(tables[1], leaves[1].lsc_tables()));
  EXPECT_TRUE(ProtoEquals(tables[2], leaves[2].lsc_tables()));
}

TEST_F(CalibratedLoadTest, CalibrationBuiltFromTheServiceMapIsApplied) {
  // The service's measurement of the GN1 module, flat per plane, resized to flat 33 by 25 tables.
  CalibrationMap calibration;
  calibration.emplace(Key("GN1", 0), FlatModule(17, 13, 1.5f, 1.25f, 1.25f, 1.75f));
  const std::shared_ptr<SensorEepromDataMap> eeprom =
      BuildTuningEepromData("brimal", calibration, /*dump=*/false);
  ASSERT_NE(eeprom, nullptr);
  const std::vector<std::string> paths = {
      WriteGolden("gn1", vosbrine::BRIMAL_REAR_GN1_NORMAL, Gn1GoldenTables()),
      WriteTuning("gn1_viewfinder", Gn1Viewfinder(), TreeSetWithShading(LeafTables())),
  };
  ScopedLogCapture capture;
  StatusOr<std::unique_ptr<TuningProvider>> provider = TuningProvider::Create(paths, eeprom.get());
  ASSERT_THAT(provider, IsOk());
  EXPECT_THAT(capture.messages(kInfo), ElementsAre(Summary(1, 1, 1, 1, 1)));
  const LscTables device = Flat(33, 25, 1.5f, 1.25f, 1.25f, 1.75f);
  const std::vector<LscDynamicParam> leaves = LscLeaves(Loaded(**provider, Gn1Viewfinder()));
  ASSERT_THAT(leaves, SizeIs(3));
  for (size_t i = 0; i < 3; ++i) {
    EXPECT_TRUE(ProtoEquals(CalibrateByHand(device, Gn1GoldenTables(), LeafTables()[i]),
                            leaves[i].lsc_tables()))
        << "leaf " << i;
  }
}

}  // namespace
}  // namespace tavik
