#include "tools/tavik-tune/lint.h"

#include <string>
#include <vector>

#include "gmock/gmock.h"
#include "gtest/gtest.h"
#include "tavik/base/testing/temp_dir.h"
#include "tools/tavik-tune/testing/testdata.h"

namespace tavik::tune {
namespace {

using ::tavik::test::TempDir;
using ::tavik::tune::test::CompileTestdata;
using ::tavik::tune::test::TestdataPath;
using ::testing::ElementsAre;
using ::testing::IsEmpty;

// The findings of one broken black-level tree, with the file shown as FILE. The test files hold
// that tree alone, so the line about the other blocks' missing trees is left out here.
std::vector<std::string> BlcFindings(const std::string& name) {
  TempDir directory;
  const std::string file = CompileTestdata(directory, "lint/" + name);
  std::vector<std::string> lines;
  for (const LintFinding& finding : LintPaths({file})) {
    if (finding.block != "BlcTuning") continue;
    LintFinding shown = finding;
    shown.file = "FILE";
    lines.push_back(shown.ToString());
  }
  return lines;
}

TEST(LintTest, CleanTreeHasNoFinding) { EXPECT_THAT(BlcFindings("clean"), IsEmpty()); }

TEST(LintTest, NodesNotAscendingByUpper) {
  EXPECT_THAT(BlcFindings("unsorted_nodes"),
              ElementsAre("FILE: BlcTuning: GAIN#1(1..4): not ascending by upper: 4 after 64; "
                          "region lookup picks wrong regions"));
}

TEST(LintTest, LowerAboveUpper) {
  EXPECT_THAT(BlcFindings("lower_above_upper"),
              ElementsAre("FILE: BlcTuning: GAIN#0(4..1): lower 4 > upper 1"));
}

TEST(LintTest, OverlappingRegions) {
  EXPECT_THAT(BlcFindings("overlapping_regions"),
              ElementsAre("FILE: BlcTuning: GAIN#1(4..64): overlaps the region before it, which "
                          "ends at 8"));
}

TEST(LintTest, UnknownLevelType) {
  EXPECT_THAT(BlcFindings("unknown_level_type"),
              ElementsAre("FILE: BlcTuning: UNKNOWN level: level type UNKNOWN: evaluation fails"));
}

TEST(LintTest, OutOfRangeLevelType) {
  EXPECT_THAT(BlcFindings("out_of_range_level_type"),
              ElementsAre("FILE: BlcTuning: type 42 level: level type 42 is out of range: "
                          "evaluation fails"));
}

TEST(LintTest, EmptyLevel) {
  EXPECT_THAT(BlcFindings("empty_level"),
              ElementsAre("FILE: BlcTuning: CCT#0(2300..2850) > GAIN level: empty level: "
                          "evaluation fails"));
}

TEST(LintTest, NodeWithNeitherChildNorLeaf) {
  EXPECT_THAT(BlcFindings("node_without_child"),
              ElementsAre("FILE: BlcTuning: GAIN#0(1..4): node has neither child_level nor "
                          "dynamic_param: evaluation fails"));
}

TEST(LintTest, LeafOfAnotherType) {
  EXPECT_THAT(BlcFindings("wrong_leaf_type"),
              ElementsAre("FILE: BlcTuning: GAIN#1(8..64): dynamic_param packs "
                          "vosbrine.zelmondrake.WbDynamicParam, expected "
                          "vosbrine.zelmondrake.BlcDynamicParam"));
}

TEST(LintTest, RepeatedFloatLengthsDifferBetweenLeaves) {
  EXPECT_THAT(BlcFindings("mismatched_lengths"),
              ElementsAre("FILE: BlcTuning: GAIN#1(8..64): offsets_r has 3 values, 4 in the leaf "
                          "at GAIN#0(1..4): the blend keeps the lower region's list"));
}

TEST(LintTest, StaticParamOfAnotherType) {
  EXPECT_THAT(BlcFindings("wrong_static_param"),
              ElementsAre("FILE: BlcTuning: static_param: static_param packs "
                          "vosbrine.zelmondrake.GammaStaticParam, expected "
                          "vosbrine.zelmondrake.BlcStaticParam"));
}

TEST(LintTest, TypeUrlWithoutTheFullName) {
  EXPECT_THAT(BlcFindings("short_type_url"),
              ElementsAre("FILE: BlcTuning: GAIN#1(8..64): dynamic_param type URL "
                          "'type.googleapis.com/BlcDynamicParam' lacks the full name "
                          "vosbrine.zelmondrake.BlcDynamicParam"));
}

TEST(LintTest, MissingTreesAreOneFindingForTheFile) {
  TempDir directory;
  const std::string file = CompileTestdata(directory, "lint/clean");
  const std::vector<LintFinding> findings = LintPaths({file});
  ASSERT_EQ(findings.size(), 1u);
  EXPECT_EQ(findings[0].ToString(),
            file + ": -: -: no tree for 24 blocks (CcmTuning, ClutTuning, DisparityTuning, "
                   "DmscTuning, DpcTuning, EdgedetTuning, GammaTuning, GtnrSharpenerTuning, "
                   "GtnrTuning, HqdnsTuning, LscStatsTuning, LscTuning, LtmTuning, "
                   "LtmDeltaYTuning, NfltrTuning, NsmixTuning, PrcTuning, "
                   "RgbYuvConversionTuning, SensorGammaTuning, SharpTuning, SkindTuning, "
                   "SnaddTuning, StkTuning, WbTuning): a request for any of them fails");
}

TEST(LintTest, DuplicateUseCaseKeysAcrossFiles) {
  TempDir directory;
  const std::string first = CompileTestdata(directory, "lint/duplicate_key_a");
  const std::string second = CompileTestdata(directory, "lint/duplicate_key_b");
  std::vector<std::string> file_findings;
  for (const LintFinding& finding : LintPaths({first, second})) {
    if (finding.problem.rfind("no tree for", 0) != 0) file_findings.push_back(finding.ToString());
  }
  EXPECT_THAT(file_findings,
              ElementsAre(second + ": -: -: duplicate use case key 'BRIMAL_REAR_GN1_NORMAL, "
                                   "FULL_4_3_FULL_15_30FPS, VIEWFINDER', also in " +
                          first + ": the runtime keeps the file it reads first"));
}

TEST(LintTest, FileThatIsNoBinarypb) {
  const std::string notes = TestdataPath("lint/notes.txt");
  const std::vector<LintFinding> findings = LintPaths({notes});
  ASSERT_EQ(findings.size(), 1u);
  EXPECT_EQ(findings[0].ToString(), notes + ": -: -: not a .binarypb file: the runtime skips it");
}

TEST(LintTest, DirectoriesAreSearchedOneLevelDeep) {
  TempDir directory;
  CompileTestdata(directory, "lint/clean");
  directory.WriteFile("README", "about this directory");
  directory.WriteFile("nested/unsorted.binarypb", "not looked at");
  std::vector<std::string> problems;
  for (const LintFinding& finding : LintPaths({directory.path()})) {
    if (finding.problem.rfind("no tree for", 0) != 0) problems.push_back(finding.ToString());
  }
  EXPECT_THAT(problems, ::testing::UnorderedElementsAre(
                            directory.Path("README") + ": -: -: not a .binarypb file: the "
                                                       "runtime skips it",
                            directory.Path("nested") + ": -: -: not a .binarypb file: the "
                                                       "runtime skips it"));
}

TEST(LintTest, UnreadableFileIsAFinding) {
  TempDir directory;
  const std::string file = directory.WriteFile("broken.binarypb", "\xff\xff\xff");
  const std::vector<LintFinding> findings = LintPaths({file});
  ASSERT_EQ(findings.size(), 1u);
  EXPECT_EQ(findings[0].ToString(),
            file + ": -: -: Could not parse file contents of " + file +
                " as wire-format protobuf of type vosbrine.TuningUsecaseData");
}

}  // namespace
}  // namespace tavik::tune
