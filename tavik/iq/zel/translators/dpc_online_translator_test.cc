#include "tavik/iq/zel/translators/dpc_online_translator.h"

#include <array>
#include <cstdint>
#include <cstring>
#include <initializer_list>
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
using ::tavik_registers::zel::g3aa::DpcConfigValue;
using ::testing::ElementsAre;
using ::testing::ElementsAreArray;
using ::testing::HasSubstr;

constexpr absl::StatusCode kInvalid = absl::StatusCode::kInvalidArgument;
constexpr uint32_t kPattern = 0xA5A5A5A5u;

template <typename Word, typename Record>
std::array<Word, sizeof(Record) / sizeof(Word)> Words(const Record& record) {
  std::array<Word, sizeof(Record) / sizeof(Word)> words;
  std::memcpy(words.data(), &record, sizeof(record));
  return words;
}

// The two 64-bit words and the third 32-bit word of a G3AA register.
struct G3aaWords {
  uint64_t first;
  uint64_t second;
  uint32_t third;
};
G3aaWords WordsOf(const DpcConfigValue& value) {
  G3aaWords words;
  std::memcpy(&words.first, &value, 8);
  std::memcpy(&words.second, reinterpret_cast<const char*>(&value) + 8, 8);
  std::memcpy(&words.third, reinterpret_cast<const char*>(&value) + 16, 4);
  return words;
}

void SetLevels(google::protobuf::RepeatedField<float>* levels,
               std::initializer_list<float> values) {
  levels->Clear();
  levels->Add(values.begin(), values.end());
}

// The default tuning's values, written out, with a G3AA threshold of `threshold`.
zm::DpcTuning Tuning(bool enable = true, float threshold = 0.0f) {
  zm::DpcTuning tuning;
  tuning.set_enable(enable);
  tuning.mutable_static_param();
  zm::DpcDynamicParam& d = *tuning.mutable_dynamic_param();
  d.set_contrast_diff_factor(0.251969f);
  SetLevels(d.mutable_predespeckle_main_thresholds(),
            {0.029299f, 0.039065f, 0.053714f, 0.073247f, 0.097662f});
  SetLevels(d.mutable_direction_effective_thresholds(),
            {0.721569f, 0.752941f, 0.784314f, 0.862745f, 0.941176f});
  d.set_max_mask_level(0.5f);
  SetLevels(d.mutable_dir_base_thresholds(),
            {0.013673f, 0.009766f, 0.023439f, 0.028322f, 0.033205f});
  SetLevels(d.mutable_omni_dynamic_threshold_weights(),
            {0.011231f, 0.013673f, 0.023439f, 0.033205f, 0.046878f});
  SetLevels(d.mutable_omni_std_thresholds(),
            {0.013673f, 0.023439f, 0.038088f, 0.062504f, 0.08106f});
  SetLevels(d.mutable_omni_tol_var_green_scales(),
            {0.188976f, 0.220472f, 0.251969f, 0.283465f, 0.314961f});
  SetLevels(d.mutable_omni_tol_var_rb_scales(),
            {0.188976f, 0.220472f, 0.251969f, 0.283465f, 0.314961f});
  d.set_g3aa_dpc_threshold(threshold);
  return tuning;
}

ZelTuningBlock<zm::DpcTuning> Block(zm::DpcTuning tuning) {
  return ZelTuningBlock<zm::DpcTuning>(std::move(tuning));
}

DpcInput Input(int32_t dpc_mode = 2, int32_t width = 4032, int32_t height = 3024,
               vosbrine::BayerPattern pattern = vosbrine::RGGB,
               vosbrine::SensorType type = vosbrine::SENSOR_TYPE_BAYER) {
  return DpcInput{pattern, type, 10, 1.0f, width, height, dpc_mode};
}

