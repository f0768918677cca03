#include "tavik/iq/zel/translators/edgedet_online_translator.h"

#include <array>
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
using ::tavik_registers::zel::itp::EdgedetMagnitudeControlValue;
using ::testing::ElementsAre;

constexpr absl::StatusCode kInvalid = absl::StatusCode::kInvalidArgument;

std::array<uint32_t, 2> Words(const EdgedetItpOutput& output) {
  std::array<uint32_t, 2> words;
  std::memcpy(words.data(), &output, sizeof(output));
  return words;
}

uint32_t Word(const EdgedetMagnitudeControlValue& control) {
  uint32_t word = 0;
  std::memcpy(&word, &control, sizeof(word));
  return word;
}

zm::EdgedetTuning Tuning(bool enable, bool low_power) {
  zm::EdgedetTuning tuning;
  tuning.set_enable(enable);
  tuning.mutable_static_param()->set_enable_low_power(low_power);
  tuning.mutable_dynamic_param();
  return tuning;
}

ZelTuningBlock<zm::EdgedetTuning> Block(zm::EdgedetTuning tuning) {
  return ZelTuningBlock<zm::EdgedetTuning>(std::move(tuning));
}

TEST(EdgedetRecordLayoutTest, MagnitudeControlHasEnableAtBit0AndModeAtBits8To9) {
  EdgedetMagnitudeControlValue control = {};
  control.enable = 1;
  control.magnitude_mode = 3;
  EXPECT_EQ(Word(control), 0x301u);
}

TEST(TranslateEdgedetTest, WritesBypassAndLowPowerAndNothingElse) {
  EdgedetItpOutput output = PatternFilled<EdgedetItpOutput>();
  TAVIK_ASSERT_OK(TranslateEdgedet(Block(Tuning(/*enable=*/true, /*low_power=*/false)), output));
  EXPECT_THAT(Words(output), ElementsAre(0xA5A5A5A4u, 0xA5A5A5A4u));
  TAVIK_ASSERT_OK(TranslateEdgedet(Block(Tuning(/*enable=*/false, /*low_power=*/true)), output));
  EXPECT_THAT(Words(output), ElementsAre(0xA5A5A5A5u, 0xA5A5A5A5u));
}

TEST(TranslateEdgedetTest, TheEmptyDynamicPartMustStillBeThere) {
  zm::EdgedetTuning tuning = Tuning(true, false);
  tuning.clear_dynamic_param();
  EdgedetItpOutput output = PatternFilled<EdgedetItpOutput>();
  EXPECT_THAT(TranslateEdgedet(Block(tuning), output),
              StatusIs(kInvalid, "Tuning data doesn't have region info."));
  EXPECT_TRUE(SameBytes(output, PatternFilled<EdgedetItpOutput>()));
}

TEST(TranslateEdgedetTest, RefusalsInOrderWithNothingWritten) {
  ScopedLogCapture log;
  EdgedetItpOutput output = PatternFilled<EdgedetItpOutput>();
  EXPECT_THAT(TranslateEdgedet(ForeignBlock(), output), StatusIs(kInvalid, "Invalid TuningBlock!"));
  EXPECT_TRUE(log.Contains("Incorrect tuning block type: Foreign, expected: EdgedetTuning"));
  zm::EdgedetTuning tuning = Tuning(true, false);
  tuning.clear_dynamic_param();
  tuning.clear_static_param();
  EXPECT_THAT(TranslateEdgedet(Block(tuning), output),
              StatusIs(kInvalid, "Tuning data doesn't have region info."));
  EXPECT_THAT(TranslateEdgedet(Block(zm::EdgedetTuning()), output),
              StatusIs(kInvalid, "Tuning data doesn't have region info."));
  tuning = Tuning(true, false);
  tuning.clear_static_param();
  EXPECT_THAT(TranslateEdgedet(Block(tuning), output),
              StatusIs(kInvalid, "Tuning data doesn't have static info."));
  EXPECT_TRUE(SameBytes(output, PatternFilled<EdgedetItpOutput>()));
}

TEST(GetDefaultEdgedetTest, ClearsBothBitsAndSetsTheMagnitudeControl) {
  EdgedetItpOutput output = PatternFilled<EdgedetItpOutput>(0xFF);
  EdgedetMagnitudeControlValue control = {};
  TAVIK_ASSERT_OK(GetDefaultEdgedet(output, &control));
  EXPECT_THAT(Words(output), ElementsAre(0xFFFFFFFEu, 0xFFFFFFFEu));
  EXPECT_EQ(Word(control), 0x201u);
  control = PatternFilled<EdgedetMagnitudeControlValue>();
  TAVIK_ASSERT_OK(GetDefaultEdgedet(output, &control));
  EXPECT_EQ(Word(control), 0xA5A5A6A5u);  // Bits 8-9 to 2, bit 0 set, the rest as found.
}

TEST(GetDefaultEdgedetTest, NullRegisterIsRefusedBeforeAnythingIsWritten) {
  EdgedetItpOutput output = PatternFilled<EdgedetItpOutput>();
  EXPECT_THAT(GetDefaultEdgedet(output, nullptr), StatusIs(kInvalid, "Output is null pointer!"));
  EXPECT_TRUE(SameBytes(output, PatternFilled<EdgedetItpOutput>()));
}

TEST(GetDefaultEdgedetTest, TranslatesNothing) {
  RecordingTraceSink sink;
  EdgedetItpOutput output;
  EdgedetMagnitudeControlValue control;
  TAVIK_ASSERT_OK(GetDefaultEdgedet(output, &control));
  EXPECT_THAT(sink.spans(), ElementsAre(RecordingTraceSink::Span(5, "GetDefaultEdgedet")));
}

TEST(EdgedetSampleSetTest, EveryLeafTranslatesToItsSwitches) {
  const int leaves = test::ForEachSampleLeaf<zm::EdgedetTuning>(
      [&](const ZelTuningBlock<zm::EdgedetTuning>& block, const std::string&) {
        EdgedetItpOutput output = {};
        TAVIK_EXPECT_OK(TranslateEdgedet(block, output));
        EXPECT_EQ(output.bypass, block.message.enable() ? 0u : 1u);
        EXPECT_EQ(output.enable_low_power, block.message.static_param().enable_low_power());
      });
  if (::testing::Test::IsSkipped()) return;
  EXPECT_GT(leaves, 0);
}

}  // namespace
}  // namespace tavik
