#include "tools/tavik-sim/summary.h"

#include <string>
#include <vector>

#include "gmock/gmock.h"
#include "gtest/gtest.h"

namespace tavik::sim {
namespace {

using ::testing::HasSubstr;
using ::testing::StartsWith;

FrameRecord Frame(int index, bool refreshed) {
  FrameRecord record;
  record.frame.index = index;
  record.key = "SENSOR, MODE, VIEWFINDER_TORCH";
  record.resolved_key = "SENSOR, MODE, VIEWFINDER";
  record.in_bundle[0] = true;  // BlcTuning
  if (refreshed) record.refreshed_blocks = {"BlcTuning"};
  record.fence_signalled = true;
  record.earlier_fences_signalled = true;
  return record;
}

TEST(FormatSummaryTest, CountsFramesKeysCacheAndFailures) {
  std::vector<FrameRecord> records = {Frame(0, true), Frame(1, false), Frame(2, false)};
  records[2].fence_signalled = false;
  records[2].fence_timed_out = true;
  records[1].failures.push_back({"GammaTuning", "Invalid gamma"});
  const std::string summary = FormatSummary(records);
  EXPECT_THAT(summary, StartsWith("Frames: 3 (fences signalled: 2, timed out: 1, out of order: 0)\n"
                                  "\n"
                                  "Use-case keys (1 distinct):\n"
                                  "     3  SENSOR, MODE, VIEWFINDER_TORCH\n"
                                  "        -> nearest key SENSOR, MODE, VIEWFINDER\n"
                                  "\n"
                                  "Block cache: 2 frames served wholly from the cache\n"));
  EXPECT_THAT(summary, HasSubstr("  BlcTuning                2/1    CcmTuning                0/0"));
  EXPECT_THAT(summary, HasSubstr("Translator and call failures:\n"
                                 "     1  GammaTuning: Invalid gamma\n"));
  EXPECT_THAT(summary, HasSubstr("  signal+wait "));
  EXPECT_TRUE(RunFailed(records));
}

TEST(RunFailedTest, CleanRunDidNotFail) {
  EXPECT_FALSE(RunFailed({Frame(0, true), Frame(1, false)}));
  EXPECT_THAT(FormatSummary({Frame(0, true)}), HasSubstr("Translator and call failures: none\n"));
}

}  // namespace
}  // namespace tavik::sim