// The 28 words of the default tuning's IPP translation, from a zeroed record.
constexpr uint32_t kDefaultIppWords[28] = {
    0x0u,         // Bypass bits cleared.
    0x11u,        // RGGB's code 1, bit 4.
    0x20u,        // contrast_diff_factor: 0.251969 x 127 = 32.00006.
    0x20u,        //
    0x2u,         // max_mask_level: 0.5 x 4.
    0xFC00000u,   // Width 4032 at bit 16.
    0x10BD0u,     // Height 3024, then 1 at bit 16.
    0xFC00000u,   // Width again.
    0xBD0u,       // Height again.
    0x28001E0u,   // predespeckle_main_thresholds: 480, 640,
    0x4B00370u,   //   880, 1200,
    0x640u,       //   1600.
    0xDCC8C0B8u,  // direction_effective_thresholds: 184, 192, 200, 220,
    0xF0u,        //   240 in a word of its own.
    0x18000E0u,   // omni_std_thresholds: 224, 384,
    0x4000270u,   //   624, 1024,
    0x530u,       //   1328.
    0xE000B8u,    // omni_dynamic_threshold_weights: 184, 224,
    0x2200180u,   //   384, 544,
    0x300u,       //   768.
    0x24201C18u,  // omni_tol_var_green_scales: 24, 28, 32, 36,
    0x28u,        //   40.
    0x24201C18u,  // omni_tol_var_rb_scales, the same.
    0x28u,        //
    0xA000E0u,    // dir_base_thresholds: 224, 160,
    0x1D00180u,   //   384, 464,
    0x220u,       //   544.
    0x1u,         // Bayer sensor mode.
};

// --- Record layouts --------------------------------------------------------------------------

TEST(DpcRecordLayoutTest, IppOutputFieldsSitInTheirWords) {
  DpcIppOutput output = {};
  output.bypass = 1;
  output.bypass_1 = 1;
  output.geometry_bit0 = 1;
  output.bayer_width_a = 0x7FFF;
  output.bayer_height_a = 0x7FFF;
  output.geometry_mode = 0x3F;
  output.geometry_low = 0x3FFF;
  output.geometry_bit16 = 1;
  output.geometry_bit20 = 1;
  output.predespeckle_main_thresholds.level_1 = 0x3FFF;
  output.direction_effective_thresholds.level_3 = 0xFF;
  output.direction_effective_thresholds.level_4 = 0xFFFFFFFF;
  output.omni_tol_var_rb_scales.level_2 = 0x7F;
  output.dir_base_thresholds.level_4 = 0x3FFF;
  output.sensor_mode = 3;
  const auto words = Words<uint32_t>(output);
  EXPECT_EQ(words[0], 0x11u);
  EXPECT_EQ(words[5], 0x7FFF0001u);
  EXPECT_EQ(words[6], 0x3F7FFFu);
  EXPECT_EQ(words[7], 0x3FFFu);
  EXPECT_EQ(words[8], 0x110000u);
  EXPECT_EQ(words[9], 0x3FFF0000u);
  EXPECT_EQ(words[12], 0xFF000000u);
  EXPECT_EQ(words[13], 0xFFFFFFFFu);
  EXPECT_EQ(words[22], 0x7F0000u);
  EXPECT_EQ(words[26], 0x3FFFu);
  EXPECT_EQ(words[27], 0x3u);
}

TEST(DpcRecordLayoutTest, G3aaFieldsSitAtTheirBitsWithTheSixteenBitCodeAcrossTheWords) {
  DpcConfigValue value = {};
  value.enable = 1;
  value.pixel_order = 3;
  value.u_38 = 0x3F;
  value.t_21 = 0x3F;
  value.SetU6554(0xFFFF);
  value.u_4915 = 0xFFFF;
  value.u_19 = 0x3F;
  value.u_32 = 0x3F;
  const G3aaWords words = WordsOf(value);
  EXPECT_EQ(words.first, 0xFFFC00000000000Du);
  EXPECT_EQ(words.second, 0x3FFFFFFFFFFu);
  EXPECT_EQ(value.u_6554_lo, 3u);
  EXPECT_EQ(value.u_6554_hi, 0x3FFFu);
  EXPECT_EQ(value.U6554(), 0xFFFFu);
  value = {};
  value.settings_1 = 0x3FFFFF;
  value.settings_2 = 0x3FF;
  EXPECT_EQ(WordsOf(value).second, 0xFFFFFC0000000000u);
  EXPECT_EQ(WordsOf(value).third, 0x3FFu);
}

// --- Defaults ----------------------------------------------------------------------------------

TEST(GetDefaultDpcTest, IppDefaultsAreTheDefaultTuningsCodes) {
  DpcIppOutput output = {};
  DpcIppFixedOutput fixed = PatternFilled<DpcIppFixedOutput>();
  TAVIK_ASSERT_OK(GetDefaultDpc(output, fixed));
  EXPECT_THAT(Words<uint32_t>(output), ElementsAreArray(kDefaultIppWords));
  EXPECT_THAT(fixed.reserved, ElementsAre(0u, 0u, 0u, 0u));
}

