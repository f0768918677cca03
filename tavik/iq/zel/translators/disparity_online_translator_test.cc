#include "tavik/iq/zel/translators/disparity_online_translator.h"

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
using ::tavik_registers::zel::g3aa::GreenImbalanceLutValue;
using ::tavik_registers::zel::g3aa_generic::GreenImbalanceConfigValue;
using ::testing::Each;
using ::testing::ElementsAre;
using ::testing::ElementsAreArray;

constexpr absl::StatusCode kInvalid = absl::StatusCode::kInvalidArgument;

template <typename Word, typename Record>
std::array<Word, sizeof(Record) / sizeof(Word)> Words(const Record& record) {
  std::array<Word, sizeof(Record) / sizeof(Word)> words;
  std::memcpy(words.data(), &record, sizeof(record));
  return words;
}

// The default tuning's values, written out.
zm::DisparityTuning Tuning(bool enable = true) {
  zm::DisparityTuning tuning;
  tuning.set_enable(enable);
  zm::DisparityStaticParam& static_param = *tuning.mutable_static_param();
  static_param.set_enable_5x7(true);
  static_param.set_enable_slope_estimation(true);
  static_param.set_max_slope_allowed_low(0.046875f);
  static_param.set_max_slope_allowed_high(0.046875f);
  zm::DisparityDynamicParam& dynamic = *tuning.mutable_dynamic_param();
  dynamic.set_disparity_threshold_low(0.062515f);
  dynamic.set_disparity_threshold_high(0.062515f);
  dynamic.set_slope_threshold_low(0.002442f);
  dynamic.set_slope_threshold_high(0.002442f);
  dynamic.set_radial_power(0.12549f);
  dynamic.set_radial_limit(0.039216f);
  return tuning;
}

ZelTuningBlock<zm::DisparityTuning> Block(zm::DisparityTuning tuning) {
  return ZelTuningBlock<zm::DisparityTuning>(std::move(tuning));
}

DisparityInput Input(int32_t width = 4032, int32_t height = 3024,
                     vosbrine::BayerPattern pattern = vosbrine::RGGB,
                     vosbrine::SensorType type = vosbrine::SENSOR_TYPE_BAYER) {
  return DisparityInput{pattern, type, 10, 1.0f, width, height};
}

// The slopes and thresholds of the default tuning's 65 table entries: round(0.046875 x k x 32767
// / 65) and round(0.062515 x k x 15 / 65).
constexpr uint32_t kDefaultSlopes[65] = {
    0,    24,   47,   71,   95,   118,  142,  165,  189,  213,  236,  260,  284,
    307,  331,  354,  378,  402,  425,  449,  473,  496,  520,  543,  567,  591,
    614,  638,  662,  685,  709,  733,  756,  780,  803,  827,  851,  874,  898,
    922,  945,  969,  992,  1016, 1040, 1063, 1087, 1111, 1134, 1158, 1182, 1205,
    1229, 1252, 1276, 1300, 1323, 1347, 1371, 1394, 1418, 1441, 1465, 1489, 1512};

std::vector<uint32_t> Slopes(const GreenImbalanceLutValue& lut) {
  std::vector<uint32_t> slopes;
  for (int k = 0; k < 65; ++k) slopes.push_back(lut.lut[GreenImbalanceLutValue::SlopeSlot(k)]);
  return slopes;
}
std::vector<uint32_t> Thresholds(const GreenImbalanceLutValue& lut) {
  std::vector<uint32_t> thresholds;
  for (int k = 0; k < 65; ++k) {
    thresholds.push_back(lut.lut[GreenImbalanceLutValue::ThresholdSlot(k)]);
  }
  return thresholds;
}

// --- Record layouts --------------------------------------------------------------------------

