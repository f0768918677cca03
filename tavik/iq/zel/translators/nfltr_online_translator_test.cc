#include "tavik/iq/zel/translators/nfltr_online_translator.h"

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

std::array<uint32_t, 5> Words(const NfltrItpOutput& output) {
  std::array<uint32_t, 5> words;
  std::memcpy(words.data(), &output, sizeof(words));
  return words;
}

std::array<uint32_t, 8> Words(const NfltrItpFixedOutput& fixed) {
  std::array<uint32_t, 8> words;
  std::memcpy(words.data(), &fixed, sizeof(words));
  return words;
}

// Both parts present, though neither carries a value.
ZelTuningBlock<zm::NfltrTuning> Block(bool enable = true) {
  zm::NfltrTuning tuning;
  tuning.set_enable(enable);
  tuning.mutable_static_param();
  tuning.mutable_dynamic_param();
  return ZelTuningBlock<zm::NfltrTuning>(std::move(tuning));
}

TEST(GetDefaultNfltrTest, WritesConstantsAndTheFixedWords) {
  NfltrItpOutput output = PatternFilled<NfltrItpOutput>();
  NfltrItpFixedOutput fixed = PatternFilled<NfltrItpFixedOutput>();
  TAVIK_ASSERT_OK(GetDefaultNfltr(output, fixed));
  EXPECT_EQ(output.bypass, 0u);
  EXPECT_EQ(output.inverse_wb_r, 30u);
  EXPECT_EQ(output.inverse_wb_g, 32u);
  EXPECT_EQ(output.inverse_wb_b, 18u);
  EXPECT_EQ(output.pixel_order, 1u);
  EXPECT_THAT(Words(output),
              ElementsAre(0xA5A5A5A4, 0xA5A5A59E, 0xA5A5A5A0, 0xA5A5A592, 0xA5A5A5A5));
  EXPECT_THAT(Words(fixed), ElementsAre(0xA5A5A53F, 0xA5A5A403, 0xA5A5A40C, 0xA5A0A5A0, 0xA5A5A5A4,
                                        0xA5A5A5A0, 0xA5A5A5A0, 0xA5A5A000));
}

TEST(GetDefaultNfltrTest, TracesItselfAloneAsItTranslatesNothing) {
  RecordingTraceSink sink;
  NfltrItpOutput output;
  NfltrItpFixedOutput fixed;
  TAVIK_ASSERT_OK(GetDefaultNfltr(output, fixed));
  EXPECT_THAT(sink.spans(), ElementsAre(RecordingTraceSink::Span(5, "GetDefaultNfltr")));
}

TEST(TranslateNfltrTest, EmptyTuningsAndMissingWhiteBalanceAreRefusedInOrderWritingNothing) {
  ScopedLogCapture log;
  const tavik_api::WhiteBalanceConfig wb;
  NfltrItpOutput output = PatternFilled<NfltrItpOutput>();
  const NfltrItpOutput before = output;
  EXPECT_THAT(TranslateNfltr(ForeignBlock(), {vosbrine::RGGB, &wb}, output),
              StatusIs(kInvalid, "Invalid TuningBlock!"));
  EXPECT_TRUE(log.Contains("Incorrect tuning block type: Foreign"));
  // Neither part: the dynamic one is looked for first.
  EXPECT_THAT(TranslateNfltr(ZelTuningBlock<zm::NfltrTuning>(), {vosbrine::RGGB, &wb}, output),
              StatusIs(kInvalid, "Tuning data doesn't have region info."));
  ZelTuningBlock<zm::NfltrTuning> no_static = Block();
  no_static.message.clear_static_param();
  EXPECT_THAT(TranslateNfltr(no_static, {vosbrine::RGGB, &wb}, output),
              StatusIs(kInvalid, "Tuning data doesn't have static info."));
  EXPECT_THAT(TranslateNfltr(Block(), {vosbrine::RGGB, nullptr}, output),
              StatusIs(kInvalid, "Config data doesn't have WB info."));
  EXPECT_TRUE(SameBytes(output, before));
}

