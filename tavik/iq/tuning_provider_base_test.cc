#include "tavik/iq/tuning_provider_base.h"

#include <memory>
#include <optional>
#include <string>
#include <utility>
#include <vector>

#include "gmock/gmock.h"
#include "gtest/gtest.h"
#include "tavik/base/testing/log_capture.h"
#include "tavik/base/testing/status_matchers.h"
#include "tavik/base/testing/temp_dir.h"
#include "tavik/iq/protos/golden_sensor_factory_calibration_data.pb.h"
#include "tavik/iq/testing/tuning_builders.h"
#include "tavik/iq/zel/protos/blc_param.pb.h"
#include "tavik/iq/zel/protos/gamma_param.pb.h"
#include "tavik/iq/zel/protos/gtnr_sharpener_param.pb.h"
#include "tavik/iq/zel/protos/lsc_param.pb.h"
#include "tavik/iq/zel/protos/sensor_factory_calibration_data.pb.h"
#include "tavik/iq/zel/protos/tuning_tree_set.pb.h"
#include "tavik/iq/zel/protos/wb_param.pb.h"

namespace vosbrine {
namespace {

using ::google::protobuf::Message;
using ::tavik::Status;
using ::tavik::test::ChildNode;
using ::tavik::test::DynamicSchema;
using ::tavik::test::EmptyNode;
using ::tavik::test::IsOk;
using ::tavik::test::LeafNode;
using ::tavik::test::MakeLevel;
using ::tavik::test::MakeTree;
using ::tavik::test::MakeUsecase;
using ::tavik::test::MakeUsecaseData;
using ::tavik::test::ParseText;
using ::tavik::test::ProtoEquals;
using ::tavik::test::ScopedLogCapture;
using ::tavik::test::StateWith;
using ::tavik::test::StatusIs;
using ::tavik::test::TempDir;
using ::tavik::test::WriteBinarypb;
using ::testing::ElementsAre;
using ::testing::IsEmpty;
using ::testing::Pair;
using ::testing::UnorderedElementsAre;
using ::vosbrine::zelmondrake::BlcDynamicParam;
using ::vosbrine::zelmondrake::BlcStaticParam;
using ::vosbrine::zelmondrake::BlcTuning;
using ::vosbrine::zelmondrake::GammaDynamicParam;
using ::vosbrine::zelmondrake::GammaStaticParam;
using ::vosbrine::zelmondrake::GammaTuning;
using ::vosbrine::zelmondrake::GtnrSharpenerTuning;
using ::vosbrine::zelmondrake::TuningTreeSet;
using ::vosbrine::zelmondrake::WbDynamicParam;
using ::vosbrine::zelmondrake::ZelSensorFactoryCalibrationData;

using Severity = android::base::LogSeverity;
constexpr Severity kVerbose = android::base::VERBOSE;
constexpr Severity kInfo = android::base::INFO;
constexpr Severity kWarning = android::base::WARNING;
constexpr Severity kError = android::base::ERROR;
constexpr absl::StatusCode kInvalidArgument = absl::StatusCode::kInvalidArgument;

constexpr char kGoldenMarker[] = "golden_sensor_factory_calibration_data";
constexpr char kGn1ViewfinderKey[] = "BRIMAL_REAR_GN1_NORMAL, FULL_4_3_FULL_15_30FPS, VIEWFINDER";
constexpr char kGn1ViewfinderDebugString[] =
    "camera_sensor: BRIMAL_REAR_GN1_NORMAL\n"
    "sensor_mode: FULL_4_3_FULL_15_30FPS\n"
    "camera_usecase: VIEWFINDER\n";

std::vector<std::pair<Severity, std::string>> SeveritiesAndMessages(
    const ScopedLogCapture& capture) {
  std::vector<std::pair<Severity, std::string>> result;
  for (const tavik::test::CapturedLogLine& line : capture.lines()) {
    result.emplace_back(line.severity, line.message);
  }
  return result;
}

std::string LoadSummary(int tuning_found, int tuning_parsed, int golden_found, int golden_parsed,
                        int calibrated) {
  return "Tuning binarypb found: " + std::to_string(tuning_found) +
         " Tuning binarypb parsed: " + std::to_string(tuning_parsed) +
         " Golden data binarypb found: " + std::to_string(golden_found) +
         " Golden data binarypb parsed: " + std::to_string(golden_parsed) +
         " Calibration applied: " + std::to_string(calibrated);
}

TuningUsecase Gn1(SensorMode mode, CameraUsecase usecase) {
  return MakeUsecase(BRIMAL_REAR_GN1_NORMAL, mode, usecase);
}

TuningUsecase Gn1Viewfinder() { return Gn1(FULL_4_3_FULL_15_30FPS, VIEWFINDER); }

GammaDynamicParam GammaR(float value) {
  GammaDynamicParam param;
  param.add_gamma_r(value);
  return param;
}

BlcDynamicParam OffsetsR(float value) {
  BlcDynamicParam param;
  param.add_offsets_r(value);
  return param;
}

// A CCT level of two regions, [0, 10] and [20, 30].
Level TwoRegions(const Message& low, const Message& high) {
  return MakeLevel(Level::CCT, {LeafNode(0, 10, low), LeafNode(20, 30, high)});
}

// A tree set that tells files apart: its gamma tree's static gamma_x holds `marker`.
TuningTreeSet MarkedTreeSet(float marker) {
  TuningTreeSet tree_set;
  *tree_set.mutable_gamma() =
      MakeTree(true, ParseText<GammaStaticParam>("gamma_x: " + std::to_string(marker)),
               TwoRegions(GammaR(2), GammaR(6)));
  return tree_set;
}

// The marker of a loaded tree set, or -1.
float MarkerOf(const Message* tree_set) {
  const auto* zel_tree_set = dynamic_cast<const TuningTreeSet*>(tree_set);
  GammaStaticParam static_param;
  if (zel_tree_set == nullptr || !zel_tree_set->gamma().static_param().UnpackTo(&static_param) ||
      static_param.gamma_x_size() != 1) {
    return -1;
  }
  return static_param.gamma_x(0);
}

std::vector<std::string> KeysOf(const TuningProviderBase& provider) {
  std::vector<std::string> keys;
  for (const auto& [key, tree_set] : provider.forest()) keys.push_back(key);
  return keys;
}

GoldenSensorFactoryCalibrationData Golden(CameraSensor sensor, int lsc_width) {
  ZelSensorFactoryCalibrationData data;
  data.mutable_lsc()->set_width(lsc_width);
  GoldenSensorFactoryCalibrationData golden;
  golden.set_camera_sensor(sensor);
  golden.mutable_calibration_data()->PackFrom(data);
  return golden;
}

class TuningProviderBaseTest : public ::testing::Test {
 protected:
  std::string WriteTuning(std::string_view relative, const TuningUsecase& usecase,
                          const TuningTreeSet& tree_set, std::string_view version = "") {
    return WriteBinarypb(dir_, relative, MakeUsecaseData(usecase, tree_set, version));
  }

  // A provider loaded from one file holding `tree_set` under Gn1Viewfinder().
  std::unique_ptr<TuningProviderBase> LoadOne(const TuningTreeSet& tree_set) {
    auto provider = std::make_unique<TuningProviderBase>();
    const std::string path =
        WriteTuning("one_" + std::to_string(++files_) + ".binarypb", Gn1Viewfinder(), tree_set);
    EXPECT_THAT(provider->Load({path}, TuningTreeSet::descriptor(), nullptr), IsOk());
    return provider;
  }