TEST(DisparityRecordLayoutTest, IppOutputFieldsSitInTheirWords) {
  DisparityIppOutput output = {};
  output.bypass = 1;
  output.enable = 1;
  output.control = 0x7FFF;
  output.sensor_mode = 3;
  output.pixel_order = 3;
  output.order_bit4 = 1;
  output.order_bit8 = 1;
  output.order_bit12 = 1;
  output.enable_correction = 1;
  output.enable_5x7 = 1;
  output.enable_slope_estimation = 1;
  output.correction_mode = 3;
  output.disparity_threshold_low = 0xFFF;
  output.slope_threshold_high = 0xFFF;
  output.radial_power = 0x12;
  output.radial_limit = 0x34;
  output.bayer_width = 0x7FFF;
  output.bayer_height = 0x7FFF;
  EXPECT_THAT(Words<uint32_t>(output), ElementsAre(0x1u, 0x3FFFFu, 0x1113u, 0x1Fu, 0xFFFu, 0u, 0u,
                                                   0u, 0u, 0xFFFu, 0x3412u, 0x7FFFu, 0x7FFFu));
}

TEST(DisparityRecordLayoutTest, G3aaConfigHasEnableAndOrderThenHalfSizes) {
  GreenImbalanceConfigValue config = {};
  config.enable = 1;
  config.pixel_order = 3;
  config.half_height = 0x1234;
  config.half_width = 0xABCD;
  EXPECT_THAT(Words<uint32_t>(config), ElementsAre(0x7u, 0xABCD1234u));
}

TEST(DisparityRecordLayoutTest, G3aaTableHoldsTwoEntriesPerGroupOfThirtyTwoBytes) {
  // Entry 0 at bytes 0 and 8, entry 1 at bytes 4 and 12, entry 2 in the next group.
  EXPECT_EQ(GreenImbalanceLutValue::SlopeSlot(0) * 4, 0);
  EXPECT_EQ(GreenImbalanceLutValue::ThresholdSlot(0) * 4, 8);
  EXPECT_EQ(GreenImbalanceLutValue::SlopeSlot(1) * 4, 4);
  EXPECT_EQ(GreenImbalanceLutValue::ThresholdSlot(1) * 4, 12);
  EXPECT_EQ(GreenImbalanceLutValue::SlopeSlot(2) * 4, 32);
  EXPECT_EQ(GreenImbalanceLutValue::ThresholdSlot(3) * 4, 44);
  // Entry 64 alone in the last group.
  EXPECT_EQ(GreenImbalanceLutValue::SlopeSlot(64) * 4, 1024);
  EXPECT_EQ(GreenImbalanceLutValue::ThresholdSlot(64) * 4, 1032);
  EXPECT_EQ(sizeof(GreenImbalanceLutValue), 33u * 32u);
}

// --- Defaults ----------------------------------------------------------------------------------

TEST(GetDefaultDisparityTest, IppDefaultsAreTheDefaultTuningsCodes) {
  DisparityIppOutput output = {};
  DisparityIppFixedOutput fixed = PatternFilled<DisparityIppFixedOutput>();
  TAVIK_ASSERT_OK(GetDefaultDisparity(output, fixed));
  EXPECT_EQ(output.bypass, 0u);
  EXPECT_EQ(output.enable, 1u);
  EXPECT_EQ(output.control, 0x1D0u);
  EXPECT_EQ(output.sensor_mode, 2u);
  EXPECT_EQ(output.pixel_order, 1u);  // RGGB.
  EXPECT_EQ(output.enable_correction, 1u);
  EXPECT_EQ(output.enable_5x7, 1u);
  EXPECT_EQ(output.enable_slope_estimation, 1u);
  EXPECT_EQ(output.correction_mode, 3u);
  EXPECT_EQ(output.disparity_threshold_low, 256u);  // 0.062515 x 4095 = 255.999.
  EXPECT_EQ(output.disparity_threshold_high, 256u);
  EXPECT_EQ(output.max_slope_allowed_low, 192u);  // 0.046875 x 4095 = 191.95.
  EXPECT_EQ(output.max_slope_allowed_high, 192u);
  EXPECT_EQ(output.slope_threshold_low, 10u);  // 0.002442 x 4095 = 9.99999.
  EXPECT_EQ(output.slope_threshold_high, 10u);
  EXPECT_EQ(output.radial_power, 32u);  // 0.12549 x 255 = 31.99995.
  EXPECT_EQ(output.radial_limit, 10u);  // 0.039216 x 255 = 10.00008.
  EXPECT_EQ(output.bayer_width, 4032u);
  EXPECT_EQ(output.bayer_height, 3024u);
  EXPECT_THAT(Words<uint32_t>(output), ElementsAre(0x0u, 0x203A1u, 0x11u, 0x1Fu, 256u, 256u, 192u,
                                                   192u, 10u, 10u, 0x0A20u, 4032u, 3024u));
  EXPECT_THAT(fixed.reserved, Each(0u));
}

