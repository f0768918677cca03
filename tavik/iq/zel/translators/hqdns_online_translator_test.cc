#include "tavik/iq/zel/translators/hqdns_online_translator.h"

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
#include "tavik/iq/testing/translator_testing.h"
#include "tavik/iq/zel/translators/internal/hqdns_std_lut.h"
#include "tavik/iq/zel/translators/translator_table.h"
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
using ::testing::ElementsAreArray;

constexpr absl::StatusCode kInvalid = absl::StatusCode::kInvalidArgument;
constexpr uint32_t kPattern = 0xA5A5A5A5;

using HeaderWords = std::array<uint32_t, 25>;

// The 25 bit-field words in front of the tables.
HeaderWords Words(const HqdnsOutput& output) {
  HeaderWords words;
  std::memcpy(words.data(), &output, sizeof(words));
  return words;
}

std::array<uint32_t, 24> Words(const HqdnsFixedOutput& fixed) {
  std::array<uint32_t, 24> words;
  std::memcpy(words.data(), &fixed, sizeof(words));
  return words;
}

vosbrine::ImageResolution Resolution(int32_t width, int32_t height) {
  vosbrine::ImageResolution resolution;
  resolution.set_width(width);
  resolution.set_height(height);
  return resolution;
}

// The values of the sample set's first leaf, which the default column stands for.
zm::HqdnsTuning DefaultValuedTuning() {
  zm::HqdnsTuning tuning;
  tuning.set_enable(true);
  tuning.mutable_static_param()->set_enable_low_power(false);
  zm::HqdnsDynamicParam& d = *tuning.mutable_dynamic_param();
  d.set_shading_param_a(2.44140625f);  // 40000 / 16384.
  d.set_std_factor_r(1.0f);
  d.set_std_factor_g(1.0f);
  d.set_std_factor_b(1.0f);
  for (float v : {0.0005f, 0.0015f, 0.002f, 0.0027f, 0.0039f, 0.0049f, 0.0068f, 0.0095f}) {
    d.add_std_lut_y(v);
    d.add_std_lut_c(v);
  }
  d.set_slope_est_support(8);
  d.set_slope_thresh_high(64);
  d.set_slope_thresh_low(128);
  d.set_residual_coring_reduce(16);
  d.set_residual_limit_reduce(128);
  d.set_max_slope_high(0);
  d.set_max_slope_low(0);
  d.set_g_lpf_for_g_denoise(3);
  d.set_g_lpf_for_rb_denoise(4);
  d.set_rb_lpf_for_g_denoise(4);
  d.set_rb_lpf_for_rb_denoise(4);
  // The thresholds are deprecated in the schema, yet still translated.
#pragma GCC diagnostic push
#pragma GCC diagnostic ignored "-Wdeprecated-declarations"
  d.set_thres_low_g(19);
  d.set_thres_high_g(16);
  d.set_thres_low_r(77);
  d.set_thres_high_r(64);
  d.set_thres_low_b(77);
  d.set_thres_high_b(64);
#pragma GCC diagnostic pop
  d.set_return_noise_g_factor(16);
  d.set_return_noise_r_factor(16);
  d.set_return_noise_b_factor(16);
  d.set_return_noise_limit_g(64);
  d.set_return_noise_limit_r(64);
  d.set_return_noise_limit_b(64);
  return tuning;
}

ZelTuningBlock<zm::HqdnsTuning> Block(zm::HqdnsTuning tuning) {
  return ZelTuningBlock<zm::HqdnsTuning>(std::move(tuning));
}

// A frame's config, owning what it points to.
class Frame {
 public:
  explicit Frame(int32_t width = 4032, int32_t height = 3024)
      : resolution_(Resolution(width, height)) {
    config.bayer_pattern = vosbrine::RGGB;
    config.sensor_type = vosbrine::SENSOR_TYPE_BAYER;
    config.image_resolution = &resolution_;
    config.digital_gain = 1.0f;
    config.wb = &wb;
    config.denoise_mode = DenoiseMode::kHighQuality;
  }
  Frame(const Frame&) = delete;
  Frame& operator=(const Frame&) = delete;

  tavik_api::WhiteBalanceConfig wb = {1.375f, 1.0f, 1.0f, 1.375f};
  HqdnsConfig config;

 private:
  vosbrine::ImageResolution resolution_;
};

// The default column over a record of the pattern.
constexpr HeaderWords kDefaultWords = {0xA5A5A5A4, 0xA5A5A5A4, 0xA5A5BFEF, 0xBD0C7820, 0x8BD08FC0,
                                       0xA5A5A5A5, 0xA5969690, 0xE1000400, 0xA5A49C40, 0xA5A49C40,
                                       0xA5A49C40, 0xA5A49C40, 0xA5A88885, 0xA440A480, 0xA5A5A010,
                                       0xA4040080, 0xA400A400, 0xA5A5A5C3, 0xA5A5A5C4, 0xA010A013,
                                       0xA040A04D, 0xA040A04D, 0xA5820010, 0xA5820010, 0xA5820010};

