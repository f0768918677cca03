#include <fstream>
#include <sstream>
#include <string>

#include "gmock/gmock.h"
#include "gtest/gtest.h"
#include "tavik/base/logging.h"
#include "tavik/base/testing/log_capture.h"
#include "tavik/base/testing/status_matchers.h"
#include "tavik/base/testing/temp_dir.h"

namespace tavik::test {
namespace {

TEST(ScopedLogCaptureTest, CountsAndFindsMessages) {
  ScopedLogCapture capture;
  TAVIK_LOG(INFO) << "Calibration applied: 2";
  TAVIK_LOG(INFO) << "Calibration applied: 2";
  EXPECT_EQ(capture.Count("Calibration applied: 2"), 2);
  EXPECT_TRUE(capture.Contains("applied"));
  EXPECT_FALSE(capture.Contains("missing"));
  capture.Clear();
  EXPECT_TRUE(capture.messages().empty());
}

TEST(TempDirTest, WritesFilesAndRemovesItselfWhenDone) {
  std::string path;
  {
    TempDir dir;
    path = dir.WriteFile("sub/file.txt", "contents");
    std::ifstream in(path);
    std::stringstream text;
    text << in.rdbuf();
    EXPECT_EQ(text.str(), "contents");
  }
  EXPECT_FALSE(std::ifstream(path).good());
}

TEST(StatusMatchersTest, MatchCodeMessageAndValue) {
  EXPECT_THAT(OkStatus(), IsOk());
  EXPECT_THAT(NotFoundError("x"), ::testing::Not(IsOk()));
  EXPECT_THAT(NotFoundError("x"), StatusIs(StatusCode::kNotFound, "x"));
  EXPECT_THAT(StatusOr<int>(3), IsOkAndHolds(3));
  EXPECT_THAT(StatusOr<int>(InternalError("y")), StatusIs(StatusCode::kInternal, "y"));
}

}  // namespace
}  // namespace tavik::test
