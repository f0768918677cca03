#include "tools/tavik-tune/eval.h"

#include <sstream>
#include <string>

#include "gmock/gmock.h"
#include "google/protobuf/text_format.h"
#include "gtest/gtest.h"
#include "tavik/base/testing/status_matchers.h"
#include "tavik/base/testing/temp_dir.h"
#include "tavik/iq/zel/protos/ccm_param.pb.h"
#include "tavik/iq/zel/protos/wb_param.pb.h"
#include "tools/tavik-tune/testing/testdata.h"

namespace tavik::tune {
namespace {

using ::tavik::test::IsOk;
using ::tavik::test::StatusIs;
using ::tavik::test::TempDir;
using ::tavik::tune::test::CompileTestdata;
using ::testing::HasSubstr;
using ::testing::StartsWith;

// The text of one block in eval's output: what follows "# <name>\n" up to the next "# ".
std::string BlockText(const std::string& output, const std::string& name) {
  const std::string header = "# " + name + "\n";
  const size_t start = output.find(header);
  if (start == std::string::npos) return "";
  const size_t body = start + header.size();
  const size_t end = output.find("\n# ", body);
  return output.substr(body, end == std::string::npos ? std::string::npos : end + 1 - body);
}

class EvalTest : public ::testing::Test {
 protected:
  void SetUp() override { CompileTestdata(directory_, "eval/gn1_viewfinder"); }

  std::string Eval(std::vector<std::string> args) {
    args.insert(args.begin(), directory_.path());
    StatusOr<EvalRequest> request = ParseEvalArgs(args);
    EXPECT_THAT(request, IsOk());
    if (!request.ok()) return "";
    std::ostringstream out;
    EXPECT_THAT(RunEval(*request, out), IsOk());
    return out.str();
  }

