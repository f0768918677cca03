#include "tools/tavik-sim/scenario.h"

#include <string>
#include <vector>

#include "gmock/gmock.h"
#include "gtest/gtest.h"
#include "tavik/base/strings.h"
#include "tavik/base/testing/status_matchers.h"
#include "tavik/base/testing/temp_dir.h"

namespace tavik::sim {
namespace {

using ::tavik::test::StatusIs;
using ::testing::Eq;

constexpr char kTwoSegments[] = R"pb(
  segments {
    name: "ramp"
    frames: 3
    sensor { name: "GN1" }
    mode_size { width: 4032 height: 3024 }
    image_size { width: 4032 height: 3024 }
    cct { start: 3000 end: 5000 }
    real_gain { start: 8 }
  }
  segments {
    name: "carried"
    frames: 2
    use_case { type: SNAPSHOT torch: true }
    hold_frame_count: 9
  }
)pb";

TEST(ExpandScenarioTest, RampsLinearlyAndCarriesValuesIntoTheNextSegment) {
  TAVIK_ASSERT_OK_AND_ASSIGN(const Scenario scenario, ParseScenario(kTwoSegments, "two"));
  const std::vector<SimFrame> frames = ExpandScenario(scenario);
  ASSERT_EQ(frames.size(), 5u);
  EXPECT_EQ(frames[0].coordinates.cct, 3000.0f);
  EXPECT_EQ(frames[1].coordinates.cct, 4000.0f);
  EXPECT_EQ(frames[2].coordinates.cct, 5000.0f);
  EXPECT_EQ(frames[1].coordinates.real_gain, 8.0f);
  // The second segment holds the first one's end values on the same sensor mode.
  EXPECT_EQ(frames[3].coordinates.cct, 5000.0f);
  EXPECT_EQ(frames[4].coordinates.cct, 5000.0f);
  EXPECT_EQ(frames[4].coordinates.real_gain, 8.0f);
  EXPECT_EQ(frames[4].tuning_info.sensor_mode_info.sensor_name, "GN1");
  EXPECT_EQ(frames[4].tuning_info.image_size.width, 4032);
  EXPECT_EQ(frames[4].use_case.type, 1);
  EXPECT_TRUE(frames[4].use_case.torch);
  EXPECT_TRUE(frames[4].use_case.first_party);
  EXPECT_EQ(frames[4].segment_name, "carried");
  // The frame counter is the frame's index unless a segment holds it.
  EXPECT_EQ(frames[2].coordinates.frame_count, 2);
  EXPECT_EQ(frames[3].coordinates.frame_count, 9);
  EXPECT_EQ(frames[4].coordinates.frame_count, 9);
  EXPECT_EQ(frames[4].index, 4);
  EXPECT_EQ(frames[4].tuning_info.sensor_mode_info.binning_x, 1);
}

TEST(ExpandScenarioTest, StopsAtTheFrameLimit) {
  TAVIK_ASSERT_OK_AND_ASSIGN(const Scenario scenario, ParseScenario(kTwoSegments, "two"));
  EXPECT_EQ(ExpandScenario(scenario, 4).size(), 4u);
  EXPECT_EQ(ExpandScenario(scenario, 0).size(), 0u);
  EXPECT_EQ(ExpandScenario(scenario, 100).size(), 5u);
}

TEST(DefaultScenarioTest, WalksFromTungstenToDaylightThenTorchSnapshotAndVideo) {
  TAVIK_ASSERT_OK_AND_ASSIGN(const Scenario scenario, DefaultScenario());
  const std::vector<SimFrame> frames = ExpandScenario(scenario);
  ASSERT_EQ(frames.size(), 300u);
  const SimFrame& first = frames.front();
  EXPECT_EQ(first.tuning_info.sensor_mode_info.sensor_name, "GN1");
  EXPECT_EQ(first.tuning_info.module_spec.facing, 0);
  EXPECT_EQ(first.tuning_info.module_spec.lens_type, 0);
  EXPECT_EQ(first.tuning_info.image_size.width, 4032);
  EXPECT_EQ(first.tuning_info.image_size.height, 3024);
  EXPECT_EQ(first.tuning_info.sensor_mode_info.target_fps_range.min, 15.0f);
  EXPECT_EQ(first.tuning_info.sensor_mode_info.target_fps_range.max, 30.0f);
  EXPECT_EQ(first.coordinates.cct, 2800.0f);
  EXPECT_EQ(first.coordinates.real_gain, 16.0f);
  EXPECT_EQ(first.use_case.type, 0);
  // The walk out ends in daylight at low gain.
  EXPECT_EQ(frames[119].coordinates.cct, 6000.0f);
  EXPECT_EQ(frames[119].coordinates.real_gain, 1.5f);
  // The torch comes on and fades back.
  EXPECT_TRUE(frames[150].use_case.torch);
  EXPECT_EQ(frames[150].coordinates.led_influence, 0.0f);
  EXPECT_EQ(frames[174].coordinates.led_influence, 1.0f);
  EXPECT_EQ(frames[199].coordinates.led_influence, 0.0f);
  EXPECT_FALSE(frames[200].use_case.torch);
  EXPECT_EQ(frames[200].use_case.type, 1);
  const SimFrame& last = frames.back();
  EXPECT_EQ(last.use_case.type, 3);
  EXPECT_EQ(last.tuning_info.image_size.width, 1920);
  EXPECT_EQ(last.tuning_info.image_size.height, 1080);
  EXPECT_EQ(last.tuning_info.sensor_mode_info.target_fps_range.min, 30.0f);
  EXPECT_EQ(last.tuning_info.sensor_mode_info.target_fps_range.max, 30.0f);
  EXPECT_EQ(last.coordinates.frame_count, 299);
}

TEST(ReadScenarioFileTest, ReadsTheExamples) {
  for (const char* name : {"front_selfie.textproto", "rear_video_stall.textproto"}) {
    TAVIK_ASSERT_OK_AND_ASSIGN(const Scenario scenario,
                               ReadScenarioFile(StrCat(TAVIK_SIM_EXAMPLES_DIR, "/", name)));
    EXPECT_FALSE(ExpandScenario(scenario).empty()) << name;
  }
  TAVIK_ASSERT_OK_AND_ASSIGN(
      const Scenario front,
      ReadScenarioFile(StrCat(TAVIK_SIM_EXAMPLES_DIR, "/front_selfie.textproto")));
  const SimFrame frame = ExpandScenario(front).front();
  EXPECT_EQ(frame.tuning_info.sensor_mode_info.sensor_name, "IMX663");
  EXPECT_EQ(frame.tuning_info.module_spec.facing, 1);
  EXPECT_EQ(frame.tuning_info.sensor_mode_info.binning_x, 2);
  EXPECT_EQ(frame.tuning_info.sensor_mode_info.binning_y, 2);
}

TEST(ReadScenarioFileTest, UnknownFieldNamesTheFileLineAndField) {
  tavik::test::TempDir dir;
  const std::string path = dir.WriteFile("bad.textproto", "segments { frame: 3 }\n");
  EXPECT_THAT(ReadScenarioFile(path).status(),
              StatusIs(StatusCode::kInvalidArgument,
                       Eq(StrCat(path,
                                 ":1:17: Message type \"tavik.sim.Segment\" has no field "
                                 "named \"frame\"."))));
}

TEST(ReadScenarioFileTest, UnknownEnumNameNamesTheValue) {
  tavik::test::TempDir dir;
  const std::string path =
      dir.WriteFile("bad.textproto", "segments {\n  frames: 3\n  use_case { type: PANORAMA }\n}\n");
  EXPECT_THAT(ReadScenarioFile(path).status(),
              StatusIs(StatusCode::kInvalidArgument,
                       Eq(StrCat(path,
                                 ":3:29: Unknown enumeration value of \"PANORAMA\" for "
                                 "field \"type\"."))));
}

TEST(ReadScenarioFileTest, NegativeFrameCountNamesTheSegment) {
  tavik::test::TempDir dir;
  const std::string path =
      dir.WriteFile("bad.textproto",
                    "segments { frames: 2 sensor { name: \"GN1\" } mode_size {} image_size {} }\n"
                    "segments { frames: -4 }\n");
  EXPECT_THAT(ReadScenarioFile(path).status(),
              StatusIs(StatusCode::kInvalidArgument,
                       Eq(StrCat(path, ": segment 2: negative frame count -4"))));
}

TEST(ReadScenarioFileTest, MissingFileIsNotFound) {
  tavik::test::TempDir dir;
  const std::string path = dir.Path("absent.textproto");
  EXPECT_THAT(ReadScenarioFile(path).status(),
              StatusIs(StatusCode::kNotFound, Eq(StrCat(path, ": cannot open"))));
}

TEST(ParseScenarioTest, FirstSegmentMustNameItsSensor) {
  EXPECT_THAT(ParseScenario("segments { frames: 1 }", "s").status(),
              StatusIs(StatusCode::kInvalidArgument, Eq("s: segment 1: no sensor")));
  EXPECT_THAT(ParseScenario("", "s").status(),
              StatusIs(StatusCode::kInvalidArgument, Eq("s: no segments")));
}

}  // namespace
}  // namespace tavik::sim