constexpr uint16_t kAbscissae[] = {0, 64, 128, 256, 640, 1024, 2048, 4095};
constexpr uint16_t kDefaultOrdinates[] = {2, 6, 8, 11, 16, 20, 28, 39};
constexpr uint16_t kDefaultSlopes[] = {128, 64, 48, 27, 21, 16, 11, 11};

// The bits of each word that a full translation writes: all named fields but fixed_a and fixed_b.
constexpr HeaderWords kTranslatedBits = {
    0x00000001, 0x00000001, 0x00004000, 0x3FFFFFFF, 0x3FFF3FFF, 0x00000003, 0x003F3F3F,
    0x7FFFFFFF, 0x0001FFFF, 0x0001FFFF, 0x0001FFFF, 0x0001FFFF, 0x0000F000, 0x03FF03FF,
    0x00000FFF, 0x03FFFFFF, 0x03FF03FF, 0x00000077, 0x00000077, 0x0FFF0FFF, 0x0FFF0FFF,
    0x0FFF0FFF, 0x007FFFFF, 0x007FFFFF, 0x007FFFFF};

// --- Defaults -----------------------------------------------------------------------------------

TEST(GetDefaultHqdnsTest, WritesTheDefaultColumn) {
  HqdnsOutput output = PatternFilled<HqdnsOutput>();
  HqdnsFixedOutput fixed = PatternFilled<HqdnsFixedOutput>();
  TAVIK_ASSERT_OK(GetDefaultHqdns(output, fixed));
  EXPECT_EQ(output.bypass, 0u);
  EXPECT_EQ(output.low_power, 0u);
  EXPECT_EQ(output.fixed_a, 16367u);
  EXPECT_EQ(output.mono, 0u);
  EXPECT_EQ(output.neg_half_width, 0x7820u);
  EXPECT_EQ(output.neg_half_height, 0x7A18u);
  EXPECT_EQ(output.image_width, 4032u);
  EXPECT_EQ(output.image_height, 3024u);
  EXPECT_EQ(output.pixel_order, 1u);
  EXPECT_EQ(output.std_factor_g, 16u);
  EXPECT_EQ(output.std_factor_r, 22u);
  EXPECT_EQ(output.std_factor_b, 22u);
  EXPECT_EQ(output.radial_control, 0x1000400u);
  EXPECT_EQ(output.size_class, 6u);
  EXPECT_EQ(output.fixed_b_0, 8u);
  EXPECT_EQ(output.fixed_b_1, 8u);
  EXPECT_EQ(output.fixed_b_2, 8u);
  EXPECT_EQ(output.slope_est_support, 8u);
  EXPECT_EQ(output.slope_thresh_low, 128u);
  EXPECT_EQ(output.slope_thresh_high, 64u);
  EXPECT_EQ(output.residual_coring_reduce, 16u);
  EXPECT_EQ(output.residual_limit_reduce, 128u);
  EXPECT_EQ(output.residual_limit_reduce_inverse, 64u);
  EXPECT_EQ(output.max_slope_low, 0u);
  EXPECT_EQ(output.max_slope_high, 0u);
  EXPECT_EQ(output.g_lpf_for_g, 3u);
  EXPECT_EQ(output.rb_lpf_for_g, 4u);
  EXPECT_EQ(output.g_lpf_for_rb, 4u);
  EXPECT_EQ(output.rb_lpf_for_rb, 4u);
  EXPECT_EQ(output.thres_low_g, 19u);
  EXPECT_EQ(output.thres_high_g, 16u);
  EXPECT_EQ(output.thres_low_r, 77u);
  EXPECT_EQ(output.thres_high_r, 64u);
  EXPECT_EQ(output.thres_low_b, 77u);
  EXPECT_EQ(output.thres_high_b, 64u);
  EXPECT_EQ(output.return_factor_r, 16u);
  EXPECT_EQ(output.return_limit_r, 64u);
  EXPECT_EQ(output.return_factor_g, 16u);
  EXPECT_EQ(output.return_limit_g, 64u);
  EXPECT_EQ(output.return_factor_b, 16u);
  EXPECT_EQ(output.return_limit_b, 64u);
  EXPECT_THAT(output.shading_a, ElementsAre(0xA5A49C40u, 0xA5A49C40u, 0xA5A49C40u, 0xA5A49C40u));
  EXPECT_THAT(output.std_lut_x_g, ElementsAreArray(kAbscissae));
  EXPECT_THAT(output.std_lut_y_g, ElementsAreArray(kDefaultOrdinates));
  EXPECT_THAT(output.std_slope_g, ElementsAreArray(kDefaultSlopes));
  EXPECT_THAT(output.std_lut_x_rb, ElementsAreArray(kAbscissae));
  EXPECT_THAT(output.std_lut_y_rb, ElementsAreArray(kDefaultOrdinates));
  EXPECT_THAT(output.std_slope_rb, ElementsAreArray(kDefaultSlopes));
  // Spare bits keep the pattern.
  EXPECT_EQ(Words(output), kDefaultWords);
}

