#include "tavik/iq/zel/translators/skind_online_translator.h"

#include <array>
#include <cmath>
#include <cstdint>
#include <cstring>
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

std::array<uint32_t, 23> Words(const SkindOutput& output) {
  std::array<uint32_t, 23> words;
  std::memcpy(words.data(), &output, sizeof(output));
  return words;
}

std::array<uint32_t, 4> Words(const SkindClassRanges& ranges) {
  std::array<uint32_t, 4> words;
  std::memcpy(words.data(), &ranges, sizeof(ranges));
  return words;
}

// An enabled tuning with every class off and every range zero.
zm::SkindTuning ZeroTuning(bool enable = true) {
  zm::SkindTuning tuning;
  tuning.set_enable(enable);
  tuning.mutable_static_param();
  tuning.mutable_dynamic_param();
  return tuning;
}

// The skin class of the rear sample tuning at low colour temperature.
zm::SkindTuning SkinTuning() {
  zm::SkindTuning tuning = ZeroTuning();
  tuning.mutable_static_param()->set_enable_skin(true);
  zm::SkindDynamicParam& d = *tuning.mutable_dynamic_param();
  d.set_skin_hue_min(10.0f);
  d.set_skin_hue_max(50.0f);
  d.set_skin_sat_min(0.12f);
  d.set_skin_sat_max(0.68f);
  d.set_skin_val_min(0.2f);
  d.set_skin_val_max(0.98f);
  d.set_skin_hue_smooth_shift(0.25f);
  d.set_skin_sat_smooth_shift(0.2f);
  d.set_skin_val_smooth_shift(0.15f);
  return tuning;
}

ZelTuningBlock<zm::SkindTuning> Block(zm::SkindTuning tuning) {
  return ZelTuningBlock<zm::SkindTuning>(std::move(tuning));
}

// --- Record layout ---------------------------------------------------------------------------

TEST(SkindRecordLayoutTest, ClassEnablesSitAfterOneSetBitBetweenTheirModeBits) {
  SkindOutput output = {};
  output.enable_skin = 1;
  output.enable_skin_b = 1;
  output.enable_sky = 1;
  output.enable_grass = 1;
  output.enable_extra = 1;
  EXPECT_EQ(Words(output)[2], 0x22222u);  // Bits 1, 5, 9, 13, 17.
  output = {};
  output.class_mode = 1;
  output.skin_mode = 7;
  output.skin_b_mode = 7;
  output.sky_mode = 7;
  output.grass_mode = 7;
  output.extra_mode = 7;
  EXPECT_EQ(Words(output)[2], 0x1DDDDDu);
}

TEST(SkindRecordLayoutTest, EachClassTakesFourWordsFromWordThree) {
  SkindClassRanges ranges = {};
  ranges.hue_min = 0x3FF;
  ranges.hue_max = 0x3FF;
  ranges.sat_min = 0x3FF;
  ranges.sat_max = 0x3FF;
  ranges.val_min = 0x7FF;
  ranges.val_max = 0x7FF;
  ranges.hue_smooth_shift = 0xF;
  ranges.sat_smooth_shift = 0xF;
  ranges.val_smooth_shift = 0xF;
  EXPECT_THAT(Words(ranges), ElementsAre(0x3FF03FFu, 0x3FF03FFu, 0x7FF07FFu, 0xF0F0Fu));
  SkindOutput output = {};
  output.grass.val_max = 1;
  EXPECT_EQ(Words(output)[3 + 4 * 3 + 2], 0x10000u);
}

// --- Defaults ----------------------------------------------------------------------------------

TEST(GetDefaultSkindTest, TheStageOnWithEveryClassOffAndNoRanges) {
  SkindOutput output = {};
  SkindFixedOutput fixed = PatternFilled<SkindFixedOutput>();
  TAVIK_ASSERT_OK(GetDefaultSkind(output, fixed));
  std::array<uint32_t, 23> expected{};
  expected[2] = 0x1DDDDD;
  EXPECT_EQ(Words(output), expected);
  EXPECT_THAT(fixed.reserved, ElementsAre(0u, 0u, 0u, 0u));
}

