#include "tavik/iq/zel/translators/prc_online_translator.h"

#include <cstdint>
#include <cstring>
#include <limits>
#include <string>
#include <utility>
#include <vector>

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
using ::tavik_registers::zel::itp::PrcConfigurationValue;
using ::testing::Each;
using ::testing::ElementsAre;
using ::testing::IsEmpty;

constexpr absl::StatusCode kInvalid = absl::StatusCode::kInvalidArgument;
constexpr TonemapMode kTuningCurve = TonemapMode::kHighQuality;
using Floats = google::protobuf::RepeatedField<float>;

// Every list of the dynamic part, in field order.
std::vector<Floats*> Lists(zm::PrcDynamicParam& d) {
  return {d.mutable_outer_hue_low(),          d.mutable_outer_hue_high(),
          d.mutable_outer_sat_low(),          d.mutable_outer_sat_high(),
          d.mutable_outer_val_low(),          d.mutable_outer_val_high(),
          d.mutable_inner_distance_hue_low(), d.mutable_inner_distance_hue_high(),
          d.mutable_inner_distance_sat_low(), d.mutable_inner_distance_sat_high(),
          d.mutable_inner_distance_val_low(), d.mutable_inner_distance_val_high(),
          d.mutable_shift_vector_hue(),       d.mutable_shift_vector_sat(),
          d.mutable_shift_vector_val()};
}

// An enabled tuning of twenty all-zero regions.
zm::PrcTuning ZeroTuning(bool enable = true) {
  zm::PrcTuning tuning;
  tuning.set_enable(enable);
  tuning.mutable_static_param();
  for (Floats* list : Lists(*tuning.mutable_dynamic_param())) list->Resize(20, 0.0f);
  return tuning;
}

// Sets the first values of `list` to `values`.
void SetFirst(Floats* list, const std::vector<float>& values) {
  for (size_t i = 0; i < values.size(); ++i) list->Set(static_cast<int>(i), values[i]);
}

ZelTuningBlock<zm::PrcTuning> Block(zm::PrcTuning tuning) {
  return ZelTuningBlock<zm::PrcTuning>(std::move(tuning));
}

// --- Record layout ---------------------------------------------------------------------------

TEST(PrcRecordLayoutTest, TablesFollowTheBypassWordAsSixteenBitEntries) {
  PrcOutput output = {};
  output.bypass = 1;
  output.outer_hue_low[0] = 0x1234;
  output.shift_vector_val[19] = -2;
  uint16_t halves[sizeof(PrcOutput) / 2];
  std::memcpy(halves, &output, sizeof(output));
  EXPECT_EQ(halves[0], 1u);
  EXPECT_EQ(halves[1], 0u);
  EXPECT_EQ(halves[2], 0x1234u);                // Position 2.
  EXPECT_EQ(halves[2 + 15 * 20 - 1], 0xFFFEu);  // The last entry of the last table.
}

// --- Defaults ----------------------------------------------------------------------------------

TEST(GetDefaultPrcTest, DisabledZeroRegionsWithTheHighBoundOffsets) {
  PrcOutput output = {};
  PrcConfigurationValue config = PatternFilled<PrcConfigurationValue>();
  TAVIK_ASSERT_OK(GetDefaultPrc(output, &config));
  EXPECT_EQ(output.bypass, 1u);
  EXPECT_THAT(output.outer_hue_low, Each(0u));
  EXPECT_THAT(output.outer_hue_high, Each(2u));
  EXPECT_THAT(output.outer_sat_low, Each(0u));
  EXPECT_THAT(output.outer_sat_high, Each(2u));
  EXPECT_THAT(output.outer_val_low, Each(0u));
  EXPECT_THAT(output.outer_val_high, Each(2u));
  EXPECT_THAT(output.inner_distance_hue_low, Each(0u));
  EXPECT_THAT(output.inner_distance_val_high, Each(0u));
  EXPECT_THAT(output.shift_vector_hue, Each(0));
  EXPECT_THAT(output.shift_vector_val, Each(0));
  EXPECT_EQ(config.settings, 0u);
}