TEST(GetDefaultHqdnsTest, SteppingsDifferInFixedWordEightOrNine) {
  HqdnsOutput a0 = PatternFilled<HqdnsOutput>();
  HqdnsOutput b0 = PatternFilled<HqdnsOutput>();
  HqdnsFixedOutput fixed_a0 = PatternFilled<HqdnsFixedOutput>();
  HqdnsFixedOutput fixed_b0 = PatternFilled<HqdnsFixedOutput>();
  TAVIK_ASSERT_OK(GetDefaultHqdns(a0, fixed_a0));
  TAVIK_ASSERT_OK(GetDefaultHqdnsB0(b0, fixed_b0));
  EXPECT_TRUE(SameBytes(a0, b0));
  EXPECT_THAT(Words(fixed_a0),
              ElementsAre(0xBBBBBBBB, 0xBBBBBBBB, 0xA5A58511, 0xA5A5A5A6, 0xA528B2B2, 0xA53FA9A9,
                          0xA5A5A00A, 0xA455500B, 0xA0204000, kPattern, 0xA5A44000, 0xA5A44000,
                          0xA5A44000, 0xA5A44000, 0xA5A5E460, 0xA5A5E460, 0xA5A5A5C4, 0xA5A5A5AF,
                          0xA5A5A5FF, 0x00FF03FF, 0x00FF03FF, 0x003F00FF, 0x000F00FF, 15));
  std::array<uint32_t, 24> expected_b0 = Words(fixed_a0);
  expected_b0[8] = kPattern;
  expected_b0[9] = 0xB0204000;
  EXPECT_EQ(Words(fixed_b0), expected_b0);
}

TEST(GetDefaultHqdnsTest, TracesItselfAloneAsItTranslatesNothing) {
  RecordingTraceSink sink;
  HqdnsOutput output;
  HqdnsFixedOutput fixed;
  TAVIK_ASSERT_OK(GetDefaultHqdns(output, fixed));
  TAVIK_ASSERT_OK(GetDefaultHqdnsB0(output, fixed));
  EXPECT_THAT(sink.spans(), ElementsAre(RecordingTraceSink::Span(5, "GetDefaultHqdns"),
                                        RecordingTraceSink::Span(5, "GetDefaultHqdnsB0")));
}

TEST(GetDefaultHqdnsTest, EqualsTheTranslationOfTheDefaultValues) {
  HqdnsOutput defaults = PatternFilled<HqdnsOutput>();
  HqdnsFixedOutput fixed;
  TAVIK_ASSERT_OK(GetDefaultHqdns(defaults, fixed));
  HqdnsOutput translated = defaults;
  const Frame frame;
  TAVIK_ASSERT_OK(TranslateHqdns(Block(DefaultValuedTuning()), frame.config, translated));
  EXPECT_TRUE(SameBytes(translated, defaults));
}

// --- Geometry -----------------------------------------------------------------------------------

TEST(TranslateHqdnsTest, FullSizeImageGeometry) {
  HqdnsOutput output = PatternFilled<HqdnsOutput>();
  const Frame frame;
  TAVIK_ASSERT_OK(TranslateHqdns(Block(DefaultValuedTuning()), frame.config, output));
  EXPECT_EQ(output.neg_half_width, 0x7820u);
  EXPECT_EQ(output.neg_half_height, 0x7A18u);
  EXPECT_EQ(output.image_width, 4032u);
  EXPECT_EQ(output.image_height, 3024u);
  EXPECT_EQ(output.size_class, 6u);
  EXPECT_EQ(output.radial_control, 0x1000400u);
}

TEST(TranslateHqdnsTest, A31WideImageFailsBeforeWritingAnything) {
  for (const auto& [width, height] : {std::pair{31, 3024}, std::pair{4032, 31}}) {
    HqdnsOutput output = PatternFilled<HqdnsOutput>();
    const HqdnsOutput before = output;
    Frame frame(width, height);
    EXPECT_THAT(TranslateHqdns(Block(DefaultValuedTuning()), frame.config, output),
                StatusIs(kInvalid, "Invalid resolution parameters."));
    EXPECT_TRUE(SameBytes(output, before));
  }
}

TEST(TranslateHqdnsTest, A32By32ImageIsSizeClassZero) {
  HqdnsOutput output = PatternFilled<HqdnsOutput>();
  Frame frame(32, 32);
  TAVIK_ASSERT_OK(TranslateHqdns(Block(DefaultValuedTuning()), frame.config, output));
  EXPECT_EQ(output.size_class, 0u);
  EXPECT_EQ(output.neg_half_width, 0x7FF0u);  // -16.
  EXPECT_EQ(output.neg_half_height, 0x7FF0u);
  // Bit 31 of word 7 is the caller's.
  EXPECT_EQ(Words(output)[7] >> 31, 1u);
}

