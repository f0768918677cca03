#include "tavik/iq/zel/translators/sensor_gamma_online_translator.h"

#include <array>
#include <cstdint>
#include <cstring>
#include <string>
#include <utility>
#include <vector>

#include "gmock/gmock.h"
#include "gtest/gtest.h"
#include "tavik/base/testing/log_capture.h"
#include "tavik/base/testing/status_matchers.h"
#include "tavik/iq/testing/translator_testing.h"
#include "tavik/iq/zel/protos/sharp_param.pb.h"
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
using ::tavik_registers::zel::g3aa::LinearizationLutValue;
using ::tavik_registers::zel::g3aa_generic::LinearizationConfigValue;
using ::testing::Each;
using ::testing::ElementsAre;
using ::testing::ElementsAreArray;
using ::testing::IsEmpty;

constexpr absl::StatusCode kInvalid = absl::StatusCode::kInvalidArgument;
constexpr TonemapMode kTuningCurve = TonemapMode::kHighQuality;
constexpr TonemapMode kApplicationCurve = TonemapMode::kContrastCurve;
constexpr char kLinearWarning[] = "Sensor Gamma doesn't have dynamic parameters. Set it to linear.";

// A tuning whose curve is `points`, or that has no dynamic part where `points` is empty.
zm::SensorGammaTuning Tuning(const std::vector<float>& points, bool enable = true) {
  zm::SensorGammaTuning tuning;
  tuning.set_enable(enable);
  tuning.mutable_static_param();
  if (!points.empty()) {
    tuning.mutable_dynamic_param()->mutable_gamma_y()->Add(points.begin(), points.end());
  }
  return tuning;
}

// i / 128, written out as the stage's own linear curve is.
std::vector<float> LinearPoints(int count = 129) {
  std::vector<float> points;
  for (int i = 0; i < count; ++i) points.push_back(static_cast<float>(i) / 128.0f);
  return points;
}

ZelTuningBlock<zm::SensorGammaTuning> Block(zm::SensorGammaTuning tuning) {
  return ZelTuningBlock<zm::SensorGammaTuning>(std::move(tuning));
}

// The Q14 codes of the linear curve: 128 i.
std::vector<uint16_t> LinearIppCodes() {
  std::vector<uint16_t> codes;
  for (int i = 0; i < 128; ++i) codes.push_back(static_cast<uint16_t>(128 * i));
  return codes;
}

// The Q15 codes of the linear curve, four times each: 256 i.
std::vector<uint16_t> LinearG3aaCodes() {
  std::vector<uint16_t> codes;
  for (int i = 0; i < 129; ++i) {
    for (int channel = 0; channel < 4; ++channel) codes.push_back(static_cast<uint16_t>(256 * i));
  }
  return codes;
}

std::vector<uint16_t> Codes(const SensorGammaIppOutput& output) {
  return {std::begin(output.gamma_lut), std::end(output.gamma_lut)};
}
std::vector<uint16_t> Codes(const LinearizationLutValue& lut) {
  return {std::begin(lut.lut), std::end(lut.lut)};
}

// --- Record layouts --------------------------------------------------------------------------

TEST(SensorGammaRecordLayoutTest, FixedOutputsFirstWordHoldsTwoFourteenBitValues) {
  SensorGammaIppFixedOutput fixed = {};
  fixed.value_0 = 0x3FFF;
  fixed.value_1 = 0x3FFF;
  uint32_t word = 0;
  std::memcpy(&word, &fixed, 4);
  EXPECT_EQ(word, 0x3FFF3FFFu);
}

TEST(SensorGammaRecordLayoutTest, G3aaConfigHasEnableThenPixelOrder) {
  LinearizationConfigValue config = {};
  config.enable = 1;
  config.pixel_order = 3;
  uint32_t word = 0;
  std::memcpy(&word, &config, 4);
  EXPECT_EQ(word, 0x7u);
}

// --- Defaults ----------------------------------------------------------------------------------

TEST(GetDefaultSensorGammaProTest, LinearCurveEndsAt16256WithALastDeltaOf128) {
  SensorGammaIppOutput output = {};
  SensorGammaIppFixedOutput fixed = {};
  TAVIK_ASSERT_OK(GetDefaultSensorGammaPro(output, fixed));
  EXPECT_EQ(output.bypass, 0u);
  EXPECT_THAT(Codes(output), ElementsAreArray(LinearIppCodes()));
  EXPECT_EQ(output.gamma_lut[127], 16256u);
  EXPECT_EQ(output.last_delta, 128u);
}

