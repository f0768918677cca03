#include "tools/tavik-sim/cli.h"

#include <algorithm>
#include <fstream>
#include <sstream>
#include <string>
#include <vector>

#include "gmock/gmock.h"
#include "gtest/gtest.h"
#include "tavik/base/strings.h"
#include "tavik/base/testing/temp_dir.h"

namespace tavik::sim {
namespace {

using ::testing::HasSubstr;
using ::testing::StartsWith;

struct Result {
  int status;
  std::string out;
  std::string err;
};

Result RunSim(const std::vector<std::string>& args) {
  std::ostringstream out;
  std::ostringstream err;
  const int status = RunSimCommand(args, out, err);
  return {status, out.str(), err.str()};
}

TEST(RunSimCommandTest, HelpExitsZero) {
  const Result result = RunSim({"--help"});
  EXPECT_EQ(result.status, kExitOk);
  EXPECT_THAT(result.out, StartsWith("Usage: tavik-sim"));
}

TEST(RunSimCommandTest, BadArgumentsExitTwo) {
  EXPECT_EQ(RunSim({"--bogus"}).status, kExitUsage);
  EXPECT_EQ(RunSim({"--frames", "-3"}).status, kExitUsage);
  EXPECT_EQ(RunSim({"--prop", "novalue"}).status, kExitUsage);
  EXPECT_EQ(RunSim({"--scenario"}).status, kExitUsage);
}

TEST(RunSimCommandTest, BadScenarioFilesGiveOneLineAndExitTwo) {
  tavik::test::TempDir dir;
  const std::string unknown_field = dir.WriteFile("field.textproto", "segments { frame: 3 }\n");
  const std::string unknown_enum =
      dir.WriteFile("enum.textproto", "segments { frames: 1 use_case { type: PANORAMA } }\n");
  const std::string negative = dir.WriteFile("negative.textproto", "segments { frames: -1 }\n");
  const std::string missing = dir.Path("missing.textproto");
  const std::vector<std::pair<std::string, std::string>> cases = {
      {unknown_field,
       StrCat(unknown_field,
              ":1:17: Message type \"tavik.sim.Segment\" has no field named \"frame\".")},
      {unknown_enum,
       StrCat(unknown_enum,
              ":1:48: Unknown enumeration value of \"PANORAMA\" for field \"type\".")},
      {negative, StrCat(negative, ": segment 1: negative frame count -1")},
      {missing, StrCat(missing, ": cannot open")},
  };
  for (const auto& [path, message] : cases) {
    const Result result = RunSim({"--scenario", path, "--quiet"});
    EXPECT_EQ(result.status, kExitUsage) << path;
    EXPECT_EQ(result.err, StrCat("tavik-sim: ", message, "\n"));
    EXPECT_EQ(result.out, "");
  }
}

TEST(RunSimCommandTest, RunsFramesAndWritesTheLogAndTrace) {
  tavik::test::TempDir dir;
  const std::string frames_out = dir.Path("frames.jsonl");
  const std::string trace = dir.Path("trace.json");
  const Result result = RunSim({"--frames", "5", "--frames-out", frames_out, "--trace", trace});
  EXPECT_EQ(result.status, kExitOk) << result.err;
  EXPECT_THAT(result.out, StartsWith("Frames: 5 (fences signalled: 5, timed out: 0, out of order: "
                                     "0)\n"));
  EXPECT_THAT(result.out, HasSubstr("BRIMAL_REAR_GN1_NORMAL, FULL_4_3_FULL_15_30FPS, VIEWFINDER"));
  std::ifstream log(frames_out);
  std::string text((std::istreambuf_iterator<char>(log)), std::istreambuf_iterator<char>());
  EXPECT_EQ(std::count(text.begin(), text.end(), '\n'), 5);
  std::ifstream trace_in(trace);
  std::string trace_text((std::istreambuf_iterator<char>(trace_in)),
                         std::istreambuf_iterator<char>());
  EXPECT_THAT(trace_text, StartsWith("{\"traceEvents\":[{\"name\":\"frame 0\""));
}

TEST(RunSimCommandTest, MissingTuningIsARunFailure) {
  tavik::test::TempDir dir;
  const Result result = RunSim({"--tuning", dir.Path("none"), "--quiet"});
  EXPECT_EQ(result.status, kExitFailure);
  EXPECT_EQ(result.err, StrCat("tavik-sim: ", dir.Path("none"), ": no tuning loaded\n"));
}

}  // namespace
}  // namespace tavik::sim