TEST(TranslateHqdnsTest, SizeClassIsTheFirstBoundNotBelowTheSmallerSide) {
  struct Case {
    int32_t width;
    int32_t height;
    uint32_t size_class;
  };
  for (const Case& c :
       {Case{486, 9000, 0}, Case{9000, 487, 1}, Case{1920, 1080, 3}, Case{3888, 3888, 6},
        Case{3889, 5000, 7}, Case{5498, 8000, 7}, Case{6000, 7000, 7}, Case{16383, 16383, 7}}) {
    SCOPED_TRACE(testing::Message() << c.width << "x" << c.height);
    HqdnsOutput output = PatternFilled<HqdnsOutput>();
    Frame frame(c.width, c.height);
    TAVIK_ASSERT_OK(TranslateHqdns(Block(DefaultValuedTuning()), frame.config, output));
    EXPECT_EQ(output.size_class, c.size_class);
  }
}

TEST(TranslateHqdnsTest, OddSidesHalveDownward) {
  HqdnsOutput output = {};
  Frame frame(33, 35);
  TAVIK_ASSERT_OK(TranslateHqdns(Block(DefaultValuedTuning()), frame.config, output));
  EXPECT_EQ(output.neg_half_width, 0x7FF0u);   // -16.
  EXPECT_EQ(output.neg_half_height, 0x7FEFu);  // -17.
}

TEST(TranslateHqdnsTest, ImageBeyondTheStageFieldsOrNoneIsRefusedUntouched) {
  HqdnsOutput output = PatternFilled<HqdnsOutput>();
  const HqdnsOutput before = output;
  Frame frame(16384, 3024);
  EXPECT_THAT(TranslateHqdns(Block(DefaultValuedTuning()), frame.config, output),
              StatusIs(kInvalid, "Image resolution exceeds the stage's 16383 pixels: 16384x3024"));
  frame.config.image_resolution = nullptr;
  EXPECT_THAT(TranslateHqdns(Block(DefaultValuedTuning()), frame.config, output),
              StatusIs(kInvalid, "Config data doesn't have image_resolution."));
  EXPECT_TRUE(SameBytes(output, before));
}

TEST(TranslateHqdnsTest, MonoAndPixelOrderFollowTheFrame) {
  HqdnsOutput output = PatternFilled<HqdnsOutput>();
  Frame frame;
  frame.config.sensor_type = vosbrine::SENSOR_TYPE_MONO;
  frame.config.bayer_pattern = vosbrine::BGGR;
  TAVIK_ASSERT_OK(TranslateHqdns(Block(DefaultValuedTuning()), frame.config, output));
  EXPECT_EQ(output.mono, 1u);
  EXPECT_EQ(output.pixel_order, 2u);
  EXPECT_EQ(output.fixed_a, 0x25A5u);  // Not translated: the pattern's.
}

// --- Denoise off --------------------------------------------------------------------------------

TEST(TranslateHqdnsTest, DenoiseOffWritesGeometryAndBypassWithoutAnyTuning) {
  const ForeignBlock foreign;
  for (const TuningBlock* block :
       {static_cast<const TuningBlock*>(&foreign), &TranslatorFrame::AbsentBlock()}) {
    ScopedLogCapture log;
    HqdnsOutput output = PatternFilled<HqdnsOutput>();
    Frame frame(1920, 1080);
    frame.config.denoise_mode = DenoiseMode::kOff;
    TAVIK_ASSERT_OK(TranslateHqdns(*block, frame.config, output));
    EXPECT_EQ(output.bypass, 1u);
    EXPECT_EQ(output.image_width, 1920u);
    EXPECT_EQ(output.image_height, 1080u);
    EXPECT_EQ(output.size_class, 3u);
    // Nothing but bypass and the geometry changed, and the block was not even looked at.
    HeaderWords expected;
    expected.fill(kPattern);
    expected[0] = kPattern | 1u;
    expected[2] = kPattern & ~0x4000u;
    expected[3] = (kPattern & 0xC0000000u) | (0x7DE4u << 15) | 0x7C40u;  // -540 and -960.
    expected[4] = (kPattern & 0xC000C000u) | (1080u << 16) | 1920u;
    expected[5] = (kPattern & ~3u) | 1u;
    expected[7] = (kPattern & 0x80000000u) | (3u << 28) | 0x1000400u;
    EXPECT_EQ(Words(output), expected);
    EXPECT_FALSE(log.Contains("Incorrect tuning block type"));
  }
}

// --- Checks and their order ---------------------------------------------------------------------

