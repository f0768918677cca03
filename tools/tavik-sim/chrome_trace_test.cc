#include "tools/tavik-sim/chrome_trace.h"

#include <memory>
#include <string>
#include <vector>

#include "gmock/gmock.h"
#include "gtest/gtest.h"
#include "tools/tavik-sim/session_runner.h"

namespace tavik::sim {
namespace {

using ::testing::HasSubstr;
using ::testing::StartsWith;

TEST(ChromeTraceSinkTest, WritesCompleteEventsForSpans) {
  ChromeTraceSink sink;
  {
    ScopedTraceSink installed(&sink);
    ScopedTrace outer("outer \"quoted\"");
    { ScopedTrace inner("inner"); }
  }
  const std::vector<ChromeTraceSink::Event> events = sink.events();
  ASSERT_EQ(events.size(), 2u);
  EXPECT_EQ(events[0].name, "inner");
  EXPECT_EQ(events[1].name, "outer \"quoted\"");
  const std::string json = sink.ToJson();
  EXPECT_THAT(json, StartsWith("{\"traceEvents\":[{\"name\":\"outer \\\"quoted\\\"\",\"cat\":"
                               "\"default\",\"ph\":\"X\",\"ts\":0.000,\"dur\":"));
  EXPECT_THAT(json, HasSubstr("{\"name\":\"inner\",\"cat\":\"default\",\"ph\":\"X\",\"ts\":"));
  EXPECT_THAT(json, HasSubstr("\"pid\":1,\"tid\":"));
}

TEST(ChromeTraceSinkTest, NothingIsCollectedOnceRemoved) {
  ChromeTraceSink sink;
  { ScopedTraceSink installed(&sink); }
  { ScopedTrace ignored("after"); }
  EXPECT_TRUE(sink.events().empty());
  EXPECT_EQ(sink.ToJson(), "{\"traceEvents\":[]}\n");
}

TEST(ChromeTraceSinkTest, ASessionShowsFramesAndStages) {
  StatusOr<Scenario> scenario = DefaultScenario();
  ASSERT_TRUE(scenario.ok());
  ZelTuningController controller(
      "", {TAVIK_SAMPLE_TUNING_DIR},
      FlatHashMap<TuningSensorKey, tavik_api::LensShadingCalibrationData>());
  ChromeTraceSink sink;
  {
    ScopedTraceSink installed(&sink);
    RunSession(controller, ExpandScenario(*scenario, 2));
  }
  std::vector<std::string> names;
  for (const ChromeTraceSink::Event& event : sink.events()) names.push_back(event.name);
  for (const char* name : {"frame 0", "frame 1", "create", "enabled checks", "interpolate",
                           "translate", "signal+wait"}) {
    EXPECT_THAT(names, ::testing::Contains(name));
  }
}

}  // namespace
}  // namespace tavik::sim