TEST(GetDefaultPrcTest, NullRegisterIsRefusedBeforeAnythingIsWritten) {
  PrcOutput output = PatternFilled<PrcOutput>();
  EXPECT_THAT(GetDefaultPrc(output, nullptr), StatusIs(kInvalid, "Output is null pointer!"));
  EXPECT_TRUE(SameBytes(output, PatternFilled<PrcOutput>()));
}

TEST(GetDefaultPrcTest, TracesItselfAroundTheTranslation) {
  RecordingTraceSink sink;
  PrcOutput output;
  PrcConfigurationValue config;
  TAVIK_ASSERT_OK(GetDefaultPrc(output, &config));
  using Span = RecordingTraceSink::Span;
  EXPECT_THAT(sink.spans(), ElementsAre(Span(5, "TranslatePrc"), Span(5, "GetDefaultPrc")));
}

// --- TranslatePrc ------------------------------------------------------------------------------

TEST(TranslatePrcTest, ApplicationCurveSucceedsOnABlockOfAnyTypeWithBypassAlone) {
  ScopedLogCapture log;
  PrcOutput output = PatternFilled<PrcOutput>();
  PrcOutput expected = output;
  expected.bypass = 1;
  TAVIK_ASSERT_OK(TranslatePrc(ForeignBlock(), output, TonemapMode::kContrastCurve));
  EXPECT_TRUE(SameBytes(output, expected));
  EXPECT_THAT(log.messages(), IsEmpty());
}

TEST(TranslatePrcTest, RefusalsInOrderWithNothingWritten) {
  PrcOutput output = PatternFilled<PrcOutput>();
  EXPECT_THAT(TranslatePrc(ForeignBlock(), output, kTuningCurve),
              StatusIs(kInvalid, "Invalid TuningBlock!"));
  zm::PrcTuning tuning = ZeroTuning();
  tuning.clear_dynamic_param();
  tuning.clear_static_param();
  EXPECT_THAT(TranslatePrc(Block(tuning), output, kTuningCurve),
              StatusIs(kInvalid, "Tuning data doesn't have region info."));
  EXPECT_THAT(TranslatePrc(Block(zm::PrcTuning()), output, kTuningCurve),
              StatusIs(kInvalid, "Tuning data doesn't have region info."));
  tuning = ZeroTuning();
  tuning.clear_static_param();
  EXPECT_THAT(TranslatePrc(Block(tuning), output, kTuningCurve),
              StatusIs(kInvalid, "Tuning data doesn't have static info."));
  EXPECT_TRUE(SameBytes(output, PatternFilled<PrcOutput>()));
}

TEST(TranslatePrcTest, AListOfFewerThanTwentyValuesIsRefusedByNameWithNothingWritten) {
  zm::PrcTuning tuning = ZeroTuning();
  tuning.mutable_dynamic_param()->mutable_inner_distance_sat_high()->Resize(19, 0.0f);
  tuning.mutable_dynamic_param()->mutable_shift_vector_val()->Clear();
  PrcOutput output = PatternFilled<PrcOutput>();
  EXPECT_THAT(TranslatePrc(Block(tuning), output, kTuningCurve),
              StatusIs(kInvalid, "inner_distance_sat_high size is wrong: 19"));
  EXPECT_TRUE(SameBytes(output, PatternFilled<PrcOutput>()));
  tuning = ZeroTuning();
  tuning.mutable_dynamic_param()->mutable_shift_vector_val()->Clear();
  EXPECT_THAT(TranslatePrc(Block(tuning), output, kTuningCurve),
              StatusIs(kInvalid, "shift_vector_val size is wrong: 0"));
}