TEST(GetDefaultDisparityTest, IppDefaultsKeepTheSpareBitsOfEveryWord) {
  DisparityIppOutput output = PatternFilled<DisparityIppOutput>();
  DisparityIppFixedOutput fixed;
  TAVIK_ASSERT_OK(GetDefaultDisparity(output, fixed));
  EXPECT_THAT(Words<uint32_t>(output),
              ElementsAre(0xA5A5A5A4u, 0xA5A603A1u, 0xA5A5A4B5u, 0xA5A5A5BFu, 0xA5A5A100u,
                          0xA5A5A100u, 0xA5A5A0C0u, 0xA5A5A0C0u, 0xA5A5A00Au, 0xA5A5A00Au,
                          0xA5A50A20u, 0xA5A58FC0u, 0xA5A58BD0u));
}

TEST(GetDefaultDisparityTest, G3aaDefaultsAreTheLinearTableOfTheDefaultTuning) {
  GreenImbalanceConfigValue config = {};
  GreenImbalanceLutValue lut = {};
  TAVIK_ASSERT_OK(GetDefaultDisparity(config, lut));
  EXPECT_EQ(config.enable, 1u);
  EXPECT_EQ(config.pixel_order, 0u);  // RGGB.
  EXPECT_EQ(config.half_width, 2016u);
  EXPECT_EQ(config.half_height, 1512u);
  EXPECT_THAT(Slopes(lut), ElementsAreArray(kDefaultSlopes));
  // 0.062515 x k x 15 / 65 reaches one half at k = 35.
  std::vector<uint32_t> thresholds(65, 0);
  for (int k = 35; k < 65; ++k) thresholds[k] = 1;
  EXPECT_THAT(Thresholds(lut), ElementsAreArray(thresholds));
}

TEST(GetDefaultDisparityTest, G3aaDefaultsLeaveTheSlotsOutsideTheTableAsFound) {
  GreenImbalanceConfigValue config = PatternFilled<GreenImbalanceConfigValue>();
  GreenImbalanceLutValue lut = PatternFilled<GreenImbalanceLutValue>();
  TAVIK_ASSERT_OK(GetDefaultDisparity(config, lut));
  // enable 1, pixel order 0 over the pattern's 0xA5; the half sizes are whole halves of the word.
  EXPECT_THAT(Words<uint32_t>(config), ElementsAre(0xA5A5A5A1u, (2016u << 16) | 1512u));
  for (int group = 0; group < 33; ++group) {
    for (int slot = 4; slot < 8; ++slot) EXPECT_EQ(lut.lut[group * 8 + slot], 0xA5A5A5A5u);
  }
  // The last group's odd slots hold no entry.
  EXPECT_EQ(lut.lut[32 * 8 + 1], 0xA5A5A5A5u);
  EXPECT_EQ(lut.lut[32 * 8 + 3], 0xA5A5A5A5u);
  EXPECT_EQ(lut.lut[32 * 8 + 0], 1512u);
  EXPECT_EQ(lut.lut[32 * 8 + 2], 1u);
}