  TempDir dir_;
  int files_ = 0;
};

// ---------------------------------------------------------------------------------------------
// Load: paths.

TEST_F(TuningProviderBaseTest, EmptyPathListFails) {
  TuningProviderBase provider;
  EXPECT_THAT(provider.Load({}, TuningTreeSet::descriptor(), nullptr),
              StatusIs(kInvalidArgument, "Empty input paths."));
}

TEST_F(TuningProviderBaseTest, LogsEachStepOfALoadInOrder) {
  const std::string good = WriteTuning("good.binarypb", Gn1Viewfinder(), MarkedTreeSet(1));
  const std::string text = dir_.WriteFile("notes.txt", "x");
  TuningProviderBase provider;
  ScopedLogCapture capture;
  TAVIK_ASSERT_OK(provider.Load({good, text}, TuningTreeSet::descriptor(), nullptr));
  EXPECT_THAT(
      SeveritiesAndMessages(capture),
      ElementsAre(
          Pair(kVerbose, "Input entry: " + good), Pair(kVerbose, "Input entry is binarypb."),
          Pair(kVerbose, "Input entry: " + text), Pair(kError, text + " is not a binarypb."),
          Pair(kVerbose, "Input entry is not directory and not binarypb."),
          Pair(kVerbose, "Available sensor EEPROM data: 0"),
          Pair(kVerbose, "Trying to parse: " + good), Pair(kInfo, LoadSummary(1, 1, 0, 0, 0))));
  EXPECT_THAT(KeysOf(provider), ElementsAre(kGn1ViewfinderKey));
}

TEST_F(TuningProviderBaseTest, DirectoryEntryLoadsEveryBinarypbInIt) {
  WriteTuning("a.binarypb", Gn1Viewfinder(), MarkedTreeSet(1));
  WriteTuning("b.binarypb", Gn1(FULL_4_3_FULL_15_30FPS, SNAPSHOT), MarkedTreeSet(2));
  dir_.WriteFile("notes.txt", "x");
  TuningProviderBase provider;
  ScopedLogCapture capture;
  TAVIK_ASSERT_OK(provider.Load({dir_.path()}, TuningTreeSet::descriptor(), nullptr));
  EXPECT_THAT(
      KeysOf(provider),
      ElementsAre("BRIMAL_REAR_GN1_NORMAL, FULL_4_3_FULL_15_30FPS, SNAPSHOT", kGn1ViewfinderKey));
  EXPECT_EQ(capture.Count("Input entry: " + dir_.path()), 1);
  EXPECT_EQ(capture.Count("Input entry is directory. Searching for binarypbs."), 1);
  EXPECT_EQ(capture.Count("No binarypb was found in the directory."), 0);
  // "." and ".." are names like any other and are rejected as such.
  EXPECT_THAT(capture.messages(kError),
              UnorderedElementsAre(dir_.path() + "/notes.txt is not a binarypb.",
                                   dir_.path() + "/. is not a binarypb.",
                                   dir_.path() + "/.. is not a binarypb."));
  EXPECT_THAT(capture.messages(kInfo), ElementsAre(LoadSummary(2, 2, 0, 0, 0)));
}

TEST_F(TuningProviderBaseTest, DirectoryIsSearchedOneLevelDeepOnly) {
  WriteTuning("top.binarypb", Gn1Viewfinder(), MarkedTreeSet(1));
  WriteTuning("sub/deeper.binarypb", Gn1(FULL_4_3_FULL_15_30FPS, SNAPSHOT), MarkedTreeSet(2));
  TuningProviderBase provider;
  ScopedLogCapture capture;
  TAVIK_ASSERT_OK(provider.Load({dir_.path()}, TuningTreeSet::descriptor(), nullptr));
  EXPECT_THAT(KeysOf(provider), ElementsAre(kGn1ViewfinderKey));
  EXPECT_EQ(capture.Count(dir_.path() + "/sub is not a binarypb."), 1);
}

TEST_F(TuningProviderBaseTest, DirectoryWithoutBinarypbsLeavesNoTuningPath) {
  dir_.WriteFile("notes.txt", "x");
  TuningProviderBase provider;
  ScopedLogCapture capture;
  EXPECT_THAT(provider.Load({dir_.path()}, TuningTreeSet::descriptor(), nullptr),
              StatusIs(kInvalidArgument, "No valid tuning binarypb path."));
  EXPECT_THAT(capture.messages(kVerbose),
              ElementsAre("Input entry: " + dir_.path(),
                          "Input entry is directory. Searching for binarypbs.",
                          "No binarypb was found in the directory."));
  EXPECT_TRUE(provider.forest().empty());
}

TEST_F(TuningProviderBaseTest, PathNotEndingInBinarypbIsRejectedWithAnErrorLineOnly) {
  const std::string good = WriteTuning("good.binarypb", Gn1Viewfinder(), MarkedTreeSet(1));
  const TuningUsecaseData other =
      MakeUsecaseData(Gn1(FULL_4_3_FULL_15_30FPS, SNAPSHOT), MarkedTreeSet(2));
  const std::string pb = WriteBinarypb(dir_, "other.pb", other);
  const std::string backup = WriteBinarypb(dir_, "other.binarypb.bak", other);
  const std::string capital = WriteBinarypb(dir_, "other.BINARYPB", other);
  const std::string no_extension = WriteBinarypb(dir_, "binarypb", other);
  TuningProviderBase provider;
  ScopedLogCapture capture;
  TAVIK_ASSERT_OK(provider.Load({pb, good, backup, capital, no_extension},
                                TuningTreeSet::descriptor(), nullptr));
  EXPECT_THAT(KeysOf(provider), ElementsAre(kGn1ViewfinderKey));
  EXPECT_THAT(capture.messages(kError),
              ElementsAre(pb + " is not a binarypb.", backup + " is not a binarypb.",
                          capital + " is not a binarypb.", no_extension + " is not a binarypb."));
  EXPECT_THAT(capture.messages(kInfo), ElementsAre(LoadSummary(1, 1, 0, 0, 0)));
}

TEST_F(TuningProviderBaseTest, OnlyRejectedPathsLeaveNoTuningPath) {
  const std::string pb =
      WriteBinarypb(dir_, "tuning.pb", MakeUsecaseData(Gn1Viewfinder(), MarkedTreeSet(1)));
  TuningProviderBase provider;
  EXPECT_THAT(provider.Load({pb, dir_.Path("missing")}, TuningTreeSet::descriptor(), nullptr),
              StatusIs(kInvalidArgument, "No valid tuning binarypb path."));
}

TEST_F(TuningProviderBaseTest, DirectoryOfGoldenFilesOnlyLeavesNoTuningPath) {
  WriteBinarypb(dir_, std::string(kGoldenMarker) + ".binarypb", Golden(BRIMAL_REAR_GN1_NORMAL, 1));
  WriteBinarypb(dir_, std::string("front_") + kGoldenMarker + ".binarypb",
                Golden(BRIMAL_FRONT_IMX355_NORMAL, 1));
  TuningProviderBase provider;
  EXPECT_THAT(provider.Load({dir_.path()}, TuningTreeSet::descriptor(), nullptr),
              StatusIs(kInvalidArgument, "No valid tuning binarypb path."));
}

// Records what the provider reads and the calibrations it is asked for.
class RecordingProvider : public TuningProviderBase {
 public:
  struct Calibration {
    const SensorEepromData* eeprom_data;
    GoldenSensorFactoryCalibrationData golden;
    const Message* tree_set;
  };

  Status ReadBinaryProto(const std::string& path, Message& message) const override {
    reads.emplace_back(path, message.GetTypeName());
    return TuningProviderBase::ReadBinaryProto(path, message);
  }

  // Without `calibration_status`, the base class answers. With it, the tree set's gtnr tree is
  // switched on to show that the calibration reached the stored message.
  Status ApplySensorEepromCalibration(const std::unique_ptr<const SensorEepromData>& eeprom_data,
                                      const GoldenSensorFactoryCalibrationData& golden,
                                      Message* tree_set) const override {
    calibrations.push_back(Calibration{eeprom_data.get(), golden, tree_set});
    if (!calibration_status.has_value()) {
      return TuningProviderBase::ApplySensorEepromCalibration(eeprom_data, golden, tree_set);
    }
    if (auto* zel_tree_set = dynamic_cast<TuningTreeSet*>(tree_set)) {
      zel_tree_set->mutable_gtnr()->set_enable(true);
    }
    return *calibration_status;
  }