TEST(GetDefaultDpcTest, IppDefaultsKeepTheSpareBitsOfEveryWord) {
  DpcIppOutput output = PatternFilled<DpcIppOutput>();
  DpcIppFixedOutput fixed;
  TAVIK_ASSERT_OK(GetDefaultDpc(output, fixed));
  // Word by word: the pattern where no field lies, the default codes where one does.
  constexpr uint32_t kFieldBits[28] = {
      0x11u,       0x1113u,     0x7Fu,       0x7Fu,       0x7u,        0x7FFF0001u, 0x3F7FFFu,
      0x7FFF3FFFu, 0x117FFFu,   0x3FFF3FFFu, 0x3FFF3FFFu, 0x3FFFu,     0xFFFFFFFFu, 0xFFFFFFFFu,
      0x3FFF3FFFu, 0x3FFF3FFFu, 0x3FFFu,     0x3FFF3FFFu, 0x3FFF3FFFu, 0x3FFFu,     0x7F7F7F7Fu,
      0x7Fu,       0x7F7F7F7Fu, 0x7Fu,       0x3FFF3FFFu, 0x3FFF3FFFu, 0x3FFFu,     0x3u};
  const auto words = Words<uint32_t>(output);
  for (int i = 0; i < 28; ++i) {
    EXPECT_EQ(words[i], (kPattern & ~kFieldBits[i]) | kDefaultIppWords[i]) << "word " << i;
  }
}

TEST(GetDefaultDpcTest, G3aaDefaultsAreTheZeroThresholdCodesAndTheStagesSettings) {
  DpcConfigValue value = {};
  TAVIK_ASSERT_OK(GetDefaultDpc(&value));
  EXPECT_EQ(value.enable, 1u);
  EXPECT_EQ(value.pixel_order, 3u);  // Put there by the settings, over RGGB's 0.
  EXPECT_EQ(value.u_38, 38u);
  EXPECT_EQ(value.t_21, 0u);
  EXPECT_EQ(value.U6554(), 6554u);
  EXPECT_EQ(value.u_4915, 4915u);
  EXPECT_EQ(value.u_19, 19u);
  EXPECT_EQ(value.u_32, 32u);
  const G3aaWords words = WordsOf(value);
  // Bits 1-49 of the first word are 0x28004004000C's.
  EXPECT_EQ(words.first & 0x3FFFFFFFFFFFEu, 0x28004004000Cu);
  EXPECT_EQ(words.first, 0x809828004004000Du);
  // Bits 42-63 of the second word are 0x1E0000000000000's.
  EXPECT_EQ(words.second & 0xFFFFFC0000000000u, 0x1E0000000000000u);
  EXPECT_EQ(words.second, 0x01E00204C4CCC666u);
  EXPECT_EQ(words.third, 0x3F0u);
}

TEST(GetDefaultDpcTest, G3aaDefaultsKeepTheThirdWordsHighBits) {
  DpcConfigValue value = PatternFilled<DpcConfigValue>();
  TAVIK_ASSERT_OK(GetDefaultDpc(&value));
  const G3aaWords words = WordsOf(value);
  EXPECT_EQ(words.first, 0x809828004004000Du);
  EXPECT_EQ(words.second, 0x01E00204C4CCC666u);
  EXPECT_EQ(words.third, (kPattern & ~0x3FFu) | 0x3F0u);
}

TEST(GetDefaultDpcTest, NullRegisterIsRefusedWithTheStockText) {
  EXPECT_THAT(GetDefaultDpc(static_cast<DpcConfigValue*>(nullptr)),
              StatusIs(kInvalid, "Output is null pointer!"));
}

TEST(GetDefaultDpcTest, TracesItselfAroundTheTranslation) {
  RecordingTraceSink sink;
  DpcIppOutput output;
  DpcIppFixedOutput fixed;
  TAVIK_ASSERT_OK(GetDefaultDpc(output, fixed));
  using Span = RecordingTraceSink::Span;
  EXPECT_THAT(sink.spans(), ElementsAre(Span(5, "TranslateDpc"), Span(5, "GetDefaultDpc")));
}

// --- TranslateDpc, IPP -------------------------------------------------------------------------

