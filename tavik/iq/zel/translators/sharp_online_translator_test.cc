#include "tavik/iq/zel/translators/sharp_online_translator.h"

#include <array>
#include <cstdint>
#include <cstring>
#include <limits>
#include <string>
#include <utility>

#include "gmock/gmock.h"
#include "gtest/gtest.h"
#include "tavik/base/testing/log_capture.h"
#include "tavik/base/testing/status_matchers.h"
#include "tavik/iq/testing/translator_testing.h"
#include "tavik/iq/zel/zel_tuning_block.h"

namespace tavik {
namespace {

namespace zm = ::vosbrine::zelmondrake;
using ::tavik::test::ForeignBlock;
using ::tavik::test::PatternFilled;
using ::tavik::test::RecordingTraceSink;
using ::tavik::test::SameBytes;
using ::tavik::test::ScopedLogCapture;
using ::tavik::test::StatusIs;
using ::testing::ElementsAre;

constexpr absl::StatusCode kInvalid = absl::StatusCode::kInvalidArgument;

std::array<uint32_t, 5> Words(const SharpItpOutput& output) {
  std::array<uint32_t, 5> words;
  std::memcpy(words.data(), &output, sizeof(words));
  return words;
}

std::array<uint32_t, 10> Words(const SharpItpFixedOutput& fixed) {
  std::array<uint32_t, 10> words;
  std::memcpy(words.data(), &fixed, sizeof(words));
  return words;
}

zm::SharpTuning MakeTuning(float threshold, float suppression, float power, bool enable = true,
                           bool low_power = false) {
  zm::SharpTuning tuning;
  tuning.set_enable(enable);
  tuning.mutable_static_param()->set_enable_low_power(low_power);
  tuning.mutable_dynamic_param()->set_lc_threshold(threshold);
  tuning.mutable_dynamic_param()->set_lc_suppression(suppression);
  tuning.mutable_dynamic_param()->set_lc_power(power);
  return tuning;
}

ZelTuningBlock<zm::SharpTuning> Block(zm::SharpTuning tuning) {
  return ZelTuningBlock<zm::SharpTuning>(std::move(tuning));
}

// --- Defaults -----------------------------------------------------------------------------------

TEST(GetDefaultSharpTest, TranslatesTheDefaultTuningOnRggb) {
  SharpItpOutput output = PatternFilled<SharpItpOutput>();
  SharpItpFixedOutput fixed = PatternFilled<SharpItpFixedOutput>();
  TAVIK_ASSERT_OK(GetDefaultSharp(output, fixed));
  EXPECT_EQ(output.bypass, 0u);
  EXPECT_EQ(output.enable_low_power, 0u);
  EXPECT_EQ(output.lc_threshold, 3u);  // 0.00293 x 1023 = 2.997.
  EXPECT_EQ(output.lc_power, 0u);
  EXPECT_EQ(output.lc_suppression, 24u);  // 0.547 x 255 - 0.453 x 255 = 23.97.
  EXPECT_EQ(output.pixel_order, 1u);
  // Word 2's low 21 bits are 0x3E100 with the power in bits 1-6; the top bits keep the pattern.
  EXPECT_THAT(Words(output),
              ElementsAre(0xA5A5A5A4, 0xA5A5A5A4, 0x8063E100, 0x80006080, 0xA5A5A5A5));
}

TEST(GetDefaultSharpTest, SteppingsDifferInBitZeroOfFixedWordSixAlone) {
  SharpItpOutput a0 = PatternFilled<SharpItpOutput>(0x5A);
  SharpItpOutput b0 = PatternFilled<SharpItpOutput>(0x5A);
  SharpItpFixedOutput fixed_a0 = PatternFilled<SharpItpFixedOutput>(0x5A);
  SharpItpFixedOutput fixed_b0 = PatternFilled<SharpItpFixedOutput>(0x5A);
  TAVIK_ASSERT_OK(GetDefaultSharp(a0, fixed_a0));
  TAVIK_ASSERT_OK(GetDefaultSharpB0(b0, fixed_b0));
  EXPECT_TRUE(SameBytes(a0, b0));
  EXPECT_THAT(Words(fixed_a0),
              ElementsAre(0x04081000, 0x5A5A5A5B, 0x5A5A5A40, 0x5A5A500F, 0x5A5A5A08, 0x5A5A5A5B,
                          0x5A5A5A5B, 0x5A5A0418, 0x5A5A5100, 0x5A800004));
  EXPECT_THAT(Words(fixed_b0),
              ElementsAre(0x04081000, 0x5A5A5A5B, 0x5A5A5A40, 0x5A5A500F, 0x5A5A5A08, 0x5A5A5A5B,
                          0x5A5A5A5A, 0x5A5A0418, 0x5A5A5100, 0x5A800004));
}

TEST(GetDefaultSharpTest, TracesItselfAlone) {
  RecordingTraceSink sink;
  SharpItpOutput output;
  SharpItpFixedOutput fixed;
  TAVIK_ASSERT_OK(GetDefaultSharp(output, fixed));
  TAVIK_ASSERT_OK(GetDefaultSharpB0(output, fixed));
  EXPECT_THAT(sink.spans(), ElementsAre(RecordingTraceSink::Span(5, "GetDefaultSharp"),
                                        RecordingTraceSink::Span(5, "GetDefaultSharpB0")));
}

// --- Checks -------------------------------------------------------------------------------------

TEST(TranslateSharpTest, EmptyTuningsAreRefusedInOrderWritingNothing) {
  ScopedLogCapture log;
  SharpItpOutput output = PatternFilled<SharpItpOutput>();
  const SharpItpOutput before = output;
  EXPECT_THAT(TranslateSharp(ForeignBlock(), vosbrine::RGGB, output),
              StatusIs(kInvalid, "Invalid TuningBlock!"));
  EXPECT_TRUE(log.Contains("Incorrect tuning block type: Foreign"));
  // The default instance has neither part: the dynamic one is looked for first.
  EXPECT_THAT(TranslateSharp(Block(zm::SharpTuning()), vosbrine::RGGB, output),
              StatusIs(kInvalid, "Tuning data doesn't have region info."));
  zm::SharpTuning no_static = MakeTuning(0.5f, 0.5f, 0.5f);
  no_static.clear_static_param();
  EXPECT_THAT(TranslateSharpB0(Block(no_static), vosbrine::RGGB, output),
              StatusIs(kInvalid, "Tuning data doesn't have static info."));
  EXPECT_TRUE(SameBytes(output, before));
}

// --- Values -------------------------------------------------------------------------------------

TEST(TranslateSharpTest, SuppressionRunsFrom255DownToMinus255In9Bits) {
  struct Case {
    float suppression;
    uint32_t code;
  };
  for (const Case& c : {Case{0.5f, 0}, Case{1.0f, 257}, Case{0.0f, 255}, Case{0.75f, 0x180},
                        Case{2.0f, 0x103}, Case{std::numeric_limits<float>::quiet_NaN(), 0}}) {
    SCOPED_TRACE(c.suppression);
    SharpItpOutput output = PatternFilled<SharpItpOutput>();
    TAVIK_ASSERT_OK(
        TranslateSharp(Block(MakeTuning(0.0f, c.suppression, 0.0f)), vosbrine::RGGB, output));
    EXPECT_EQ(output.lc_suppression, c.code);
    EXPECT_EQ(output.lc_fixed_b, 128u);
    EXPECT_EQ(output.lc_suppression_spare, 0u);
  }
}

TEST(TranslateSharpTest, ThresholdAndPowerAreLimitedToTheirRanges) {
  SharpItpOutput output = {};
  TAVIK_ASSERT_OK(TranslateSharp(Block(MakeTuning(1.0f, 0.5f, 1.0f)), vosbrine::RGGB, output));
  EXPECT_EQ(output.lc_threshold, 1023u);
  EXPECT_EQ(output.lc_power, 63u);
  TAVIK_ASSERT_OK(TranslateSharp(Block(MakeTuning(2.0f, 0.5f, 0.5f)), vosbrine::RGGB, output));
  EXPECT_EQ(output.lc_threshold, 1023u);
  EXPECT_EQ(output.lc_power, 32u);  // 31.5 rounds away from zero.
  TAVIK_ASSERT_OK(TranslateSharp(Block(MakeTuning(-1.0f, 0.5f, -1.0f)), vosbrine::RGGB, output));
  EXPECT_EQ(output.lc_threshold, 0u);
  EXPECT_EQ(output.lc_power, 0u);
}

TEST(TranslateSharpTest, PowerIsShiftedByOneInTheLow21BitsOfItsWord) {
  SharpItpOutput output = PatternFilled<SharpItpOutput>();
  TAVIK_ASSERT_OK(TranslateSharp(Block(MakeTuning(0.0f, 0.5f, 1.0f)), vosbrine::RGGB, output));
  EXPECT_EQ(Words(output)[2] & 0x1FFFFF, (63u << 1) | 0x3E100u);
  EXPECT_EQ(Words(output)[2] >> 31, 1u);  // The pattern's.
}

TEST(TranslateSharpTest, ExtremeValuesConvertWithoutOverflow) {
  constexpr float kInf = std::numeric_limits<float>::infinity();
  for (float value : {kInf, -kInf, 3e38f, -3e38f, std::numeric_limits<float>::quiet_NaN()}) {
    SCOPED_TRACE(value);
    SharpItpOutput output = {};
    TAVIK_ASSERT_OK(TranslateSharp(Block(MakeTuning(value, value, value)), vosbrine::RGGB, output));
    EXPECT_EQ(output.lc_threshold, value > 0 ? 1023u : 0u);
    EXPECT_EQ(output.lc_power, value > 0 ? 63u : 0u);
    // No finite suppression code: wrapped to 0.
    EXPECT_EQ(output.lc_suppression, 0u);
  }
}

TEST(TranslateSharpTest, SwitchesAndPixelOrder) {
  struct Case {
    vosbrine::BayerPattern pattern;
    uint32_t code;
  };
  for (const Case& c : {Case{vosbrine::RGGB, 1}, Case{vosbrine::BGGR, 2}, Case{vosbrine::GRBG, 0},
                        Case{vosbrine::GBRG, 3}}) {
    SharpItpOutput output = PatternFilled<SharpItpOutput>();
    TAVIK_ASSERT_OK(TranslateSharp(Block(MakeTuning(0.5f, 0.5f, 0.5f, /*enable=*/false,
                                                    /*low_power=*/true)),
                                   c.pattern, output));
    EXPECT_EQ(output.bypass, 1u);
    EXPECT_EQ(output.enable_low_power, 1u);
    EXPECT_EQ(output.pixel_order, c.code);
  }
}

TEST(TranslateSharpTest, BitsOutsideTheFieldsSurvive) {
  SharpItpOutput output = PatternFilled<SharpItpOutput>();
  TAVIK_ASSERT_OK(TranslateSharp(Block(MakeTuning(0.5f, 0.5f, 0.5f)), vosbrine::RGGB, output));
  const std::array<uint32_t, 5> words = Words(output);
  EXPECT_EQ(words[0] & ~1u, 0xA5A5A5A4u);
  EXPECT_EQ(words[1] & ~1u, 0xA5A5A5A4u);
  EXPECT_EQ(words[2] >> 31, 1u);
  EXPECT_EQ(words[3] >> 30, 2u);
  EXPECT_EQ(words[4] & ~3u, 0xA5A5A5A4u);
}

TEST(TranslateSharpTest, SteppingsTranslateAlikeUnderTheirOwnTraces) {
  const auto block = Block(MakeTuning(0.01431f, 0.5377f, 0.1667f));
  SharpItpOutput a0 = PatternFilled<SharpItpOutput>();
  SharpItpOutput b0 = PatternFilled<SharpItpOutput>();
  RecordingTraceSink sink;
  TAVIK_ASSERT_OK(TranslateSharp(block, vosbrine::GBRG, a0));
  TAVIK_ASSERT_OK(TranslateSharpB0(block, vosbrine::GBRG, b0));
  EXPECT_TRUE(SameBytes(a0, b0));
  EXPECT_EQ(a0.lc_threshold, 15u);       // 14.64.
  EXPECT_EQ(a0.lc_power, 11u);           // 10.50.
  EXPECT_EQ(a0.lc_suppression, 0x1EDu);  // -19.23 rounds to -19.
  EXPECT_THAT(sink.spans(), ElementsAre(RecordingTraceSink::Span(5, "TranslateSharp"),
                                        RecordingTraceSink::Span(5, "TranslateSharpB0")));
}

TEST(TranslateSharpTest, SampleSetTranslatesOnEveryPattern) {
  const int leaves = test::ForEachSampleLeaf<zm::SharpTuning>(
      [&](const ZelTuningBlock<zm::SharpTuning>& block, const std::string&) {
        for (vosbrine::BayerPattern pattern :
             {vosbrine::RGGB, vosbrine::BGGR, vosbrine::GRBG, vosbrine::GBRG}) {
          SharpItpOutput output = {};
          TAVIK_EXPECT_OK(TranslateSharpB0(block, pattern, output));
          EXPECT_EQ(output.lc_fixed_a, 0x3E1u);
        }
      });
  if (::testing::Test::IsSkipped()) return;
  EXPECT_GT(leaves, 0);
}

}  // namespace
}  // namespace tavik