TEST(TranslateHqdnsTest, BlockOfAnotherTypeFailsAfterTheGeometry) {
  ScopedLogCapture log;
  HqdnsOutput output = PatternFilled<HqdnsOutput>();
  const Frame frame;
  EXPECT_THAT(TranslateHqdns(ForeignBlock(), frame.config, output),
              StatusIs(kInvalid, "Invalid TuningBlock!"));
  EXPECT_TRUE(log.Contains("Incorrect tuning block type: Foreign"));
  EXPECT_EQ(output.image_width, 4032u);
  EXPECT_EQ(output.bypass, 1u);  // The pattern's.
}

TEST(TranslateHqdnsTest, StaticPartIsCheckedBeforeBypassAndBeforeTheDynamicPart) {
  HqdnsOutput output = PatternFilled<HqdnsOutput>();
  const Frame frame;
  zm::HqdnsTuning empty;
  empty.set_enable(true);
  EXPECT_THAT(TranslateHqdns(Block(empty), frame.config, output),
              StatusIs(kInvalid, "Tuning data doesn't have static info."));
  EXPECT_EQ(output.bypass, 1u);  // Untouched.
  EXPECT_EQ(output.image_width, 4032u);
}

TEST(TranslateHqdnsTest, MissingDynamicPartFailsAfterBypassAndLowPower) {
  HqdnsOutput output = PatternFilled<HqdnsOutput>();
  const Frame frame;
  zm::HqdnsTuning tuning = DefaultValuedTuning();
  tuning.clear_dynamic_param();
  tuning.mutable_static_param()->set_enable_low_power(true);
  EXPECT_THAT(TranslateHqdns(Block(tuning), frame.config, output),
              StatusIs(kInvalid, "Tuning data doesn't have dynamic info."));
  EXPECT_EQ(output.bypass, 0u);
  EXPECT_EQ(output.low_power, 1u);
  EXPECT_EQ(output.shading_a[0], kPattern);
}

TEST(TranslateHqdnsTest, GreenTableOfOtherThanEightValuesFailsAfterTheShading) {
  HqdnsOutput output = PatternFilled<HqdnsOutput>();
  const Frame frame;
  zm::HqdnsTuning tuning = DefaultValuedTuning();
  tuning.mutable_dynamic_param()->mutable_std_lut_y()->RemoveLast();
  EXPECT_THAT(TranslateHqdns(Block(tuning), frame.config, output),
              StatusIs(kInvalid, "Invalid input lut size"));
  EXPECT_EQ(output.shading_a[3], 0xA5A49C40u);
  EXPECT_EQ(output.std_lut_x_g[7], 0xA5A5u);
  EXPECT_EQ(output.std_lut_y_g[0], 0xA5A5u);
}

TEST(TranslateHqdnsTest, ChromaTableOfOtherThanEightValuesFailsAfterTheGreenTable) {
  HqdnsOutput output = PatternFilled<HqdnsOutput>();
  const Frame frame;
  zm::HqdnsTuning tuning = DefaultValuedTuning();
  tuning.mutable_dynamic_param()->add_std_lut_c(0.5f);
  EXPECT_THAT(TranslateHqdns(Block(tuning), frame.config, output),
              StatusIs(kInvalid, "Invalid input lut size"));
  EXPECT_THAT(output.std_lut_y_g, ElementsAreArray(kDefaultOrdinates));
  EXPECT_EQ(output.std_lut_x_rb[0], 0xA5A5u);
  EXPECT_EQ(output.std_slope_g[0], 0xA5A5u);  // Slopes come after both tables.
}

TEST(TranslateHqdnsTest, MissingWhiteBalanceFailsAfterTheSlopes) {
  HqdnsOutput output = PatternFilled<HqdnsOutput>();
  Frame frame;
  frame.config.wb = nullptr;
  EXPECT_THAT(TranslateHqdns(Block(DefaultValuedTuning()), frame.config, output),
              StatusIs(kInvalid, "Config data doesn't have WB info."));
  EXPECT_THAT(output.std_slope_rb, ElementsAreArray(kDefaultSlopes));
  EXPECT_EQ(Words(output)[6], kPattern);
}

TEST(TranslateHqdnsTest, ResidualLimitReduceBelowOneFailsAfterTheFactors) {
  HqdnsOutput output = PatternFilled<HqdnsOutput>();
  const Frame frame;
  zm::HqdnsTuning tuning = DefaultValuedTuning();
  tuning.mutable_dynamic_param()->set_residual_limit_reduce(0.999f);
  EXPECT_THAT(TranslateHqdns(Block(tuning), frame.config, output),
              StatusIs(kInvalid, "residual_limit_reduce is invalid."));
  EXPECT_EQ(output.std_factor_r, 22u);
  EXPECT_EQ(Words(output)[12], kPattern);
}