TEST(TranslateNfltrTest, InverseGainsAreRoundedQ5MaskedToSixBits) {
  struct Case {
    tavik_api::WhiteBalanceConfig wb;
    std::array<uint32_t, 3> codes;
  };
  for (const Case& c : {
           Case{{1.0f, 1.0f, 1.0f, 1.0f}, {32, 32, 32}},
           Case{{1.0666f, 1.0f, 1.0f, 1.7778f}, {30, 32, 18}},  // 30.002 and 18.0.
           Case{{2.0f, 1.0f, 3.0f, 64.0f}, {16, 16, 1}},        // Green takes the mean; 0.5 -> 1.
           Case{{0.6f, 0.5f, 0.5f, 0.25f}, {53, 0, 0}},         // 64 and 128 lose bit 6 and 7.
       }) {
    NfltrItpOutput output = PatternFilled<NfltrItpOutput>();
    TAVIK_ASSERT_OK(TranslateNfltr(Block(), {vosbrine::RGGB, &c.wb}, output));
    EXPECT_EQ(output.inverse_wb_r, c.codes[0]);
    EXPECT_EQ(output.inverse_wb_g, c.codes[1]);
    EXPECT_EQ(output.inverse_wb_b, c.codes[2]);
  }
}

TEST(TranslateNfltrTest, AZeroOrNanGainIsTheCallersErrorAndWritesZero) {
  const tavik_api::WhiteBalanceConfig wb = {0.0f, std::numeric_limits<float>::quiet_NaN(), 1.0f,
                                            -0.0f};
  NfltrItpOutput output = PatternFilled<NfltrItpOutput>();
  TAVIK_ASSERT_OK(TranslateNfltr(Block(), {vosbrine::RGGB, &wb}, output));
  EXPECT_EQ(output.inverse_wb_r, 0u);
  EXPECT_EQ(output.inverse_wb_g, 0u);
  EXPECT_EQ(output.inverse_wb_b, 0u);
}

TEST(TranslateNfltrTest, BypassPixelOrderAndSpareBits) {
  struct Case {
    vosbrine::BayerPattern pattern;
    uint32_t code;
  };
  const tavik_api::WhiteBalanceConfig wb;
  for (const Case& c : {Case{vosbrine::RGGB, 1}, Case{vosbrine::BGGR, 2}, Case{vosbrine::GRBG, 0},
                        Case{vosbrine::GBRG, 3}}) {
    NfltrItpOutput output = PatternFilled<NfltrItpOutput>();
    RecordingTraceSink sink;
    TAVIK_ASSERT_OK(TranslateNfltr(Block(/*enable=*/false), {c.pattern, &wb}, output));
    EXPECT_EQ(output.bypass, 1u);
    EXPECT_EQ(output.pixel_order, c.code);
    // 32 is 0b100000 over the pattern's spare bits.
    EXPECT_THAT(Words(output),
                ElementsAre(0xA5A5A5A5, 0xA5A5A5A0, 0xA5A5A5A0, 0xA5A5A5A0, 0xA5A5A5A4 | c.code));
    EXPECT_THAT(sink.spans(), ElementsAre(RecordingTraceSink::Span(5, "TranslateNfltr")));
  }
}

TEST(TranslateNfltrTest, SampleSetTranslatesUnderAWarmWhiteBalance) {
  const tavik_api::WhiteBalanceConfig wb = {1.6f, 1.0f, 1.0f, 2.4f};
  const int leaves = test::ForEachSampleLeaf<zm::NfltrTuning>(
      [&](const ZelTuningBlock<zm::NfltrTuning>& block, const std::string&) {
        NfltrItpOutput output = {};
        TAVIK_EXPECT_OK(TranslateNfltr(block, {vosbrine::GRBG, &wb}, output));
        EXPECT_EQ(output.inverse_wb_r, 20u);
        EXPECT_EQ(output.inverse_wb_b, 13u);  // 13.33.
      });
  if (::testing::Test::IsSkipped()) return;
  EXPECT_GT(leaves, 0);
}

}  // namespace
}  // namespace tavik