TEST(TranslateDpcIppTest, ModeZeroWritesTheFrameFieldsAndBypassWithoutReadingTheTuning) {
  ScopedLogCapture log;
  DpcIppOutput output = PatternFilled<DpcIppOutput>();
  TAVIK_ASSERT_OK(TranslateDpc(
      ForeignBlock(), Input(/*dpc_mode=*/0, 640, 480, vosbrine::GRBG, vosbrine::SENSOR_TYPE_MONO),
      output));
  EXPECT_FALSE(log.Contains("Incorrect tuning block type"));
  const auto words = Words<uint32_t>(output);
  EXPECT_EQ(words[0], kPattern | 0x11u);               // Both bypass bits.
  EXPECT_EQ(words[1], (kPattern & ~0x1113u) | 0x10u);  // GRBG's code 0, bit 4.
  EXPECT_EQ(output.bayer_width_a, 640u);
  EXPECT_EQ(output.bayer_height_b, 480u);
  EXPECT_EQ(output.geometry_mode, 1u);
  EXPECT_EQ(words[27], (kPattern & ~0x3u) | 0x3u);
  // Nothing of the tuning's.
  for (int i : {2, 3, 4, 9, 12, 13, 20, 26}) EXPECT_EQ(words[i], kPattern) << "word " << i;
}

TEST(TranslateDpcIppTest, BlockOfAnotherTypeIsRefusedAfterTheFrameFields) {
  DpcIppOutput output = PatternFilled<DpcIppOutput>();
  EXPECT_THAT(TranslateDpc(ForeignBlock(), Input(), output),
              StatusIs(kInvalid, "Invalid TuningBlock!"));
  const auto words = Words<uint32_t>(output);
  EXPECT_EQ(words[0], kPattern);  // The bypass bits are the tuning's.
  EXPECT_EQ(words[5], (kPattern & ~0x7FFF0001u) | 0xFC00000u);
  EXPECT_EQ(words[2], kPattern);
}

TEST(TranslateDpcIppTest, RegionInfoIsCheckedBeforeStaticInfo) {
  zm::DpcTuning tuning = Tuning();
  tuning.clear_dynamic_param();
  tuning.clear_static_param();
  DpcIppOutput output = PatternFilled<DpcIppOutput>();
  EXPECT_THAT(TranslateDpc(Block(tuning), Input(), output),
              StatusIs(kInvalid, "Tuning data doesn't have region info."));
  EXPECT_THAT(TranslateDpc(Block(zm::DpcTuning()), Input(), output),
              StatusIs(kInvalid, "Tuning data doesn't have region info."));
  tuning = Tuning();
  tuning.clear_static_param();
  EXPECT_THAT(TranslateDpc(Block(tuning), Input(), output),
              StatusIs(kInvalid, "Tuning data doesn't have static info."));
  EXPECT_EQ(Words<uint32_t>(output)[0], kPattern);
  EXPECT_EQ(Words<uint32_t>(output)[2], kPattern);
}

TEST(TranslateDpcIppTest, FourLevelsFailAfterWordsTwoToFourWithTheWholeDynamicPartsText) {
  zm::DpcTuning tuning;
  tuning.set_enable(false);
  tuning.mutable_static_param();
  zm::DpcDynamicParam& d = *tuning.mutable_dynamic_param();
  d.set_contrast_diff_factor(0.5f);
  SetLevels(d.mutable_direction_effective_thresholds(), {0.25f, 0.5f, 0.75f, 1.0f});
  d.set_max_mask_level(0.75f);
  d.set_g3aa_dpc_threshold(0.25f);
  DpcIppOutput output = PatternFilled<DpcIppOutput>();
  EXPECT_THAT(TranslateDpc(Block(tuning), Input(), output),
              StatusIs(kInvalid,
                       "dpc size is wrong: contrast_diff_factor: 0.5\n"
                       "direction_effective_thresholds: 0.25\n"
                       "direction_effective_thresholds: 0.5\n"
                       "direction_effective_thresholds: 0.75\n"
                       "direction_effective_thresholds: 1\n"
                       "max_mask_level: 0.75\n"
                       "g3aa_dpc_threshold: 0.25\n"));
  const auto words = Words<uint32_t>(output);
  EXPECT_EQ(words[0], kPattern | 0x11u);           // Disabled: both bypass bits.
  EXPECT_EQ(words[2], (kPattern & ~0x7Fu) | 64u);  // 0.5 x 127 = 63.5.
  EXPECT_EQ(words[3], (kPattern & ~0x7Fu) | 64u);
  EXPECT_EQ(words[4], (kPattern & ~0x7u) | 3u);  // 0.75 x 4.
  for (int i = 9; i <= 26; ++i) EXPECT_EQ(words[i], kPattern) << "word " << i;
}

