// Runs a piece of a test in a fresh process of the test binary, for a body that changes the
// process for good (gives up a right, say): a death-test child in the "threadsafe" style
// re-executes the binary and runs only the current test up to this point.
#ifndef TAVIK_IQ_TESTING_FRESH_PROCESS_H_
#define TAVIK_IQ_TESTING_FRESH_PROCESS_H_

#include <cstdio>
#include <cstdlib>
#include <functional>
#include <string>
#include <string_view>
#include <vector>

#include "gtest/gtest.h"
#include "tavik/base/testing/log_capture.h"

namespace tavik::test {

// Runs `body` in a fresh process. The body returns an empty text when all its checks hold, and
// otherwise a description of what failed, which the parent shows.
inline void ExpectInFreshProcess(const std::function<std::string()>& body) {
  GTEST_FLAG_SET(death_test_style, "threadsafe");
  EXPECT_EXIT(
      {
        const std::string failure = body();
        std::fputs(failure.c_str(), stderr);
        std::fflush(stderr);
        std::_Exit(failure.empty() ? 0 : 1);
      },
      ::testing::ExitedWithCode(0), "");
}

// Empty when `log` holds exactly `expected` lines with exactly `message`; otherwise a description
// with every captured line.
inline std::string CheckLogCount(const ScopedLogCapture& log, std::string_view message,
                                 int expected) {
  const int count = log.Count(message);
  if (count == expected) return "";
  std::string failure = "expected " + std::to_string(expected) + " line(s) \"" +
                        std::string(message) + "\", got " + std::to_string(count) + "; captured:\n";
  for (const std::string& line : log.messages()) failure += "  " + line + "\n";
  return failure;
}

}  // namespace tavik::test

#endif  // TAVIK_IQ_TESTING_FRESH_PROCESS_H_