TEST(TranslateHqdnsTest, NanResidualLimitReducePasses) {
  HqdnsOutput output = PatternFilled<HqdnsOutput>();
  const Frame frame;
  zm::HqdnsTuning tuning = DefaultValuedTuning();
  tuning.mutable_dynamic_param()->set_residual_limit_reduce(
      std::numeric_limits<float>::quiet_NaN());
  TAVIK_ASSERT_OK(TranslateHqdns(Block(tuning), frame.config, output));
  // No finite code: both fields wrap to 0.
  EXPECT_EQ(output.residual_limit_reduce, 0u);
  EXPECT_EQ(output.residual_limit_reduce_inverse, 0u);
}

TEST(SetStdSlopeTest, AbscissaeThatDoNotRiseAreRefusedByTable) {
  HqdnsOutput output = {};
  std::copy(std::begin(kAbscissae), std::end(kAbscissae), output.std_lut_x_g);
  std::copy(std::begin(kAbscissae), std::end(kAbscissae), output.std_lut_x_rb);
  output.std_lut_x_g[4] = 256;
  EXPECT_THAT(hqdns_internal::SetStdSlope(output), StatusIs(kInvalid, "std_lut_x_g is invalid."));
  output.std_lut_x_g[4] = 640;
  output.std_lut_x_rb[7] = 100;
  EXPECT_THAT(hqdns_internal::SetStdSlope(output), StatusIs(kInvalid, "std_lut_x_rb is invalid."));
  // The green slopes were written before the red and blue table failed.
  EXPECT_THAT(output.std_slope_g, ElementsAre(0, 0, 0, 0, 0, 0, 0, 0));
}

// --- Values -------------------------------------------------------------------------------------

TEST(TranslateHqdnsTest, ShadingIsTruncatedAndLimitedInAllFourWords) {
  struct Case {
    float a;
    uint32_t code;
  };
  for (const Case& c : {Case{2.6f, 42598}, Case{7.99f, 130908}, Case{8.0f, 131071},
                        Case{100.0f, 131071}, Case{-1.0f, 0}}) {
    SCOPED_TRACE(c.a);
    HqdnsOutput output = PatternFilled<HqdnsOutput>();
    const Frame frame;
    zm::HqdnsTuning tuning = DefaultValuedTuning();
    tuning.mutable_dynamic_param()->set_shading_param_a(c.a);
    TAVIK_ASSERT_OK(TranslateHqdns(Block(tuning), frame.config, output));
    const uint32_t word = (kPattern & ~0x1FFFFu) | c.code;
    EXPECT_THAT(output.shading_a, ElementsAre(word, word, word, word));
  }
}

TEST(TranslateHqdnsTest, AFallingTableGivesNegativeSlopesInTwosComplement) {
  HqdnsOutput output = PatternFilled<HqdnsOutput>();
  const Frame frame;
  zm::HqdnsTuning tuning = DefaultValuedTuning();
  auto* lut = tuning.mutable_dynamic_param()->mutable_std_lut_y();
  lut->Clear();
  for (float v : {1.0f, 0.75f, 0.5f, 0.25f, 0.125f, 0.0625f, 0.03125f, 0.0f}) lut->Add(v);
  TAVIK_ASSERT_OK(TranslateHqdns(Block(tuning), frame.config, output));
  // 0.5 x 4095 = 2047.5 rounds away from zero.
  EXPECT_THAT(output.std_lut_y_g, ElementsAre(4095, 3071, 2048, 1024, 512, 256, 128, 0));
  // -1024 x 2048 / 64 = -32768; -1023 x 32; -1024 x 16; -512 x 2048 / 384 = -2730.67;
  // -256 x 2048 / 384 = -1365.33; -128 x 2; -128 x 2048 / 2047 = -128.06; then repeated.
  EXPECT_THAT(output.std_slope_g,
              ElementsAre(0x8000, 0x8020, 0xC000, 0xF555, 0xFAAB, 0xFF00, 0xFF80, 0xFF80));
  EXPECT_THAT(output.std_slope_rb, ElementsAreArray(kDefaultSlopes));
}

TEST(TranslateHqdnsTest, OrdinatesAreLimitedToTwelveBits) {
  HqdnsOutput output = {};
  const Frame frame;
  zm::HqdnsTuning tuning = DefaultValuedTuning();
  auto* lut = tuning.mutable_dynamic_param()->mutable_std_lut_c();
  lut->Set(0, -0.1f);
  lut->Set(7, 1.5f);
  TAVIK_ASSERT_OK(TranslateHqdns(Block(tuning), frame.config, output));
  EXPECT_EQ(output.std_lut_y_rb[0], 0u);
  EXPECT_EQ(output.std_lut_y_rb[7], 4095u);
}