TEST(GetDefaultSensorGammaProTest, FixedOutputHolds0x400TwiceThenTheLinearCurve) {
  SensorGammaIppOutput output = {};
  SensorGammaIppFixedOutput fixed = PatternFilled<SensorGammaIppFixedOutput>();
  TAVIK_ASSERT_OK(GetDefaultSensorGammaPro(output, fixed));
  uint32_t word = 0;
  std::memcpy(&word, &fixed, 4);
  EXPECT_EQ(word, 0x04000400u);  // The record is written whole: its spare bits are zero.
  EXPECT_THAT(std::vector<uint16_t>(std::begin(fixed.gamma_lut), std::end(fixed.gamma_lut)),
              ElementsAreArray(LinearIppCodes()));
  EXPECT_EQ(fixed.last_delta, 128u);
}

TEST(GetDefaultSensorGammaProTest, KeepsTheSpareBitsOfTheBypassWord) {
  SensorGammaIppOutput output = PatternFilled<SensorGammaIppOutput>();
  SensorGammaIppFixedOutput fixed;
  TAVIK_ASSERT_OK(GetDefaultSensorGammaPro(output, fixed));
  uint32_t word = 0;
  std::memcpy(&word, &output, 4);
  EXPECT_EQ(word, 0xA5A5A5A4u);
  // The tail padding after last_delta is not the record's.
  EXPECT_EQ(reinterpret_cast<const uint8_t*>(&output)[262], 0xA5);
}

TEST(GetDefaultSensorGammaTest, G3aaLinearCurveIsTheSameFourTimesOver) {
  LinearizationConfigValue config = PatternFilled<LinearizationConfigValue>();
  LinearizationLutValue lut = {};
  TAVIK_ASSERT_OK(GetDefaultSensorGamma(config, lut));
  EXPECT_EQ(config.enable, 1u);
  EXPECT_EQ(config.pixel_order, 0u);  // RGGB.
  uint32_t word = 0;
  std::memcpy(&word, &config, 4);
  EXPECT_EQ(word, 0xA5A5A5A1u);
  EXPECT_THAT(Codes(lut), ElementsAreArray(LinearG3aaCodes()));
  EXPECT_THAT(std::vector<uint16_t>(lut.lut + 4 * 128, lut.lut + 4 * 129), Each(32768u));
}

TEST(GetDefaultSensorGammaTest, BothTraceThemselvesAroundTheTranslation) {
  RecordingTraceSink sink;
  SensorGammaIppOutput output;
  SensorGammaIppFixedOutput fixed;
  TAVIK_ASSERT_OK(GetDefaultSensorGammaPro(output, fixed));
  LinearizationConfigValue config;
  LinearizationLutValue lut;
  TAVIK_ASSERT_OK(GetDefaultSensorGamma(config, lut));
  using Span = RecordingTraceSink::Span;
  EXPECT_THAT(sink.spans(),
              ElementsAre(Span(5, "TranslateSensorGammaPro"), Span(5, "GetDefaultSensorGammaPro"),
                          Span(5, "TranslateSensorGamma"), Span(5, "GetDefaultSensorGamma")));
}

TEST(GetDefaultSensorGammaTest, DefaultsWarnOfNothing) {
  ScopedLogCapture log;
  SensorGammaIppOutput output;
  SensorGammaIppFixedOutput fixed;
  TAVIK_ASSERT_OK(GetDefaultSensorGammaPro(output, fixed));
  EXPECT_THAT(log.messages(), IsEmpty());
}

// --- TranslateSensorGammaPro -------------------------------------------------------------------

TEST(TranslateSensorGammaProTest, ApplicationCurveSetsBypassWithoutReadingTheBlock) {
  ScopedLogCapture log;
  SensorGammaIppOutput output = PatternFilled<SensorGammaIppOutput>();
  SensorGammaIppOutput expected = output;
  expected.bypass = 1;
  TAVIK_ASSERT_OK(TranslateSensorGammaPro(ForeignBlock(), output, kApplicationCurve));
  EXPECT_TRUE(SameBytes(output, expected));
  EXPECT_THAT(log.messages(), IsEmpty());
}