TEST(GetDefaultSkindTest, ClearsTheFirstTwoWordsBitsAndKeepsTheSpareBits) {
  SkindOutput output = PatternFilled<SkindOutput>();
  SkindFixedOutput fixed;
  TAVIK_ASSERT_OK(GetDefaultSkind(output, fixed));
  const auto words = Words(output);
  EXPECT_EQ(words[0], 0xA5A5A5A4u);
  EXPECT_EQ(words[1], 0xA5A5A5A4u);
  EXPECT_EQ(words[2], 0xA5BDDDDDu);
  EXPECT_EQ(words[3], 0xA400A400u);  // Hue bounds zero, bits 10-15 and 26-31 as found.
  EXPECT_EQ(words[6], 0xA5A0A0A0u);  // Smoothing shifts zero.
}

TEST(GetDefaultSkindTest, TranslatesNothing) {
  RecordingTraceSink sink;
  SkindOutput output;
  SkindFixedOutput fixed;
  TAVIK_ASSERT_OK(GetDefaultSkind(output, fixed));
  EXPECT_THAT(sink.spans(), ElementsAre(RecordingTraceSink::Span(5, "GetDefaultSkind")));
}

// --- TranslateSkind ----------------------------------------------------------------------------

TEST(TranslateSkindTest, RefusalsInOrderWithNothingWritten) {
  ScopedLogCapture log;
  SkindOutput output = PatternFilled<SkindOutput>();
  EXPECT_THAT(TranslateSkind(ForeignBlock(), output), StatusIs(kInvalid, "Invalid TuningBlock!"));
  EXPECT_TRUE(log.Contains("Incorrect tuning block type: Foreign, expected: SkindTuning"));
  zm::SkindTuning tuning = ZeroTuning();
  tuning.clear_dynamic_param();
  tuning.clear_static_param();
  EXPECT_THAT(TranslateSkind(Block(tuning), output),
              StatusIs(kInvalid, "Tuning data doesn't have region info."));
  EXPECT_THAT(TranslateSkind(Block(zm::SkindTuning()), output),
              StatusIs(kInvalid, "Tuning data doesn't have region info."));
  tuning = ZeroTuning();
  tuning.clear_static_param();
  EXPECT_THAT(TranslateSkind(Block(tuning), output),
              StatusIs(kInvalid, "Tuning data doesn't have static info."));
  EXPECT_TRUE(SameBytes(output, PatternFilled<SkindOutput>()));
}

TEST(TranslateSkindTest, ExtraClassOnGivesLowBits0x1FDDDD) {
  zm::SkindTuning tuning = ZeroTuning();
  tuning.mutable_static_param()->set_enable_extra(true);
  SkindOutput output = PatternFilled<SkindOutput>();
  TAVIK_ASSERT_OK(TranslateSkind(Block(tuning), output));
  EXPECT_EQ(Words(output)[2] & 0x1FFFFFu, 0x1FDDDDu);
  EXPECT_EQ(Words(output)[2], 0xA5BFDDDDu);  // Bits 21-31 as found.
}

TEST(TranslateSkindTest, EveryClassOnSetsTheLowTwentyOneBits) {
  zm::SkindTuning tuning = ZeroTuning();
  zm::SkindStaticParam& s = *tuning.mutable_static_param();
  s.set_enable_skin(true);
  s.set_enable_skin_b(true);
  s.set_enable_sky(true);
  s.set_enable_grass(true);
  s.set_enable_extra(true);
  s.set_enable_low_power(true);
  tuning.set_enable(false);
  SkindOutput output = {};
  TAVIK_ASSERT_OK(TranslateSkind(Block(tuning), output));
  EXPECT_EQ(Words(output)[0], 1u);
  EXPECT_EQ(Words(output)[1], 1u);
  EXPECT_EQ(Words(output)[2], 0x1FFFFFu);
}

TEST(TranslateSkindTest, SkinClassOfTheSampleSet) {
  SkindOutput output = {};
  TAVIK_ASSERT_OK(TranslateSkind(Block(SkinTuning()), output));
  EXPECT_EQ(Words(output)[2], 0x1DDDDFu);
  // Hue 10 and 50 degrees: 21.3 and 106.7 in 768ths of a turn.
  EXPECT_EQ(output.skin.hue_min, 21u);
  EXPECT_EQ(output.skin.hue_max, 107u);
  EXPECT_EQ(output.skin.sat_min, 123u);   // 0.12 x 1023 = 122.76.
  EXPECT_EQ(output.skin.sat_max, 696u);   // 695.64.
  EXPECT_EQ(output.skin.val_min, 205u);   // 204.6.
  EXPECT_EQ(output.skin.val_max, 1003u);  // 1002.54.
  EXPECT_EQ(output.skin.hue_smooth_shift, 2u);
  EXPECT_EQ(output.skin.sat_smooth_shift, 2u);  // 1.6.
  EXPECT_EQ(output.skin.val_smooth_shift, 1u);  // 1.2.
  EXPECT_THAT(Words(output.skin), ElementsAre(0x6B0015u, 0x2B8007Bu, 0x3EB00CDu, 0x10202u));
  EXPECT_THAT(Words(output.sky), ElementsAre(0u, 0u, 0u, 0u));
}