TEST(TranslateHqdnsTest, FactorsFollowTheWhiteBalanceTruncatedAndLimited) {
  HqdnsOutput output = PatternFilled<HqdnsOutput>();
  Frame frame;
  frame.wb = {2.0f, 1.5f, 2.5f, 0.5f};
  zm::HqdnsTuning tuning = DefaultValuedTuning();
  tuning.mutable_dynamic_param()->set_std_factor_r(0.85f);
  tuning.mutable_dynamic_param()->set_std_factor_b(1.2f);
  TAVIK_ASSERT_OK(TranslateHqdns(Block(tuning), frame.config, output));
  EXPECT_EQ(output.std_factor_r, 27u);  // 2 x 0.85 x 16 = 27.2.
  EXPECT_EQ(output.std_factor_g, 32u);  // 1 x 2 x 16.
  EXPECT_EQ(output.std_factor_b, 9u);   // 0.5 x 1.2 x 16 = 9.6.

  frame.wb = {10.0f, -1.0f, -1.0f, 3.9375f};
  TAVIK_ASSERT_OK(TranslateHqdns(Block(DefaultValuedTuning()), frame.config, output));
  EXPECT_EQ(output.std_factor_r, 63u);
  EXPECT_EQ(output.std_factor_g, 0u);
  EXPECT_EQ(output.std_factor_b, 63u);  // 3.9375 x 16 = 63.
}

TEST(TranslateHqdnsTest, ResidualLimitReduceOfOneHasAnInverseOf8192) {
  HqdnsOutput output = {};
  const Frame frame;
  zm::HqdnsTuning tuning = DefaultValuedTuning();
  tuning.mutable_dynamic_param()->set_residual_limit_reduce(1.0f);
  TAVIK_ASSERT_OK(TranslateHqdns(Block(tuning), frame.config, output));
  EXPECT_EQ(output.residual_limit_reduce, 1u);
  EXPECT_EQ(output.residual_limit_reduce_inverse, 8192u);
  tuning.mutable_dynamic_param()->set_residual_limit_reduce(3.0f);
  TAVIK_ASSERT_OK(TranslateHqdns(Block(tuning), frame.config, output));
  EXPECT_EQ(output.residual_limit_reduce_inverse, 2731u);  // 2730.67.
}

TEST(TranslateHqdnsTest, ReturnedNoiseIsTruncatedWhileTheOthersRound) {
  HqdnsOutput output = {};
  const Frame frame;
  zm::HqdnsTuning tuning = DefaultValuedTuning();
  tuning.mutable_dynamic_param()->set_return_noise_g_factor(16.9f);
  tuning.mutable_dynamic_param()->set_max_slope_low(16.9f);
  TAVIK_ASSERT_OK(TranslateHqdns(Block(tuning), frame.config, output));
  EXPECT_EQ(output.return_factor_g, 16u);
  EXPECT_EQ(output.max_slope_low, 17u);
}

TEST(TranslateHqdnsTest, RoundedFieldsAreMaskedNotLimited) {
  HqdnsOutput output = {};
  const Frame frame;
  zm::HqdnsTuning tuning = DefaultValuedTuning();
  zm::HqdnsDynamicParam& d = *tuning.mutable_dynamic_param();
  d.set_slope_est_support(17);   // 4 bits: 1.
  d.set_g_lpf_for_g_denoise(9);  // 3 bits: 1.
  d.set_max_slope_high(-1);      // 10 bits: 1023.
#pragma GCC diagnostic push
#pragma GCC diagnostic ignored "-Wdeprecated-declarations"
  d.set_thres_low_r(4096.4f);  // 12 bits: 0.
#pragma GCC diagnostic pop
  d.set_return_noise_limit_b(-1);  // 12 bits: 4095.
  TAVIK_ASSERT_OK(TranslateHqdns(Block(tuning), frame.config, output));
  EXPECT_EQ(output.slope_est_support, 1u);
  EXPECT_EQ(output.g_lpf_for_g, 1u);
  EXPECT_EQ(output.max_slope_high, 1023u);
  EXPECT_EQ(output.thres_low_r, 0u);
  EXPECT_EQ(output.return_limit_b, 4095u);
}

TEST(TranslateHqdnsTest, ReturnedNoiseWordsHoldRedThenGreenThenBlue) {
  HqdnsOutput output = {};
  const Frame frame;
  zm::HqdnsTuning tuning = DefaultValuedTuning();
  zm::HqdnsDynamicParam& d = *tuning.mutable_dynamic_param();
  d.set_return_noise_r_factor(1);
  d.set_return_noise_limit_r(2);
  d.set_return_noise_g_factor(3);
  d.set_return_noise_limit_g(4);
  d.set_return_noise_b_factor(5);
  d.set_return_noise_limit_b(6);
  TAVIK_ASSERT_OK(TranslateHqdns(Block(tuning), frame.config, output));
  EXPECT_EQ(Words(output)[22], (2u << 11) | 1u);
  EXPECT_EQ(Words(output)[23], (4u << 11) | 3u);
  EXPECT_EQ(Words(output)[24], (6u << 11) | 5u);
}