TEST(TranslateSensorGammaProTest, BlockOfAnotherTypeIsRefusedWithNothingWritten) {
  ScopedLogCapture log;
  SensorGammaIppOutput output = PatternFilled<SensorGammaIppOutput>();
  EXPECT_THAT(TranslateSensorGammaPro(ForeignBlock(), output, kTuningCurve),
              StatusIs(kInvalid, "Invalid TuningBlock!"));
  EXPECT_TRUE(log.Contains("Incorrect tuning block type: Foreign, expected: SensorGammaTuning"));
  EXPECT_TRUE(SameBytes(output, PatternFilled<SensorGammaIppOutput>()));
}

// The controller answers a request for "SensorGammaTuning" with the SharpTuning block, which
// this translator refuses as any block of another type.
TEST(TranslateSensorGammaProTest, TheControllersSharpBlockIsRefused) {
  ZelTuningBlock<zm::SharpTuning> sharp;
  sharp.message.set_enable(true);
  SensorGammaIppOutput output = {};
  EXPECT_THAT(TranslateSensorGammaPro(sharp, output, kTuningCurve),
              StatusIs(kInvalid, "Invalid TuningBlock!"));
  LinearizationConfigValue config = {};
  LinearizationLutValue lut = {};
  EXPECT_THAT(TranslateSensorGamma(sharp, vosbrine::RGGB, config, lut, kTuningCurve),
              StatusIs(kInvalid, "Invalid TuningBlock!"));
}

TEST(TranslateSensorGammaProTest, DisabledBlockWritesBypassAlone) {
  SensorGammaIppOutput output = PatternFilled<SensorGammaIppOutput>();
  SensorGammaIppOutput expected = output;
  expected.bypass = 1;
  // Even a curve of the wrong size is not looked at.
  TAVIK_ASSERT_OK(TranslateSensorGammaPro(Block(Tuning(LinearPoints(3), /*enable=*/false)), output,
                                          kTuningCurve));
  EXPECT_TRUE(SameBytes(output, expected));
}

TEST(TranslateSensorGammaProTest, CurveOf128ValuesFailsWithItsSizeAndNoCodeWritten) {
  SensorGammaIppOutput output = PatternFilled<SensorGammaIppOutput>();
  SensorGammaIppOutput expected = output;
  expected.bypass = 0;
  EXPECT_THAT(TranslateSensorGammaPro(Block(Tuning(LinearPoints(128))), output, kTuningCurve),
              StatusIs(kInvalid, "Gamma y size is wrong! can't be converted to hardware lut: 128"));
  EXPECT_TRUE(SameBytes(output, expected));
  EXPECT_THAT(TranslateSensorGammaPro(Block(Tuning(LinearPoints(130))), output, kTuningCurve),
              StatusIs(kInvalid, "Gamma y size is wrong! can't be converted to hardware lut: 130"));
}

TEST(TranslateSensorGammaProTest, EmptyCurveInADynamicPartIsAWrongSizeNotTheLinearCurve) {
  zm::SensorGammaTuning tuning = Tuning({});
  tuning.mutable_dynamic_param();
  SensorGammaIppOutput output = {};
  EXPECT_THAT(TranslateSensorGammaPro(Block(tuning), output, kTuningCurve),
              StatusIs(kInvalid, "Gamma y size is wrong! can't be converted to hardware lut: 0"));
}

TEST(TranslateSensorGammaProTest, TuningsCurveInQ14WithTheLastPointAsAStep) {
  std::vector<float> points = LinearPoints();
  points[1] = 0.3f;     // 4915.2.
  points[127] = 0.75f;  // 12288.
  points[128] = 0.8f;   // 13107.2: a step of 819.
  SensorGammaIppOutput output = {};
  TAVIK_ASSERT_OK(TranslateSensorGammaPro(Block(Tuning(points)), output, kTuningCurve));
  EXPECT_EQ(output.gamma_lut[0], 0u);
  EXPECT_EQ(output.gamma_lut[1], 4915u);
  EXPECT_EQ(output.gamma_lut[2], 256u);
  EXPECT_EQ(output.gamma_lut[127], 12288u);
  EXPECT_EQ(output.last_delta, 819u);
}