TEST(TranslatePrcTest, OfALongerListTheFirstTwentyValuesAreRead) {
  zm::PrcTuning tuning = ZeroTuning();
  tuning.mutable_dynamic_param()->mutable_outer_hue_low()->Add(360.0f);
  PrcOutput output = {};
  TAVIK_ASSERT_OK(TranslatePrc(Block(tuning), output, kTuningCurve));
  EXPECT_THAT(output.outer_hue_low, Each(0u));
}

TEST(TranslatePrcTest, OuterHueBoundsInTheStagesUnitsWithTheHighOffsetBy2) {
  zm::PrcTuning tuning = ZeroTuning();
  zm::PrcDynamicParam& d = *tuning.mutable_dynamic_param();
  SetFirst(d.mutable_outer_hue_low(), {0.0f, 18.0f, 180.0f, 342.0f, 360.0f, 400.0f, -10.0f});
  SetFirst(d.mutable_outer_hue_high(), {0.0f, 18.0f, 342.0f, 360.0f, 400.0f, -10.0f});
  PrcOutput output = {};
  TAVIK_ASSERT_OK(TranslatePrc(Block(tuning), output, kTuningCurve));
  // 18 x 49151 / 360 = 2457.55; 180 gives 24575.5, rounded away from zero.
  EXPECT_THAT(std::vector<uint16_t>(output.outer_hue_low, output.outer_hue_low + 7),
              ElementsAre(0u, 2458u, 24576u, 46693u, 49151u, 49151u, 0u));
  // 360 gives 49153, the top of the high bound's range.
  EXPECT_THAT(std::vector<uint16_t>(output.outer_hue_high, output.outer_hue_high + 6),
              ElementsAre(2u, 2460u, 46695u, 49153u, 49153u, 2u));
}

TEST(TranslatePrcTest, OuterSaturationAndValueBoundsWithTheHighOffsetBy2) {
  zm::PrcTuning tuning = ZeroTuning();
  zm::PrcDynamicParam& d = *tuning.mutable_dynamic_param();
  SetFirst(d.mutable_outer_sat_low(), {0.08f, 1.0f, 2.0f, -1.0f});
  SetFirst(d.mutable_outer_sat_high(), {1.0f, 0.5f, 2.0f, -1.0f});
  SetFirst(d.mutable_outer_val_low(), {0.06f});
  SetFirst(d.mutable_outer_val_high(), {0.0f});
  PrcOutput output = {};
  TAVIK_ASSERT_OK(TranslatePrc(Block(tuning), output, kTuningCurve));
  EXPECT_THAT(std::vector<uint16_t>(output.outer_sat_low, output.outer_sat_low + 4),
              ElementsAre(1310u, 16381u, 16381u, 0u));
  // 0.5 x 16381 + 2 = 8192.5.
  EXPECT_THAT(std::vector<uint16_t>(output.outer_sat_high, output.outer_sat_high + 4),
              ElementsAre(16383u, 8193u, 16383u, 2u));
  EXPECT_EQ(output.outer_val_low[0], 983u);
  EXPECT_EQ(output.outer_val_high[0], 2u);
}

TEST(TranslatePrcTest, InnerDistancesAreShiftCounts) {
  zm::PrcTuning tuning = ZeroTuning();
  zm::PrcDynamicParam& d = *tuning.mutable_dynamic_param();
  SetFirst(d.mutable_inner_distance_hue_low(), {0.0f, 360.0f, 4.0f, 1.0f, 0.001f, -1.0f});
  SetFirst(d.mutable_inner_distance_sat_low(), {0.0f, 0.04f, 1.0f, 4.0f, 100.0f, -0.5f});
  SetFirst(d.mutable_inner_distance_val_high(),
           {std::numeric_limits<float>::quiet_NaN(), std::numeric_limits<float>::infinity()});
  PrcOutput output = {};
  TAVIK_ASSERT_OK(TranslatePrc(Block(tuning), output, kTuningCurve));
  // 360 degrees: round(log2(24575)) = 15; 4 degrees: log2(273.06) = 8.09.
  EXPECT_THAT(
      std::vector<uint16_t>(output.inner_distance_hue_low, output.inner_distance_hue_low + 6),
      ElementsAre(0u, 15u, 8u, 6u, 0u, 0u));
  // 0.04: log2(327.64) = 8.36; 1.0: log2(8191) = 12.9998; beyond 15 limited.
  EXPECT_THAT(
      std::vector<uint16_t>(output.inner_distance_sat_low, output.inner_distance_sat_low + 6),
      ElementsAre(0u, 8u, 13u, 15u, 15u, 0u));
  EXPECT_EQ(output.inner_distance_val_high[0], 0u);
  EXPECT_EQ(output.inner_distance_val_high[1], 15u);
}

