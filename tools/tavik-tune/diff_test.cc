#include "tools/tavik-tune/diff.h"

#include <string>
#include <vector>

#include "gmock/gmock.h"
#include "gtest/gtest.h"
#include "tavik/base/testing/status_matchers.h"
#include "tavik/base/testing/temp_dir.h"
#include "tools/tavik-tune/testing/testdata.h"

namespace tavik::tune {
namespace {

using ::tavik::test::IsOk;
using ::tavik::test::IsOkAndHolds;
using ::tavik::test::StatusIs;
using ::tavik::test::TempDir;
using ::tavik::tune::test::CompileTestdata;
using ::testing::ElementsAre;
using ::testing::IsEmpty;
using ::testing::StartsWith;

constexpr char kKey[] = "BRIMAL_REAR_GN1_NORMAL, FULL_4_3_FULL_15_30FPS, VIEWFINDER";

std::string Line(const std::string& rest) { return std::string(kKey) + ": " + rest; }

StatusOr<std::vector<std::string>> DiffPaths(const std::string& old_path,
                                             const std::string& new_path,
                                             std::vector<std::string> options = {}) {
  std::vector<std::string> args = {old_path, new_path};
  args.insert(args.end(), options.begin(), options.end());
  StatusOr<DiffRequest> request = ParseDiffArgs(args);
  if (!request.ok()) return request.status();
  StatusOr<std::vector<DiffFinding>> findings = DiffTunings(*request);
  if (!findings.ok()) return findings.status();
  std::vector<std::string> lines;
  for (const DiffFinding& finding : *findings) lines.push_back(finding.ToString());
  return lines;
}

// The differences from testdata/diff/<old_name> to testdata/diff/<new_name>, as files.
std::vector<std::string> DiffFiles(const std::string& old_name, const std::string& new_name) {
  TempDir old_directory, new_directory;
  StatusOr<std::vector<std::string>> lines =
      DiffPaths(CompileTestdata(old_directory, "diff/" + old_name, "tuning"),
                CompileTestdata(new_directory, "diff/" + new_name, "tuning"));
  EXPECT_THAT(lines, IsOk());
  return lines.ok() ? *lines : std::vector<std::string>{};
}

TEST(DiffTest, FileAgainstItselfHasNoDifference) {
  TempDir directory;
  const std::string file = CompileTestdata(directory, "diff/base");
  EXPECT_THAT(DiffPaths(file, file), IsOkAndHolds(IsEmpty()));
  EXPECT_THAT(DiffFiles("base", "base"), IsEmpty());
}

TEST(DiffTest, TreeAddedOrRemoved) {
  EXPECT_THAT(DiffFiles("base", "tree_removed"), ElementsAre(Line("StkTuning: -: tree removed")));
  EXPECT_THAT(DiffFiles("tree_removed", "base"), ElementsAre(Line("StkTuning: -: tree added")));
}

TEST(DiffTest, SwitchOfATree) {
  EXPECT_THAT(DiffFiles("base", "enable_changed"),
              ElementsAre(Line("WbTuning: -: enable: true -> false")));
}

TEST(DiffTest, StaticParameterChanged) {
  EXPECT_THAT(DiffFiles("base", "static_changed"),
              ElementsAre(Line("StkTuning: static_param: enable_prepostgamma: false -> true")));
}

TEST(DiffTest, LevelTypeChanged) {
  EXPECT_THAT(DiffFiles("base", "level_type_changed"),
              ElementsAre(Line("WbTuning: CCT level: level type CCT -> BV: the subtree is "
                               "replaced")));
}

TEST(DiffTest, RegionAddedOrRemoved) {
  EXPECT_THAT(DiffFiles("base", "region_added"),
              ElementsAre(Line("WbTuning: CCT level: region 7000..8000 added")));
  EXPECT_THAT(DiffFiles("region_added", "base"),
              ElementsAre(Line("WbTuning: CCT level: region 7000..8000 removed")));
}

TEST(DiffTest, RegionMoved) {
  EXPECT_THAT(DiffFiles("base", "region_moved"),
              ElementsAre(Line("WbTuning: CCT level: region 5000..6000 -> 5500..6500")));
}

TEST(DiffTest, LeafValuesChanged) {
  EXPECT_THAT(DiffFiles("base", "leaf_changed"),
              ElementsAre(Line("WbTuning: CCT#0(2000..3000) > GAIN#1(4..8): wb_gains[2]: 2.2 -> "
                               "2.3"),
                          Line("WbTuning: CCT#1(5000..6000): wb_gains[0]: 2 -> 2.1")));
  EXPECT_THAT(DiffFiles("base", "list_shortened"),
              ElementsAre(Line("WbTuning: CCT#1(5000..6000): wb_gains: 3 values -> 2 values")));
}

TEST(DiffTest, LeafBecameALevel) {
  EXPECT_THAT(DiffFiles("base", "leaf_to_level"),
              ElementsAre(Line("WbTuning: CCT#1(5000..6000): leaf -> GAIN level")));
  EXPECT_THAT(DiffFiles("leaf_to_level", "base"),
              ElementsAre(Line("WbTuning: CCT#1(5000..6000): GAIN level -> leaf")));
}

TEST(DiffTest, VersionText) {
  EXPECT_THAT(DiffFiles("base", "version_changed"),
              ElementsAre(Line("-: -: version: \"1\" -> \"2\"")));
}

TEST(DiffTest, TwoFilesOfOtherKeysAreComparedWithEachOther) {
  EXPECT_THAT(DiffFiles("base", "snapshot"),
              ElementsAre("-: -: -: use case: " + std::string(kKey) +
                          " -> BRIMAL_REAR_GN1_NORMAL, FULL_4_3_FULL_15_30FPS, SNAPSHOT"));
}

TEST(DiffTest, GoldenFilesAreComparedByValue) {
  TempDir old_directory, new_directory;
  const std::string name = "golden_sensor_factory_calibration_data";
  const std::string old_file = CompileTestdata(old_directory, "diff/" + name);
  const std::string new_file =
      CompileTestdata(new_directory, "diff/golden_red_changed_" + name, name);
  EXPECT_THAT(DiffPaths(old_file, old_file), IsOkAndHolds(IsEmpty()));
  EXPECT_THAT(DiffPaths(old_file, new_file),
              IsOkAndHolds(ElementsAre("golden BRIMAL_REAR_GN1_NORMAL: -: calibration_data: "
                                       "lsc.lsc_grid_gain_r[0]: 1.5 -> 1.75")));
}

class DiffDirectoryTest : public ::testing::Test {
 protected:
  void SetUp() override {
    CompileTestdata(old_, "diff/base", "viewfinder");
    CompileTestdata(old_, "diff/snapshot");
    CompileTestdata(old_, "diff/golden_sensor_factory_calibration_data");
    old_.WriteFile("notes.txt", "the runtime reads .binarypb files only\n");
    CompileTestdata(new_, "diff/leaf_changed", "viewfinder");
    CompileTestdata(new_, "diff/video");
    CompileTestdata(new_, "diff/golden_red_changed_golden_sensor_factory_calibration_data",
                    "golden_sensor_factory_calibration_data");
  }

