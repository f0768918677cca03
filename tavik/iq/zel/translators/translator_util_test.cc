#include "tavik/iq/zel/translators/translator_util.h"

#include <cmath>
#include <cstdint>
#include <limits>

#include "gtest/gtest.h"
#include "tavik/base/testing/status_matchers.h"
#include "tavik/iq/zel/protos/blc_param.pb.h"

namespace tavik {
namespace {

using ::tavik::test::IsOk;
using ::tavik::test::StatusIs;

TEST(ClutPackingTest, WorkedExamples) {
  EXPECT_EQ(ClutPacking(1024, 1, 2), 0xA0000802u);
  EXPECT_EQ(ClutPacking(1, 2, 3), 0x00100803u);
}

TEST(ClutPackingTest, EachOverflowingComponentHasItsLayout) {
  // a overflows: prefix 0xA, a's low 7 bits at 22, b at 11, c low.
  EXPECT_EQ(ClutPacking(1023 + 5, 7, 9), 0xA0000000u | (4u << 22) | (7u << 11) | 9u);
  // All within 10 bits: a at 20, b at 10, c low.
  EXPECT_EQ(ClutPacking(1023, 1023, 1023), (1023u << 20) | (1023u << 10) | 1023u);
  // c overflows: prefix 0xE, c's low 7 bits at 22, a at 11, b low.
  EXPECT_EQ(ClutPacking(3, 5, 1024 + 0x45), 0xE0000000u | (0x45u << 22) | (3u << 11) | 5u);
  // b overflows: prefix 0xC, b's low 8 bits (not 7) at 22, a at 11, c low.
  EXPECT_EQ(ClutPacking(3, 1024 + 0xC5, 5), 0xC0000000u | (0xC5u << 22) | (3u << 11) | 5u);
}

TEST(ClutPackingTest, OverflowOfAIsTestedFirst) {
  // Both a and b overflow: a's layout wins, and b reaches the bits above its place unmasked.
  EXPECT_EQ(ClutPacking(1024, 1024, 0), 0xA0000000u | (1024u << 11));
}

TEST(ToFixedPointTest, RoundsHalfAwayFromZeroThenLimits) {
  EXPECT_EQ(ToFixedPoint(0.5f, 0, -100, 100), 1);
  EXPECT_EQ(ToFixedPoint(-0.5f, 0, -100, 100), -1);
  EXPECT_EQ(ToFixedPoint(2.5f, 0, -100, 100), 3);
  EXPECT_EQ(ToFixedPoint(0.25f, 2, -100, 100), 1);
  EXPECT_EQ(ToFixedPoint(1.0f, 14, 0, 16384), 16384);
  EXPECT_EQ(ToFixedPoint(2.0f, 14, 0, 16384), 16384);
  EXPECT_EQ(ToFixedPoint(-1.0f, 14, 0, 16384), 0);
}

TEST(ToFixedPointTest, MultipliesInSinglePrecision) {
  // 0.1f * 1024 = 102.4000015... rounds to 102.
  EXPECT_EQ(ToFixedPoint(0.1f, 10, 0, 4095), 102);
}

TEST(ToFixedPointTest, ExtremesNeverOverflowTheConversion) {
  EXPECT_EQ(ToFixedPoint(std::numeric_limits<float>::infinity(), 30, 0, 255), 255);
  EXPECT_EQ(ToFixedPoint(-std::numeric_limits<float>::infinity(), 30, 0, 255), 0);
  EXPECT_EQ(ToFixedPoint(std::nanf(""), 4, -8, 7), -8);
  EXPECT_EQ(ToFixedPoint(3e38f, 20, 0, 1), 1);
}

TEST(RoundAndLimitTest, RoundsHalfAwayFromZeroThenLimits) {
  EXPECT_EQ(RoundAndLimit(2.5f, -100, 100), 3);
  EXPECT_EQ(RoundAndLimit(-2.5f, -100, 100), -3);
  EXPECT_EQ(RoundAndLimit(101.0f, -100, 100), 100);
  EXPECT_EQ(RoundAndLimit(-101.0f, -100, 100), -100);
  EXPECT_EQ(RoundAndLimit(std::nanf(""), 2, 9), 2);
  EXPECT_EQ(RoundAndLimit(-std::numeric_limits<float>::infinity(), -5, 5), -5);
}

TEST(ToScaledCodeTest, MultipliesByTheScaleInSinglePrecisionThenRounds) {
  // 0.062515f * 4095 = 255.99892 and 0.046875f * 4095 = 191.953125 in single precision.
  EXPECT_EQ(ToScaledCode(0.062515f, 4095), 256);
  EXPECT_EQ(ToScaledCode(0.046875f, 4095), 192);
}

TEST(ToScaledCodeTest, ShortFormLimitsToZeroAndTheScale) {
  EXPECT_EQ(ToScaledCode(1.0f, 4095), 4095);
  EXPECT_EQ(ToScaledCode(1.5f, 4095), 4095);
  EXPECT_EQ(ToScaledCode(-0.25f, 255), 0);
  EXPECT_EQ(ToScaledCode(std::nanf(""), 255), 0);
  EXPECT_EQ(ToScaledCode(2.0f, 1023, -1023, 1023), 1023);
  // -511.5: half away from zero.
  EXPECT_EQ(ToScaledCode(-0.5f, 1023, -1023, 1023), -512);
}

TEST(ToScaledCodeTest, RoundsTheScaledValueHalfAwayFromZeroThenLimits) {
  EXPECT_EQ(ToScaledCode(0.5f, 1023.0f, 0, 1023), 512);   // 511.5.
  EXPECT_EQ(ToScaledCode(0.25f, 1023.0f, 0, 1023), 256);  // 255.75.
  EXPECT_EQ(ToScaledCode(-0.5f, 1.0f, -100, 100), -1);
  EXPECT_EQ(ToScaledCode(1.5f, 1023.0f, 0, 1023), 1023);
  EXPECT_EQ(ToScaledCode(-1.0f, 255.0f, 0, 255), 0);
  EXPECT_EQ(ToScaledCode(std::nanf(""), 255.0f, 3, 255), 3);
  EXPECT_EQ(ToScaledCode(std::numeric_limits<float>::infinity(), 255.0f, 0, 255), 255);
  // The same rounding as ToFixedPoint for a power of two.
  EXPECT_EQ(ToScaledCode(0.1f, 1024.0f, 0, 4095), ToFixedPoint(0.1f, 10, 0, 4095));
}

TEST(RoundWrappingTest, RoundsThenWrapsAnyFloat) {
  EXPECT_EQ(RoundWrapping(16.5f), 17);
  EXPECT_EQ(RoundWrapping(-2.5f), -3);
  EXPECT_EQ(LowBits(RoundWrapping(17.0f), 4), 1u);
  EXPECT_EQ(RoundWrapping(std::nanf("")), 0);
  EXPECT_EQ(RoundWrapping(std::numeric_limits<float>::infinity()), 0);
  EXPECT_EQ(RoundWrapping(1e30f) & 0xFFFF, 0);
}

TEST(WithLowBitsTest, ReplacesTheLowBitsAndKeepsTheRest) {
  EXPECT_EQ(WithLowBits(uint16_t{0xA5A5}, 14, 0x3FFF), 0xBFFF);
  EXPECT_EQ(WithLowBits(uint16_t{0xA5A5}, 14, 0x12345), 0xA345);
  EXPECT_EQ(WithLowBits(uint32_t{0xA5A5A5A5}, 17, 40000), 0xA5A49C40u);
  EXPECT_EQ(WithLowBits(uint32_t{0xFFFFFFFF}, 32, 5), 5u);
}

TEST(WriteFixedBitsTest, KeepsTheKeptBitsClearsTheOthersAndOrsTheValue) {
  uint32_t word = 0xA5A5A5A5;
  WriteFixedBits(word, 0xFFFFC008, 0x511);
  EXPECT_EQ(word, 0xA5A58511u);
  WriteFixedBits(word, 0, 0xBBBBBBBB);
  EXPECT_EQ(word, 0xBBBBBBBBu);
  // A keep mask of all ones ors a flag into what was there.
  word = 0xA5A5A5A4;
  WriteFixedBits(word, ~uint32_t{0}, 0xF);
  EXPECT_EQ(word, 0xA5A5A5AFu);
}

TEST(LowBitsTest, MasksTwosComplement) {
  EXPECT_EQ(LowBits(-1024, 15), 31744u);
  EXPECT_EQ(LowBits(0x12345, 16), 0x2345u);
  EXPECT_EQ(LowBits(-1, 64), ~uint64_t{0});
}

TEST(CheckTuningTest, StockTextsInOrder) {
  EXPECT_THAT(CheckTuning<vosbrine::zelmondrake::BlcTuning>(nullptr),
              StatusIs(StatusCode::kInvalidArgument, "Invalid TuningBlock!"));
  vosbrine::zelmondrake::BlcTuning tuning;
  tuning.mutable_static_param();
  EXPECT_THAT(CheckTuning(&tuning),
              StatusIs(StatusCode::kInvalidArgument, "Tuning data doesn't have region info."));
  tuning.clear_static_param();
  tuning.mutable_dynamic_param();
  EXPECT_THAT(CheckTuning(&tuning),
              StatusIs(StatusCode::kInvalidArgument, "Tuning data doesn't have static info."));
  tuning.mutable_static_param();
  EXPECT_THAT(CheckTuning(&tuning), IsOk());
}

}  // namespace
}  // namespace tavik
