#include "tools/tavik-sim/session_runner.h"

#include <algorithm>
#include <fstream>
#include <memory>
#include <regex>
#include <sstream>
#include <string>
#include <vector>

#include "gmock/gmock.h"
#include "gtest/gtest.h"
#include "tavik/base/strings.h"
#include "tavik/base/testing/status_matchers.h"
#include "tavik/base/testing/temp_dir.h"
#include "tools/tavik-sim/frame_log.h"
#include "tools/tavik-sim/summary.h"

namespace tavik::sim {
namespace {

using ::testing::ElementsAreArray;
using ::testing::IsEmpty;

std::unique_ptr<ZelTuningController> MakeController() {
  return std::make_unique<ZelTuningController>(
      "", std::vector<std::string>{TAVIK_SAMPLE_TUNING_DIR},
      FlatHashMap<TuningSensorKey, tavik_api::LensShadingCalibrationData>());
}

std::vector<SimFrame> DefaultFrames() {
  StatusOr<Scenario> scenario = DefaultScenario();
  EXPECT_TRUE(scenario.ok()) << scenario.status();
  return ExpandScenario(*scenario);
}

std::string ReadFile(const std::string& path) {
  std::ifstream in(path);
  std::ostringstream text;
  text << in.rdbuf();
  return text.str();
}

std::string WithoutTiming(const std::string& text) {
  return std::regex_replace(text, std::regex(",\"timing\":\\{[^}]*\\}"), "");
}

// The blocks of a bundle: every block but SensorGammaTuning, which this generation does not
// interpolate.
std::vector<std::string> BundleBlocks(const FrameRecord& record) {
  std::vector<std::string> names;
  for (size_t i = 0; i < kZelBlockCount; ++i) {
    if (record.in_bundle[i]) names.emplace_back(kZelBlockNames[i]);
  }
  return names;
}

TEST(RunSessionTest, DefaultScenarioSignalsEveryFenceInOrder) {
  std::unique_ptr<ZelTuningController> controller = MakeController();
  ASSERT_NE(controller->provider(), nullptr);
  const std::vector<FrameRecord> records = RunSession(*controller, DefaultFrames());
  ASSERT_EQ(records.size(), 300u);
  for (const FrameRecord& record : records) {
    EXPECT_TRUE(record.fence_signalled) << "frame " << record.frame.index;
    EXPECT_FALSE(record.fence_timed_out) << "frame " << record.frame.index;
    EXPECT_TRUE(record.earlier_fences_signalled) << "frame " << record.frame.index;
    EXPECT_THAT(record.failures, IsEmpty()) << "frame " << record.frame.index;
    EXPECT_FALSE(record.translations.empty()) << "frame " << record.frame.index;
  }
  EXPECT_FALSE(RunFailed(records));
}

TEST(RunSessionTest, BlocksAreRefreshedExactlyWhenTheControllerSeesAChange) {
  // The default scenario's frame counter moves every frame; the stalled example holds everything
  // still for a while, then steps.
  StatusOr<Scenario> stalled =
      ReadScenarioFile(StrCat(TAVIK_SIM_EXAMPLES_DIR, "/rear_video_stall.textproto"));
  ASSERT_TRUE(stalled.ok()) << stalled.status();
  for (const std::vector<SimFrame>& frames : {DefaultFrames(), ExpandScenario(*stalled)}) {
    std::unique_ptr<ZelTuningController> controller = MakeController();
    const std::vector<FrameRecord> records = RunSession(*controller, frames);
    ASSERT_EQ(records.size(), frames.size());
    int hits = 0;
    for (size_t i = 0; i < records.size(); ++i) {
      bool updated = true;
      if (i > 0) {
        const std::shared_ptr<TuningPoint> before = controller->CreateTuningPoint(
            frames[i - 1].use_case, frames[i - 1].tuning_info, frames[i - 1].coordinates);
        const std::shared_ptr<TuningPoint> now = controller->CreateTuningPoint(
            frames[i].use_case, frames[i].tuning_info, frames[i].coordinates);
        TAVIK_ASSERT_OK_AND_ASSIGN(updated, controller->IsTuningPointUpdated(*before, *now));
      }
      if (updated) {
        EXPECT_THAT(records[i].refreshed_blocks, ElementsAreArray(BundleBlocks(records[i])))
            << "frame " << i;
      } else {
        ++hits;
        EXPECT_THAT(records[i].refreshed_blocks, IsEmpty()) << "frame " << i;
      }
    }
    if (frames.size() == 60) {
      EXPECT_EQ(hits, 29);
    }
  }
}

TEST(RunSessionTest, KeysFollowTheScenariosSensorAndModes) {
  std::unique_ptr<ZelTuningController> controller = MakeController();
  const std::vector<FrameRecord> records = RunSession(*controller, DefaultFrames());
  ASSERT_EQ(records.size(), 300u);
  for (const FrameRecord& record : records) {
    const int i = record.frame.index;
    std::string key;
    std::string resolved;
    if (i < 150) {
      key = resolved = "BRIMAL_REAR_GN1_NORMAL, FULL_4_3_FULL_15_30FPS, VIEWFINDER";
    } else if (i < 200) {
      // No torch file for this mode: the nearest key is the plain viewfinder.
      key = "BRIMAL_REAR_GN1_NORMAL, FULL_4_3_FULL_15_30FPS, VIEWFINDER_TORCH";
      resolved = "BRIMAL_REAR_GN1_NORMAL, FULL_4_3_FULL_15_30FPS, VIEWFINDER";
    } else if (i < 220) {
      key = resolved = "BRIMAL_REAR_GN1_NORMAL, FULL_4_3_FULL_15_30FPS, SNAPSHOT";
    } else {
      key = "BRIMAL_REAR_GN1_NORMAL, FULL_16_9_1080P_30FPS, VIDEO_RECORDING";
      resolved = "BRIMAL_REAR_GN1_NORMAL, FULL_16_9_1080P_30_60FPS, VIDEO_RECORDING";
    }
    EXPECT_EQ(record.key, key) << "frame " << i;
    EXPECT_EQ(record.resolved_key, resolved) << "frame " << i;
  }
}

TEST(RunSessionTest, FrontCameraBinnedKeys) {
  StatusOr<Scenario> front =
      ReadScenarioFile(StrCat(TAVIK_SIM_EXAMPLES_DIR, "/front_selfie.textproto"));
  ASSERT_TRUE(front.ok()) << front.status();
  std::unique_ptr<ZelTuningController> controller = MakeController();
  const std::vector<FrameRecord> records = RunSession(*controller, ExpandScenario(*front));
  ASSERT_EQ(records.size(), 90u);
  EXPECT_EQ(records[0].key, "BRIMAL_FRONT_IMX663_NORMAL, BINNING2X2_4_3_FULL_15_30FPS, VIEWFINDER");
  EXPECT_EQ(records[0].resolved_key, records[0].key);
  EXPECT_EQ(records[80].key,
            "BRIMAL_FRONT_IMX663_NORMAL, BINNING2X2_4_3_FULL_15_30FPS, VIEWFINDER_3P");
  EXPECT_EQ(records[80].resolved_key,
            "BRIMAL_FRONT_IMX663_NORMAL, BINNING2X2_4_3_FULL_15_30FPS, VIEWFINDER");
  EXPECT_FALSE(RunFailed(records));
}

TEST(RunSessionTest, SameScenarioGivesTheSameFrameLogWithoutTiming) {
  tavik::test::TempDir dir;
  std::vector<std::string> logs;
  for (int run = 0; run < 2; ++run) {
    std::unique_ptr<ZelTuningController> controller = MakeController();
    const std::string path = dir.Path(StrCat("frames", run, ".jsonl"));
    TAVIK_ASSERT_OK(WriteFrameLog(path, RunSession(*controller, DefaultFrames())));
    logs.push_back(ReadFile(path));
  }
  ASSERT_FALSE(logs[0].empty());
  EXPECT_NE(logs[0].find(",\"timing\":{\"create_ns\":"), std::string::npos);
  const std::string first = WithoutTiming(logs[0]);
  EXPECT_EQ(first.find("\"timing\""), std::string::npos);
  EXPECT_EQ(first, WithoutTiming(logs[1]));
  EXPECT_EQ(std::count(first.begin(), first.end(), '\n'), 300);
}

}  // namespace
}  // namespace tavik::sim