TEST(GetDefaultDisparityTest, TracesItselfAroundTheTranslation) {
  RecordingTraceSink sink;
  DisparityIppOutput output;
  DisparityIppFixedOutput fixed;
  TAVIK_ASSERT_OK(GetDefaultDisparity(output, fixed));
  GreenImbalanceConfigValue config;
  GreenImbalanceLutValue lut;
  TAVIK_ASSERT_OK(GetDefaultDisparity(config, lut));
  using Span = RecordingTraceSink::Span;
  EXPECT_THAT(sink.spans(),
              ElementsAre(Span(5, "TranslateDisparity"), Span(5, "GetDefaultDisparity"),
                          Span(5, "TranslateDisparity"), Span(5, "GetDefaultDisparity")));
}

// --- TranslateDisparity, IPP -------------------------------------------------------------------

TEST(TranslateDisparityIppTest, BlockOfAnotherTypeIsRefusedAfterTheTypeLogLine) {
  ScopedLogCapture log;
  DisparityIppOutput output = PatternFilled<DisparityIppOutput>();
  const DisparityIppOutput before = output;
  EXPECT_THAT(TranslateDisparity(ForeignBlock(), Input(), output),
              StatusIs(kInvalid, "Invalid TuningBlock!"));
  EXPECT_TRUE(log.Contains("Incorrect tuning block type: Foreign, expected: DisparityTuning"));
  EXPECT_TRUE(SameBytes(output, before));
}

TEST(TranslateDisparityIppTest, RegionInfoIsCheckedBeforeStaticInfoAndNothingIsWritten) {
  zm::DisparityTuning tuning = Tuning();
  tuning.clear_dynamic_param();
  tuning.clear_static_param();
  DisparityIppOutput output = PatternFilled<DisparityIppOutput>();
  const DisparityIppOutput before = output;
  EXPECT_THAT(TranslateDisparity(Block(tuning), Input(), output),
              StatusIs(kInvalid, "Tuning data doesn't have region info."));
  EXPECT_TRUE(SameBytes(output, before));

  tuning = Tuning();
  tuning.clear_static_param();
  EXPECT_THAT(TranslateDisparity(Block(tuning), Input(), output),
              StatusIs(kInvalid, "Tuning data doesn't have static info."));
  EXPECT_TRUE(SameBytes(output, before));
}

TEST(TranslateDisparityIppTest, EmptyMessageIsRegionInfoFailure) {
  DisparityIppOutput output = {};
  EXPECT_THAT(TranslateDisparity(Block(zm::DisparityTuning()), Input(), output),
              StatusIs(kInvalid, "Tuning data doesn't have region info."));
}

TEST(TranslateDisparityIppTest, DisabledBlockStillWritesEveryValueButTheEnables) {
  DisparityIppOutput output = {};
  TAVIK_ASSERT_OK(TranslateDisparity(Block(Tuning(/*enable=*/false)), Input(), output));
  EXPECT_EQ(output.bypass, 1u);
  EXPECT_EQ(output.enable, 0u);
  EXPECT_EQ(output.enable_correction, 0u);
  EXPECT_EQ(output.control, 0x1D0u);
  EXPECT_EQ(output.enable_5x7, 1u);
  EXPECT_EQ(output.disparity_threshold_low, 256u);
  EXPECT_EQ(output.radial_power, 32u);
  EXPECT_EQ(output.bayer_width, 4032u);
}

TEST(TranslateDisparityIppTest, MonoSensorTakesMode3AndPatternsTheMainIspCode) {
  DisparityIppOutput output = {};
  TAVIK_ASSERT_OK(TranslateDisparity(
      Block(Tuning()), Input(4032, 3024, vosbrine::GBRG, vosbrine::SENSOR_TYPE_MONO), output));
  EXPECT_EQ(output.sensor_mode, 3u);
  EXPECT_EQ(output.pixel_order, 3u);
  for (auto [pattern, code] : {std::pair{vosbrine::RGGB, 1u}, std::pair{vosbrine::BGGR, 2u},
                               std::pair{vosbrine::GRBG, 0u}}) {
    TAVIK_ASSERT_OK(TranslateDisparity(
        Block(Tuning()), Input(4032, 3024, pattern, vosbrine::SENSOR_TYPE_QUAD_BAYER), output));
    EXPECT_EQ(output.pixel_order, code) << pattern;
    EXPECT_EQ(output.sensor_mode, 2u);
  }
}