TEST(TranslateDpcIppTest, EachListMustHoldFiveValues) {
  const auto lists = {&zm::DpcDynamicParam::mutable_predespeckle_main_thresholds,
                      &zm::DpcDynamicParam::mutable_direction_effective_thresholds,
                      &zm::DpcDynamicParam::mutable_dir_base_thresholds,
                      &zm::DpcDynamicParam::mutable_omni_dynamic_threshold_weights,
                      &zm::DpcDynamicParam::mutable_omni_std_thresholds,
                      &zm::DpcDynamicParam::mutable_omni_tol_var_green_scales,
                      &zm::DpcDynamicParam::mutable_omni_tol_var_rb_scales};
  for (auto list : lists) {
    for (int extra : {-1, 1}) {
      zm::DpcTuning tuning = Tuning();
      auto* levels = (tuning.mutable_dynamic_param()->*list)();
      if (extra < 0) {
        levels->RemoveLast();
      } else {
        levels->Add(0.5f);
      }
      DpcIppOutput output = {};
      EXPECT_THAT(TranslateDpc(Block(tuning), Input(), output),
                  StatusIs(kInvalid, HasSubstr("dpc size is wrong: contrast_diff_factor: ")));
    }
  }
}

TEST(TranslateDpcIppTest, SensorModeIsThreeForMonoAndOneOtherwise) {
  DpcIppOutput output = {};
  TAVIK_ASSERT_OK(TranslateDpc(
      Block(Tuning()), Input(2, 4032, 3024, vosbrine::RGGB, vosbrine::SENSOR_TYPE_MONO), output));
  EXPECT_EQ(output.sensor_mode, 3u);
  TAVIK_ASSERT_OK(
      TranslateDpc(Block(Tuning()),
                   Input(2, 4032, 3024, vosbrine::RGGB, vosbrine::SENSOR_TYPE_QUAD_BAYER), output));
  EXPECT_EQ(output.sensor_mode, 1u);
}

TEST(TranslateDpcIppTest, LevelsAreLimitedToTheirScales) {
  zm::DpcTuning tuning = Tuning();
  zm::DpcDynamicParam& d = *tuning.mutable_dynamic_param();
  SetLevels(d.mutable_predespeckle_main_thresholds(), {1.0f, 2.0f, -1.0f, 0.5f, 0.0f});
  SetLevels(d.mutable_omni_tol_var_green_scales(), {1.0f, 2.0f, -1.0f, 0.5f, 0.0f});
  SetLevels(d.mutable_direction_effective_thresholds(), {1.0f, 2.0f, -1.0f, 0.5f, 3.0f});
  d.set_max_mask_level(2.0f);
  d.set_contrast_diff_factor(-1.0f);
  DpcIppOutput output = {};
  TAVIK_ASSERT_OK(TranslateDpc(Block(tuning), Input(), output));
  const DpcLevels14& pre = output.predespeckle_main_thresholds;
  EXPECT_EQ(pre.level_0, 16383u);
  EXPECT_EQ(pre.level_1, 16383u);
  EXPECT_EQ(pre.level_2, 0u);
  EXPECT_EQ(pre.level_3, 8192u);  // 8191.5 rounds away from zero.
  const DpcLevels7& green = output.omni_tol_var_green_scales;
  EXPECT_EQ(green.level_1, 127u);
  EXPECT_EQ(green.level_3, 64u);
  EXPECT_EQ(output.direction_effective_thresholds.level_4, 255u);
  EXPECT_EQ(output.max_mask_level, 4u);
  EXPECT_EQ(output.contrast_diff_factor_0, 0u);
}

// --- TranslateDpc, G3AA ------------------------------------------------------------------------

TEST(TranslateDpcG3aaTest, NullRegisterHasTheStagesOwnText) {
  EXPECT_THAT(TranslateDpc(Block(Tuning()), Input(), static_cast<DpcConfigValue*>(nullptr)),
              StatusIs(kInvalid, "G3AA algo params is null."));
}