  std::optional<Status> calibration_status;
  mutable std::vector<std::pair<std::string, std::string>> reads;
  mutable std::vector<Calibration> calibrations;
};

TEST_F(TuningProviderBaseTest, GoldenSubstringAnywhereInThePathMakesAFileGolden) {
  const std::string tuning = WriteTuning("tuning.binarypb", Gn1Viewfinder(), MarkedTreeSet(1));
  // A tuning file by content, in a directory whose name holds the substring.
  const std::string in_golden_directory =
      WriteTuning(std::string(kGoldenMarker) + "/tuning.binarypb",
                  Gn1(FULL_4_3_FULL_15_30FPS, SNAPSHOT), MarkedTreeSet(2));
  const std::string in_file_name =
      WriteBinarypb(dir_, std::string("rear_") + kGoldenMarker + "_v2.binarypb",
                    Golden(BRIMAL_REAR_GN1_NORMAL, 1));
  RecordingProvider provider;
  ScopedLogCapture capture;
  TAVIK_ASSERT_OK(provider.Load({in_golden_directory, tuning, in_file_name},
                                TuningTreeSet::descriptor(), nullptr));
  EXPECT_THAT(KeysOf(provider), ElementsAre(kGn1ViewfinderKey));
  EXPECT_THAT(provider.reads,
              ElementsAre(Pair(in_golden_directory, "vosbrine.GoldenSensorFactoryCalibrationData"),
                          Pair(in_file_name, "vosbrine.GoldenSensorFactoryCalibrationData"),
                          Pair(tuning, "vosbrine.TuningUsecaseData")));
  EXPECT_EQ(capture.Count("Golden data parsing status: OK"), 2);
  EXPECT_THAT(capture.messages(kInfo), ElementsAre(LoadSummary(1, 1, 2, 2, 0)));
}

TEST_F(TuningProviderBaseTest, TuningFileInAGoldenDirectoryAloneLeavesNoTuningPath) {
  const std::string in_golden_directory = WriteTuning(
      std::string(kGoldenMarker) + "/tuning.binarypb", Gn1Viewfinder(), MarkedTreeSet(1));
  TuningProviderBase provider;
  EXPECT_THAT(provider.Load({in_golden_directory}, TuningTreeSet::descriptor(), nullptr),
              StatusIs(kInvalidArgument, "No valid tuning binarypb path."));
}

// ---------------------------------------------------------------------------------------------
// Load: files.

TEST_F(TuningProviderBaseTest, FileThatFailsToParseIsSkipped) {
  const std::string garbage = dir_.WriteFile("garbage.binarypb", "garbage");
  const std::string good = WriteTuning("good.binarypb", Gn1Viewfinder(), MarkedTreeSet(1));
  TuningProviderBase provider;
  ScopedLogCapture capture;
  TAVIK_ASSERT_OK(provider.Load({garbage, good}, TuningTreeSet::descriptor(), nullptr));
  EXPECT_THAT(KeysOf(provider), ElementsAre(kGn1ViewfinderKey));
  EXPECT_EQ(capture.Count("Trying to parse: " + garbage), 1);
  EXPECT_THAT(capture.messages(kError), ElementsAre("Failed to parse binarypb. Name: " + garbage));
  EXPECT_THAT(capture.messages(kInfo), ElementsAre(LoadSummary(2, 1, 0, 0, 0)));
}

TEST_F(TuningProviderBaseTest, MissingFileIsTakenAsABinarypbThatFailsToParse) {
  const std::string missing = dir_.Path("missing.binarypb");
  const std::string good = WriteTuning("good.binarypb", Gn1Viewfinder(), MarkedTreeSet(1));
  TuningProviderBase provider;
  ScopedLogCapture capture;
  TAVIK_ASSERT_OK(provider.Load({missing, good}, TuningTreeSet::descriptor(), nullptr));
  EXPECT_THAT(capture.messages(kVerbose), ::testing::Contains("Input entry is binarypb.").Times(2));
  EXPECT_THAT(capture.messages(kError), ElementsAre("Failed to parse binarypb. Name: " + missing));
}

TEST_F(TuningProviderBaseTest, TreeSetOfAnotherTypeIsSkipped) {
  TuningUsecaseData wrong_type;
  *wrong_type.mutable_tuning_usecase() = Gn1(FULL_4_3_FULL_15_30FPS, SNAPSHOT);
  wrong_type.mutable_tuning_tree_set()->PackFrom(TuningTree());
  const std::string wrong = WriteBinarypb(dir_, "wrong.binarypb", wrong_type);
  TuningUsecaseData unset;
  *unset.mutable_tuning_usecase() = Gn1(FULL_4_3_FULL_15_30FPS, VIDEO_RECORDING);
  const std::string empty = WriteBinarypb(dir_, "unset.binarypb", unset);
  const std::string good = WriteTuning("good.binarypb", Gn1Viewfinder(), MarkedTreeSet(1));
  TuningProviderBase provider;
  ScopedLogCapture capture;
  TAVIK_ASSERT_OK(provider.Load({wrong, empty, good}, TuningTreeSet::descriptor(), nullptr));
  EXPECT_THAT(KeysOf(provider), ElementsAre(kGn1ViewfinderKey));
  EXPECT_THAT(capture.messages(kError),
              ElementsAre("Failed to unpack tuning_tree_set. Name: " + wrong,
                          "Failed to unpack tuning_tree_set. Name: " + empty));
}

TEST_F(TuningProviderBaseTest, NoFileThatLoadsFails) {
  const std::string garbage = dir_.WriteFile("garbage.binarypb", "garbage");
  const std::string missing = dir_.Path("missing.binarypb");
  TuningProviderBase provider;
  ScopedLogCapture capture;
  EXPECT_THAT(provider.Load({garbage, missing}, TuningTreeSet::descriptor(), nullptr),
              StatusIs(kInvalidArgument, "No valid tuning binarypb."));
  EXPECT_THAT(capture.messages(kError), ElementsAre("Failed to parse binarypb. Name: " + garbage,
                                                    "Failed to parse binarypb. Name: " + missing));
  EXPECT_THAT(capture.messages(kInfo), IsEmpty());
}

TEST_F(TuningProviderBaseTest, FirstFileReadWinsForOneKeyWhateverItsVersion) {
  const std::string first =
      WriteTuning("first.binarypb", Gn1Viewfinder(), MarkedTreeSet(1), "version 9");
  const std::string second =
      WriteTuning("second.binarypb", Gn1Viewfinder(), MarkedTreeSet(2), "version 1");
  {
    TuningProviderBase provider;
    ScopedLogCapture capture;
    TAVIK_ASSERT_OK(provider.Load({first, second}, TuningTreeSet::descriptor(), nullptr));
    ASSERT_THAT(KeysOf(provider), ElementsAre(kGn1ViewfinderKey));
    EXPECT_EQ(MarkerOf(provider.forest().at(kGn1ViewfinderKey).get()), 1.0f);
    EXPECT_THAT(capture.messages(kWarning),
                ElementsAre(std::string("Duplicated tuning_usecase: ") + kGn1ViewfinderKey));
    EXPECT_THAT(capture.messages(kInfo), ElementsAre(LoadSummary(2, 1, 0, 0, 0)));
  }
  TuningProviderBase provider;
  TAVIK_ASSERT_OK(provider.Load({second, first}, TuningTreeSet::descriptor(), nullptr));
  EXPECT_EQ(MarkerOf(provider.forest().at(kGn1ViewfinderKey).get()), 2.0f);
}

TEST_F(TuningProviderBaseTest, EnumValueZeroIsStoredUnderItsInvalidName) {
  const std::string invalid_mode =
      WriteTuning("invalid_mode.binarypb", Gn1(INVALID_SENSOR_MODE, VIEWFINDER), MarkedTreeSet(1));
  const std::string all_invalid =
      WriteTuning("all_invalid.binarypb",
                  MakeUsecase(INVALID_CAMERA_SENSOR, INVALID_SENSOR_MODE, INVALID_CAMERA_USECASE),
                  MarkedTreeSet(2));
  TuningProviderBase provider;
  TAVIK_ASSERT_OK(provider.Load({invalid_mode, all_invalid}, TuningTreeSet::descriptor(), nullptr));
  EXPECT_THAT(KeysOf(provider),
              ElementsAre("BRIMAL_REAR_GN1_NORMAL, INVALID_SENSOR_MODE, VIEWFINDER",
                          "INVALID_CAMERA_SENSOR, INVALID_SENSOR_MODE, INVALID_CAMERA_USECASE"));
  EXPECT_TRUE(provider.HasTuningUsecase(Gn1(INVALID_SENSOR_MODE, VIEWFINDER)));
}

TEST_F(TuningProviderBaseTest, UnknownEnumNumberGivesAnEmptyNameInTheKey) {
  const std::string path =
      WriteTuning("unknown.binarypb", Gn1(FULL_4_3_FULL_15_30FPS, static_cast<CameraUsecase>(99)),
                  MarkedTreeSet(1));
  TuningProviderBase provider;
  TAVIK_ASSERT_OK(provider.Load({path}, TuningTreeSet::descriptor(), nullptr));
  EXPECT_THAT(KeysOf(provider), ElementsAre("BRIMAL_REAR_GN1_NORMAL, FULL_4_3_FULL_15_30FPS, "));
}

TEST_F(TuningProviderBaseTest, EmptyVersionLoads) {
  const std::string path =
      WriteTuning("empty_version.binarypb", Gn1Viewfinder(), MarkedTreeSet(1), /*version=*/"");
  TuningProviderBase provider;
  TAVIK_ASSERT_OK(provider.Load({path}, TuningTreeSet::descriptor(), nullptr));
  EXPECT_THAT(KeysOf(provider), ElementsAre(kGn1ViewfinderKey));
}

TEST_F(TuningProviderBaseTest, ForestHoldsTreeSetsOfTheGivenTypeInKeyByteOrder) {
  const std::string snapshot =
      WriteTuning("1.binarypb", Gn1(FULL_4_3_FULL_15_30FPS, SNAPSHOT), MarkedTreeSet(1));
  const std::string imx363 = WriteTuning(
      "2.binarypb", MakeUsecase(BRIMAL_REAR_IMX363_NORMAL, FULL_4_3_FULL_15_30FPS, VIEWFINDER),
      MarkedTreeSet(2));
  const std::string wide_mode =
      WriteTuning("3.binarypb", Gn1(FULL_16_9_1080P_30FPS, VIEWFINDER), MarkedTreeSet(3));
  TuningProviderBase provider;
  TAVIK_ASSERT_OK(
      provider.Load({snapshot, imx363, wide_mode}, TuningTreeSet::descriptor(), nullptr));
  // "FULL_16_9" sorts before "FULL_4_3" byte by byte.
  EXPECT_THAT(KeysOf(provider),
              ElementsAre("BRIMAL_REAR_GN1_NORMAL, FULL_16_9_1080P_30FPS, VIEWFINDER",
                          "BRIMAL_REAR_GN1_NORMAL, FULL_4_3_FULL_15_30FPS, SNAPSHOT",
                          "BRIMAL_REAR_IMX363_NORMAL, FULL_4_3_FULL_15_30FPS, VIEWFINDER"));
  for (const auto& [key, tree_set] : provider.forest()) {
    EXPECT_EQ(tree_set->GetDescriptor(), TuningTreeSet::descriptor()) << key;
  }
  const TuningForestMap& forest = provider.forest();
  EXPECT_TRUE(ProtoEquals(MarkedTreeSet(3),
                          *forest.at("BRIMAL_REAR_GN1_NORMAL, FULL_16_9_1080P_30FPS, VIEWFINDER")));
  EXPECT_TRUE(ProtoEquals(MarkedTreeSet(1),
                          *forest.at("BRIMAL_REAR_GN1_NORMAL, FULL_4_3_FULL_15_30FPS, SNAPSHOT")));
  EXPECT_TRUE(
      ProtoEquals(MarkedTreeSet(2),
                  *forest.at("BRIMAL_REAR_IMX363_NORMAL, FULL_4_3_FULL_15_30FPS, VIEWFINDER")));
}

// ---------------------------------------------------------------------------------------------
// Load: golden files and calibration.

class LoadCalibrationTest : public TuningProviderBaseTest {
 protected:
  std::string WriteGolden(std::string_view name, const GoldenSensorFactoryCalibrationData& golden) {
    return WriteBinarypb(dir_, std::string(name) + "_" + kGoldenMarker + ".binarypb", golden);
  }
};

TEST_F(LoadCalibrationTest, BaseProviderHasNoCalibration) {
  const TuningProviderBase provider;
  TuningTreeSet tree_set;
  EXPECT_THAT(
      provider.ApplySensorEepromCalibration(std::make_unique<const SensorEepromData>(),
                                            Golden(BRIMAL_REAR_GN1_NORMAL, 1), &tree_set),
      StatusIs(absl::StatusCode::kUnimplemented, "ApplySensorEepromCalibration not implemented"));
}

TEST_F(LoadCalibrationTest, WithoutCalibrationDataNothingIsCalibrated) {
  const std::string golden = WriteGolden("gn1", Golden(BRIMAL_REAR_GN1_NORMAL, 1));
  const std::string tuning = WriteTuning("tuning.binarypb", Gn1Viewfinder(), MarkedTreeSet(1));
  for (const bool null_map : {true, false}) {
    const SensorEepromDataMap empty_map;
    RecordingProvider provider;
    ScopedLogCapture capture;
    TAVIK_ASSERT_OK(provider.Load({golden, tuning}, TuningTreeSet::descriptor(),
                                  null_map ? nullptr : &empty_map));
    EXPECT_THAT(provider.calibrations, IsEmpty());
    EXPECT_EQ(capture.Count("Available sensor EEPROM data: 0"), 1);
    EXPECT_THAT(capture.messages(kInfo), ElementsAre(LoadSummary(1, 1, 1, 1, 0)));
  }
}

TEST_F(LoadCalibrationTest, UnimplementedCalibrationIsLoggedPerFileAndTheFilesAreKept) {
  const std::string golden = WriteGolden("gn1", Golden(BRIMAL_REAR_GN1_NORMAL, 1));
  const std::string viewfinder = WriteTuning("vf.binarypb", Gn1Viewfinder(), MarkedTreeSet(1));
  const std::string snapshot =
      WriteTuning("snap.binarypb", Gn1(FULL_4_3_FULL_15_30FPS, SNAPSHOT), MarkedTreeSet(2));
  SensorEepromDataMap eeprom;
  eeprom[BRIMAL_REAR_GN1_NORMAL] = std::make_unique<const SensorEepromData>();
  TuningProviderBase provider;
  ScopedLogCapture capture;
  TAVIK_ASSERT_OK(
      provider.Load({golden, viewfinder, snapshot}, TuningTreeSet::descriptor(), &eeprom));
  EXPECT_EQ(provider.forest().size(), 2u);
  EXPECT_THAT(capture.messages(kError),
              ElementsAre("ApplySensorEepromCalibration not implemented",
                          "ApplySensorEepromCalibration not implemented"));
  EXPECT_EQ(capture.Count("Available sensor EEPROM data: 1"), 1);
  EXPECT_THAT(capture.messages(kInfo), ElementsAre(LoadSummary(2, 2, 1, 1, 0)));
}

TEST_F(LoadCalibrationTest, FileIsCalibratedWithItsSensorsDataAndItsFirstGoldenRecord) {
  // Golden records of GN1 (two) and IMX363; calibration data of GN1 and IMX386. Only GN1 has
  // both.
  const std::string gn1_first = WriteGolden("a", Golden(BRIMAL_REAR_GN1_NORMAL, 11));
  const std::string gn1_second = WriteGolden("b", Golden(BRIMAL_REAR_GN1_NORMAL, 22));
  const std::string imx363 = WriteGolden("c", Golden(BRIMAL_REAR_IMX363_NORMAL, 33));
  const std::string gn1_tuning = WriteTuning("gn1.binarypb", Gn1Viewfinder(), MarkedTreeSet(1));
  const std::string imx363_tuning = WriteTuning(
      "imx363.binarypb", MakeUsecase(BRIMAL_REAR_IMX363_NORMAL, FULL_4_3_FULL_15_30FPS, VIEWFINDER),
      MarkedTreeSet(2));
  const std::string imx386_tuning = WriteTuning(
      "imx386.binarypb", MakeUsecase(BRIMAL_REAR_IMX386_WIDE, FULL_4_3_FULL_15_30FPS, VIEWFINDER),
      MarkedTreeSet(3));
  SensorEepromDataMap eeprom;
  eeprom[BRIMAL_REAR_GN1_NORMAL] = std::make_unique<const SensorEepromData>();
  eeprom[BRIMAL_REAR_IMX386_WIDE] = std::make_unique<const SensorEepromData>();

  RecordingProvider provider;
  provider.calibration_status = tavik::OkStatus();
  ScopedLogCapture capture;
  TAVIK_ASSERT_OK(
      provider.Load({gn1_first, gn1_second, imx363, gn1_tuning, imx363_tuning, imx386_tuning},
                    TuningTreeSet::descriptor(), &eeprom));
  ASSERT_EQ(provider.calibrations.size(), 1u);
  EXPECT_EQ(provider.calibrations[0].eeprom_data, eeprom.at(BRIMAL_REAR_GN1_NORMAL).get());
  EXPECT_TRUE(ProtoEquals(Golden(BRIMAL_REAR_GN1_NORMAL, 11), provider.calibrations[0].golden));
  const Message* stored = provider.forest().at(kGn1ViewfinderKey).get();
  EXPECT_EQ(provider.calibrations[0].tree_set, stored);
  EXPECT_TRUE(dynamic_cast<const TuningTreeSet*>(stored)->gtnr().enable());
  EXPECT_EQ(provider.forest().size(), 3u);
  EXPECT_EQ(capture.Count("Available sensor EEPROM data: 2"), 1);
  EXPECT_THAT(capture.messages(kInfo), ElementsAre(LoadSummary(3, 3, 3, 3, 1)));
}

TEST_F(LoadCalibrationTest, FailedCalibrationLogsItsTextAndKeepsThePartlyCalibratedFile) {
  const std::string golden = WriteGolden("gn1", Golden(BRIMAL_REAR_GN1_NORMAL, 1));
  const std::string tuning = WriteTuning("tuning.binarypb", Gn1Viewfinder(), MarkedTreeSet(1));
  SensorEepromDataMap eeprom;
  eeprom[BRIMAL_REAR_GN1_NORMAL] = std::make_unique<const SensorEepromData>();
  RecordingProvider provider;
  provider.calibration_status = tavik::InternalError("Shading table is too small.");
  ScopedLogCapture capture;
  TAVIK_ASSERT_OK(provider.Load({golden, tuning}, TuningTreeSet::descriptor(), &eeprom));
  EXPECT_THAT(capture.messages(kError), ElementsAre("Shading table is too small."));
  const auto* stored =
      dynamic_cast<const TuningTreeSet*>(provider.forest().at(kGn1ViewfinderKey).get());
  ASSERT_NE(stored, nullptr);
  EXPECT_TRUE(stored->gtnr().enable());
  EXPECT_THAT(capture.messages(kInfo), ElementsAre(LoadSummary(1, 1, 1, 1, 0)));
}

TEST_F(LoadCalibrationTest, DuplicateFileIsCalibratedBeforeItIsDropped) {
  const std::string golden = WriteGolden("gn1", Golden(BRIMAL_REAR_GN1_NORMAL, 1));
  const std::string first = WriteTuning("first.binarypb", Gn1Viewfinder(), MarkedTreeSet(1));
  const std::string second = WriteTuning("second.binarypb", Gn1Viewfinder(), MarkedTreeSet(2));
  SensorEepromDataMap eeprom;
  eeprom[BRIMAL_REAR_GN1_NORMAL] = std::make_unique<const SensorEepromData>();
  RecordingProvider provider;
  provider.calibration_status = tavik::OkStatus();
  ScopedLogCapture capture;
  TAVIK_ASSERT_OK(provider.Load({golden, first, second}, TuningTreeSet::descriptor(), &eeprom));
  EXPECT_EQ(provider.calibrations.size(), 2u);
  EXPECT_EQ(MarkerOf(provider.forest().at(kGn1ViewfinderKey).get()), 1.0f);
  EXPECT_THAT(capture.messages(kInfo), ElementsAre(LoadSummary(2, 1, 1, 1, 2)));
}

TEST_F(LoadCalibrationTest, GoldenFileThatFailsToParseIsOnlySkipped) {
  const std::string bad =
      dir_.WriteFile(std::string("bad_") + kGoldenMarker + ".binarypb", "garbage");
  const std::string good = WriteGolden("good", Golden(BRIMAL_REAR_GN1_NORMAL, 5));
  const std::string tuning = WriteTuning("tuning.binarypb", Gn1Viewfinder(), MarkedTreeSet(1));
  SensorEepromDataMap eeprom;
  eeprom[BRIMAL_REAR_GN1_NORMAL] = std::make_unique<const SensorEepromData>();
  RecordingProvider provider;
  provider.calibration_status = tavik::OkStatus();
  ScopedLogCapture capture;
  TAVIK_ASSERT_OK(provider.Load({bad, good, tuning}, TuningTreeSet::descriptor(), &eeprom));
  EXPECT_THAT(capture.messages(kVerbose),
              ::testing::IsSupersetOf(
                  {"Golden data parsing status: INVALID_ARGUMENT: Could not parse file contents "
                   "of " +
                       bad + " as wire-format protobuf of type " +
                       "vosbrine.GoldenSensorFactoryCalibrationData",
                   std::string("Golden data parsing status: OK")}));
  ASSERT_EQ(provider.calibrations.size(), 1u);
  EXPECT_TRUE(ProtoEquals(Golden(BRIMAL_REAR_GN1_NORMAL, 5), provider.calibrations[0].golden));
  EXPECT_THAT(capture.messages(kInfo), ElementsAre(LoadSummary(1, 1, 2, 1, 1)));
}

TEST_F(LoadCalibrationTest, GoldenFilesAreReadBeforeTheTuningFiles) {
  const std::string tuning = WriteTuning("tuning.binarypb", Gn1Viewfinder(), MarkedTreeSet(1));
  const std::string golden = WriteGolden("gn1", Golden(BRIMAL_REAR_GN1_NORMAL, 1));
  RecordingProvider provider;
  TAVIK_ASSERT_OK(provider.Load({tuning, golden}, TuningTreeSet::descriptor(), nullptr));
  EXPECT_THAT(provider.reads,
              ElementsAre(Pair(golden, "vosbrine.GoldenSensorFactoryCalibrationData"),
                          Pair(tuning, "vosbrine.TuningUsecaseData")));
}

// ---------------------------------------------------------------------------------------------
// Lookup.

// Four keys, in byte order:
//   1 BRIMAL_REAR_GN1_NORMAL, FULL_16_9_1080P_30FPS, VIEWFINDER
//   2 BRIMAL_REAR_GN1_NORMAL, FULL_4_3_FULL_15_30FPS, SNAPSHOT
//   3 BRIMAL_REAR_GN1_NORMAL, FULL_4_3_FULL_15_30FPS, VIEWFINDER
//   4 BRIMAL_REAR_IMX363_NORMAL, FULL_4_3_FULL_15_30FPS, VIEWFINDER
// The marker of each tree set is its number.
class TreeSetLookupTest : public TuningProviderBaseTest {
 protected:
  void SetUp() override {
    const std::vector<std::string> paths = {
        WriteTuning("1.binarypb", Gn1(FULL_16_9_1080P_30FPS, VIEWFINDER), MarkedTreeSet(1)),
        WriteTuning("2.binarypb", Gn1(FULL_4_3_FULL_15_30FPS, SNAPSHOT), MarkedTreeSet(2)),
        WriteTuning("3.binarypb", Gn1Viewfinder(), MarkedTreeSet(3)),
        WriteTuning("4.binarypb",
                    MakeUsecase(BRIMAL_REAR_IMX363_NORMAL, FULL_4_3_FULL_15_30FPS, VIEWFINDER),
                    MarkedTreeSet(4))};
    TAVIK_ASSERT_OK(provider_.Load(paths, TuningTreeSet::descriptor(), nullptr));
  }