TEST(TranslateDisparityIppTest, CodesAreLimitedToZeroAndTheirScale) {
  zm::DisparityTuning tuning = Tuning();
  tuning.mutable_dynamic_param()->set_disparity_threshold_low(2.0f);
  tuning.mutable_dynamic_param()->set_disparity_threshold_high(-0.5f);
  tuning.mutable_static_param()->set_max_slope_allowed_low(1.0f);
  tuning.mutable_dynamic_param()->set_radial_power(1.5f);
  tuning.mutable_dynamic_param()->set_radial_limit(0.5f);  // 127.5 rounds away from zero.
  DisparityIppOutput output = {};
  TAVIK_ASSERT_OK(TranslateDisparity(Block(tuning), Input(), output));
  EXPECT_EQ(output.disparity_threshold_low, 4095u);
  EXPECT_EQ(output.disparity_threshold_high, 0u);
  EXPECT_EQ(output.max_slope_allowed_low, 4095u);
  EXPECT_EQ(output.radial_power, 255u);
  EXPECT_EQ(output.radial_limit, 128u);
}

TEST(TranslateDisparityIppTest, SizesAreMaskedToFifteenBits) {
  DisparityIppOutput output = {};
  TAVIK_ASSERT_OK(TranslateDisparity(Block(Tuning()), Input(0x8000 + 5, -1), output));
  EXPECT_EQ(output.bayer_width, 5u);
  EXPECT_EQ(output.bayer_height, 0x7FFFu);
}

// --- TranslateDisparity, G3AA ------------------------------------------------------------------

TEST(TranslateDisparityG3aaTest, BlockOfAnotherTypeIsRefusedWithNothingWritten) {
  GreenImbalanceConfigValue config = PatternFilled<GreenImbalanceConfigValue>();
  GreenImbalanceLutValue lut = PatternFilled<GreenImbalanceLutValue>();
  EXPECT_THAT(TranslateDisparity(ForeignBlock(), Input(), config, lut),
              StatusIs(kInvalid, "Invalid TuningBlock!"));
  EXPECT_TRUE(SameBytes(config, PatternFilled<GreenImbalanceConfigValue>()));
  EXPECT_TRUE(SameBytes(lut, PatternFilled<GreenImbalanceLutValue>()));
}

TEST(TranslateDisparityG3aaTest, StaticPartIsCheckedFirstWithTheUnitsOwnText) {
  zm::DisparityTuning tuning = Tuning();
  tuning.clear_static_param();
  tuning.clear_dynamic_param();
  GreenImbalanceConfigValue config = PatternFilled<GreenImbalanceConfigValue>();
  GreenImbalanceLutValue lut = PatternFilled<GreenImbalanceLutValue>();
  EXPECT_THAT(TranslateDisparity(Block(tuning), Input(0, 0), config, lut),
              StatusIs(kInvalid, "DisparityTuning proto doesn't have static param!"));
  EXPECT_THAT(TranslateDisparity(Block(zm::DisparityTuning()), Input(), config, lut),
              StatusIs(kInvalid, "DisparityTuning proto doesn't have static param!"));
  EXPECT_TRUE(SameBytes(config, PatternFilled<GreenImbalanceConfigValue>()));
  EXPECT_TRUE(SameBytes(lut, PatternFilled<GreenImbalanceLutValue>()));
}