TEST(TranslateDpcG3aaTest, ModeZeroWritesThePixelOrderAndClearsEnableWithoutReadingTheTuning) {
  ScopedLogCapture log;
  DpcConfigValue value = PatternFilled<DpcConfigValue>();
  TAVIK_ASSERT_OK(
      TranslateDpc(ForeignBlock(), Input(/*dpc_mode=*/0, 0, 0, vosbrine::BGGR), &value));
  EXPECT_FALSE(log.Contains("Incorrect tuning block type"));
  const G3aaWords words = WordsOf(value);
  // 0xA5: enable cleared, BGGR's code 3 in bits 2-3.
  EXPECT_EQ(words.first, 0xA5A5A5A5A5A5A5ACu);
  EXPECT_EQ(words.second, 0xA5A5A5A5A5A5A5A5u);
}

TEST(TranslateDpcG3aaTest, RefusalsFollowThePixelOrderInTheirOrder) {
  const DpcConfigValue pattern = PatternFilled<DpcConfigValue>();
  DpcConfigValue only_order = pattern;
  only_order.pixel_order = 2;  // GBRG.
  const DpcInput input = Input(2, 4032, 3024, vosbrine::GBRG);

  DpcConfigValue value = pattern;
  EXPECT_THAT(TranslateDpc(ForeignBlock(), input, &value),
              StatusIs(kInvalid, "Invalid TuningBlock!"));
  EXPECT_TRUE(SameBytes(value, only_order));

  // The texts name the disparity block.
  zm::DpcTuning tuning = Tuning();
  tuning.clear_static_param();
  tuning.clear_dynamic_param();
  value = pattern;
  EXPECT_THAT(TranslateDpc(Block(tuning), Input(2, 0, 0, vosbrine::GBRG), &value),
              StatusIs(kInvalid, "DisparityTuning proto doesn't have static param!"));
  EXPECT_THAT(TranslateDpc(Block(zm::DpcTuning()), input, &value),
              StatusIs(kInvalid, "DisparityTuning proto doesn't have static param!"));
  EXPECT_TRUE(SameBytes(value, only_order));

  tuning = Tuning();
  tuning.clear_dynamic_param();
  EXPECT_THAT(TranslateDpc(Block(tuning), Input(2, 0, 0, vosbrine::GBRG), &value),
              StatusIs(kInvalid, "DisparityTuning proto doesn't have dynamic param!"));
  EXPECT_TRUE(SameBytes(value, only_order));

  EXPECT_THAT(TranslateDpc(Block(Tuning()), Input(2, 0, 0, vosbrine::GBRG), &value),
              StatusIs(kInvalid, "bayer_width or bayer_height is not positive!"));
  EXPECT_THAT(TranslateDpc(Block(Tuning()), Input(2, -8, 0, vosbrine::GBRG), &value),
              StatusIs(kInvalid, "bayer_width or bayer_height is not positive!"));
  EXPECT_TRUE(SameBytes(value, only_order));
}

TEST(TranslateDpcG3aaTest, AWidthOfZeroWithAHeightOf100Passes) {
  DpcConfigValue value = {};
  TAVIK_ASSERT_OK(TranslateDpc(Block(Tuning()), Input(2, 0, 100), &value));
  TAVIK_ASSERT_OK(TranslateDpc(Block(Tuning()), Input(2, 100, 0), &value));
  EXPECT_EQ(value.enable, 1u);
}

TEST(TranslateDpcG3aaTest, ThresholdZeroGivesTheFullCodes) {
  DpcConfigValue value = {};
  TAVIK_ASSERT_OK(TranslateDpc(Block(Tuning(true, 0.0f)), Input(), &value));
  EXPECT_EQ(value.u_38, 38u);
  EXPECT_EQ(value.t_21, 0u);
  EXPECT_EQ(value.U6554(), 6554u);
  EXPECT_EQ(value.u_4915, 4915u);
  EXPECT_EQ(value.u_19, 19u);
  EXPECT_EQ(value.u_32, 32u);
}