TEST(TranslatePrcTest, ShiftVectorsAreSignedCodes) {
  zm::PrcTuning tuning = ZeroTuning();
  zm::PrcDynamicParam& d = *tuning.mutable_dynamic_param();
  SetFirst(d.mutable_shift_vector_hue(), {-180.0f, 1.0f, 1.5f, -1.2f, 200.0f});
  SetFirst(d.mutable_shift_vector_sat(), {-0.01f, 0.03f, 1.0f, -0.5f});
  SetFirst(d.mutable_shift_vector_val(), {-0.006f, 0.018f});
  PrcOutput output = {};
  TAVIK_ASSERT_OK(TranslatePrc(Block(tuning), output, kTuningCurve));
  // (x 24575 + x 24575) / 360: -180 gives -24575.
  EXPECT_THAT(std::vector<int16_t>(output.shift_vector_hue, output.shift_vector_hue + 5),
              ElementsAre(-24575, 137, 205, -164, 24575));
  EXPECT_THAT(std::vector<int16_t>(output.shift_vector_sat, output.shift_vector_sat + 4),
              ElementsAre(-164, 491, 8191, -8191));
  EXPECT_THAT(std::vector<int16_t>(output.shift_vector_val, output.shift_vector_val + 2),
              ElementsAre(-98, 295));
}

TEST(TranslatePrcTest, BypassIsTheInverseOfEnableAndItsWordsSpareBitsSurvive) {
  PrcOutput output = PatternFilled<PrcOutput>();
  TAVIK_ASSERT_OK(TranslatePrc(Block(ZeroTuning(/*enable=*/true)), output, kTuningCurve));
  uint32_t word = 0;
  std::memcpy(&word, &output, 4);
  EXPECT_EQ(word, 0xA5A5A5A4u);
  TAVIK_ASSERT_OK(TranslatePrc(Block(ZeroTuning(/*enable=*/false)), output, kTuningCurve));
  std::memcpy(&word, &output, 4);
  EXPECT_EQ(word, 0xA5A5A5A5u);
}

// --- The sample tuning set ---------------------------------------------------------------------

TEST(PrcSampleSetTest, EveryLeafGivesRegionsWhoseUpperBoundsLieAboveTheLowerOnes) {
  const int leaves = test::ForEachSampleLeaf<zm::PrcTuning>(
      [&](const ZelTuningBlock<zm::PrcTuning>& block, const std::string&) {
        PrcOutput output = {};
        TAVIK_EXPECT_OK(TranslatePrc(block, output, kTuningCurve));
        for (int i = 0; i < kPrcRegions; ++i) {
          EXPECT_GT(output.outer_hue_high[i], output.outer_hue_low[i]) << "region " << i;
          EXPECT_GT(output.outer_sat_high[i], output.outer_sat_low[i]) << "region " << i;
          EXPECT_GT(output.outer_val_high[i], output.outer_val_low[i]) << "region " << i;
        }
      });
  if (::testing::Test::IsSkipped()) return;
  EXPECT_GT(leaves, 0);
}

}  // namespace
}  // namespace tavik