TEST(TranslateHqdnsTest, BitsOutsideTheFieldsSurviveAFullTranslation) {
  HqdnsOutput output = PatternFilled<HqdnsOutput>();
  const Frame frame;
  zm::HqdnsTuning tuning = DefaultValuedTuning();
  tuning.set_enable(false);
  tuning.mutable_static_param()->set_enable_low_power(true);
  TAVIK_ASSERT_OK(TranslateHqdns(Block(tuning), frame.config, output));
  EXPECT_EQ(output.bypass, 1u);
  EXPECT_EQ(output.low_power, 1u);
  const HeaderWords words = Words(output);
  for (size_t i = 0; i < words.size(); ++i) {
    EXPECT_EQ(words[i] & ~kTranslatedBits[i], kPattern & ~kTranslatedBits[i]) << "word " << i;
  }
}

TEST(TranslateHqdnsTest, SteppingsTranslateAlikeUnderTheirOwnTraces) {
  const Frame frame;
  const auto block = Block(DefaultValuedTuning());
  HqdnsOutput a0 = PatternFilled<HqdnsOutput>();
  HqdnsOutput b0 = PatternFilled<HqdnsOutput>();
  RecordingTraceSink sink;
  TAVIK_ASSERT_OK(TranslateHqdns(block, frame.config, a0));
  TAVIK_ASSERT_OK(TranslateHqdnsB0(block, frame.config, b0));
  EXPECT_TRUE(SameBytes(a0, b0));
  EXPECT_THAT(sink.spans(), ElementsAre(RecordingTraceSink::Span(5, "TranslateHqdns"),
                                        RecordingTraceSink::Span(5, "TranslateHqdnsB0")));

  HqdnsOutput failed = PatternFilled<HqdnsOutput>();
  Frame small(31, 31);
  EXPECT_THAT(TranslateHqdnsB0(block, small.config, failed),
              StatusIs(kInvalid, "Invalid resolution parameters."));
}

TEST(TranslateHqdnsTest, ExtremeValuesConvertWithoutOverflow) {
  constexpr float kInf = std::numeric_limits<float>::infinity();
  const float nan = std::numeric_limits<float>::quiet_NaN();
  struct Case {
    float value;
    uint32_t shading;
    uint16_t ordinate;
    uint32_t factor;
  };
  for (const Case& c :
       {Case{kInf, 131071, 4095, 63}, Case{3e38f, 131071, 4095, 63}, Case{nan, 0, 0, 0}}) {
    SCOPED_TRACE(c.value);
    zm::HqdnsTuning tuning = DefaultValuedTuning();
    test::SetEveryFloat(tuning, c.value);
    Frame frame;
    frame.wb = {c.value, c.value, c.value, c.value};
    HqdnsOutput output = {};
    TAVIK_ASSERT_OK(TranslateHqdns(Block(tuning), frame.config, output));
    EXPECT_EQ(output.shading_a[0], c.shading);
    EXPECT_EQ(output.std_lut_y_g[0], c.ordinate);
    EXPECT_EQ(output.std_slope_g[0], 0u);
    EXPECT_EQ(output.std_factor_r, c.factor);
    EXPECT_EQ(output.residual_limit_reduce_inverse, 0u);
    EXPECT_EQ(output.return_factor_g, 0u);  // No finite integer part: wrapped to 0.
  }
  for (float value : {-kInf, -3e38f}) {
    zm::HqdnsTuning tuning = DefaultValuedTuning();
    test::SetEveryFloat(tuning, value);
    const Frame frame;
    HqdnsOutput output = {};
    EXPECT_THAT(TranslateHqdns(Block(tuning), frame.config, output),
                StatusIs(kInvalid, "residual_limit_reduce is invalid."));
    EXPECT_EQ(output.shading_a[0], 0u);
  }
}

TEST(TranslateHqdnsTest, SampleSetTranslatesForAMonoFrameAndWithDenoiseOff) {
  Frame frame;
  frame.config.sensor_type = vosbrine::SENSOR_TYPE_MONO;
  const int leaves = test::ForEachSampleLeaf<zm::HqdnsTuning>(
      [&](const ZelTuningBlock<zm::HqdnsTuning>& block, const std::string&) {
        HqdnsOutput output = {};
        frame.config.denoise_mode = DenoiseMode::kHighQuality;
        TAVIK_EXPECT_OK(TranslateHqdns(block, frame.config, output));
        EXPECT_EQ(output.mono, 1u);
        frame.config.denoise_mode = DenoiseMode::kOff;
        TAVIK_EXPECT_OK(TranslateHqdnsB0(block, frame.config, output));
        EXPECT_EQ(output.bypass, 1u);
      });
  if (::testing::Test::IsSkipped()) return;
  EXPECT_GT(leaves, 0);
}

}  // namespace
}  // namespace tavik