TEST(TranslateDisparityG3aaTest, EnabledBlockWithoutDynamicPartIsRefusedBeforeTheSizeTest) {
  zm::DisparityTuning tuning = Tuning();
  tuning.clear_dynamic_param();
  GreenImbalanceConfigValue config = PatternFilled<GreenImbalanceConfigValue>();
  GreenImbalanceLutValue lut = PatternFilled<GreenImbalanceLutValue>();
  EXPECT_THAT(TranslateDisparity(Block(tuning), Input(0, 0), config, lut),
              StatusIs(kInvalid, "DisparityTuning proto doesn't have dynamic param!"));
  EXPECT_TRUE(SameBytes(config, PatternFilled<GreenImbalanceConfigValue>()));
}

TEST(TranslateDisparityG3aaTest, DisabledBlockNeedsNoDynamicPartAndLeavesTheTableUntouched) {
  zm::DisparityTuning tuning = Tuning(/*enable=*/false);
  tuning.clear_dynamic_param();
  GreenImbalanceConfigValue config = PatternFilled<GreenImbalanceConfigValue>();
  GreenImbalanceLutValue lut = PatternFilled<GreenImbalanceLutValue>();
  TAVIK_ASSERT_OK(TranslateDisparity(Block(tuning), Input(), config, lut));
  // Only the enable bit changes.
  EXPECT_THAT(Words<uint32_t>(config), ElementsAre(0xA5A5A5A4u, 0xA5A5A5A5u));
  EXPECT_TRUE(SameBytes(lut, PatternFilled<GreenImbalanceLutValue>()));
}

TEST(TranslateDisparityG3aaTest, NeitherSidePositiveIsRefusedWithNothingWritten) {
  GreenImbalanceConfigValue config = PatternFilled<GreenImbalanceConfigValue>();
  GreenImbalanceLutValue lut = PatternFilled<GreenImbalanceLutValue>();
  for (auto [width, height] : {std::pair{0, 0}, std::pair{-4, 0}, std::pair{0, -1}}) {
    EXPECT_THAT(TranslateDisparity(Block(Tuning()), Input(width, height), config, lut),
                StatusIs(kInvalid, "bayer_width or bayer_height is not positive!"));
  }
  // The size test comes before a disabled block's early return too.
  EXPECT_THAT(TranslateDisparity(Block(Tuning(/*enable=*/false)), Input(0, 0), config, lut),
              StatusIs(kInvalid, "bayer_width or bayer_height is not positive!"));
  EXPECT_TRUE(SameBytes(config, PatternFilled<GreenImbalanceConfigValue>()));
  EXPECT_TRUE(SameBytes(lut, PatternFilled<GreenImbalanceLutValue>()));
}

TEST(TranslateDisparityG3aaTest, OnePositiveSideIsEnoughAndAWidthOf5GivesHalfWidth2) {
  GreenImbalanceConfigValue config = {};
  GreenImbalanceLutValue lut = {};
  TAVIK_ASSERT_OK(TranslateDisparity(Block(Tuning()), Input(5, 0), config, lut));
  EXPECT_EQ(config.half_width, 2u);
  EXPECT_EQ(config.half_height, 0u);
  TAVIK_ASSERT_OK(TranslateDisparity(Block(Tuning()), Input(0, 100), config, lut));
  EXPECT_EQ(config.half_width, 0u);
  EXPECT_EQ(config.half_height, 50u);
}

TEST(TranslateDisparityG3aaTest, FullSlopeEndsAt32263AndStartsAtZero) {
  zm::DisparityTuning tuning = Tuning();
  tuning.mutable_static_param()->set_max_slope_allowed_low(1.0f);
  GreenImbalanceConfigValue config = {};
  GreenImbalanceLutValue lut = {};
  TAVIK_ASSERT_OK(TranslateDisparity(Block(tuning), Input(), config, lut));
  // 64 x 32767 / 65 = 32262.9: below the limit of 32766, as the divisor is 65.
  EXPECT_EQ(lut.lut[GreenImbalanceLutValue::SlopeSlot(64)], 32263u);
  EXPECT_EQ(lut.lut[GreenImbalanceLutValue::SlopeSlot(0)], 0u);
  EXPECT_EQ(lut.lut[GreenImbalanceLutValue::SlopeSlot(1)], 504u);  // 32767 / 65 = 504.1.
}