TEST(TranslateSkindTest, EachClassTakesItsOwnNineValues) {
  zm::SkindTuning tuning = ZeroTuning();
  zm::SkindDynamicParam& d = *tuning.mutable_dynamic_param();
  d.set_skin_b_hue_min(4.0f);
  d.set_sky_sat_max(0.85f);
  d.set_grass_val_min(0.12f);
  d.set_extra_val_smooth_shift(0.375f);
  SkindOutput output = {};
  TAVIK_ASSERT_OK(TranslateSkind(Block(tuning), output));
  EXPECT_EQ(output.skin_b.hue_min, 9u);   // 8.53.
  EXPECT_EQ(output.sky.sat_max, 870u);    // 869.55.
  EXPECT_EQ(output.grass.val_min, 123u);  // 122.76.
  EXPECT_EQ(output.extra.val_smooth_shift, 3u);
  EXPECT_THAT(Words(output.skin), ElementsAre(0u, 0u, 0u, 0u));
}

TEST(TranslateSkindTest, HueOf400IsLimitedTo768AndNegativesToZero) {
  zm::SkindTuning tuning = ZeroTuning();
  zm::SkindDynamicParam& d = *tuning.mutable_dynamic_param();
  d.set_skin_hue_max(400.0f);
  d.set_skin_hue_min(400.0f);
  d.set_sky_hue_min(-20.0f);
  d.set_sky_sat_min(1.5f);
  d.set_sky_val_max(1.5f);
  d.set_sky_hue_smooth_shift(2.0f);
  SkindOutput output = {};
  TAVIK_ASSERT_OK(TranslateSkind(Block(tuning), output));
  EXPECT_EQ(output.skin.hue_max, 768u);
  EXPECT_EQ(output.skin.hue_min, 768u);
  EXPECT_EQ(output.sky.hue_min, 0u);
  EXPECT_EQ(output.sky.sat_min, 1023u);
  EXPECT_EQ(output.sky.val_max, 1023u);
  EXPECT_EQ(output.sky.hue_smooth_shift, 8u);
}

TEST(TranslateSkindTest, TheTwoHueBoundsRoundInTheirOwnOrders) {
  // One step below 1.640625 degrees: 1.640625 x 768 / 360 is 3.4999998 in single precision, while
  // 1.640625 / 360 x 768 comes to exactly 3.5.
  const float hue = std::nextafter(1.640625f, 0.0f);
  zm::SkindTuning tuning = ZeroTuning();
  tuning.mutable_dynamic_param()->set_grass_hue_min(hue);
  tuning.mutable_dynamic_param()->set_grass_hue_max(hue);
  SkindOutput output = {};
  TAVIK_ASSERT_OK(TranslateSkind(Block(tuning), output));
  EXPECT_EQ(output.grass.hue_min, 3u);
  EXPECT_EQ(output.grass.hue_max, 4u);
}

// --- The sample tuning set ---------------------------------------------------------------------

TEST(SkindSampleSetTest, EveryLeafGivesEnabledClassesRisingRanges) {
  const int leaves = test::ForEachSampleLeaf<zm::SkindTuning>(
      [&](const ZelTuningBlock<zm::SkindTuning>& block, const std::string&) {
        SkindOutput output = {};
        TAVIK_EXPECT_OK(TranslateSkind(block, output));
        const std::pair<bool, const SkindClassRanges*> classes[] = {
            {output.enable_skin == 1, &output.skin},
            {output.enable_skin_b == 1, &output.skin_b},
            {output.enable_sky == 1, &output.sky},
            {output.enable_grass == 1, &output.grass},
            {output.enable_extra == 1, &output.extra}};
        for (const auto& [enabled, ranges] : classes) {
          if (!enabled) continue;
          EXPECT_LT(ranges->hue_min, ranges->hue_max);
          EXPECT_LT(ranges->sat_min, ranges->sat_max);
          EXPECT_LT(ranges->val_min, ranges->val_max);
        }
      });
  if (::testing::Test::IsSkipped()) return;
  EXPECT_GT(leaves, 0);
}

}  // namespace
}  // namespace tavik
