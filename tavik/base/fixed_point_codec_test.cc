#include "tavik/base/fixed_point_codec.h"

#include <cmath>

#include "gtest/gtest.h"

namespace tavik {
namespace {

TEST(QCodecTest, EncodesTheMagnitudeAtTheFractionalBits) {
  const QCodec codec(3, 10);
  EXPECT_EQ(codec.Encode(1.0), 1024u);
  EXPECT_EQ(codec.Encode(-1.0), 1024u);
  EXPECT_EQ(codec.Encode(0.5), 512u);
  EXPECT_EQ(codec.Encode(1.5 / 1024.0), 2u);  // 1.5 codes rounds half away from zero.
  EXPECT_EQ(codec.Encode(0.0), 0u);
}

TEST(QCodecTest, SaturatesToTheLargestMagnitude) {
  const QCodec codec(3, 10);
  EXPECT_EQ(codec.Encode(8.0), 8191u);
  EXPECT_EQ(codec.Encode(1e30), 8191u);
  EXPECT_EQ(codec.Encode(INFINITY), 8191u);
  EXPECT_EQ(codec.Encode(NAN), 0u);
}

TEST(QCodecTest, KeepsItsBitCounts) {
  const QCodec codec(0, 63);
  EXPECT_EQ(codec.integer_bits(), 0);
  EXPECT_EQ(codec.fractional_bits(), 63);
}

TEST(QCodecDeathTest, RejectsNegativeIntegerBits) {
  EXPECT_DEATH(QCodec(-1, 4), "Check failed: m_ >= 0 \\(m_=-1, 0=0\\) ");
}

TEST(QCodecDeathTest, RejectsNegativeFractionalBits) {
  EXPECT_DEATH(QCodec(4, -2), "Check failed: n_ >= 0 \\(n_=-2, 0=0\\) ");
}

TEST(QCodecDeathTest, RejectsMoreThanSixtyFourBits) {
  EXPECT_DEATH(QCodec(40, 24),
               "Check failed: m_ \\+ n_ \\+ 1 <= 64 \\(m_ \\+ n_ \\+ 1=65, 64=64\\) ");
}

}  // namespace
}  // namespace tavik