TEST(TranslateSensorGammaProTest, LastPointBelowPoint127GivesAStepOfZero) {
  std::vector<float> points = LinearPoints();
  points[128] = 0.5f;
  SensorGammaIppOutput output = {};
  TAVIK_ASSERT_OK(TranslateSensorGammaPro(Block(Tuning(points)), output, kTuningCurve));
  EXPECT_EQ(output.gamma_lut[127], 16256u);
  EXPECT_EQ(output.last_delta, 0u);
}

TEST(TranslateSensorGammaProTest, PointsOf2AreLimitedTo32767AndNegativesToZero) {
  std::vector<float> points(129, 2.0f);
  points[5] = -0.5f;
  points[128] = 100.0f;
  SensorGammaIppOutput output = {};
  TAVIK_ASSERT_OK(TranslateSensorGammaPro(Block(Tuning(points)), output, kTuningCurve));
  EXPECT_EQ(output.gamma_lut[0], 32767u);
  EXPECT_EQ(output.gamma_lut[5], 0u);
  // 1638400 - 32767, limited.
  EXPECT_EQ(output.last_delta, 32767u);
}

TEST(TranslateSensorGammaProTest, WithoutDynamicPartTheCurveIsLinearWithAWarning) {
  ScopedLogCapture log;
  SensorGammaIppOutput output = PatternFilled<SensorGammaIppOutput>();
  TAVIK_ASSERT_OK(TranslateSensorGammaPro(Block(Tuning({})), output, kTuningCurve));
  EXPECT_EQ(output.bypass, 0u);
  EXPECT_THAT(Codes(output), ElementsAreArray(LinearIppCodes()));
  EXPECT_EQ(output.gamma_lut[127], 16256u);
  EXPECT_EQ(output.last_delta, 128u);
  EXPECT_THAT(log.messages(android::base::WARNING), ElementsAre(kLinearWarning));
}

TEST(TranslateSensorGammaProTest, TheLinearWarningIsRateLimited) {
  ScopedLogCapture log;
  SensorGammaIppOutput output = {};
  for (int frame = 0; frame < 30; ++frame) {
    TAVIK_ASSERT_OK(TranslateSensorGammaPro(Block(Tuning({})), output, kTuningCurve));
  }
  EXPECT_EQ(log.Count(kLinearWarning), 1);
}

// --- TranslateSensorGamma (G3AA) ---------------------------------------------------------------

TEST(TranslateSensorGammaG3aaTest, BlockIsReadBeforeTheModeIsLookedAt) {
  ScopedLogCapture log;
  LinearizationConfigValue config = PatternFilled<LinearizationConfigValue>();
  LinearizationLutValue lut = PatternFilled<LinearizationLutValue>();
  EXPECT_THAT(TranslateSensorGamma(ForeignBlock(), vosbrine::RGGB, config, lut, kApplicationCurve),
              StatusIs(kInvalid, "Invalid TuningBlock!"));
  EXPECT_TRUE(log.Contains("Incorrect tuning block type: Foreign, expected: SensorGammaTuning"));
  EXPECT_TRUE(SameBytes(config, PatternFilled<LinearizationConfigValue>()));
  EXPECT_TRUE(SameBytes(lut, PatternFilled<LinearizationLutValue>()));
}

TEST(TranslateSensorGammaG3aaTest, ApplicationCurveClearsEnableAndWritesNothingElse) {
  LinearizationConfigValue config = PatternFilled<LinearizationConfigValue>();
  LinearizationLutValue lut = PatternFilled<LinearizationLutValue>();
  TAVIK_ASSERT_OK(TranslateSensorGamma(Block(Tuning(LinearPoints())), vosbrine::GBRG, config, lut,
                                       kApplicationCurve));
  uint32_t word = 0;
  std::memcpy(&word, &config, 4);
  EXPECT_EQ(word, 0xA5A5A5A4u);
  EXPECT_TRUE(SameBytes(lut, PatternFilled<LinearizationLutValue>()));
}

TEST(TranslateSensorGammaG3aaTest, DisabledBlockWritesEnableAlone) {
  LinearizationConfigValue config = PatternFilled<LinearizationConfigValue>();
  LinearizationLutValue lut = PatternFilled<LinearizationLutValue>();
  TAVIK_ASSERT_OK(TranslateSensorGamma(Block(Tuning(LinearPoints(7), /*enable=*/false)),
                                       vosbrine::GBRG, config, lut, kTuningCurve));
  uint32_t word = 0;
  std::memcpy(&word, &config, 4);
  EXPECT_EQ(word, 0xA5A5A5A4u);
  EXPECT_TRUE(SameBytes(lut, PatternFilled<LinearizationLutValue>()));
}