  float Found(const TuningUsecase& usecase, bool fallback) {
    return MarkerOf(provider_.GetTuningTreeSet(usecase, fallback));
  }

  TuningProviderBase provider_;
};

TEST_F(TreeSetLookupTest, EmptyForestFindsNothing) {
  const TuningProviderBase empty;
  ScopedLogCapture capture;
  EXPECT_EQ(empty.GetTuningTreeSet(Gn1Viewfinder(), true), nullptr);
  EXPECT_THAT(capture.messages(kError), ElementsAre("TuningForestMap is empty."));
}

TEST_F(TreeSetLookupTest, ExactKeyIsFoundWithOrWithoutFallback) {
  EXPECT_EQ(Found(Gn1Viewfinder(), false), 3.0f);
  EXPECT_EQ(Found(Gn1Viewfinder(), true), 3.0f);
  EXPECT_EQ(Found(Gn1(FULL_4_3_FULL_15_30FPS, SNAPSHOT), false), 2.0f);
  EXPECT_EQ(provider_.GetTuningTreeSet(Gn1Viewfinder(), false),
            provider_.forest().at(kGn1ViewfinderKey).get());
}

TEST_F(TreeSetLookupTest, AbsentKeyWithoutFallbackFindsNothing) {
  ScopedLogCapture capture;
  EXPECT_EQ(provider_.GetTuningTreeSet(Gn1(FULL_4_3_FULL_15_30FPS, VIDEO_RECORDING), false),
            nullptr);
  EXPECT_THAT(capture.messages(kError),
              ElementsAre("Tuning_usecase not found: BRIMAL_REAR_GN1_NORMAL, "
                          "FULL_4_3_FULL_15_30FPS, VIDEO_RECORDING"));
}

TEST_F(TreeSetLookupTest, FallbackForAnAbsentUsecaseOfAKnownSensorAndModeStaysOnTheMode) {
  // "VIDEO_RECORDING" lies between "SNAPSHOT" and "VIEWFINDER" and shares "VI" with the latter.
  EXPECT_EQ(Found(Gn1(FULL_4_3_FULL_15_30FPS, VIDEO_RECORDING), true), 3.0f);
  // "SNAPSHOT_TORCH" lies between the same two and shares all of "SNAPSHOT".
  EXPECT_EQ(Found(Gn1(FULL_4_3_FULL_15_30FPS, SNAPSHOT_TORCH), true), 2.0f);
}

TEST_F(TreeSetLookupTest, FallbackForAnAbsentModeStaysOnTheSensor) {
  // "FULL_16_9_2160P" shares "FULL_16_9_" with key 1 but only "FULL_" with key 2.
  EXPECT_EQ(Found(Gn1(FULL_16_9_2160P_30FPS, VIEWFINDER), true), 1.0f);
}

TEST_F(TreeSetLookupTest, FallbackForAKeySortingAfterAllOthersIsTheLastKey) {
  EXPECT_EQ(
      Found(MakeUsecase(FENNELMOORE_SENSOR_BRINGUP, FULL_4_3_FULL_15_30FPS, VIEWFINDER), true),
      4.0f);
}

TEST_F(TreeSetLookupTest, FallbackForAKeySortingBeforeAllOthersIsTheFirstKey) {
  EXPECT_EQ(
      Found(MakeUsecase(BRIMAL_FRONT_IMX355_NORMAL, FULL_4_3_FULL_15_30FPS, VIEWFINDER), true),
      1.0f);
}

TEST_F(TuningProviderBaseTest, FallbackTieGoesToTheSmallerKey) {
  const std::string small =
      WriteTuning("small.binarypb", Gn1(FULL_16_9_1080P_30FPS, VIEWFINDER), MarkedTreeSet(1));
  const std::string large =
      WriteTuning("large.binarypb", Gn1(FULL_16_9_720P_30FPS, VIEWFINDER), MarkedTreeSet(2));
  TuningProviderBase provider;
  TAVIK_ASSERT_OK(provider.Load({large, small}, TuningTreeSet::descriptor(), nullptr));
  // "FULL_16_9_2160P" shares "FULL_16_9_" with "FULL_16_9_1080P" and with "FULL_16_9_720P".
  EXPECT_EQ(MarkerOf(provider.GetTuningTreeSet(Gn1(FULL_16_9_2160P_30FPS, VIEWFINDER), true)),
            1.0f);
}

TEST_F(TreeSetLookupTest, HasTuningUsecaseIsAnExactLookup) {
  ScopedLogCapture capture;
  EXPECT_TRUE(provider_.HasTuningUsecase(Gn1Viewfinder()));
  EXPECT_THAT(capture.lines(), IsEmpty());
  EXPECT_FALSE(provider_.HasTuningUsecase(Gn1(FULL_4_3_FULL_15_30FPS, VIDEO_RECORDING)));
  EXPECT_THAT(capture.messages(kWarning),
              ElementsAre("Tuning_usecase not found: BRIMAL_REAR_GN1_NORMAL, "
                          "FULL_4_3_FULL_15_30FPS, VIDEO_RECORDING"));
}

// ---------------------------------------------------------------------------------------------
// Block names.

TEST(FieldNameFromMessageNameTest, GivesTheTreeSetFieldOfABlockMessage) {
  EXPECT_EQ(FieldNameFromMessageName("vosbrine.zelmondrake.GtnrSharpenerTuning"), "gtnr_sharpener");
  EXPECT_EQ(FieldNameFromMessageName("RgbYuvConversionTuning"), "rgb_yuv_conversion");
  EXPECT_EQ(FieldNameFromMessageName("LtmDeltaYTuning"), "ltm_delta_y");
  EXPECT_EQ(FieldNameFromMessageName("LscTuning"), "lsc");
}

TEST(FieldNameFromMessageNameTest, KeepsNamesWithoutTheTuningSuffix) {
  EXPECT_EQ(FieldNameFromMessageName("vosbrine.LscTables"), "lsc_tables");
  EXPECT_EQ(FieldNameFromMessageName("Tuning"), "tuning");  // Six characters: no suffix to drop.
  EXPECT_EQ(FieldNameFromMessageName("TuningTree"), "tuning_tree");
}

TEST(FieldNameFromMessageNameTest, DropsASuffixThatIsTheWholeName) {
  EXPECT_EQ(FieldNameFromMessageName("_tuning"), "");
  EXPECT_EQ(FieldNameFromMessageName("XTuning"), "x");
}

TEST(FieldNameFromMessageNameTest, LowersCapitalsAndPassesOtherCharactersUnchanged) {
  EXPECT_EQ(FieldNameFromMessageName("Ltm2Tuning"), "ltm2");
  EXPECT_EQ(FieldNameFromMessageName("HDR"), "h_d_r");
  EXPECT_EQ(FieldNameFromMessageName("lscTuning"), "lsc");
  EXPECT_EQ(FieldNameFromMessageName("a.b.Snake_caseTuning"), "snake_case");
  EXPECT_EQ(FieldNameFromMessageName(""), "");
}

// A tree set for block switches and fills: gamma on, blc off, gtnr_sharpener on, gtnr off.
TuningTreeSet SwitchedTreeSet() {
  TuningTreeSet tree_set;
  *tree_set.mutable_gamma() = MakeTree(true, ParseText<GammaStaticParam>("gamma_x: [0, 0.5, 1]"),
                                       TwoRegions(GammaR(2), GammaR(6)));
  *tree_set.mutable_blc() = MakeTree(false, BlcStaticParam(), TwoRegions(OffsetsR(2), OffsetsR(6)));
  tree_set.mutable_gtnr_sharpener()->set_enable(true);
  tree_set.mutable_gtnr()->set_enable(false);
  return tree_set;
}

TEST_F(TuningProviderBaseTest, SubBlockIsEnabledByItsTreesSwitch) {
  const auto provider = LoadOne(SwitchedTreeSet());
  EXPECT_TRUE(provider->IsSubBlockEnabled(Gn1Viewfinder(), "GammaTuning", false));
  EXPECT_FALSE(provider->IsSubBlockEnabled(Gn1Viewfinder(), "BlcTuning", false));
  EXPECT_TRUE(provider->IsSubBlockEnabled(Gn1Viewfinder(), "GtnrSharpenerTuning", false));
  EXPECT_FALSE(provider->IsSubBlockEnabled(Gn1Viewfinder(), "GtnrTuning", false));
  EXPECT_FALSE(provider->IsSubBlockEnabled(Gn1Viewfinder(), "WbTuning", false));  // Unset tree.
}

TEST_F(TuningProviderBaseTest, UnknownSubBlockIsNotEnabled) {
  const auto provider = LoadOne(SwitchedTreeSet());
  ScopedLogCapture capture;
  EXPECT_FALSE(provider->IsSubBlockEnabled(Gn1Viewfinder(), "FooTuning", false));
  EXPECT_THAT(capture.messages(kError),
              ElementsAre("Field is not found: foo", "Invalid sub_block_str FooTuning"));
}

TEST_F(TuningProviderBaseTest, SubBlockOfAnAbsentUsecaseIsNotEnabledUnlessFallbackFindsOne) {
  const auto provider = LoadOne(SwitchedTreeSet());
  const TuningUsecase absent = Gn1(FULL_4_3_FULL_15_30FPS, SNAPSHOT);
  ScopedLogCapture capture;
  EXPECT_FALSE(provider->IsSubBlockEnabled(absent, "GammaTuning", false));
  EXPECT_THAT(capture.messages(kError),
              ElementsAre("Tuning_usecase not found: BRIMAL_REAR_GN1_NORMAL, "
                          "FULL_4_3_FULL_15_30FPS, SNAPSHOT",
                          // The use case's text form spans lines; each is a log line of its own.
                          "Invalid tuning_usecase camera_sensor: BRIMAL_REAR_GN1_NORMAL",
                          "sensor_mode: FULL_4_3_FULL_15_30FPS", "camera_usecase: SNAPSHOT", ""));
  EXPECT_TRUE(provider->IsSubBlockEnabled(absent, "GammaTuning", true));
}

// ---------------------------------------------------------------------------------------------
// FillSubBlockTuning.

TEST_F(TuningProviderBaseTest, FillOfANullMessageFails) {
  const auto provider = LoadOne(SwitchedTreeSet());
  EXPECT_THAT(provider->FillSubBlockTuning(Gn1Viewfinder(), CameraState(), nullptr, false, false),
              StatusIs(kInvalidArgument, "sub_block_tuning is nullptr."));
}

TEST_F(TuningProviderBaseTest, FillForAnAbsentUsecaseIsNotFoundWithAnEmptyMessage) {
  const auto provider = LoadOne(SwitchedTreeSet());
  GammaTuning tuning;
  EXPECT_THAT(provider->FillSubBlockTuning(Gn1(FULL_4_3_FULL_15_30FPS, SNAPSHOT), CameraState(),
                                           &tuning, false, false),
              StatusIs(absl::StatusCode::kNotFound, ""));
  TAVIK_EXPECT_OK(provider->FillSubBlockTuning(Gn1(FULL_4_3_FULL_15_30FPS, SNAPSHOT),
                                               StateWith("cct", 15), &tuning, true, false));
  EXPECT_THAT(tuning.dynamic_param().gamma_r(), ElementsAre(4.0f));
}

TEST_F(TuningProviderBaseTest, FillOfAMessageWithoutATreeIsNotFoundNamingTheField) {
  const auto provider = LoadOne(SwitchedTreeSet());
  LscTables tables;
  ScopedLogCapture capture;
  EXPECT_THAT(provider->FillSubBlockTuning(Gn1Viewfinder(), CameraState(), &tables, false, false),
              StatusIs(absl::StatusCode::kNotFound,
                       "TuningUsecaseData does not contain the requested sub block tuning tree "
                       "for lsc_tables"));
  EXPECT_THAT(capture.messages(kError), ElementsAre("Field is not found: lsc_tables"));
}

TEST_F(TuningProviderBaseTest, AbsentUsecaseIsReportedBeforeAMissingTree) {
  const auto provider = LoadOne(SwitchedTreeSet());
  LscTables tables;
  EXPECT_THAT(provider->FillSubBlockTuning(Gn1(FULL_4_3_FULL_15_30FPS, SNAPSHOT), CameraState(),
                                           &tables, false, false),
              StatusIs(absl::StatusCode::kNotFound, ""));
}

TEST_F(TuningProviderBaseTest, EnabledBlockIsInterpolatedAtTheCameraState) {
  const auto provider = LoadOne(SwitchedTreeSet());
  GammaTuning tuning;
  TAVIK_ASSERT_OK(
      provider->FillSubBlockTuning(Gn1Viewfinder(), StateWith("cct", 15), &tuning, false, false));
  EXPECT_TRUE(ProtoEquals(ParseText<GammaTuning>(R"pb(
                            enable: true
                            static_param { gamma_x: [ 0, 0.5, 1 ] }
                            dynamic_param { gamma_r: 4 }
                          )pb"),
                          tuning));
  TAVIK_ASSERT_OK(
      provider->FillSubBlockTuning(Gn1Viewfinder(), StateWith("cct", 25), &tuning, false, false));
  EXPECT_THAT(tuning.dynamic_param().gamma_r(), ElementsAre(6.0f));
}

TEST_F(TuningProviderBaseTest, BypassedBlockGetsTheFirstLeafWhateverTheStateAndReadsDisabled) {
  const auto provider = LoadOne(SwitchedTreeSet());
  for (const float cct : {15.0f, 25.0f}) {
    GammaTuning tuning;
    tuning.set_enable(true);
    TAVIK_ASSERT_OK(provider->FillSubBlockTuning(Gn1Viewfinder(), StateWith("cct", cct), &tuning,
                                                 false, /*bypassed=*/true));
    EXPECT_TRUE(ProtoEquals(ParseText<GammaTuning>(R"pb(
                              enable: false
                              static_param { gamma_x: [ 0, 0.5, 1 ] }
                              dynamic_param { gamma_r: 2 }
                            )pb"),
                            tuning))
        << cct;
  }
}

TEST_F(TuningProviderBaseTest, DisabledBlockGetsTheFirstLeafWhateverTheStateAndReadsDisabled) {
  const auto provider = LoadOne(SwitchedTreeSet());
  for (const float cct : {15.0f, 25.0f}) {
    BlcTuning tuning;
    tuning.set_enable(true);
    TAVIK_ASSERT_OK(provider->FillSubBlockTuning(Gn1Viewfinder(), StateWith("cct", cct), &tuning,
                                                 false, false));
    EXPECT_FALSE(tuning.enable());
    EXPECT_THAT(tuning.dynamic_param().offsets_r(), ElementsAre(2.0f)) << cct;
  }
}

TEST_F(TuningProviderBaseTest, FailedStaticUnpackIsInternalNamingTheUsecase) {
  TuningTreeSet tree_set;
  *tree_set.mutable_blc() = MakeTree(true, ParseText<GammaStaticParam>("gamma_x: 1"),
                                     TwoRegions(OffsetsR(2), OffsetsR(6)));
  const auto provider = LoadOne(tree_set);
  BlcTuning tuning;
  EXPECT_THAT(provider->FillSubBlockTuning(Gn1Viewfinder(), CameraState(), &tuning, false, false),
              StatusIs(absl::StatusCode::kInternal,
                       std::string("Failed to unpack static_param. ") + kGn1ViewfinderDebugString));
  EXPECT_TRUE(tuning.enable());  // Written before the failure.
}

TEST_F(TuningProviderBaseTest, EnabledBlockWithoutDynamicLevelsFailsAsTheTreeDoes) {
  TuningTreeSet tree_set;
  tree_set.mutable_blc()->set_enable(true);
  tree_set.mutable_blc()->mutable_static_param()->PackFrom(BlcStaticParam());
  const auto provider = LoadOne(tree_set);
  BlcTuning tuning;
  EXPECT_THAT(provider->FillSubBlockTuning(Gn1Viewfinder(), CameraState(), &tuning, false, false),
              StatusIs(kInvalidArgument, "Tree does not have dynamic_top_level."));
}

// The first leaf of a disabled gamma tree whose top level is `top`, or its failure.
class FirstLeafFillTest : public TuningProviderBaseTest {
 protected:
  tavik::StatusOr<GammaTuning> FirstLeaf(std::optional<Level> top) {
    TuningTreeSet tree_set;
    TuningTree* tree = tree_set.mutable_gamma();
    tree->mutable_static_param()->PackFrom(GammaStaticParam());
    if (top.has_value()) *tree->mutable_dynamic_top_level() = *top;
    const auto provider = LoadOne(tree_set);
    GammaTuning tuning;
    const Status status =
        provider->FillSubBlockTuning(Gn1Viewfinder(), StateWith("cct", 25), &tuning, false, false);
    if (!status.ok()) return status;
    return tuning;
  }
};

float FirstGammaR(const tavik::StatusOr<GammaTuning>& tuning) {
  if (!tuning.ok() || tuning->dynamic_param().gamma_r_size() != 1) return -1;
  return tuning->dynamic_param().gamma_r(0);
}

TEST_F(FirstLeafFillTest, DescendsIntoChildLevelsToTheFirstLeaf) {
  const Level top = MakeLevel(
      Level::CCT,
      {ChildNode(
           0, 10,
           MakeLevel(Level::BV, {ChildNode(0, 10,
                                           MakeLevel(Level::GAIN, {LeafNode(0, 1, GammaR(3)),
                                                                   LeafNode(2, 3, GammaR(4))})),
                                 LeafNode(20, 30, GammaR(5))})),
       LeafNode(20, 30, GammaR(9))});
  EXPECT_EQ(FirstGammaR(FirstLeaf(top)), 3.0f);
}

TEST_F(FirstLeafFillTest, SkipsLeavesOfAnotherTypeAndNodesWithNeitherChild) {
  WbDynamicParam wb;
  wb.add_wb_gains(1);
  const Level top =
      MakeLevel(Level::CCT, {LeafNode(0, 1, wb), EmptyNode(2, 3), LeafNode(4, 5, GammaR(7))});
  EXPECT_EQ(FirstGammaR(FirstLeaf(top)), 7.0f);
}

TEST_F(FirstLeafFillTest, ChildLevelWithoutNodesEndsTheWalk) {
  const Level top =
      MakeLevel(Level::CCT, {ChildNode(0, 1, MakeLevel(Level::BV, {})), LeafNode(4, 5, GammaR(7))});
  EXPECT_THAT(FirstLeaf(top),
              StatusIs(absl::StatusCode::kInternal, "First dynamic_param not found."));
}

TEST_F(FirstLeafFillTest, WalkDoesNotReturnToAParentLevel) {
  WbDynamicParam wb;
  wb.add_wb_gains(1);
  const Level top = MakeLevel(
      Level::CCT,
      {ChildNode(0, 1, MakeLevel(Level::BV, {LeafNode(0, 1, wb)})), LeafNode(4, 5, GammaR(7))});
  EXPECT_THAT(FirstLeaf(top),
              StatusIs(absl::StatusCode::kInternal, "First dynamic_param not found."));
}

TEST_F(FirstLeafFillTest, TreeWithoutDynamicLevelsHasNoFirstLeaf) {
  EXPECT_THAT(FirstLeaf(std::nullopt),
              StatusIs(absl::StatusCode::kInternal, "First dynamic_param not found."));
}

// Block messages that lack one of the usual fields. Each is named <Block>Tuning, nested so that
// several can stand for the gamma block.
constexpr char kIncompleteBlocksSchema[] = R"pb(
  name: "tavik/iq/incomplete_block_messages.proto"
  package: "tavik_test"
  syntax: "proto3"
  dependency: "tavik/iq/zel/protos/gamma_param.proto"
  message_type {
    name: "NoEnable"
    nested_type {
      name: "GammaTuning"
      field {
        name: "static_param"
        number: 1
        label: LABEL_OPTIONAL
        type: TYPE_MESSAGE
        type_name: ".vosbrine.zelmondrake.GammaStaticParam"
      }
      field {
        name: "dynamic_param"
        number: 2
        label: LABEL_OPTIONAL
        type: TYPE_MESSAGE
        type_name: ".vosbrine.zelmondrake.GammaDynamicParam"
      }
    }
  }
  message_type {
    name: "NoParams"
    nested_type {
      name: "GammaTuning"
      field { name: "enable" number: 3 label: LABEL_OPTIONAL type: TYPE_BOOL }
    }
  }
  message_type {
    name: "NoDynamic"
    nested_type {
      name: "GammaTuning"
      field {
        name: "static_param"
        number: 1
        label: LABEL_OPTIONAL
        type: TYPE_MESSAGE
        type_name: ".vosbrine.zelmondrake.GammaStaticParam"
      }
      field { name: "enable" number: 3 label: LABEL_OPTIONAL type: TYPE_BOOL }
    }
  }
)pb";

class IncompleteBlockFillTest : public TuningProviderBaseTest {
 protected:
  // The message in the form of a GammaTuning, for comparison.
  GammaTuning AsGammaTuning(const Message& message) {
    return ParseText<GammaTuning>(message.ShortDebugString());
  }