TEST(TranslateDpcG3aaTest, ThresholdOneGivesOnly21) {
  DpcConfigValue value = PatternFilled<DpcConfigValue>();
  TAVIK_ASSERT_OK(TranslateDpc(Block(Tuning(true, 1.0f)), Input(), &value));
  EXPECT_EQ(value.u_38, 0u);
  EXPECT_EQ(value.t_21, 21u);
  EXPECT_EQ(value.U6554(), 0u);
  EXPECT_EQ(value.u_4915, 0u);
  EXPECT_EQ(value.u_19, 0u);
  EXPECT_EQ(value.u_32, 0u);
}

TEST(TranslateDpcG3aaTest, HalfThresholdRoundsHalvesAwayFromZero) {
  DpcConfigValue value = {};
  TAVIK_ASSERT_OK(TranslateDpc(Block(Tuning(true, 0.5f)), Input(), &value));
  EXPECT_EQ(value.u_38, 19u);
  EXPECT_EQ(value.t_21, 11u);  // 10.5.
  EXPECT_EQ(value.U6554(), 3277u);
  EXPECT_EQ(value.u_4915, 2458u);  // 2457.5.
  EXPECT_EQ(value.u_19, 10u);      // 9.5.
  EXPECT_EQ(value.u_32, 16u);
}

TEST(TranslateDpcG3aaTest, ThresholdsBeyondTheRangeAreLimited) {
  DpcConfigValue value = {};
  TAVIK_ASSERT_OK(TranslateDpc(Block(Tuning(true, 2.0f)), Input(), &value));
  EXPECT_EQ(value.t_21, 21u);
  EXPECT_EQ(value.u_38, 0u);
  TAVIK_ASSERT_OK(TranslateDpc(Block(Tuning(true, -1.0f)), Input(), &value));
  EXPECT_EQ(value.t_21, 0u);
  EXPECT_EQ(value.u_38, 38u);
  EXPECT_EQ(value.U6554(), 6554u);
}

TEST(TranslateDpcG3aaTest, EnableIsTheTuningsNotInvertedAndTheSettingsAreLeftAsFound) {
  DpcConfigValue value = PatternFilled<DpcConfigValue>();
  TAVIK_ASSERT_OK(TranslateDpc(Block(Tuning(/*enable=*/false, 0.2f)), Input(), &value));
  EXPECT_EQ(value.enable, 0u);
  EXPECT_EQ(value.pixel_order, 0u);
  EXPECT_EQ(value.u_38, 30u);  // 0.8 x 38 = 30.4.
  EXPECT_EQ(value.t_21, 4u);   // 4.2.
  EXPECT_EQ(value.U6554(), 5243u);
  EXPECT_EQ(value.u_4915, 3932u);
  EXPECT_EQ(value.u_19, 15u);
  EXPECT_EQ(value.u_32, 26u);  // 25.6.
  const DpcConfigValue pattern = PatternFilled<DpcConfigValue>();
  EXPECT_EQ(value.settings_bit1, pattern.settings_bit1);
  EXPECT_EQ(value.settings, pattern.settings);
  EXPECT_EQ(value.settings_1, pattern.settings_1);
  EXPECT_EQ(value.settings_2, pattern.settings_2);
}

// --- The sample tuning set ---------------------------------------------------------------------

TEST(DpcSampleSetTest, EveryLeafTranslatesInBothModesForAMonoFrame) {
  const int leaves = test::ForEachSampleLeaf<zm::DpcTuning>(
      [&](const ZelTuningBlock<zm::DpcTuning>& block, const std::string&) {
        for (int32_t mode : {0, 1, 2}) {
          const DpcInput input =
              Input(mode, 1920, 1080, vosbrine::GBRG, vosbrine::SENSOR_TYPE_MONO);
          DpcIppOutput output = {};
          TAVIK_EXPECT_OK(TranslateDpc(block, input, output));
          EXPECT_EQ(output.bayer_width_b, 1920u);
          EXPECT_EQ(output.sensor_mode, 3u);
          DpcConfigValue value = {};
          TAVIK_EXPECT_OK(TranslateDpc(block, input, &value));
          EXPECT_EQ(value.pixel_order, 2u);
        }
        // Real thresholds leave room on both sides.
        DpcConfigValue value = {};
        TAVIK_EXPECT_OK(TranslateDpc(block, Input(), &value));
        EXPECT_GT(value.u_38, 0u);
        EXPECT_LT(value.t_21, 21u);
      });
  if (::testing::Test::IsSkipped()) return;
  EXPECT_GT(leaves, 0);
}

}  // namespace
}  // namespace tavik