  TempDir old_, new_;
};

TEST_F(DiffDirectoryTest, DirectoryAgainstItselfHasNoDifference) {
  EXPECT_THAT(DiffPaths(old_.path(), old_.path()), IsOkAndHolds(IsEmpty()));
}

TEST_F(DiffDirectoryTest, UseCasesMatchByKeyAndGoldensBySensor) {
  EXPECT_THAT(
      DiffPaths(old_.path(), new_.path()),
      IsOkAndHolds(ElementsAre(
          "BRIMAL_REAR_GN1_NORMAL, FULL_4_3_FULL_15_30FPS, SNAPSHOT: -: -: removed (was " +
              old_.Path("snapshot.binarypb") + ")",
          "BRIMAL_REAR_GN1_NORMAL, FULL_4_3_FULL_15_30FPS, VIDEO_VIEWFINDER: -: -: added (in " +
              new_.Path("video.binarypb") + ")",
          Line("WbTuning: CCT#0(2000..3000) > GAIN#1(4..8): wb_gains[2]: 2.2 -> 2.3"),
          Line("WbTuning: CCT#1(5000..6000): wb_gains[0]: 2 -> 2.1"),
          "golden BRIMAL_REAR_GN1_NORMAL: -: calibration_data: lsc.lsc_grid_gain_r[0]: 1.5 -> "
          "1.75")));
}

TEST_F(DiffDirectoryTest, FileAgainstADirectoryMatchesByKey) {
  EXPECT_THAT(DiffPaths(old_.Path("viewfinder.binarypb"), old_.path()),
              IsOkAndHolds(ElementsAre(
                  "BRIMAL_REAR_GN1_NORMAL, FULL_4_3_FULL_15_30FPS, SNAPSHOT: -: -: added (in " +
                      old_.Path("snapshot.binarypb") + ")",
                  "golden BRIMAL_REAR_GN1_NORMAL: -: -: added (in " +
                      old_.Path("golden_sensor_factory_calibration_data.binarypb") + ")")));
}

TEST(DiffSampleSetTest, SampleTuningSetAgainstItselfHasNoDifference) {
  EXPECT_THAT(DiffPaths(TAVIK_SAMPLE_TUNING_DIR, TAVIK_SAMPLE_TUNING_DIR), IsOkAndHolds(IsEmpty()));
}

TEST(DiffFailureTest, FilesThatCantBeRead) {
  TempDir directory;
  const std::string missing = directory.Path("absent.binarypb");
  EXPECT_THAT(DiffPaths(missing, missing),
              StatusIs(StatusCode::kNotFound, missing + ": cannot open"));
  const std::string garbage = directory.WriteFile("garbage.binarypb", "\xff\xff\xff");
  EXPECT_THAT(DiffPaths(garbage, garbage),
              StatusIs(StatusCode::kInvalidArgument,
                       StartsWith("Could not parse file contents of " + garbage)));
  EXPECT_THAT(DiffPaths(directory.path(), directory.path()),
              StatusIs(StatusCode::kInvalidArgument,
                       StartsWith("Could not parse file contents of " + garbage)));
}

TEST(DiffArgsTest, TwoPathsAndAnOption) {
  StatusOr<DiffRequest> request = ParseDiffArgs({"a", "--all", "b"});
  ASSERT_THAT(request, IsOk());
  EXPECT_EQ(request->old_path, "a");
  EXPECT_EQ(request->new_path, "b");
  EXPECT_TRUE(request->all_elements);
  EXPECT_FALSE(ParseDiffArgs({"a", "b"})->all_elements);
  EXPECT_THAT(ParseDiffArgs({"a"}),
              StatusIs(StatusCode::kInvalidArgument, "give two tunings, OLD and NEW"));
  EXPECT_THAT(ParseDiffArgs({"a", "b", "c"}),
              StatusIs(StatusCode::kInvalidArgument, "give two tunings, OLD and NEW"));
  EXPECT_THAT(ParseDiffArgs({"a", "b", "--brief"}),
              StatusIs(StatusCode::kInvalidArgument, "unknown option --brief"));
}

}  // namespace
}  // namespace tavik::tune
