#include "tavik/iq/zel/translators/bayer_pattern_util.h"

#include "gmock/gmock.h"
#include "gtest/gtest.h"
#include "tavik/base/testing/log_capture.h"

namespace {

using ::tavik::test::ScopedLogCapture;
using ::testing::ElementsAre;

TEST(PixelOrderTest, MainIspTable) {
  EXPECT_EQ(vosbrine::GetMainIspPixelOrder(vosbrine::RGGB), 1u);
  EXPECT_EQ(vosbrine::GetMainIspPixelOrder(vosbrine::BGGR), 2u);
  EXPECT_EQ(vosbrine::GetMainIspPixelOrder(vosbrine::GRBG), 0u);
  EXPECT_EQ(vosbrine::GetMainIspPixelOrder(vosbrine::GBRG), 3u);
}

TEST(PixelOrderTest, SarkonTable) {
  EXPECT_EQ(vosbrine::GetSarkonPixelOrder(vosbrine::RGGB), 0u);
  EXPECT_EQ(vosbrine::GetSarkonPixelOrder(vosbrine::BGGR), 3u);
  EXPECT_EQ(vosbrine::GetSarkonPixelOrder(vosbrine::GRBG), 1u);
  EXPECT_EQ(vosbrine::GetSarkonPixelOrder(vosbrine::GBRG), 2u);
}

TEST(PixelOrderTest, G3aaCodesEqualTheSarkonOnes) {
  for (vosbrine::BayerPattern pattern :
       {vosbrine::RGGB, vosbrine::BGGR, vosbrine::GRBG, vosbrine::GBRG}) {
    EXPECT_EQ(tavik::GetG3aaPixelOrder(pattern), vosbrine::GetSarkonPixelOrder(pattern));
  }
  EXPECT_EQ(tavik::GetG3aaPixelOrder(vosbrine::BGGR), 3u);
}

TEST(PixelOrderTest, InvalidPatternLogsAndGivesTheCodeOfGrbg) {
  ScopedLogCapture capture;
  const auto invalid = static_cast<vosbrine::BayerPattern>(7);
  EXPECT_EQ(vosbrine::GetMainIspPixelOrder(invalid), 0u);
  EXPECT_EQ(vosbrine::GetMainIspPixelOrder(invalid),
            vosbrine::GetMainIspPixelOrder(vosbrine::GRBG));
  EXPECT_EQ(vosbrine::GetSarkonPixelOrder(invalid), 0u);
  // An unknown value has no enum name, so the line ends after the prefix.
  EXPECT_THAT(
      capture.messages(android::base::ERROR),
      ElementsAre("Invalid bayer_pattern: ", "Invalid bayer_pattern: ", "Invalid bayer_pattern: "));
}

}  // namespace
