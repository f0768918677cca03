#include "tavik/iq/zel/translators/nsmix_online_translator.h"

#include <algorithm>
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
#include "tavik/iq/zel/translators/translator_table.h"
#include "tavik/iq/zel/zel_tuning_block.h"

namespace tavik {
namespace {

namespace zm = ::vosbrine::zelmondrake;
using ::google::protobuf::FieldDescriptor;
using ::tavik::test::ForeignBlock;
using ::tavik::test::PatternFilled;
using ::tavik::test::RecordingTraceSink;
using ::tavik::test::SameBytes;
using ::tavik::test::ScopedLogCapture;
using ::tavik::test::StatusIs;
using ::testing::Each;
using ::testing::ElementsAre;

constexpr absl::StatusCode kInvalid = absl::StatusCode::kInvalidArgument;
constexpr uint32_t kPattern = 0xA5A5A5A5;
constexpr uint16_t kPatternEntry = 0xA5A5;

using HeaderWords = std::array<uint32_t, 38>;

// The 38 bit-field words in front of the noise gain table.
HeaderWords Words(const NsmixItpOutput& output) {
  HeaderWords words;
  std::memcpy(words.data(), &output, sizeof(words));
  return words;
}

HeaderWords Words(const NsmixItpFixedOutput& fixed) {
  HeaderWords words;
  std::memcpy(words.data(), &fixed, sizeof(words));
  return words;
}

constexpr NsmixInput kInput = {vosbrine::SENSOR_TYPE_BAYER, 4032, 3024, DenoiseMode::kHighQuality};

// Every float of the dynamic part set to `value`, lists at their lengths (a noise gain table too).
zm::NsmixTuning Uniform(float value) {
  zm::NsmixTuning tuning;
  tuning.set_enable(true);
  tuning.mutable_static_param();
  zm::NsmixDynamicParam& d = *tuning.mutable_dynamic_param();
  const google::protobuf::Reflection& reflection = *d.GetReflection();
  for (int i = 0; i < d.GetDescriptor()->field_count(); ++i) {
    const FieldDescriptor* field = d.GetDescriptor()->field(i);
    if (!field->is_repeated()) reflection.SetFloat(&d, field, value);
  }
  for (int i = 0; i < 4; ++i) d.add_edge_limits(value), d.add_texture_limits(value);
  for (int i = 0; i < 3; ++i) d.add_noise_shape_gains(value), d.add_noise_shape_thresholds(value);
  for (int i = 0; i < 32; ++i) d.add_noise_gain_lut(value);
  return tuning;
}

ZelTuningBlock<zm::NsmixTuning> Block(zm::NsmixTuning tuning) {
  return ZelTuningBlock<zm::NsmixTuning>(std::move(tuning));
}

// The default tuning over a record of the pattern.
constexpr HeaderWords kDefaultWords = {
    0xA5A5A5A4, 0xA5A5A5A4, 0x8BD08FC0, 0xA440A420, 0xA4A0A540, 0xA482A464, 0xA6EEA7E8, 0xA411A411,
    0xA455A455, 0xA40CA40C, 0xA43CA43C, 0xA404A414, 0xA416A470, 0xA405A416, 0xA40AA423, 0xA40D2800,
    0xA5808E85, 0xA02DA050, 0xA5809487, 0xA5809686, 0xA1A9A055, 0xADACADAC, 0xA4042816, 0x0830460E,
    0x8458A403, 0xA800A40A, 0xA408A404, 0xA518A518, 0xA403A41C, 0xA0A0A5AA, 0xA0A0A5A4, 0x18202824,
    0x191C5050, 0xA01EA400, 0xA03CA400, 0xA041A400, 0xA400A41E, 0xA400A400};

// The bits of each word that the common translation writes.
constexpr HeaderWords kTranslatedBits = {
    0x00000001, 0x00000003, 0x7FFF7FFF, 0x03FF03FF, 0x03FF03FF, 0x03FF03FF, 0x03FF03FF, 0x03FF03FF,
    0x03FF03FF, 0x03FF03FF, 0x03FF03FF, 0x03FF03FF, 0x03FF03FF, 0x03FF03FF, 0x03FF03FF, 0x01FFFFFF,
    0x003F3F3F, 0x07FF07FF, 0x003F3F3F, 0x003F3F3F, 0x0FFF0FFF, 0x1FFF1FFF, 0x01FFFFFF, 0xFFFFFFFF,
    0x3FFF03FF, 0x0FFF03FF, 0x03FF03FF, 0x03FF03FF, 0x03FF03FF, 0x1F1F001F, 0x1F1F001F, 0xFFFFFFFF,
    0xFFFFFFFF, 0x07FF03FF, 0x07FF03FF, 0x07FF03FF, 0x03FF01FF, 0x01FF01FF};

// The fixed words both steppings share, over the pattern: words 1 to 19.
constexpr uint32_t kCommonFixedWords[] = {
    0xA1FFF3FF, 0xA54040A6, 0x00000000, 0x00000000, 0x00000000, 0x00000000, 0xA000A000,
    0xA4C8A464, 0xA000A000, 0xA5AAAFC8, 0x80008000, 0xA100A100, 0xA0008000, 0xA5A4A41E,
    0xA5A5AFE0, 0xA5A5A5A9, 0x08080808, 0xA5A5A5A0, 0xA5A58000};

// --- Defaults -----------------------------------------------------------------------------------

TEST(GetDefaultNsmixTest, TranslatesTheDefaultTuning) {
  NsmixItpOutput output = PatternFilled<NsmixItpOutput>();
  NsmixItpFixedOutput fixed = PatternFilled<NsmixItpFixedOutput>();
  TAVIK_ASSERT_OK(GetDefaultNsmix(output, fixed));
  EXPECT_EQ(Words(output), kDefaultWords);
  EXPECT_EQ(output.bypass, 0u);
  EXPECT_EQ(output.image_width, 4032u);
  EXPECT_EQ(output.image_height, 3024u);
  EXPECT_EQ(output.texture_only_sharp_power_bright, 3u);     // 0.00293 x 1023 = 2.997.
  EXPECT_EQ(output.fine_edge_suppress_bright_pos, 1000u);    // 0.9775 x 1023 = 999.98.
  EXPECT_EQ(output.fine_noise_add_despeckle_dark, 80u);      // (1 - 0.9609) x 2047 = 80.04.
  EXPECT_EQ(output.flat_region_sharp_suppress_bright, 1u);   // (1 - 0.9167) x 12 = 1.0.
  EXPECT_EQ(output.flat_region_noise_add_base_dark, 3500u);  // 0.8545 x 4096 = 3500.03.
  EXPECT_EQ(output.radial_noise_add_power, 10u);             // 522 - 512.
  EXPECT_EQ(output.edge_limit_1, 32u);                       // 0.1255 x 255 = 32.0.
  EXPECT_EQ(output.noise_shape_gain_2, 65u);                 // 0.0635 x 1024 = 65.02.
  EXPECT_EQ(output.high_frequency_detector_constant, 30u);
  EXPECT_EQ(output.high_frequency_detector_power, 0u);  // Unset in the default tuning.
  // No default noise gain table: the B0 words are the caller's.
  EXPECT_THAT(output.noise_gain, Each(kPatternEntry));
}

TEST(GetDefaultNsmixTest, SteppingsShareTheOutputAndDifferInFixedWords) {
  NsmixItpOutput a0 = PatternFilled<NsmixItpOutput>();
  NsmixItpOutput b0 = PatternFilled<NsmixItpOutput>();
  NsmixItpFixedOutput fixed_a0 = PatternFilled<NsmixItpFixedOutput>();
  NsmixItpFixedOutput fixed_b0 = PatternFilled<NsmixItpFixedOutput>();
  TAVIK_ASSERT_OK(GetDefaultNsmix(a0, fixed_a0));
  TAVIK_ASSERT_OK(GetDefaultNsmixB0(b0, fixed_b0));
  EXPECT_TRUE(SameBytes(a0, b0));

  HeaderWords expected_a0;
  expected_a0.fill(kPattern);
  expected_a0[0] = 0x8764ED37;
  std::copy(std::begin(kCommonFixedWords), std::end(kCommonFixedWords), expected_a0.begin() + 1);
  EXPECT_EQ(Words(fixed_a0), expected_a0);

  HeaderWords expected_b0 = expected_a0;
  expected_b0[0] = kPattern;
  expected_b0[20] = 0xC764ED37;
  // The noise gain abscissae, two a word over the pattern's spare bits; the last one is 512.
  const uint32_t abscissae[] = {0xA010A000, 0xA040A020, 0xA080A060, 0xA0C0A0A0,
                                0xA100A0E0, 0xA180A140, 0xA200A1C0, 0xA280A240,
                                0xA300A2C0, 0xA400A380, 0xA500A480, 0xA700A600,
                                0xA900A800, 0xAB00AA00, 0xAD00AC00, 0xA200AE00};
  std::copy(std::begin(abscissae), std::end(abscissae), expected_b0.begin() + 21);
  expected_b0[37] = kPattern | 1u;
  EXPECT_EQ(Words(fixed_b0), expected_b0);
}

TEST(GetDefaultNsmixTest, TracesTheTranslationUnderTheA0Name) {
  RecordingTraceSink sink;
  NsmixItpOutput output;
  NsmixItpFixedOutput fixed;
  TAVIK_ASSERT_OK(GetDefaultNsmix(output, fixed));
  TAVIK_ASSERT_OK(GetDefaultNsmixB0(output, fixed));
  EXPECT_THAT(sink.spans(), ElementsAre(RecordingTraceSink::Span(5, "TranslateNsmix"),
                                        RecordingTraceSink::Span(5, "GetDefaultNsmix"),
                                        RecordingTraceSink::Span(5, "TranslateNsmix"),
                                        RecordingTraceSink::Span(5, "GetDefaultNsmixB0")));
}

// --- Denoise off --------------------------------------------------------------------------------

TEST(TranslateNsmixTest, DenoiseOffChangesOnlyBypassAndReadsNoTuning) {
  ScopedLogCapture log;
  NsmixItpOutput output = PatternFilled<NsmixItpOutput>(0x5A);
  NsmixItpOutput expected = output;
  expected.bypass = 1;
  NsmixInput input = kInput;
  input.denoise_mode = DenoiseMode::kOff;
  TAVIK_ASSERT_OK(TranslateNsmix(ForeignBlock(), input, output));
  EXPECT_TRUE(SameBytes(output, expected));
  EXPECT_FALSE(log.Contains("Incorrect tuning block type"));
}

TEST(TranslateNsmixB0Test, DenoiseOffStillReadsTheNoiseGainTable) {
  NsmixInput input = kInput;
  input.denoise_mode = DenoiseMode::kOff;
  NsmixItpOutput output = PatternFilled<NsmixItpOutput>(0x5A);
  NsmixItpOutput expected = output;
  expected.bypass = 1;
  EXPECT_THAT(TranslateNsmixB0(ForeignBlock(), input, output),
              StatusIs(kInvalid, "Invalid TuningBlock!"));
  EXPECT_TRUE(SameBytes(output, expected));

  zm::NsmixTuning no_table = Uniform(0.5f);
  no_table.mutable_dynamic_param()->clear_noise_gain_lut();
  EXPECT_THAT(TranslateNsmixB0(Block(no_table), input, output),
              StatusIs(kInvalid, "Noise gain lut size is wrong: 0"));
  EXPECT_TRUE(SameBytes(output, expected));

  TAVIK_ASSERT_OK(TranslateNsmixB0(Block(Uniform(0.5f)), input, output));
  // 0.5 x 16383 = 8191.5, rounded away from zero, over the entries' spare bits 14 and 15.
  std::fill(std::begin(expected.noise_gain), std::end(expected.noise_gain), uint16_t{0x6000});
  EXPECT_TRUE(SameBytes(output, expected));
}

// --- Checks and their order ---------------------------------------------------------------------

TEST(TranslateNsmixTest, EmptyTuningsAreRefusedBeforeAnyWordInTheirOrder) {
  ScopedLogCapture log;
  NsmixItpOutput output = PatternFilled<NsmixItpOutput>();
  const NsmixItpOutput before = output;
  EXPECT_THAT(TranslateNsmix(ForeignBlock(), kInput, output),
              StatusIs(kInvalid, "Invalid TuningBlock!"));
  EXPECT_TRUE(log.Contains("Incorrect tuning block type: Foreign"));

  // A message with neither part: the dynamic part is looked for first.
  EXPECT_THAT(TranslateNsmix(Block(zm::NsmixTuning()), kInput, output),
              StatusIs(kInvalid, "Tuning data doesn't have region info."));
  zm::NsmixTuning no_static = Uniform(0.5f);
  no_static.clear_static_param();
  EXPECT_THAT(TranslateNsmix(Block(no_static), kInput, output),
              StatusIs(kInvalid, "Tuning data doesn't have static info."));
  EXPECT_TRUE(SameBytes(output, before));
}

TEST(TranslateNsmixTest, EdgeLimitsOfThreeAreRefusedAfterTheBandWordsAndBeforeAnyLimit) {
  NsmixItpOutput output = PatternFilled<NsmixItpOutput>();
  zm::NsmixTuning tuning = Uniform(1.0f);
  tuning.mutable_dynamic_param()->mutable_edge_limits()->RemoveLast();
  EXPECT_THAT(TranslateNsmix(Block(tuning), kInput, output),
              StatusIs(kInvalid, "Edge limit control number is wrong: 3"));
  EXPECT_EQ(output.texture_only_sharp_power_bright, 1023u);  // Word 28 is written.
  EXPECT_EQ(Words(output)[29], kPattern);
  EXPECT_EQ(Words(output)[31], kPattern);
  EXPECT_EQ(Words(output)[32], kPattern);
}

TEST(TranslateNsmixTest, BothLimitListsAreCheckedBeforeEitherIsWritten) {
  NsmixItpOutput output = PatternFilled<NsmixItpOutput>();
  zm::NsmixTuning tuning = Uniform(1.0f);
  tuning.mutable_dynamic_param()->add_texture_limits(1.0f);
  EXPECT_THAT(TranslateNsmix(Block(tuning), kInput, output),
              StatusIs(kInvalid, "Texture limit control number is wrong: 5"));
  EXPECT_EQ(Words(output)[31], kPattern);
  EXPECT_EQ(Words(output)[32], kPattern);
}

TEST(TranslateNsmixTest, NoiseShapeGainsAreCheckedBeforeThresholds) {
  NsmixItpOutput output = PatternFilled<NsmixItpOutput>();
  zm::NsmixTuning tuning = Uniform(1.0f);
  tuning.mutable_dynamic_param()->mutable_noise_shape_gains()->RemoveLast();
  tuning.mutable_dynamic_param()->add_noise_shape_thresholds(1.0f);
  EXPECT_THAT(TranslateNsmix(Block(tuning), kInput, output),
              StatusIs(kInvalid, "Noise shape gains number is wrong: 2"));
  // The limits and both interpolation factors come first.
  EXPECT_EQ(Words(output)[31], 0xFFFFFFFFu);
  EXPECT_EQ(output.edge_limit_func_interp_factor, 16u);
  EXPECT_EQ(output.texture_limit_func_interp_factor, 16u);
  EXPECT_EQ(Words(output)[33], kPattern);

  tuning.mutable_dynamic_param()->add_noise_shape_gains(1.0f);
  EXPECT_THAT(TranslateNsmix(Block(tuning), kInput, output),
              StatusIs(kInvalid, "Noise shape thresholdss number is wrong: 4"));
  EXPECT_EQ(Words(output)[33], kPattern);
  EXPECT_EQ(Words(output)[36], kPattern);
}

// --- Values -------------------------------------------------------------------------------------

TEST(TranslateNsmixTest, OneIsFullScaleInEveryField) {
  NsmixItpOutput output = {};
  TAVIK_ASSERT_OK(TranslateNsmix(Block(Uniform(1.0f)), kInput, output));
  EXPECT_THAT(Words(output),
              ElementsAre(0x00000000, 0x00000000, 0x0BD00FC0, 0x03FF03FF, 0x03FF03FF, 0x03FF03FF,
                          0x03FF03FF, 0x03FF03FF, 0x03FF03FF, 0x03FF03FF, 0x03FF03FF, 0x03FF03FF,
                          0x03FF03FF, 0x03FF03FF, 0x03FF03FF, 0x008080FF, 0x00002020, 0x00000000,
                          0x00002020, 0x00002020, 0x0FFE0FFE, 0x10001000, 0x01FF0000, 0xFFFF0000,
                          0x045803FF, 0x080001FF, 0x03FF03FF, 0x03FF03FF, 0x03FF03FF, 0x00000010,
                          0x00000010, 0xFFFFFFFF, 0xFFFFFFFF, 0x040003FF, 0x040003FF, 0x040003FF,
                          0x03FF001E, 0x000001FF));
  // 1.0 of the base needs bit 12 of its 13.
  EXPECT_EQ(output.flat_region_noise_add_base_dark, 4096u);
  EXPECT_EQ(output.fine_noise_add_despeckle_dark, 0u);
  EXPECT_EQ(output.edge_antihalo_strength_hf, 511u);
}

TEST(TranslateNsmixTest, ZeroStoresTheComplementsAtFullScale) {
  NsmixItpOutput output = {};
  TAVIK_ASSERT_OK(TranslateNsmix(Block(Uniform(0.0f)), kInput, output));
  EXPECT_THAT(Words(output),
              ElementsAre(0x00000000, 0x00000000, 0x0BD00FC0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0,
                          0, 0x07FF07FF, 0, 0, 0, 0, 0x0000CCCC, 0x0000FFFF, 0x04580000, 0x08000200,
                          0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0x0000001E, 0));
}

TEST(TranslateNsmixTest, FlatRegionSharpSuppressIsStoredAsItsComplement) {
  NsmixItpOutput output = {};
  zm::NsmixTuning tuning = Uniform(0.5f);
  tuning.mutable_dynamic_param()->set_flat_region_sharp_suppress_bright(1.0f);
  TAVIK_ASSERT_OK(TranslateNsmix(Block(tuning), kInput, output));
  EXPECT_EQ(output.flat_region_sharp_suppress_bright, 0u);
  tuning.mutable_dynamic_param()->set_flat_region_sharp_suppress_bright(0.0f);
  TAVIK_ASSERT_OK(TranslateNsmix(Block(tuning), kInput, output));
  EXPECT_EQ(output.flat_region_sharp_suppress_bright, 12u);
}

TEST(TranslateNsmixTest, RadialNoiseAddPowerIsSignedAroundAHalf) {
  struct Case {
    float power;
    uint32_t code;
  };
  // 0.5 x 1023 = 511.5 rounds to 512, which is 0; 0 is -512; 1 is 511.
  for (const Case& c :
       {Case{0.5f, 0}, Case{0.0f, 0x200}, Case{1.0f, 511}, Case{2.0f, 511}, Case{-1.0f, 0x200}}) {
    SCOPED_TRACE(c.power);
    NsmixItpOutput output = PatternFilled<NsmixItpOutput>();
    zm::NsmixTuning tuning = Uniform(0.5f);
    tuning.mutable_dynamic_param()->set_radial_noise_add_power(c.power);
    TAVIK_ASSERT_OK(TranslateNsmix(Block(tuning), kInput, output));
    EXPECT_EQ(output.radial_noise_add_power, c.code);
    EXPECT_EQ(output.radial_noise_constant, 2048u);
  }
}

TEST(TranslateNsmixTest, ANoiseShapeGainOfOneLeavesTheThresholdOfItsWordIntact) {
  NsmixItpOutput output = {};
  zm::NsmixTuning tuning = Uniform(1.0f);
  auto* thresholds = tuning.mutable_dynamic_param()->mutable_noise_shape_thresholds();
  thresholds->Set(0, 0.5f);
  thresholds->Set(1, 0.25f);
  thresholds->Set(2, 0.0f);
  TAVIK_ASSERT_OK(TranslateNsmix(Block(tuning), kInput, output));
  EXPECT_EQ(Words(output)[33], (1024u << 16) | 512u);  // 511.5 rounds up.
  EXPECT_EQ(Words(output)[34], (1024u << 16) | 256u);  // 255.75.
  EXPECT_EQ(Words(output)[35], 1024u << 16);
}

TEST(TranslateNsmixTest, LimitsStandCrosswiseInTheirWords) {
  NsmixItpOutput output = {};
  zm::NsmixTuning tuning = Uniform(0.0f);
  auto* edge = tuning.mutable_dynamic_param()->mutable_edge_limits();
  auto* texture = tuning.mutable_dynamic_param()->mutable_texture_limits();
  const float values[] = {0.0f, 1.0f, 0.5f, 0.25f};  // Codes 0, 255, 128, 64.
  for (int i = 0; i < 4; ++i) edge->Set(i, values[i]), texture->Set(3 - i, values[i]);
  TAVIK_ASSERT_OK(TranslateNsmix(Block(tuning), kInput, output));
  // Element 0 low, then 2, then 1, then 3.
  EXPECT_EQ(Words(output)[31], 0x40FF8000u);
  EXPECT_EQ(Words(output)[32], 0x0080FF40u);
  EXPECT_EQ(output.edge_limit_1, 255u);
  EXPECT_EQ(output.texture_limit_0, 64u);
}

TEST(TranslateNsmixTest, ValuesOutsideTheirRangeAreLimitedAndNanIsZero) {
  NsmixItpOutput output = {};
  zm::NsmixTuning tuning = Uniform(0.5f);
  zm::NsmixDynamicParam& d = *tuning.mutable_dynamic_param();
  d.set_wide_edge_suppress_dark_pos(7.0f);
  d.set_wide_edge_suppress_dark_neg(-3.0f);
  d.set_fine_noise_add_despeckle_bright(-1.0f);  // Complement 2.0.
  d.set_grass_texture_power(std::numeric_limits<float>::quiet_NaN());
  d.set_edge_antihalo_extent_dark(std::numeric_limits<float>::quiet_NaN());
  TAVIK_ASSERT_OK(TranslateNsmix(Block(tuning), kInput, output));
  EXPECT_EQ(output.wide_edge_suppress_dark_pos, 1023u);
  EXPECT_EQ(output.wide_edge_suppress_dark_neg, 0u);
  EXPECT_EQ(output.fine_noise_add_despeckle_bright, 2047u);
  EXPECT_EQ(output.grass_texture_power, 0u);
  EXPECT_EQ(output.edge_antihalo_extent_dark, 0u);
}

TEST(TranslateNsmixTest, ExtremeValuesConvertWithoutOverflow) {
  constexpr float kInf = std::numeric_limits<float>::infinity();
  for (float value : {kInf, -kInf, 3e38f, -3e38f, std::numeric_limits<float>::quiet_NaN()}) {
    SCOPED_TRACE(value);
    NsmixItpOutput output = {};
    TAVIK_ASSERT_OK(TranslateNsmixB0(Block(Uniform(value)), kInput, output));
    const bool high = value > 0;
    EXPECT_EQ(output.wide_edge_suppress_dark_pos, high ? 1023u : 0u);
    // The complement of a high value is low, and that of a low one high; NaN stays NaN, 0.
    EXPECT_EQ(output.fine_noise_add_despeckle_dark, high ? 0u : value < 0 ? 2047u : 0u);
    EXPECT_EQ(output.radial_noise_add_power, high ? 511u : 0x200u);
    EXPECT_EQ(output.noise_gain[0], high ? 16383u : 0u);
  }
}

TEST(TranslateNsmixTest, GeometryIsMaskedToFifteenBitsAndMonoAndLowPowerAreFlags) {
  NsmixItpOutput output = PatternFilled<NsmixItpOutput>();
  zm::NsmixTuning tuning = Uniform(0.5f);
  tuning.set_enable(false);
  tuning.mutable_static_param()->set_enable_low_power(true);
  const NsmixInput input = {vosbrine::SENSOR_TYPE_MONO, 0xFFFF, 0x8001, DenoiseMode::kHighQuality};
  TAVIK_ASSERT_OK(TranslateNsmix(Block(tuning), input, output));
  EXPECT_EQ(output.bypass, 1u);
  EXPECT_EQ(output.low_power, 1u);
  EXPECT_EQ(output.mono, 1u);
  EXPECT_EQ(output.image_width, 0x7FFFu);
  EXPECT_EQ(output.image_height, 1u);
}

TEST(TranslateNsmixTest, BitsOutsideTheFieldsSurviveAFullTranslation) {
  NsmixItpOutput output = PatternFilled<NsmixItpOutput>();
  TAVIK_ASSERT_OK(TranslateNsmix(Block(Uniform(0.5f)), kInput, output));
  const HeaderWords words = Words(output);
  for (size_t i = 0; i < words.size(); ++i) {
    EXPECT_EQ(words[i] & ~kTranslatedBits[i], kPattern & ~kTranslatedBits[i]) << "word " << i;
  }
  // A0 has no noise gain table.
  EXPECT_THAT(output.noise_gain, Each(kPatternEntry));
}

// --- Stepping B0 --------------------------------------------------------------------------------

TEST(TranslateNsmixB0Test, AddsTheNoiseGainTableToTheA0Words) {
  zm::NsmixTuning tuning = Uniform(0.5f);
  auto* lut = tuning.mutable_dynamic_param()->mutable_noise_gain_lut();
  lut->Set(0, 0.0f);
  lut->Set(1, 1.0f);
  lut->Set(2, 2.0f);
  lut->Set(3, -1.0f);
  lut->Set(31, 0.25f);
  NsmixItpOutput a0 = PatternFilled<NsmixItpOutput>();
  NsmixItpOutput b0 = PatternFilled<NsmixItpOutput>();
  RecordingTraceSink sink;
  TAVIK_ASSERT_OK(TranslateNsmix(Block(tuning), kInput, a0));
  TAVIK_ASSERT_OK(TranslateNsmixB0(Block(tuning), kInput, b0));
  EXPECT_EQ(Words(a0), Words(b0));
  // 14-bit codes over the pattern's bits 14 and 15 (0x8000 of 0xA5A5).
  EXPECT_EQ(b0.noise_gain[0], 0x8000u);
  EXPECT_EQ(b0.noise_gain[1], 0xBFFFu);
  EXPECT_EQ(b0.noise_gain[2], 0xBFFFu);
  EXPECT_EQ(b0.noise_gain[3], 0x8000u);
  EXPECT_EQ(b0.noise_gain[4], 0xA000u);           // 8192.
  EXPECT_EQ(b0.noise_gain[31], 0x8000u | 4096u);  // 4095.75.
  EXPECT_THAT(sink.spans(), ElementsAre(RecordingTraceSink::Span(5, "TranslateNsmix"),
                                        RecordingTraceSink::Span(5, "TranslateNsmixB0")));
}

TEST(TranslateNsmixB0Test, ATableOfOtherThan32ValuesFailsAfterTheA0Words) {
  zm::NsmixTuning tuning = Uniform(0.5f);
  tuning.mutable_dynamic_param()->mutable_noise_gain_lut()->RemoveLast();
  NsmixItpOutput output = PatternFilled<NsmixItpOutput>();
  EXPECT_THAT(TranslateNsmixB0(Block(tuning), kInput, output),
              StatusIs(kInvalid, "Noise gain lut size is wrong: 31"));
  EXPECT_EQ(output.high_frequency_detector_constant, 30u);
  EXPECT_THAT(output.noise_gain, Each(kPatternEntry));
}

TEST(TranslateNsmixB0Test, CommonFailuresComeFirst) {
  zm::NsmixTuning tuning = Uniform(0.5f);
  tuning.mutable_dynamic_param()->clear_noise_gain_lut();
  tuning.mutable_dynamic_param()->clear_edge_limits();
  NsmixItpOutput output = {};
  EXPECT_THAT(TranslateNsmixB0(Block(tuning), kInput, output),
              StatusIs(kInvalid, "Edge limit control number is wrong: 0"));
}

TEST(TranslateNsmixTest, SampleSetTranslatesForAMonoSensorOfAnotherSize) {
  const NsmixInput input = {vosbrine::SENSOR_TYPE_MONO, 1920, 1080, DenoiseMode::kHighQuality};
  const int leaves = test::ForEachSampleLeaf<zm::NsmixTuning>(
      [&](const ZelTuningBlock<zm::NsmixTuning>& block, const std::string&) {
        NsmixItpOutput output = {};
        TAVIK_EXPECT_OK(TranslateNsmixB0(block, input, output));
        EXPECT_EQ(output.mono, 1u);
        EXPECT_EQ(output.image_width, 1920u);
        EXPECT_EQ(output.radial_sharp_constant, 1112u);
      });
  if (::testing::Test::IsSkipped()) return;
  EXPECT_GT(leaves, 0);
}

}  // namespace
}  // namespace tavik