TEST(TranslateSensorGammaG3aaTest, CurveOf128ValuesFailsAfterEnableAndPixelOrder) {
  LinearizationConfigValue config = PatternFilled<LinearizationConfigValue>();
  LinearizationLutValue lut = PatternFilled<LinearizationLutValue>();
  EXPECT_THAT(TranslateSensorGamma(Block(Tuning(LinearPoints(128))), vosbrine::BGGR, config, lut,
                                   kTuningCurve),
              StatusIs(kInvalid, "Gamma y size is wrong! can't be converted to hardware lut: 128"));
  EXPECT_EQ(config.enable, 1u);
  EXPECT_EQ(config.pixel_order, 3u);  // BGGR.
  EXPECT_TRUE(SameBytes(lut, PatternFilled<LinearizationLutValue>()));
}

TEST(TranslateSensorGammaG3aaTest, TuningsCurveInQ15WithTheLastPointAPoint) {
  std::vector<float> points = LinearPoints();
  points[1] = 0.3f;     // 9830.4.
  points[128] = 0.8f;   // 26214.4.
  points[127] = 2.0f;   // Limited to 32768, one more than the Pro form's limit.
  points[126] = -1.0f;  // Limited to 0.
  LinearizationConfigValue config = {};
  LinearizationLutValue lut = {};
  TAVIK_ASSERT_OK(
      TranslateSensorGamma(Block(Tuning(points)), vosbrine::GRBG, config, lut, kTuningCurve));
  EXPECT_EQ(config.pixel_order, 1u);  // GRBG.
  EXPECT_THAT(std::vector<uint16_t>(lut.lut + 4, lut.lut + 8), Each(9830u));
  EXPECT_THAT(std::vector<uint16_t>(lut.lut + 8, lut.lut + 12), Each(512u));
  EXPECT_THAT(std::vector<uint16_t>(lut.lut + 4 * 126, lut.lut + 4 * 127), Each(0u));
  EXPECT_THAT(std::vector<uint16_t>(lut.lut + 4 * 127, lut.lut + 4 * 128), Each(32768u));
  EXPECT_THAT(std::vector<uint16_t>(lut.lut + 4 * 128, lut.lut + 4 * 129), Each(26214u));
}

TEST(TranslateSensorGammaG3aaTest, WithoutDynamicPartTheCurveIsLinearWithAWarning) {
  ScopedLogCapture log;
  LinearizationConfigValue config = {};
  LinearizationLutValue lut = {};
  TAVIK_ASSERT_OK(
      TranslateSensorGamma(Block(Tuning({})), vosbrine::RGGB, config, lut, kTuningCurve));
  EXPECT_EQ(config.enable, 1u);
  EXPECT_THAT(Codes(lut), ElementsAreArray(LinearG3aaCodes()));
  EXPECT_THAT(log.messages(android::base::WARNING), ElementsAre(kLinearWarning));
}

// --- The sample tuning set ---------------------------------------------------------------------

TEST(SensorGammaSampleSetTest, EveryLeafTranslatesEnabledOrNot) {
  const int leaves = test::ForEachSampleLeaf<zm::SensorGammaTuning>(
      [&](const ZelTuningBlock<zm::SensorGammaTuning>& block, const std::string&) {
        // The sample set's curves are read whether or not their stage is on.
        zm::SensorGammaTuning enabled = block.message;
        enabled.set_enable(true);
        SensorGammaIppOutput output = {};
        TAVIK_EXPECT_OK(TranslateSensorGammaPro(Block(enabled), output, kTuningCurve));
        EXPECT_LE(output.gamma_lut[0], output.gamma_lut[127]);
        LinearizationConfigValue config = {};
        LinearizationLutValue lut = {};
        TAVIK_EXPECT_OK(
            TranslateSensorGamma(Block(enabled), vosbrine::BGGR, config, lut, kTuningCurve));
        EXPECT_EQ(config.pixel_order, 3u);
      });
  if (::testing::Test::IsSkipped()) return;
  EXPECT_GT(leaves, 0);
}

}  // namespace
}  // namespace tavik