  TempDir directory_;
};

TEST_F(EvalTest, BlendsBetweenTwoColourTemperatureRegions) {
  const std::string output =
      Eval({"--sensor", "BRIMAL_REAR_GN1_NORMAL", "--mode", "FULL_4_3_FULL_15_30FPS",
            "--usecase", "VIEWFINDER", "--cct", "3500", "--block", "WbTuning"});
  EXPECT_THAT(output, StartsWith("# use case: BRIMAL_REAR_GN1_NORMAL, FULL_4_3_FULL_15_30FPS, "
                                 "VIEWFINDER\n# camera state: cct: 3500\n# WbTuning\n"));
  vosbrine::zelmondrake::WbTuning wb;
  ASSERT_TRUE(google::protobuf::TextFormat::ParseFromString(BlockText(output, "WbTuning"), &wb));
  ASSERT_EQ(wb.dynamic_param().wb_gains_size(), 3);
  // By hand: 3500 K lies a quarter of the way from the end of the tungsten region (3000) to the
  // start of the daylight region (5000): t = 500 / 2000 = 0.25, and the red gain is
  // 0.75 * 1.2 + 0.25 * 2.0, each product and the sum rounded to single precision.
  const float t = 0.25f;
  const float red = (1.0f - t) * 1.2f;
  const float daylight_red = t * 2.0f;
  EXPECT_EQ(wb.dynamic_param().wb_gains(0), red + daylight_red);
  EXPECT_NEAR(wb.dynamic_param().wb_gains(0), 1.4f, 1e-6f);
  EXPECT_EQ(wb.dynamic_param().wb_gains(1), 1.0f);
  EXPECT_NEAR(wb.dynamic_param().wb_gains(2), 2.35f, 1e-6f);
  EXPECT_TRUE(wb.enable());
}

TEST_F(EvalTest, DisabledBlockShowsItsFirstLeaf) {
  const std::string output =
      Eval({"--sensor", "BRIMAL_REAR_GN1_NORMAL", "--mode", "FULL_4_3_FULL_15_30FPS",
            "--usecase", "VIEWFINDER", "--cct", "5500", "--block", "ccm"});
  vosbrine::zelmondrake::CcmTuning ccm;
  ASSERT_TRUE(google::protobuf::TextFormat::ParseFromString(BlockText(output, "CcmTuning"), &ccm));
  EXPECT_FALSE(ccm.enable());
  ASSERT_EQ(ccm.dynamic_param().ccm_gains_size(), 9);
  EXPECT_EQ(ccm.dynamic_param().ccm_gains(0), 1.9f);
}

TEST_F(EvalTest, MissingUseCaseFallsBackToTheNearestKey) {
  const std::string output =
      Eval({"--sensor", "BRIMAL_REAR_GN1_NORMAL", "--mode", "FULL_4_3_FULL_15_30FPS",
            "--usecase", "SNAPSHOT", "--block", "wb"});
  EXPECT_THAT(output, StartsWith("# use case: BRIMAL_REAR_GN1_NORMAL, FULL_4_3_FULL_15_30FPS, "
                                 "VIEWFINDER (nearest to BRIMAL_REAR_GN1_NORMAL, "
                                 "FULL_4_3_FULL_15_30FPS, SNAPSHOT)\n"));
}

TEST_F(EvalTest, BlockWithoutATreeFailsAndSaysSo) {
  StatusOr<EvalRequest> request =
      ParseEvalArgs({directory_.path(), "--sensor", "BRIMAL_REAR_GN1_NORMAL", "--mode",
                     "FULL_4_3_FULL_15_30FPS", "--usecase", "VIEWFINDER", "--block", "gamma"});
  ASSERT_THAT(request, IsOk());
  std::ostringstream out;
  EXPECT_THAT(RunEval(*request, out),
              StatusIs(StatusCode::kInternal, StartsWith("Failed to unpack static_param. ")));
  EXPECT_THAT(out.str(), HasSubstr("# GammaTuning (failed: Failed to unpack static_param. "));
}

TEST(EvalArgsTest, AllBlocksWhenNoneIsNamed) {
  StatusOr<EvalRequest> request = ParseEvalArgs(
      {"dir", "--sensor", "BRIMAL_SENSOR_BRINGUP", "--mode", "FULL_4_3_FULL_15_30FPS",
       "--usecase", "VIEWFINDER", "--gain", "4", "--led", "0.5", "--exp-ratio", "2"});
  ASSERT_THAT(request, IsOk());
  EXPECT_EQ(request->blocks.size(), 25u);
  EXPECT_EQ(request->state.level_coordinates().real_gain(), 4.0f);
  EXPECT_EQ(request->state.level_coordinates().led_influence(), 0.5f);
  EXPECT_EQ(request->state.level_coordinates().exp_ratio(), 2.0f);
}

TEST(EvalArgsTest, BadArgumentsAreExplained) {
  const std::vector<std::string> usecase = {"--sensor", "BRIMAL_SENSOR_BRINGUP", "--mode",
                                            "FULL_4_3_FULL_15_30FPS", "--usecase", "VIEWFINDER"};
  auto with = [&usecase](std::vector<std::string> extra) {
    std::vector<std::string> args = {"dir"};
    args.insert(args.end(), usecase.begin(), usecase.end());
    args.insert(args.end(), extra.begin(), extra.end());
    return ParseEvalArgs(args);
  };
  EXPECT_THAT(with({"--cct", "warm"}),
              StatusIs(StatusCode::kInvalidArgument, "--cct takes a number, not 'warm'"));
  EXPECT_THAT(with({"--colour", "1"}),
              StatusIs(StatusCode::kInvalidArgument, "unknown option --colour"));
  EXPECT_THAT(with({"--block", "Sharpness"}),
              StatusIs(StatusCode::kInvalidArgument, "unknown block 'Sharpness'"));
  EXPECT_THAT(with({"--cct"}), StatusIs(StatusCode::kInvalidArgument, "--cct needs a value"));
  EXPECT_THAT(ParseEvalArgs({"dir", "--sensor", "IMX999"}),
              StatusIs(StatusCode::kInvalidArgument, "unknown CameraSensor 'IMX999'"));
  EXPECT_THAT(ParseEvalArgs({"dir", "--sensor", "BRIMAL_SENSOR_BRINGUP"}),
              StatusIs(StatusCode::kInvalidArgument,
                       "--sensor, --mode and --usecase are all required"));
  EXPECT_THAT(ParseEvalArgs({"--sensor", "BRIMAL_SENSOR_BRINGUP"}),
              StatusIs(StatusCode::kInvalidArgument, "no tuning directory given"));
}

}  // namespace
}  // namespace tavik::tune
