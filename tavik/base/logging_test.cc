#include "tavik/base/logging.h"

#include <errno.h>

#include <atomic>
#include <cerrno>
#include <string>
#include <thread>
#include <vector>

#include "gmock/gmock.h"
#include "gtest/gtest.h"
#include "tavik/base/testing/log_capture.h"

namespace tavik {
namespace {

using ::tavik::test::ScopedLogCapture;
using ::testing::ElementsAre;

TEST(LoggingTest, LoggerReceivesTheBareMessage) {
  ScopedLogCapture capture;
  TAVIK_LOG(ERROR) << "Failed to parse binarypb. Name: " << "/x/a.binarypb";
  const auto lines = capture.lines();
  ASSERT_EQ(lines.size(), 1u);
  EXPECT_EQ(lines[0].message, "Failed to parse binarypb. Name: /x/a.binarypb");
  EXPECT_EQ(lines[0].severity, android::base::ERROR);
  EXPECT_THAT(lines[0].file, ::testing::EndsWith("logging_test.cc"));
}

TEST(LoggingTest, PassesNoTagOfItsOwn) {
  ScopedLogCapture capture;
  TAVIK_LOG(INFO) << "x";
  const auto lines = capture.lines();
  ASSERT_EQ(lines.size(), 1u);
  // With no tag given, libbase fills in its process-wide default, the program's name.
  EXPECT_EQ(lines[0].tag, program_invocation_short_name);
  EXPECT_EQ(lines[0].message, "x");
}

TEST(LoggingTest, KeepsSeverities) {
  ScopedLogCapture capture;
  TAVIK_LOG(VERBOSE) << "v";
  TAVIK_LOG(INFO) << "i";
  TAVIK_LOG(WARNING) << "w";
  TAVIK_LOG(ERROR) << "e";
  EXPECT_THAT(capture.messages(android::base::VERBOSE), ElementsAre("v"));
  EXPECT_THAT(capture.messages(android::base::INFO), ElementsAre("i"));
  EXPECT_THAT(capture.messages(android::base::WARNING), ElementsAre("w"));
  EXPECT_THAT(capture.messages(android::base::ERROR), ElementsAre("e"));
}

TEST(LoggingTest, SkipsLinesBelowTheMinimumSeverityWithoutEvaluatingThem) {
  ScopedLogCapture capture;
  const auto previous = android::base::SetMinimumLogSeverity(android::base::WARNING);
  int evaluated = 0;
  auto count = [&evaluated]() { return ++evaluated; };
  TAVIK_LOG(VERBOSE) << count();
  TAVIK_LOG(WARNING) << count();
  android::base::SetMinimumLogSeverity(previous);
  EXPECT_EQ(evaluated, 1);
  EXPECT_THAT(capture.messages(), ElementsAre("1"));
}

TEST(LoggingTest, ErrnoIsUnchangedAcrossALogLine) {
  ScopedLogCapture capture;
  errno = ENOENT;
  TAVIK_LOG(ERROR) << "line";
  EXPECT_EQ(errno, ENOENT);
  errno = EACCES;
  TAVIK_LOG_EVERY_N_SEC(WARNING, 5) << "limited";
  EXPECT_EQ(errno, EACCES);
}

TEST(LoggingTest, ErrnoSetWhileFormattingIsRestored) {
  ScopedLogCapture capture;
  errno = EINTR;
  auto clobber = []() {
    errno = EBADF;
    return "clobbered";
  };
  TAVIK_LOG(ERROR) << clobber();
  EXPECT_EQ(errno, EINTR);
}

TEST(LoggingTest, RateLimitedCallSiteLetsOneLineThroughPerPeriod) {
  ScopedLogCapture capture;
  for (int i = 0; i < 100; ++i) {
    TAVIK_LOG_EVERY_N_SEC(WARNING, 5) << "every frame " << i;
  }
  EXPECT_THAT(capture.messages(), ElementsAre("every frame 0"));
}

TEST(LoggingTest, RateLimitIsPerCallSite) {
  ScopedLogCapture capture;
  for (int i = 0; i < 3; ++i) {
    TAVIK_LOG_EVERY_N_SEC(WARNING, 5) << "site a";
    TAVIK_LOG_EVERY_N_SEC(WARNING, 5) << "site b";
  }
  EXPECT_THAT(capture.messages(), ElementsAre("site a", "site b"));
}

TEST(RateLimiterTest, PassesOncePerFiveSeconds) {
  RateLimiter limiter(5);
  EXPECT_TRUE(limiter.ShouldPass(100));
  EXPECT_FALSE(limiter.ShouldPass(100));
  EXPECT_FALSE(limiter.ShouldPass(102));
  EXPECT_FALSE(limiter.ShouldPass(104));
  EXPECT_TRUE(limiter.ShouldPass(105));
  EXPECT_FALSE(limiter.ShouldPass(109));
  EXPECT_TRUE(limiter.ShouldPass(110));
}

TEST(RateLimiterTest, ResetForTestingLetsTheNextEventThrough) {
  RateLimiter limiter(5);
  EXPECT_TRUE(limiter.ShouldPass(100));
  EXPECT_FALSE(limiter.ShouldPass(101));
  RateLimiter::ResetAllForTesting();
  EXPECT_TRUE(limiter.ShouldPass(101));
  EXPECT_FALSE(limiter.ShouldPass(102));
}

TEST(LoggingTest, ANewCaptureSeesTheFirstLineOfAnAlreadyUsedCallSite) {
  auto warn = []() { TAVIK_LOG_EVERY_N_SEC(WARNING, 5) << "per frame"; };
  {
    ScopedLogCapture capture;
    warn();
    warn();
    EXPECT_THAT(capture.messages(), ElementsAre("per frame"));
  }
  ScopedLogCapture capture;
  warn();
  EXPECT_THAT(capture.messages(), ElementsAre("per frame"));
}

TEST(RateLimiterTest, FirstEventPassesWhateverTheClock) {
  RateLimiter limiter(5);
  EXPECT_TRUE(limiter.ShouldPass(0));
}

TEST(RateLimiterTest, OneThreadPassesWhenManyRace) {
  RateLimiter limiter(5);
  std::atomic<int> passed{0};
  std::vector<std::thread> threads;
  for (int t = 0; t < 8; ++t) {
    threads.emplace_back([&]() {
      for (int i = 0; i < 1000; ++i) passed += limiter.ShouldPass(42) ? 1 : 0;
    });
  }
  for (std::thread& thread : threads) thread.join();
  EXPECT_EQ(passed.load(), 1);
}

TEST(CheckDeathTest, FailedCheckAbortsWithItsCondition) {
  const int width = 33;
  const int height = 25;
  const size_t size = 824;
  EXPECT_DEATH(TAVIK_CHECK(width * height == static_cast<int>(size)) << "LumaLsc",
               "Check failed: width \\* height == static_cast<int>\\(size\\) LumaLsc");
}

TEST(CheckDeathTest, PassingCheckDoesNothing) {
  int evaluated = 0;
  TAVIK_CHECK(true) << ++evaluated;
  EXPECT_EQ(evaluated, 0);
}

}  // namespace
}  // namespace tavik