  DynamicSchema schema_{kIncompleteBlocksSchema};
};

TEST_F(IncompleteBlockFillTest, MessageWithoutAnEnableFieldStillFills) {
  const auto provider = LoadOne(SwitchedTreeSet());
  std::unique_ptr<Message> tuning = schema_.New("tavik_test.NoEnable.GammaTuning");
  TAVIK_ASSERT_OK(provider->FillSubBlockTuning(Gn1Viewfinder(), StateWith("cct", 15), tuning.get(),
                                               false, false));
  EXPECT_TRUE(ProtoEquals(ParseText<GammaTuning>(R"pb(
                            static_param { gamma_x: [ 0, 0.5, 1 ] }
                            dynamic_param { gamma_r: 4 }
                          )pb"),
                          AsGammaTuning(*tuning)));
  TAVIK_ASSERT_OK(provider->FillSubBlockTuning(Gn1Viewfinder(), StateWith("cct", 15), tuning.get(),
                                               false, /*bypassed=*/true));
  EXPECT_TRUE(ProtoEquals(ParseText<GammaTuning>(R"pb(
                            static_param { gamma_x: [ 0, 0.5, 1 ] }
                            dynamic_param { gamma_r: 2 }
                          )pb"),
                          AsGammaTuning(*tuning)));
}

TEST_F(IncompleteBlockFillTest, MessageWithoutParamsFailsOnStaticParamAfterWritingEnable) {
  const auto provider = LoadOne(SwitchedTreeSet());
  std::unique_ptr<Message> tuning = schema_.New("tavik_test.NoParams.GammaTuning");
  EXPECT_THAT(
      provider->FillSubBlockTuning(Gn1Viewfinder(), StateWith("cct", 15), tuning.get(), false,
                                   false),
      StatusIs(kInvalidArgument, "Can't get mutable static_param message from output message."));
  EXPECT_TRUE(ProtoEquals(ParseText<GammaTuning>("enable: true"), AsGammaTuning(*tuning)));
}

TEST_F(IncompleteBlockFillTest, MessageWithoutDynamicParamFailsAfterUnpackingStaticParam) {
  const auto provider = LoadOne(SwitchedTreeSet());
  std::unique_ptr<Message> tuning = schema_.New("tavik_test.NoDynamic.GammaTuning");
  EXPECT_THAT(
      provider->FillSubBlockTuning(Gn1Viewfinder(), StateWith("cct", 15), tuning.get(), false,
                                   false),
      StatusIs(kInvalidArgument, "Can't get mutable dynamic_param message from output message."));
  EXPECT_TRUE(
      ProtoEquals(ParseText<GammaTuning>("enable: true static_param { gamma_x: [0, 0.5, 1] }"),
                  AsGammaTuning(*tuning)));
}

// ---------------------------------------------------------------------------------------------
// FindMutableDynamicParams.

TEST(FindMutableDynamicParamsTest, NullArgumentsFail) {
  Level level;
  std::vector<google::protobuf::Any*> params;
  EXPECT_THAT(TuningProviderBase::FindMutableDynamicParams(nullptr, &params),
              StatusIs(kInvalidArgument, "level is nullptr"));
  EXPECT_THAT(TuningProviderBase::FindMutableDynamicParams(&level, nullptr),
              StatusIs(kInvalidArgument, "dynamic_params is nullptr"));
  EXPECT_THAT(TuningProviderBase::FindMutableDynamicParams(nullptr, nullptr),
              StatusIs(kInvalidArgument, "level is nullptr"));
}

TEST(FindMutableDynamicParamsTest, GivesEveryLeafDepthFirstInNodeOrder) {
  Level top = MakeLevel(
      Level::CCT,
      {LeafNode(0, 1, GammaR(1)),
       ChildNode(2, 3,
                 MakeLevel(Level::BV,
                           {LeafNode(0, 1, GammaR(2)),
                            ChildNode(2, 3, MakeLevel(Level::GAIN, {LeafNode(0, 1, GammaR(3))})),
                            EmptyNode(4, 5), LeafNode(6, 7, GammaR(4))})),
       EmptyNode(4, 5), LeafNode(6, 7, GammaR(5))});
  std::vector<google::protobuf::Any*> params;
  TAVIK_ASSERT_OK(TuningProviderBase::FindMutableDynamicParams(&top, &params));
  ASSERT_EQ(params.size(), 5u);
  EXPECT_EQ(params[0], top.mutable_nodes(0)->mutable_dynamic_param());
  EXPECT_EQ(params[1],
            top.mutable_nodes(1)->mutable_child_level()->mutable_nodes(0)->mutable_dynamic_param());
  EXPECT_EQ(params[4], top.mutable_nodes(3)->mutable_dynamic_param());
  for (size_t i = 0; i < params.size(); ++i) {
    GammaDynamicParam param;
    ASSERT_TRUE(params[i]->UnpackTo(&param));
    EXPECT_THAT(param.gamma_r(), ElementsAre(static_cast<float>(i + 1)));
  }
  // The leaves are rewritten in place.
  params[2]->PackFrom(GammaR(30));
  GammaDynamicParam rewritten;
  ASSERT_TRUE(top.nodes(1).child_level().nodes(1).child_level().nodes(0).dynamic_param().UnpackTo(
      &rewritten));
  EXPECT_THAT(rewritten.gamma_r(), ElementsAre(30.0f));
}

TEST(FindMutableDynamicParamsTest, AppendsToWhatTheListHeld) {
  Level top = MakeLevel(Level::CCT, {LeafNode(0, 1, GammaR(1))});
  google::protobuf::Any earlier;
  std::vector<google::protobuf::Any*> params = {&earlier};
  TAVIK_ASSERT_OK(TuningProviderBase::FindMutableDynamicParams(&top, &params));
  EXPECT_THAT(params, ElementsAre(&earlier, top.mutable_nodes(0)->mutable_dynamic_param()));
}

}  // namespace
}  // namespace vosbrine
