#include "tavik/iq/zel/translators/blc_online_translator.h"

#include <array>
#include <cmath>
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
#include "tavik/base/trace.h"
#include "tavik/iq/testing/blc_tunings.h"
#include "tavik/iq/testing/translator_testing.h"
#include "tavik/iq/zel/translators/dg_online_translator.h"
#include "tavik/iq/zel/translators/translator_util.h"
#include "tavik/iq/zel/zel_tuning_block.h"

namespace tavik {
namespace {

using ::tavik::test::IsOk;
using ::tavik::test::ScopedLogCapture;
using ::tavik::test::StatusIs;
using ::tavik_registers::zel::g3aa::BlcConfigValue;
using ::tavik_registers::zel::g3aa::DgConfigValue;
using ::testing::Each;
using ::testing::ElementsAre;
using ::testing::ElementsAreArray;
using ::testing::HasSubstr;
using ::testing::IsEmpty;

namespace zm = ::vosbrine::zelmondrake;
using ::tavik::test::BlcBlock;
using ::tavik::test::ForeignBlock;
using ::tavik::test::MakeBlcTuning;
using ::tavik::test::PatternFilled;
using ::tavik::test::RecordingTraceSink;
using ::tavik::test::SameBytes;
using ::tavik::test::UniformBlcTuning;

constexpr absl::StatusCode kInvalid = absl::StatusCode::kInvalidArgument;

// r = 1..4, gr = 5..8, gb = 9..12, b = 13..16: every element of every colour is told apart.
zm::BlcTuning NumberedTuning() {
  return MakeBlcTuning({1, 2, 3, 4}, {5, 6, 7, 8}, {9, 10, 11, 12}, {13, 14, 15, 16});
}

template <typename Word, typename Record>
std::array<Word, sizeof(Record) / sizeof(Word)> Words(const Record& record) {
  std::array<Word, sizeof(Record) / sizeof(Word)> words;
  std::memcpy(words.data(), &record, sizeof(record));
  return words;
}

std::vector<uint16_t> Offsets(const BlcIppOutput& output) {
  return std::vector<uint16_t>(std::begin(output.offsets), std::end(output.offsets));
}
std::vector<uint16_t> Gains(const BlcIppOutput& output) {
  return std::vector<uint16_t>(std::begin(output.gains), std::end(output.gains));
}

// The raw 15-bit entries of a tile of pedestals `values` at depth 14 (scale 1): 32768 - value.
std::vector<uint16_t> RawAtDepth14(const std::vector<int>& values) {
  std::vector<uint16_t> raw;
  for (int value : values) raw.push_back(static_cast<uint16_t>(32768 - value));
  return raw;
}

BlcInput IppInput(vosbrine::BayerPattern pattern, vosbrine::SensorType type, int32_t depth,
                  float digital_gain) {
  return BlcInput{pattern, type, depth, digital_gain};
}

constexpr char kCapLine31[] =
    "Max digital gain * stretch_gain should be under32. If not, it is capped to "
    "kMaxDigitalGain: 31 1.06667";

// --- Record layouts --------------------------------------------------------------------------

TEST(BlcRecordLayoutTest, IppOutputFieldsSitInTheirWords) {
  BlcIppOutput output = {};
  output.bypass = 1;
  output.tile_mode = 0xF;
  output.gain_integer_bits = 7;
  output.offsets[0] = 0x1234;
  output.gains[15] = 0x7FFF;
  const auto words = Words<uint32_t>(output);
  EXPECT_EQ(words[0], 0x1u);
  EXPECT_EQ(words[1], 0xFu);
  EXPECT_EQ(words[2], 0x7u);
  EXPECT_EQ(words[3], 0x1234u);       // offsets[0] in the low half of the first table word.
  EXPECT_EQ(words[18], 0x7FFF0000u);  // gains[15] in the high half of the last word.
}

TEST(BlcRecordLayoutTest, IppFixedOutputRangesSitInTheLowBitsOfWordsZeroAndOne) {
  BlcIppFixedOutput fixed = {};
  fixed.range_high = 0x7FFF;
  fixed.range_low = 0x4001;
  const auto words = Words<uint32_t>(fixed);
  EXPECT_EQ(words[0], 0x7FFFu);
  EXPECT_EQ(words[1], 0x4001u);
}

TEST(BlcRecordLayoutTest, BlcConfigValueFieldsSitAtTheirBits) {
  BlcConfigValue value = {};
  value.enable = 1;
  EXPECT_THAT(Words<uint64_t>(value), ElementsAre(0x1u, 0u));
  value = {};
  value.pixel_order = 3;
  EXPECT_THAT(Words<uint64_t>(value), ElementsAre(0x6u, 0u));
  value = {};
  value.offset_r = 0xFFFF;
  EXPECT_THAT(Words<uint64_t>(value), ElementsAre(0x7FFF8u, 0u));
  value = {};
  value.offset_gr = 0xFFFF;
  EXPECT_THAT(Words<uint64_t>(value), ElementsAre(0x7FFF80000u, 0u));
  value = {};
  value.offset_gb = 0xFFFF;
  EXPECT_THAT(Words<uint64_t>(value), ElementsAre(0x7FFF800000000u, 0u));
  value = {};
  value.SetOffsetB(0xFFFF);
  EXPECT_THAT(Words<uint64_t>(value), ElementsAre(0xFFF8000000000000u, 0x7u));
  EXPECT_EQ(value.OffsetB(), 0xFFFFu);
}

TEST(BlcRecordLayoutTest, BlcConfigValueSplitsOffsetBThirteenLowBitsThenThreeHigh) {
  BlcConfigValue value = {};
  value.enable = 1;
  value.pixel_order = 2;
  value.offset_r = 0x1234;
  value.offset_gr = 0x5678;
  value.offset_gb = 0x9ABC;
  value.SetOffsetB(0xDEF0);
  EXPECT_THAT(Words<uint64_t>(value), ElementsAre(0xF784D5E2B3C091A5u, 0x6u));
  EXPECT_EQ(value.OffsetB(), 0xDEF0u);
}

TEST(BlcRecordLayoutTest, DgConfigValueFieldsSitAtTheirBits) {
  DgConfigValue value = {};
  value.gain_r = 0xFFFFFF;
  EXPECT_THAT(Words<uint64_t>(value), ElementsAre(0x7FFFFF8u, 0u));
  value = {};
  value.gain_gr = 0xFFFFFF;
  EXPECT_THAT(Words<uint64_t>(value), ElementsAre(0x7FFFFF8000000u, 0u));
  value = {};
  value.SetGainGb(0xFFFFFF);
  EXPECT_THAT(Words<uint64_t>(value), ElementsAre(0xFFF8000000000000u, 0x7FFu));
  EXPECT_EQ(value.GainGb(), 0xFFFFFFu);
  value = {};
  value.gain_b = 0xFFFFFF;
  EXPECT_THAT(Words<uint64_t>(value), ElementsAre(0u, 0x7FFFFF800u));
}

// --- Defaults ----------------------------------------------------------------------------------

TEST(GetDefaultBlcTest, IppDefaultsAreTheWorkedValues) {
  BlcIppOutput output = {};
  BlcIppFixedOutput fixed = PatternFilled<BlcIppFixedOutput>();
  TAVIK_ASSERT_OK(GetDefaultBlc(output, fixed));
  EXPECT_EQ(output.bypass, 0u);
  EXPECT_EQ(output.tile_mode, 6u);
  EXPECT_EQ(output.gain_integer_bits, 4u);
  EXPECT_THAT(Offsets(output), Each(31744));  // -1024 in 15 bits.
  EXPECT_THAT(Gains(output), Each(1092));
  EXPECT_EQ(fixed.range_high, 16383u);
  EXPECT_EQ(fixed.range_low, 16385u);  // -16383 in 15 bits.
  // The fixed record is written whole: everything else is zero.
  EXPECT_THAT(Words<uint32_t>(fixed), ElementsAre(16383u, 16385u, 0u, 0u, 0u, 0u, 0u, 0u, 0u, 0u));
}

TEST(GetDefaultBlcTest, IppDefaultsKeepTheSpareBitsOfTheControlWords) {
  BlcIppOutput output = PatternFilled<BlcIppOutput>();
  BlcIppFixedOutput fixed;
  TAVIK_ASSERT_OK(GetDefaultBlc(output, fixed));
  const auto words = Words<uint32_t>(output);
  EXPECT_EQ(words[0], 0xA5A5A5A4u);
  EXPECT_EQ(words[1], 0xA5A5A5A6u);
  EXPECT_EQ(words[2], 0xA5A5A5A4u);
  EXPECT_THAT(Offsets(output), Each(31744));
  EXPECT_THAT(Gains(output), Each(1092));
}

TEST(GetDefaultBlcTest, G3aaOffsetDefaultsAre2048AndKeepWordOneSpareBits) {
  BlcConfigValue value = PatternFilled<BlcConfigValue>();
  TAVIK_ASSERT_OK(GetDefaultBlc(&value));
  EXPECT_EQ(value.enable, 1u);
  EXPECT_EQ(value.pixel_order, 0u);
  EXPECT_EQ(value.offset_r, 2048u);
  EXPECT_EQ(value.offset_gr, 2048u);
  EXPECT_EQ(value.offset_gb, 2048u);
  EXPECT_EQ(value.OffsetB(), 2048u);
  EXPECT_THAT(Words<uint64_t>(value), ElementsAre(0x4000400040004001u, 0xA5A5A5A5A5A5A5A0u));
}

TEST(GetDefaultBlcTest, G3aaGainDefaultsAre69905AndKeepWordOneHighBits) {
  DgConfigValue value = PatternFilled<DgConfigValue>();
  TAVIK_ASSERT_OK(GetDefaultBlc(&value));
  EXPECT_EQ(value.enable, 1u);
  EXPECT_EQ(value.pixel_order, 0u);
  EXPECT_EQ(value.gain_r, 69905u);
  EXPECT_EQ(value.gain_gr, 69905u);
  EXPECT_EQ(value.GainGb(), 69905u);
  EXPECT_EQ(value.gain_b, 69905u);
  EXPECT_THAT(Words<uint64_t>(value), ElementsAre(0x8888088888088889u, 0xA5A5A5A008888808u));
}

TEST(GetDefaultBlcTest, NullRegisterIsRefused) {
  EXPECT_THAT(GetDefaultBlc(static_cast<BlcConfigValue*>(nullptr)),
              StatusIs(kInvalid, "Output is null pointer!"));
  EXPECT_THAT(GetDefaultBlc(static_cast<DgConfigValue*>(nullptr)),
              StatusIs(kInvalid, "Output is null pointer!"));
}

TEST(GetDefaultBlcTest, TracesItselfAroundTheTranslation) {
  RecordingTraceSink sink;
  BlcIppOutput output;
  BlcIppFixedOutput fixed;
  TAVIK_ASSERT_OK(GetDefaultBlc(output, fixed));
  EXPECT_THAT(sink.spans(), ElementsAre(std::pair<int, std::string>(5, "TranslateBlc"),
                                        std::pair<int, std::string>(5, "GetDefaultBlc")));
}

// --- TranslateBlc for IPP ----------------------------------------------------------------------

TEST(TranslateBlcIppTest, BlockOfAnotherTypeIsInvalidAfterTheTypeLogLine) {
  ScopedLogCapture log;
  BlcIppOutput output = PatternFilled<BlcIppOutput>();
  const BlcIppOutput before = output;
  EXPECT_THAT(TranslateBlc(ForeignBlock(),
                           IppInput(vosbrine::RGGB, vosbrine::SENSOR_TYPE_BAYER, 10, 1.0f), output),
              StatusIs(kInvalid, "Invalid TuningBlock!"));
  EXPECT_TRUE(log.Contains("Incorrect tuning block type: Foreign"));
  EXPECT_TRUE(SameBytes(output, before));
}

TEST(TranslateBlcIppTest, MissingDynamicParamIsRegionInfoFailureBeforeAnyWrite) {
  zm::BlcTuning tuning = UniformBlcTuning(64);
  tuning.clear_dynamic_param();
  tuning.clear_static_param();
  BlcIppOutput output = PatternFilled<BlcIppOutput>();
  const BlcIppOutput before = output;
  EXPECT_THAT(TranslateBlc(BlcBlock(tuning),
                           IppInput(vosbrine::RGGB, vosbrine::SENSOR_TYPE_BAYER, 10, 1.0f), output),
              StatusIs(kInvalid, "Tuning data doesn't have region info."));
  EXPECT_TRUE(SameBytes(output, before));
}

TEST(TranslateBlcIppTest, MissingStaticParamIsStaticInfoFailure) {
  zm::BlcTuning tuning = UniformBlcTuning(64);
  tuning.clear_static_param();
  BlcIppOutput output = PatternFilled<BlcIppOutput>();
  const BlcIppOutput before = output;
  EXPECT_THAT(TranslateBlc(BlcBlock(tuning),
                           IppInput(vosbrine::RGGB, vosbrine::SENSOR_TYPE_BAYER, 10, 1.0f), output),
              StatusIs(kInvalid, "Tuning data doesn't have static info."));
  EXPECT_TRUE(SameBytes(output, before));
}

TEST(TranslateBlcIppTest, DepthOutsideOneToSixteenIsRefused) {
  for (int32_t depth : {0, 17, -3}) {
    BlcIppOutput output = PatternFilled<BlcIppOutput>();
    const BlcIppOutput before = output;
    EXPECT_THAT(
        TranslateBlc(BlcBlock(UniformBlcTuning(64)),
                     IppInput(vosbrine::RGGB, vosbrine::SENSOR_TYPE_BAYER, depth, 1.0f), output),
        StatusIs(kInvalid,
                 "Sensor bit depth doesn't match with hardware pipeline " + std::to_string(depth)));
    EXPECT_TRUE(SameBytes(output, before));
  }
}

TEST(TranslateBlcIppTest, WrongArraySizeIsRefusedWithTheParamTextAfterBypassAndTileMode) {
  BlcIppOutput output = PatternFilled<BlcIppOutput>();
  EXPECT_THAT(TranslateBlc(BlcBlock(MakeBlcTuning({64}, {}, {}, {}, /*enable=*/false)),
                           IppInput(vosbrine::RGGB, vosbrine::SENSOR_TYPE_MONO, 10, 1.0f), output),
              StatusIs(kInvalid, "Offsets size is wrong: offsets_r: 64\n"));
  EXPECT_EQ(output.bypass, 1u);
  EXPECT_EQ(output.tile_mode, 7u);
  EXPECT_EQ(output.gain_integer_bits, 5u);  // 0xA5's low 3 bits: untouched.
  EXPECT_THAT(Offsets(output), Each(0xA5A5));
  EXPECT_THAT(Gains(output), Each(0xA5A5));
}

TEST(TranslateBlcIppTest, FiveValuesInOneArrayAreAlsoRefused) {
  BlcIppOutput output = {};
  const Status status = TranslateBlc(
      BlcBlock(MakeBlcTuning({1, 2, 3, 4}, {1, 2, 3, 4}, {1, 2, 3, 4, 5}, {1, 2, 3, 4})),
      IppInput(vosbrine::RGGB, vosbrine::SENSOR_TYPE_BAYER, 10, 1.0f), output);
  EXPECT_THAT(status, StatusIs(kInvalid, HasSubstr("Offsets size is wrong: offsets_r: 1\n")));
  EXPECT_THAT(status, StatusIs(kInvalid, HasSubstr("offsets_gb: 5\noffsets_b: 1\n")));
}

TEST(TranslateBlcIppTest, DigitalGainBelowOneIsRefusedAfterTheOffsetsAreWritten) {
  BlcIppOutput output = PatternFilled<BlcIppOutput>();
  EXPECT_THAT(TranslateBlc(BlcBlock(UniformBlcTuning(64)),
                           IppInput(vosbrine::RGGB, vosbrine::SENSOR_TYPE_BAYER, 10, 0.5f), output),
              StatusIs(kInvalid, "digital_gain should be higher than 1.0f 0.5"));
  EXPECT_THAT(Offsets(output), Each(31744));
  EXPECT_THAT(Gains(output), Each(0xA5A5));
  EXPECT_EQ(output.gain_integer_bits, 5u);
}

TEST(TranslateBlcIppTest, DigitalGainFailureShowsSixSignificantDigits) {
  BlcIppOutput output = {};
  EXPECT_THAT(
      TranslateBlc(BlcBlock(UniformBlcTuning(64)),
                   IppInput(vosbrine::RGGB, vosbrine::SENSOR_TYPE_BAYER, 10, 0.1234567f), output),
      StatusIs(kInvalid, "digital_gain should be higher than 1.0f 0.123457"));
}

TEST(TranslateBlcIppTest, EnableClearsBypassAndMonoSetsTileModeBitZero) {
  BlcIppOutput output = PatternFilled<BlcIppOutput>();
  TAVIK_ASSERT_OK(TranslateBlc(BlcBlock(UniformBlcTuning(64)),
                               IppInput(vosbrine::RGGB, vosbrine::SENSOR_TYPE_MONO, 10, 1.0f),
                               output));
  EXPECT_EQ(output.bypass, 0u);
  EXPECT_EQ(output.tile_mode, 7u);
  TAVIK_ASSERT_OK(TranslateBlc(BlcBlock(UniformBlcTuning(64, /*enable=*/false)),
                               IppInput(vosbrine::RGGB, vosbrine::SENSOR_TYPE_QUAD_BAYER, 10, 1.0f),
                               output));
  EXPECT_EQ(output.bypass, 1u);
  EXPECT_EQ(output.tile_mode, 6u);
  const auto words = Words<uint32_t>(output);
  EXPECT_EQ(words[0], 0xA5A5A5A5u);
  EXPECT_EQ(words[1], 0xA5A5A5A6u);
  EXPECT_EQ(words[2], 0xA5A5A5A4u);
}

TEST(TranslateBlcIppTest, BayerTilePlacesElementKInTheKthQuadForEachPattern) {
  struct Case {
    vosbrine::BayerPattern pattern;
    std::vector<int> tile;  // Pedestals, row-major.
  };
  const Case cases[] = {
      {vosbrine::RGGB, {1, 5, 2, 6, 9, 13, 10, 14, 3, 7, 4, 8, 11, 15, 12, 16}},
      {vosbrine::BGGR, {13, 9, 14, 10, 5, 1, 6, 2, 15, 11, 16, 12, 7, 3, 8, 4}},
      {vosbrine::GRBG, {5, 1, 6, 2, 13, 9, 14, 10, 7, 3, 8, 4, 15, 11, 16, 12}},
      {vosbrine::GBRG, {9, 13, 10, 14, 1, 5, 2, 6, 11, 15, 12, 16, 3, 7, 4, 8}},
  };
  for (const Case& c : cases) {
    SCOPED_TRACE(vosbrine::BayerPattern_Name(c.pattern));
    for (vosbrine::SensorType type : {vosbrine::SENSOR_TYPE_BAYER, vosbrine::SENSOR_TYPE_MONO}) {
      BlcIppOutput output = PatternFilled<BlcIppOutput>();
      TAVIK_ASSERT_OK(
          TranslateBlc(BlcBlock(NumberedTuning()), IppInput(c.pattern, type, 14, 1.0f), output));
      EXPECT_THAT(Offsets(output), ElementsAreArray(RawAtDepth14(c.tile)));
    }
  }
}

TEST(TranslateBlcIppTest, QuadBayerTileGivesEachColourOneTwoByTwoBlock) {
  BlcIppOutput output = {};
  TAVIK_ASSERT_OK(TranslateBlc(BlcBlock(NumberedTuning()),
                               IppInput(vosbrine::RGGB, vosbrine::SENSOR_TYPE_QUAD_BAYER, 14, 1.0f),
                               output));
  EXPECT_THAT(
      Offsets(output),
      ElementsAreArray(RawAtDepth14({1, 2, 5, 6, 3, 4, 7, 8, 9, 10, 13, 14, 11, 12, 15, 16})));
  TAVIK_ASSERT_OK(TranslateBlc(BlcBlock(NumberedTuning()),
                               IppInput(vosbrine::GBRG, vosbrine::SENSOR_TYPE_QUAD_BAYER, 14, 1.0f),
                               output));
  EXPECT_THAT(
      Offsets(output),
      ElementsAreArray(RawAtDepth14({9, 10, 13, 14, 11, 12, 15, 16, 1, 2, 5, 6, 3, 4, 7, 8})));
}

TEST(TranslateBlcIppTest, UnknownPatternIsLoggedAndReadAsRggb) {
  ScopedLogCapture log;
  BlcIppOutput output = {};
  TAVIK_ASSERT_OK(TranslateBlc(
      BlcBlock(NumberedTuning()),
      IppInput(static_cast<vosbrine::BayerPattern>(7), vosbrine::SENSOR_TYPE_BAYER, 14, 1.0f),
      output));
  EXPECT_THAT(
      Offsets(output),
      ElementsAreArray(RawAtDepth14({1, 5, 2, 6, 9, 13, 10, 14, 3, 7, 4, 8, 11, 15, 12, 16})));
  EXPECT_TRUE(log.Contains("Invalid bayer_pattern: "));
}

TEST(TranslateBlcIppTest, OffsetsScaleToFourteenBitsAndRoundHalfAwayFromZero) {
  struct Case {
    int32_t depth;
    float offset;
    uint16_t raw;
  };
  const Case cases[] = {
      {14, 64.0f, 32704},     // Scale 1.
      {10, 64.0f, 31744},     // Scale 16: -1024.
      {1, 1.0f, 24576},       // Scale 8192: -8192.
      {14, 2.5f, 32765},      // -2.5 rounds to -3.
      {14, 0.5f, 32767},      // -0.5 rounds to -1.
      {14, 0.4f, 0},          // -0.4 rounds to 0.
      {14, -0.5f, 1},         // A negative pedestal gives a positive entry.
      {14, 20000.0f, 12768},  // -20000 wrapped to 15 bits, not clamped.
      {14, 1e30f, 0},         // Far beyond: the low 15 bits of a huge integer are zero.
  };
  for (const Case& c : cases) {
    SCOPED_TRACE(testing::Message() << "depth " << c.depth << " offset " << c.offset);
    BlcIppOutput output = {};
    TAVIK_ASSERT_OK(
        TranslateBlc(BlcBlock(UniformBlcTuning(c.offset)),
                     IppInput(vosbrine::RGGB, vosbrine::SENSOR_TYPE_BAYER, c.depth, 1.0f), output));
    EXPECT_THAT(Offsets(output), Each(c.raw));
  }
}

TEST(TranslateBlcIppTest, NanOffsetGivesAZeroEntry) {
  BlcIppOutput output = PatternFilled<BlcIppOutput>();
  TAVIK_ASSERT_OK(TranslateBlc(BlcBlock(UniformBlcTuning(std::numeric_limits<float>::quiet_NaN())),
                               IppInput(vosbrine::RGGB, vosbrine::SENSOR_TYPE_BAYER, 14, 1.0f),
                               output));
  EXPECT_THAT(Offsets(output), Each(0));
}

// Depths 15 and 16 pass the IPP check; 14 - depth, as a 32-bit shift count, wraps to 31 and 30.
TEST(TranslateBlcIppTest, DepthsFifteenAndSixteenUseTheWrappedShiftScale) {
  const float tiny = std::ldexp(1.0f, -21);
  BlcIppOutput output = {};
  TAVIK_ASSERT_OK(TranslateBlc(BlcBlock(UniformBlcTuning(tiny)),
                               IppInput(vosbrine::RGGB, vosbrine::SENSOR_TYPE_BAYER, 15, 1.0f),
                               output));
  EXPECT_THAT(Offsets(output), Each(31744));  // 2^-21 x 2^31 = 1024.
  TAVIK_ASSERT_OK(TranslateBlc(BlcBlock(UniformBlcTuning(tiny)),
                               IppInput(vosbrine::RGGB, vosbrine::SENSOR_TYPE_BAYER, 16, 1.0f),
                               output));
  EXPECT_THAT(Offsets(output), Each(32256));  // 2^-21 x 2^30 = 512.
  // An ordinary pedestal is a multiple of 2^15 there: every entry is 0.
  TAVIK_ASSERT_OK(TranslateBlc(BlcBlock(UniformBlcTuning(64)),
                               IppInput(vosbrine::RGGB, vosbrine::SENSOR_TYPE_BAYER, 16, 1.0f),
                               output));
  EXPECT_THAT(Offsets(output), Each(0));
  EXPECT_THAT(Gains(output), Each(1024));
}

TEST(TranslateBlcIppTest, StretchTimesGainFromSixteenUpSelectsFiveIntegerBits) {
  BlcIppOutput output = {};
  // max_stretch 16383 / 15359 = 1.066671; x 20 = 21.33.
  TAVIK_ASSERT_OK(TranslateBlc(BlcBlock(UniformBlcTuning(64)),
                               IppInput(vosbrine::RGGB, vosbrine::SENSOR_TYPE_BAYER, 10, 20.0f),
                               output));
  EXPECT_EQ(output.gain_integer_bits, 5u);
  EXPECT_THAT(Gains(output), Each(10922));  // 1.066671 x 20 x 512 = 10922.71.
  // 14.99 x 1.066671 = 15.99: four integer bits.
  TAVIK_ASSERT_OK(TranslateBlc(BlcBlock(UniformBlcTuning(64)),
                               IppInput(vosbrine::RGGB, vosbrine::SENSOR_TYPE_BAYER, 10, 14.99f),
                               output));
  EXPECT_EQ(output.gain_integer_bits, 4u);
  // 15 x 1.066671 = 16.0001: five.
  TAVIK_ASSERT_OK(TranslateBlc(BlcBlock(UniformBlcTuning(64)),
                               IppInput(vosbrine::RGGB, vosbrine::SENSOR_TYPE_BAYER, 10, 15.0f),
                               output));
  EXPECT_EQ(output.gain_integer_bits, 5u);
}

TEST(TranslateBlcIppTest, ProductOfThirtyTwoOrMoreCapsTheGainAndKeepsThePriorFormat) {
  ScopedLogCapture log;
  BlcIppOutput output;
  BlcIppFixedOutput fixed;
  TAVIK_ASSERT_OK(GetDefaultBlc(output, fixed));
  log.Clear();
  // 31 x 1.066671 = 33.07: the gain becomes 32 / 1.066671 = 29.99988, and the format stays the
  // 4 integer bits that GetDefaultBlc left. 32 x 1024 = 32768 wraps to 0 in 15 bits.
  TAVIK_ASSERT_OK(TranslateBlc(BlcBlock(UniformBlcTuning(64)),
                               IppInput(vosbrine::RGGB, vosbrine::SENSOR_TYPE_BAYER, 10, 31.0f),
                               output));
  EXPECT_EQ(output.gain_integer_bits, 4u);
  EXPECT_THAT(Gains(output), Each(0));
  EXPECT_THAT(log.messages(android::base::ERROR), ElementsAre(kCapLine31));

  // A caller that left five integer bits gets 32 x 512.
  log.Clear();
  output.gain_integer_bits = 5;
  TAVIK_ASSERT_OK(TranslateBlc(BlcBlock(UniformBlcTuning(64)),
                               IppInput(vosbrine::RGGB, vosbrine::SENSOR_TYPE_BAYER, 10, 31.0f),
                               output));
  EXPECT_EQ(output.gain_integer_bits, 5u);
  EXPECT_THAT(Gains(output), Each(16384));
  EXPECT_EQ(log.Count(kCapLine31), 1);
}

TEST(TranslateBlcIppTest, NanDigitalGainPassesTheCheckAndIsCapped) {
  ScopedLogCapture log;
  BlcIppOutput output = {};
  output.gain_integer_bits = 5;
  TAVIK_ASSERT_OK(TranslateBlc(BlcBlock(UniformBlcTuning(64)),
                               IppInput(vosbrine::RGGB, vosbrine::SENSOR_TYPE_BAYER, 10,
                                        std::numeric_limits<float>::quiet_NaN()),
                               output));
  EXPECT_EQ(output.gain_integer_bits, 5u);
  EXPECT_THAT(Gains(output), Each(16384));
  EXPECT_THAT(log.messages(android::base::ERROR),
              ElementsAre("Max digital gain * stretch_gain should be under32. If not, it is capped "
                          "to kMaxDigitalGain: nan 1.06667"));
}

TEST(TranslateBlcIppTest, ZeroOffsetKeepsFourIntegerBitsAndItsEntryGainIsTheDigitalGain) {
  ScopedLogCapture log;
  BlcIppOutput output = {};
  output.gain_integer_bits = 7;
  // Element 0 of offsets_r lands at tile entry 0 in RGGB.
  TAVIK_ASSERT_OK(TranslateBlc(BlcBlock(MakeBlcTuning({0, 64, 64, 64}, {64, 64, 64, 64},
                                                      {64, 64, 64, 64}, {64, 64, 64, 64})),
                               IppInput(vosbrine::RGGB, vosbrine::SENSOR_TYPE_BAYER, 10, 20.0f),
                               output));
  EXPECT_EQ(output.gain_integer_bits, 4u);
  EXPECT_EQ(output.offsets[0], 0u);
  EXPECT_EQ(output.gains[0], 20480u);                                    // 20 x 1024.
  for (int i = 1; i < 16; ++i) EXPECT_EQ(output.gains[i], 21845u) << i;  // 1.066671 x 20 x 1024.
  EXPECT_THAT(log.messages(android::base::ERROR), IsEmpty());
}

TEST(TranslateBlcIppTest, GainsWrapToFifteenBits) {
  BlcIppOutput output = {};
  // 40 x 1024 = 40960 and 1.066671 x 40 x 1024 = 43690.8, both past 15 bits.
  TAVIK_ASSERT_OK(TranslateBlc(BlcBlock(MakeBlcTuning({0, 64, 64, 64}, {64, 64, 64, 64},
                                                      {64, 64, 64, 64}, {64, 64, 64, 64})),
                               IppInput(vosbrine::RGGB, vosbrine::SENSOR_TYPE_BAYER, 10, 40.0f),
                               output));
  EXPECT_EQ(output.gains[0], 8192u);
  EXPECT_EQ(output.gains[1], 10922u);
}

TEST(TranslateBlcIppTest, NonPositiveStretchOfAnEntryGivesAZeroGain) {
  BlcIppOutput output = {};
  // At depth 14 a pedestal of 16384 is raw 16384, which reads as -16384: its stretch is
  // 16383 / -1, and a negative gain truncates to 0. It is also the least entry, which makes
  // max_stretch negative and the format 4 integer bits.
  TAVIK_ASSERT_OK(TranslateBlc(BlcBlock(MakeBlcTuning({16384, 64, 64, 64}, {64, 64, 64, 64},
                                                      {64, 64, 64, 64}, {64, 64, 64, 64})),
                               IppInput(vosbrine::RGGB, vosbrine::SENSOR_TYPE_BAYER, 14, 1.0f),
                               output));
  EXPECT_EQ(output.offsets[0], 16384u);
  EXPECT_EQ(output.gain_integer_bits, 4u);
  EXPECT_EQ(output.gains[0], 0u);
  EXPECT_EQ(output.gains[1], 1028u);  // 16383 / 16319 x 1024 = 1028.02.
}

// --- TranslateBlc for the G3AA offset register -------------------------------------------------

TEST(TranslateBlcG3aaOffsetTest, ChecksComeInTheirOrder) {
  const BlcInput input = IppInput(vosbrine::RGGB, vosbrine::SENSOR_TYPE_BAYER, 10, 1.0f);
  EXPECT_THAT(
      TranslateBlc(BlcBlock(UniformBlcTuning(64)), input, static_cast<BlcConfigValue*>(nullptr)),
      StatusIs(kInvalid, "Output is null pointer!"));

  BlcConfigValue value = PatternFilled<BlcConfigValue>();
  const BlcConfigValue before = value;
  EXPECT_THAT(TranslateBlc(ForeignBlock(), input, &value),
              StatusIs(kInvalid, "Invalid TuningBlock!"));
  EXPECT_TRUE(SameBytes(value, before));

  zm::BlcTuning no_static = UniformBlcTuning(64);
  no_static.clear_static_param();
  no_static.clear_dynamic_param();
  EXPECT_THAT(TranslateBlc(BlcBlock(no_static), input, &value),
              StatusIs(kInvalid, "BlcTuning proto doesn't have static param!"));
  EXPECT_TRUE(SameBytes(value, before));
}

TEST(TranslateBlcG3aaOffsetTest, MissingDynamicParamIsRefusedAfterEnableAndPixelOrder) {
  zm::BlcTuning tuning = UniformBlcTuning(64, /*enable=*/false);
  tuning.clear_dynamic_param();
  BlcConfigValue value = PatternFilled<BlcConfigValue>();
  EXPECT_THAT(TranslateBlc(BlcBlock(tuning),
                           IppInput(vosbrine::GBRG, vosbrine::SENSOR_TYPE_BAYER, 10, 1.0f), &value),
              StatusIs(kInvalid, "BlcTuning proto doesn't have dynamic param!"));
  EXPECT_EQ(value.enable, 0u);
  EXPECT_EQ(value.pixel_order, 2u);
  // The offsets are untouched.
  EXPECT_EQ(Words<uint64_t>(value)[0] >> 3, 0xA5A5A5A5A5A5A5A5u >> 3);
  EXPECT_EQ(Words<uint64_t>(value)[1], 0xA5A5A5A5A5A5A5A5u);
}

TEST(TranslateBlcG3aaOffsetTest, DepthSixteenIsRefusedAndFifteenUsesScaleOne) {
  BlcConfigValue value = PatternFilled<BlcConfigValue>();
  EXPECT_THAT(TranslateBlc(BlcBlock(UniformBlcTuning(64)),
                           IppInput(vosbrine::RGGB, vosbrine::SENSOR_TYPE_BAYER, 16, 1.0f), &value),
              StatusIs(kInvalid, "Sensor bit depth is larger than g3aa pipeline!16"));
  EXPECT_EQ(Words<uint64_t>(value)[0] >> 3, 0xA5A5A5A5A5A5A5A5u >> 3);  // Offsets unwritten.

  TAVIK_ASSERT_OK(TranslateBlc(BlcBlock(UniformBlcTuning(64)),
                               IppInput(vosbrine::RGGB, vosbrine::SENSOR_TYPE_BAYER, 15, 1.0f),
                               &value));
  EXPECT_EQ(value.offset_r, 64u);
  TAVIK_ASSERT_OK(TranslateBlc(BlcBlock(UniformBlcTuning(64)),
                               IppInput(vosbrine::RGGB, vosbrine::SENSOR_TYPE_BAYER, 14, 1.0f),
                               &value));
  EXPECT_EQ(value.offset_r, 128u);
  EXPECT_EQ(value.offset_gr, 128u);
  EXPECT_EQ(value.offset_gb, 128u);
  EXPECT_EQ(value.OffsetB(), 128u);
}

TEST(TranslateBlcG3aaOffsetTest, OffsetAboveFullScaleIsRefusedAtTheFirstSuchChannel) {
  BlcConfigValue value = {};
  const BlcInput input = IppInput(vosbrine::RGGB, vosbrine::SENSOR_TYPE_BAYER, 10, 1.0f);
  // 1025 x 32 = 32800.
  EXPECT_THAT(TranslateBlc(BlcBlock(MakeBlcTuning({64}, {1025}, {2000}, {64})), input, &value),
              StatusIs(kInvalid, "Offset is too large to calculate stretch gain! 32800"));
  // 32768 exactly passes and fills the 16 bits.
  TAVIK_ASSERT_OK(TranslateBlc(BlcBlock(MakeBlcTuning({64}, {1024}, {64}, {64})), input, &value));
  EXPECT_EQ(value.offset_gr, 32768u);
}

TEST(TranslateBlcG3aaOffsetTest, ReadsElementZeroWithoutASizeTest) {
  BlcConfigValue value = {};
  TAVIK_ASSERT_OK(TranslateBlc(BlcBlock(MakeBlcTuning({10, 99}, {20}, {}, {40, 1, 2, 3, 4, 5, 6})),
                               IppInput(vosbrine::RGGB, vosbrine::SENSOR_TYPE_BAYER, 15, 1.0f),
                               &value));
  EXPECT_EQ(value.offset_r, 10u);
  EXPECT_EQ(value.offset_gr, 20u);
  EXPECT_EQ(value.offset_gb, 0u);  // An empty array is no pedestal.
  EXPECT_EQ(value.OffsetB(), 40u);
}

TEST(TranslateBlcG3aaOffsetTest, OffsetsStayInChannelOrderWhateverThePattern) {
  struct Case {
    vosbrine::BayerPattern pattern;
    uint32_t code;
  };
  for (const Case& c : {Case{vosbrine::RGGB, 0}, Case{vosbrine::BGGR, 3}, Case{vosbrine::GRBG, 1},
                        Case{vosbrine::GBRG, 2}}) {
    BlcConfigValue value = {};
    TAVIK_ASSERT_OK(TranslateBlc(BlcBlock(NumberedTuning()),
                                 IppInput(c.pattern, vosbrine::SENSOR_TYPE_BAYER, 15, 1.0f),
                                 &value));
    EXPECT_EQ(value.pixel_order, c.code);
    EXPECT_EQ(value.offset_r, 1u);
    EXPECT_EQ(value.offset_gr, 5u);
    EXPECT_EQ(value.offset_gb, 9u);
    EXPECT_EQ(value.OffsetB(), 13u);
  }
}

TEST(TranslateBlcG3aaOffsetTest, OffsetsTruncateAndNegativeOnesWrapToSixteenBits) {
  BlcConfigValue value = {};
  TAVIK_ASSERT_OK(TranslateBlc(BlcBlock(MakeBlcTuning({64.99f}, {-1}, {-64.99f}, {0.5f})),
                               IppInput(vosbrine::RGGB, vosbrine::SENSOR_TYPE_BAYER, 15, 1.0f),
                               &value));
  EXPECT_EQ(value.offset_r, 64u);
  EXPECT_EQ(value.offset_gr, 0xFFFFu);
  EXPECT_EQ(value.offset_gb, 0xFFC0u);  // -64.
  EXPECT_EQ(value.OffsetB(), 0u);
}

// --- TranslateBlc for the G3AA gain register ---------------------------------------------------

TEST(TranslateBlcG3aaGainTest, ChecksComeInTheirOrder) {
  const BlcInput input = IppInput(vosbrine::RGGB, vosbrine::SENSOR_TYPE_BAYER, 10, 1.0f);
  EXPECT_THAT(
      TranslateBlc(BlcBlock(UniformBlcTuning(64)), input, static_cast<DgConfigValue*>(nullptr)),
      StatusIs(kInvalid, "Output is null pointer!"));
  DgConfigValue value = PatternFilled<DgConfigValue>();
  const DgConfigValue before = value;
  EXPECT_THAT(TranslateBlc(ForeignBlock(), input, &value),
              StatusIs(kInvalid, "Invalid TuningBlock!"));
  zm::BlcTuning no_dynamic = UniformBlcTuning(64);
  no_dynamic.clear_dynamic_param();
  EXPECT_THAT(TranslateBlc(BlcBlock(no_dynamic), input, &value),
              StatusIs(kInvalid, "BlcTuning proto doesn't have dynamic param!"));
  // The depth and the offsets are tested before the gain.
  EXPECT_THAT(TranslateBlc(BlcBlock(UniformBlcTuning(64)),
                           IppInput(vosbrine::RGGB, vosbrine::SENSOR_TYPE_BAYER, 16, 0.5f), &value),
              StatusIs(kInvalid, "Sensor bit depth is larger than g3aa pipeline!16"));
  EXPECT_THAT(TranslateBlc(BlcBlock(UniformBlcTuning(2000)),
                           IppInput(vosbrine::RGGB, vosbrine::SENSOR_TYPE_BAYER, 10, 0.5f), &value),
              StatusIs(kInvalid, "Offset is too large to calculate stretch gain! 64000"));
  EXPECT_THAT(TranslateBlc(BlcBlock(UniformBlcTuning(64)),
                           IppInput(vosbrine::RGGB, vosbrine::SENSOR_TYPE_BAYER, 10, 0.5f), &value),
              StatusIs(kInvalid, "Digital gain is lower than 1!"));
  EXPECT_THAT(TranslateBlc(BlcBlock(UniformBlcTuning(64)),
                           IppInput(vosbrine::RGGB, vosbrine::SENSOR_TYPE_BAYER, 10,
                                    std::numeric_limits<float>::quiet_NaN()),
                           &value),
              StatusIs(kInvalid, "Digital gain is lower than 1!"));
  EXPECT_TRUE(SameBytes(value, before));
}

TEST(TranslateBlcG3aaGainTest, NeedsNoStaticParamAndEnablesWhateverTheTuningSays) {
  zm::BlcTuning tuning = UniformBlcTuning(64, /*enable=*/false);
  tuning.clear_static_param();
  DgConfigValue value = {};
  TAVIK_ASSERT_OK(TranslateBlc(
      BlcBlock(tuning), IppInput(vosbrine::BGGR, vosbrine::SENSOR_TYPE_BAYER, 10, 20.0f), &value));
  EXPECT_EQ(value.enable, 1u);
  EXPECT_EQ(value.pixel_order, 3u);
  // 32768 / 30720 x 20 x 65536 = 1398101.3.
  EXPECT_EQ(value.gain_r, 1398101u);
  EXPECT_EQ(value.gain_gr, 1398101u);
  EXPECT_EQ(value.GainGb(), 1398101u);
  EXPECT_EQ(value.gain_b, 1398101u);
}

TEST(TranslateBlcG3aaGainTest, EachCappedChannelLogsOneLine) {
  ScopedLogCapture log;
  DgConfigValue value = {};
  TAVIK_ASSERT_OK(TranslateBlc(BlcBlock(UniformBlcTuning(64)),
                               IppInput(vosbrine::RGGB, vosbrine::SENSOR_TYPE_BAYER, 10, 31.0f),
                               &value));
  // Stretch 1.0666667 x 31 = 33.07: the gain becomes 32 / 1.0666667 = 30, and 1.0666667 x 30 x
  // 65536 = 2097152.
  EXPECT_THAT(log.messages(android::base::ERROR),
              ElementsAre(kCapLine31, kCapLine31, kCapLine31, kCapLine31));
  EXPECT_EQ(value.gain_r, 2097152u);
  EXPECT_EQ(value.gain_gr, 2097152u);
  EXPECT_EQ(value.GainGb(), 2097152u);
  EXPECT_EQ(value.gain_b, 2097152u);
}

TEST(TranslateBlcG3aaGainTest, OnlyCappedChannelsLog) {
  ScopedLogCapture log;
  DgConfigValue value = {};
  // Stretch of r: 1 (no pedestal); of b: 32768 / 30720. At gain 31 only b passes 32.
  TAVIK_ASSERT_OK(TranslateBlc(BlcBlock(MakeBlcTuning({0}, {0}, {0}, {64})),
                               IppInput(vosbrine::RGGB, vosbrine::SENSOR_TYPE_BAYER, 10, 31.0f),
                               &value));
  EXPECT_THAT(log.messages(android::base::ERROR), ElementsAre(kCapLine31));
  EXPECT_EQ(value.gain_r, 2031616u);  // 31 x 65536.
  EXPECT_EQ(value.gain_b, 2097152u);
}

TEST(TranslateBlcG3aaGainTest, ComputedZeroBecomesOne) {
  DgConfigValue value = {};
  // A pedestal of -1e10 gives a stretch of 3.3e-6: 0.21 after scaling, truncated to 0.
  TAVIK_ASSERT_OK(TranslateBlc(BlcBlock(MakeBlcTuning({-1e10f}, {64}, {64}, {std::nanf("")})),
                               IppInput(vosbrine::RGGB, vosbrine::SENSOR_TYPE_BAYER, 15, 1.0f),
                               &value));
  EXPECT_EQ(value.gain_r, 1u);
  EXPECT_EQ(value.gain_gr, 65664u);  // 32768 / 32704 x 65536 = 65664.25.
  EXPECT_EQ(value.GainGb(), 65664u);
  EXPECT_EQ(value.gain_b, 1u);  // A NaN pedestal passes the checks and gives 0, then 1.
}

TEST(TranslateBlcG3aaGainTest, UnknownPatternLogsAndWritesCodeZero) {
  ScopedLogCapture log;
  DgConfigValue value = PatternFilled<DgConfigValue>();
  TAVIK_ASSERT_OK(TranslateBlc(
      BlcBlock(UniformBlcTuning(64)),
      IppInput(static_cast<vosbrine::BayerPattern>(9), vosbrine::SENSOR_TYPE_BAYER, 10, 1.0f),
      &value));
  EXPECT_EQ(value.pixel_order, 0u);
  EXPECT_TRUE(log.Contains("Invalid bayer_pattern: "));
}

// --- CalculateG3AAOffsetGains ------------------------------------------------------------------

TEST(CalculateG3AAOffsetGainsTest, GivesOffsetsAndStretchesInChannelOrder) {
  std::array<double, 4> offsets;
  std::array<double, 4> stretch_gains;
  TAVIK_ASSERT_OK(
      CalculateG3AAOffsetGains(MakeBlcTuning({64}, {0}, {512}, {-64}), 10, offsets, stretch_gains));
  EXPECT_THAT(offsets, ElementsAre(2048.0, 0.0, 16384.0, -2048.0));
  EXPECT_THAT(stretch_gains, ElementsAre(32768.0 / 30720.0, 1.0, 2.0, 32768.0 / 34816.0));
}

TEST(CalculateG3AAOffsetGainsTest, DepthOfSixteenOrMoreIsRefusedWithoutABlank) {
  std::array<double, 4> offsets;
  std::array<double, 4> stretch_gains;
  EXPECT_THAT(CalculateG3AAOffsetGains(UniformBlcTuning(64), 20, offsets, stretch_gains),
              StatusIs(kInvalid, "Sensor bit depth is larger than g3aa pipeline!20"));
}

TEST(CalculateG3AAOffsetGainsTest, OffsetTextShowsSixSignificantDigits) {
  std::array<double, 4> offsets;
  std::array<double, 4> stretch_gains;
  // 1234.5678 x 32 = 39506.17 in single precision.
  EXPECT_THAT(CalculateG3AAOffsetGains(MakeBlcTuning({64}, {64}, {64}, {1234.5678f}), 10, offsets,
                                       stretch_gains),
              StatusIs(kInvalid, "Offset is too large to calculate stretch gain! 39506.2"));
}

// --- GetDynamicBlc -----------------------------------------------------------------------------

TEST(GetDynamicBlcTest, GivesElementZeroInTheRasterOrderOfTheQuad) {
  const ZelTuningBlock<zm::BlcTuning> block = BlcBlock(NumberedTuning());
  EXPECT_THAT(GetDynamicBlc(block, vosbrine::RGGB), ElementsAre(1, 5, 9, 13));
  EXPECT_THAT(GetDynamicBlc(block, vosbrine::BGGR), ElementsAre(13, 9, 5, 1));
  EXPECT_THAT(GetDynamicBlc(block, vosbrine::GRBG), ElementsAre(5, 1, 13, 9));
  EXPECT_THAT(GetDynamicBlc(block, vosbrine::GBRG), ElementsAre(9, 13, 1, 5));
}

TEST(GetDynamicBlcTest, EmptyArrayGivesZero) {
  EXPECT_THAT(GetDynamicBlc(BlcBlock(MakeBlcTuning({3}, {}, {5}, {6})), vosbrine::RGGB),
              ElementsAre(3, 0, 5, 6));
}

TEST(GetDynamicBlcTest, NoUsableBlockGives64FourTimesWithALogLine) {
  constexpr char kLine[] = "Blc tuning block is empty. Return default 64 value for offsets.";
  {
    ScopedLogCapture log;
    EXPECT_THAT(GetDynamicBlc(ForeignBlock(), vosbrine::RGGB), ElementsAre(64, 64, 64, 64));
    EXPECT_EQ(log.Count(kLine), 1);
  }
  {
    ScopedLogCapture log;
    zm::BlcTuning tuning = NumberedTuning();
    tuning.clear_dynamic_param();
    EXPECT_THAT(GetDynamicBlc(BlcBlock(tuning), vosbrine::GBRG), ElementsAre(64, 64, 64, 64));
    EXPECT_THAT(log.messages(android::base::ERROR), ElementsAre(kLine));
  }
}

// --- Conversions of the translator frame used here -------------------------------------------

TEST(TruncateWrappingTest, GivesTheLowBitsOfAnyFloatWithoutOverflow) {
  EXPECT_EQ(TruncateWrapping(-1024.0), -1024);
  EXPECT_EQ(TruncateWrapping(2.9), 2);
  EXPECT_EQ(TruncateWrapping(-2.9), -2);
  EXPECT_EQ(TruncateWrapping(std::ldexp(1.0, 63)), std::numeric_limits<int64_t>::min());
  EXPECT_EQ(TruncateWrapping(std::ldexp(1.0, 64) + std::ldexp(1.0, 12)), 4096);
  EXPECT_EQ(TruncateWrapping(-std::ldexp(1.0, 64) - std::ldexp(1.0, 12)), -4096);
  EXPECT_EQ(TruncateWrapping(1e300), 0);
  EXPECT_EQ(TruncateWrapping(std::numeric_limits<double>::infinity()), 0);
  EXPECT_EQ(TruncateWrapping(std::numeric_limits<double>::quiet_NaN()), 0);
}

TEST(TruncateToUint32Test, SaturatesAndSendsNanToZero) {
  EXPECT_EQ(TruncateToUint32(1092.9), 1092u);
  EXPECT_EQ(TruncateToUint32(-5.0), 0u);
  EXPECT_EQ(TruncateToUint32(0.99), 0u);
  EXPECT_EQ(TruncateToUint32(4294967295.5), 0xFFFFFFFFu);
  EXPECT_EQ(TruncateToUint32(1e20), 0xFFFFFFFFu);
  EXPECT_EQ(TruncateToUint32(std::numeric_limits<double>::quiet_NaN()), 0u);
}

// --- The sample tuning set ---------------------------------------------------------------------

// Every form over the inputs that change the black-level arithmetic: pattern, quad layout, gain.
TEST(BlcSampleTuningTest, EveryLeafOfEverySampleTranslatesInEveryFormAndInput) {
  const int leaves = test::ForEachSampleLeaf<zm::BlcTuning>(
      [](const ZelTuningBlock<zm::BlcTuning>& block, const std::string&) {
        for (vosbrine::BayerPattern pattern : {vosbrine::RGGB, vosbrine::GBRG}) {
          for (vosbrine::SensorType type :
               {vosbrine::SENSOR_TYPE_BAYER, vosbrine::SENSOR_TYPE_QUAD_BAYER}) {
            for (float gain : {1.0f, 4.0f, 16.0f}) {
              const BlcInput input = {pattern, type, 10, gain};
              BlcIppOutput ipp;
              BlcIppFixedOutput fixed;
              TAVIK_ASSERT_OK(GetDefaultBlc(ipp, fixed));
              EXPECT_THAT(TranslateBlc(block, input, ipp), IsOk()) << block.message.DebugString();
              BlcConfigValue offsets = {};
              EXPECT_THAT(TranslateBlc(block, input, &offsets), IsOk());
              DgConfigValue gains = {};
              EXPECT_THAT(TranslateBlc(block, input, &gains), IsOk());
              EXPECT_THAT(TranslateDg(block, DgInput{pattern, 10, gain}, gains), IsOk());
            }
          }
        }
      });
  if (::testing::Test::IsSkipped()) return;
  EXPECT_GT(leaves, 0);
}

}  // namespace
}  // namespace tavik