TEST(TranslateDisparityG3aaTest, FullThresholdIsLimitedTo14) {
  zm::DisparityTuning tuning = Tuning();
  tuning.mutable_dynamic_param()->set_disparity_threshold_low(1.0f);
  GreenImbalanceConfigValue config = {};
  GreenImbalanceLutValue lut = {};
  TAVIK_ASSERT_OK(TranslateDisparity(Block(tuning), Input(), config, lut));
  // 15 x 64 / 65 = 14.77 would round to 15.
  EXPECT_EQ(lut.lut[GreenImbalanceLutValue::ThresholdSlot(64)], 14u);
  EXPECT_EQ(lut.lut[GreenImbalanceLutValue::ThresholdSlot(0)], 0u);
}

TEST(TranslateDisparityG3aaTest, SlopeBeyondFullScaleIsLimitedTo32766AndNegativeToZero) {
  zm::DisparityTuning tuning = Tuning();
  tuning.mutable_static_param()->set_max_slope_allowed_low(4.0f);
  tuning.mutable_dynamic_param()->set_disparity_threshold_low(-1.0f);
  GreenImbalanceConfigValue config = {};
  GreenImbalanceLutValue lut = {};
  TAVIK_ASSERT_OK(TranslateDisparity(Block(tuning), Input(), config, lut));
  EXPECT_EQ(lut.lut[GreenImbalanceLutValue::SlopeSlot(64)], 32766u);
  EXPECT_EQ(lut.lut[GreenImbalanceLutValue::SlopeSlot(16)], 32263u);  // 4 x 16 = 64 steps' worth.
  EXPECT_THAT(Thresholds(lut), Each(0u));
}

TEST(TranslateDisparityG3aaTest, PixelOrderIsTheG3aaCode) {
  GreenImbalanceConfigValue config = {};
  GreenImbalanceLutValue lut = {};
  for (auto [pattern, code] : {std::pair{vosbrine::RGGB, 0u}, std::pair{vosbrine::BGGR, 3u},
                               std::pair{vosbrine::GRBG, 1u}, std::pair{vosbrine::GBRG, 2u}}) {
    TAVIK_ASSERT_OK(TranslateDisparity(Block(Tuning()), Input(4032, 3024, pattern), config, lut));
    EXPECT_EQ(config.pixel_order, code) << pattern;
  }
}

// --- The sample tuning set ---------------------------------------------------------------------

TEST(DisparitySampleSetTest, EveryLeafTranslatesForAMonoFrameOfAnotherSize) {
  const DisparityInput input = Input(1920, 1080, vosbrine::BGGR, vosbrine::SENSOR_TYPE_MONO);
  const int leaves = test::ForEachSampleLeaf<zm::DisparityTuning>(
      [&](const ZelTuningBlock<zm::DisparityTuning>& block, const std::string&) {
        DisparityIppOutput output = {};
        TAVIK_EXPECT_OK(TranslateDisparity(block, input, output));
        EXPECT_EQ(output.sensor_mode, 3u);
        EXPECT_EQ(output.bayer_width, 1920u);
        // Thresholds of real tunings are small fractions of the full scale.
        EXPECT_LT(output.disparity_threshold_high, 1024u);
        GreenImbalanceConfigValue config = {};
        GreenImbalanceLutValue lut = {};
        TAVIK_EXPECT_OK(TranslateDisparity(block, input, config, lut));
        EXPECT_EQ(config.enable, block.message.enable() ? 1u : 0u);
        // A disabled stage (some sensors need no green balance) takes nothing more.
        EXPECT_EQ(config.half_height, block.message.enable() ? 540u : 0u);
      });
  if (::testing::Test::IsSkipped()) return;
  EXPECT_GT(leaves, 0);
}

}  // namespace
}  // namespace tavik
