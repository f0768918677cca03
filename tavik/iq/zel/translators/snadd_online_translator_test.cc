#include "tavik/iq/zel/translators/snadd_online_translator.h"

#include <array>
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
using ::testing::Each;
using ::testing::ElementsAre;

constexpr absl::StatusCode kInvalid = absl::StatusCode::kInvalidArgument;
constexpr uint32_t kPattern = 0xA5A5A5A5;
constexpr uint16_t kPatternEntry = 0xA5A5;

using HeaderWords = std::array<uint32_t, 11>;

HeaderWords Words(const SnaddItpOutput& output) {
  HeaderWords words;
  std::memcpy(words.data(), &output, sizeof(words));
  return words;
}

std::array<uint32_t, 34> Words(const SnaddItpFixedOutput& fixed) {
  std::array<uint32_t, 34> words;
  std::memcpy(words.data(), &fixed, sizeof(words));
  return words;
}

vosbrine::Roi Roi(int32_t left, int32_t top, int32_t width, int32_t height) {
  vosbrine::Roi roi;
  roi.set_left(left);
  roi.set_top(top);
  roi.set_width(width);
  roi.set_height(height);
  return roi;
}

// The schema's defaults, switches off.
zm::SnaddTuning DefaultValuedTuning() {
  zm::SnaddTuning tuning;
  tuning.set_enable(true);
  tuning.mutable_static_param();
  zm::SnaddDynamicParam& d = *tuning.mutable_dynamic_param();
  d.set_extend_skin_map_by_texture_index(0.2039f);
  d.set_extend_skin_map_by_edge_index(0.62745f);
  d.set_extend_skin_b_map_by_texture_index(0.03922f);
  d.set_extend_skin_b_map_by_edge_index(0.47843f);
  d.set_skin_sharpening_reduction(0.3871f);
  d.set_skin_noise_add_reduction(0.19355f);
  d.set_skin_b_sharpening_reduction(0.3871f);
  d.set_skin_b_noise_add_reduction(0.19355f);
  d.set_extend_sky_map_by_texture_index(0.3804f);
  d.set_extend_sky_map_by_edge_index(0.75686f);
  d.set_sky_sharpening_reduction(0.2903f);
  d.set_sky_noise_add_reduction(0.2903f);
  d.set_extend_grass_map_by_texture_index(0.89412f);
  d.set_extend_grass_map_by_edge_index(0.29412f);
  d.set_grass_sharpening_power(0.32258f);
  d.set_grass_noise_add_power(0.2258f);
  d.set_radial_face_margin_width_ratio(0.2f);
  d.set_radial_face_margin_height_ratio(0.3f);
  d.set_face_brightness_gain(0.25f);
  return tuning;
}

ZelTuningBlock<zm::SnaddTuning> Block(zm::SnaddTuning tuning) {
  return ZelTuningBlock<zm::SnaddTuning>(std::move(tuning));
}

// A frame of 4032 x 3024 with its regions, padded to ten, owning what its input points to.
class Frame {
 public:
  explicit Frame(std::vector<vosbrine::Roi> regions = {}, size_t count = kSnaddFaceRegionCount)
      : regions_(std::move(regions)) {
    regions_.resize(count);
    resolution_.set_width(4032);
    resolution_.set_height(3024);
    input.face_regions = regions_;
    input.image_resolution = &resolution_;
  }
  Frame(const Frame&) = delete;
  Frame& operator=(const Frame&) = delete;

  SnaddInput input;

 private:
  std::vector<vosbrine::Roi> regions_;
  vosbrine::ImageResolution resolution_;
};

// The default tuning's words over a record of the pattern.
constexpr HeaderWords kDefaultWords = {0xA5A5A5A4, 0xA5A5A5A4, 0xA7A0A734, 0xA70A868C,
                                       0xA58CA77A, 0xA5A5A586, 0xADC1A761, 0xA5A58989,
                                       0xA74BA71B, 0xA5A5878A, 0xA40037BD};

// --- Defaults -----------------------------------------------------------------------------------

TEST(GetDefaultSnaddTest, TranslatesTheDefaultTuningForTenEmptyRegions) {
  SnaddItpOutput output = PatternFilled<SnaddItpOutput>();
  SnaddItpFixedOutput fixed = PatternFilled<SnaddItpFixedOutput>();
  TAVIK_ASSERT_OK(GetDefaultSnadd(output, fixed));
  EXPECT_EQ(Words(output), kDefaultWords);
  EXPECT_EQ(output.extend_skin_map_by_texture_index, 52u);   // 51.99.
  EXPECT_EQ(output.skin_sharpening_reduction, 12u);          // 12.0.
  EXPECT_EQ(output.extend_grass_map_by_texture_index, 27u);  // (1 - 0.89412) x 255 = 27.0.
  EXPECT_EQ(output.grass_sharpening_power, 10u);
  EXPECT_THAT(output.face_region_left, Each(0));
  EXPECT_THAT(output.face_region_bottom, Each(0));
  EXPECT_THAT(output.face_margin_right, Each(0));
  EXPECT_THAT(output.face_sharp_levels, Each(0));  // (0 - 0.5) x 64 is limited to 0.
  EXPECT_THAT(output.face_noise_levels, Each(0));
  EXPECT_THAT(output.face_brightness_levels, Each(0));
  EXPECT_EQ(output.face_brightness_gain_code, 256u);
  EXPECT_THAT(output.face_margin_grade_x, Each(0u));
  EXPECT_THAT(output.face_margin_grade_y, Each(0u));
  EXPECT_THAT(Words(fixed), ElementsAre(0xA5A5A580, 0xA5A5A5A0, 0xA5A5A800, 0xA5A5A000, 0xA5A5A584,
                                        0xA5A5A400, 0xA5A5A7BE, 0x114B2540, 0xA5A58382, 0xA5A5A5A1,
                                        0xA5A5A000, kPattern, 0xA4000000, 0xA5A5A001, 0, 0, 0, 0, 0,
                                        0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0));
}

TEST(GetDefaultSnaddTest, TracesTheTranslationInsideItsOwnSpan) {
  RecordingTraceSink sink;
  SnaddItpOutput output;
  SnaddItpFixedOutput fixed;
  TAVIK_ASSERT_OK(GetDefaultSnadd(output, fixed));
  EXPECT_THAT(sink.spans(), ElementsAre(RecordingTraceSink::Span(5, "TranslateSnadd"),
                                        RecordingTraceSink::Span(5, "GetDefaultSnadd")));
}

// --- Edge mode off and the checks ---------------------------------------------------------------

TEST(TranslateSnaddTest, EdgeModeOffSetsBypassAloneWithoutTuningOrRegions) {
  ScopedLogCapture log;
  SnaddItpOutput output = PatternFilled<SnaddItpOutput>(0x5A);
  SnaddItpOutput expected = output;
  expected.bypass = 1;
  TAVIK_ASSERT_OK(TranslateSnadd(SnaddInput{}, ForeignBlock(), output, EdgeMode::kOff));
  EXPECT_TRUE(SameBytes(output, expected));
  EXPECT_FALSE(log.Contains("Incorrect tuning block type"));
}

TEST(TranslateSnaddTest, InputIsCheckedBeforeTheTuningAndNothingIsWritten) {
  SnaddItpOutput output = PatternFilled<SnaddItpOutput>();
  const SnaddItpOutput before = output;
  EXPECT_THAT(TranslateSnadd(SnaddInput{}, ForeignBlock(), output, EdgeMode::kHighQuality),
              StatusIs(kInvalid, "Input face regions is null."));
  Frame frame;
  frame.input.image_resolution = nullptr;
  EXPECT_THAT(TranslateSnadd(frame.input, ForeignBlock(), output, EdgeMode::kHighQuality),
              StatusIs(kInvalid, "Input image resolution is null."));
  EXPECT_TRUE(SameBytes(output, before));
}

TEST(TranslateSnaddTest, EmptyTuningsAreRefusedInOrderWritingNothing) {
  ScopedLogCapture log;
  const Frame frame;
  SnaddItpOutput output = PatternFilled<SnaddItpOutput>();
  const SnaddItpOutput before = output;
  EXPECT_THAT(TranslateSnadd(frame.input, ForeignBlock(), output, EdgeMode::kHighQuality),
              StatusIs(kInvalid, "Invalid TuningBlock!"));
  EXPECT_TRUE(log.Contains("Incorrect tuning block type: Foreign"));
  EXPECT_THAT(TranslateSnadd(frame.input, Block(zm::SnaddTuning()), output, EdgeMode::kHighQuality),
              StatusIs(kInvalid, "Tuning data doesn't have region info."));
  zm::SnaddTuning no_static = DefaultValuedTuning();
  no_static.clear_static_param();
  EXPECT_THAT(TranslateSnadd(frame.input, Block(no_static), output, EdgeMode::kHighQuality),
              StatusIs(kInvalid, "Tuning data doesn't have static info."));
  EXPECT_TRUE(SameBytes(output, before));
}

// --- Face regions -------------------------------------------------------------------------------

TEST(TranslateSnaddTest, NineRegionsFailAtTheMarginsAfterRectanglesAndGrades) {
  Frame frame({Roi(10, 20, 30, 40)}, 9);
  zm::SnaddTuning tuning = DefaultValuedTuning();
  tuning.mutable_dynamic_param()->set_radial_face_margin_gain_x(1.0f);
  SnaddItpOutput output = PatternFilled<SnaddItpOutput>();
  EXPECT_THAT(TranslateSnadd(frame.input, Block(tuning), output, EdgeMode::kHighQuality),
              StatusIs(kInvalid, "Face region lengths are wrong."));
  // The words of the table, but for word 10's fixed bits, which come last.
  EXPECT_EQ(output.extend_sky_map_by_edge_index, 193u);
  EXPECT_EQ(output.face_fixed, 0x1A5A5u);
  EXPECT_EQ(output.face_spare, 5u);
  EXPECT_THAT(output.face_region_left, ElementsAre(10, 0, 0, 0, 0, 0, 0, 0, 0, 0));
  EXPECT_THAT(output.face_region_right, ElementsAre(40, 0, 0, 0, 0, 0, 0, 0, 0, 0));
  EXPECT_THAT(output.face_margin_grade_x, Each(0xFFFFFu));
  EXPECT_THAT(output.face_margin_left, Each(kPatternEntry));
  EXPECT_THAT(output.face_sharp_levels, Each(kPatternEntry));
  EXPECT_EQ(output.face_brightness_gain_code, 0x5A5u);
}

TEST(TranslateSnaddTest, ElevenRegionsGiveTheFirstTenRectanglesThenFail) {
  std::vector<vosbrine::Roi> regions;
  for (int i = 0; i < 11; ++i) regions.push_back(Roi(100 * i, 50 * i, 10, 20));
  Frame frame(regions, 11);
  SnaddItpOutput output = PatternFilled<SnaddItpOutput>();
  EXPECT_THAT(
      TranslateSnadd(frame.input, Block(DefaultValuedTuning()), output, EdgeMode::kHighQuality),
      StatusIs(kInvalid, "Face region lengths are wrong."));
  EXPECT_THAT(output.face_region_left, ElementsAre(0, 100, 200, 300, 400, 500, 600, 700, 800, 900));
  EXPECT_THAT(output.face_region_bottom,
              ElementsAre(20, 70, 120, 170, 220, 270, 320, 370, 420, 470));
}

TEST(TranslateSnaddTest, TenZeroRegionsPassWithEveryRectangleZero) {
  const Frame frame;
  SnaddItpOutput output = PatternFilled<SnaddItpOutput>();
  TAVIK_ASSERT_OK(
      TranslateSnadd(frame.input, Block(DefaultValuedTuning()), output, EdgeMode::kHighQuality));
  for (const uint16_t* table :
       {output.face_region_left, output.face_region_top, output.face_region_right,
        output.face_region_bottom, output.face_margin_left, output.face_margin_top,
        output.face_margin_right, output.face_margin_bottom}) {
    EXPECT_THAT((std::array<uint16_t, 10>{table[0], table[1], table[2], table[3], table[4],
                                          table[5], table[6], table[7], table[8], table[9]}),
                Each(0));
  }
}

TEST(TranslateSnaddTest, RectanglesAndMarginsOfRealFaces) {
  // A face in the middle, one that touches the bottom right corner, one at the top left.
  Frame frame({Roi(1000, 800, 400, 500), Roi(3900, 2900, 132, 124), Roi(0, 0, 100, 100)});
  SnaddItpOutput output = PatternFilled<SnaddItpOutput>();
  TAVIK_ASSERT_OK(
      TranslateSnadd(frame.input, Block(DefaultValuedTuning()), output, EdgeMode::kHighQuality));
  EXPECT_THAT(output.face_region_left, ElementsAre(1000, 3900, 0, 0, 0, 0, 0, 0, 0, 0));
  EXPECT_THAT(output.face_region_top, ElementsAre(800, 2900, 0, 0, 0, 0, 0, 0, 0, 0));
  EXPECT_THAT(output.face_region_right, ElementsAre(1400, 4032, 100, 0, 0, 0, 0, 0, 0, 0));
  EXPECT_THAT(output.face_region_bottom, ElementsAre(1300, 3024, 100, 0, 0, 0, 0, 0, 0, 0));
  // Margins of 0.2 x width and 0.3 x height: 80 and 150; 26.4 and 37.2; 20 and 30.
  EXPECT_THAT(output.face_margin_left, ElementsAre(920, 3874, 0, 0, 0, 0, 0, 0, 0, 0));
  EXPECT_THAT(output.face_margin_top, ElementsAre(650, 2863, 0, 0, 0, 0, 0, 0, 0, 0));
  EXPECT_THAT(output.face_margin_right, ElementsAre(1480, 4032, 120, 0, 0, 0, 0, 0, 0, 0));
  EXPECT_THAT(output.face_margin_bottom, ElementsAre(1450, 3024, 130, 0, 0, 0, 0, 0, 0, 0));
}

TEST(TranslateSnaddTest, GradesFillAllTenEntriesLimitedToTwentyBits) {
  const Frame frame;
  zm::SnaddTuning tuning = DefaultValuedTuning();
  tuning.mutable_dynamic_param()->set_radial_face_margin_gain_x(0.5f);
  tuning.mutable_dynamic_param()->set_radial_face_margin_gain_y(2.0f);
  SnaddItpOutput output = {};
  TAVIK_ASSERT_OK(TranslateSnadd(frame.input, Block(tuning), output, EdgeMode::kHighQuality));
  EXPECT_THAT(output.face_margin_grade_x, Each(524288u));  // 524287.5.
  EXPECT_THAT(output.face_margin_grade_y, Each(0xFFFFFu));
  tuning.mutable_dynamic_param()->set_radial_face_margin_gain_x(-1.0f);
  TAVIK_ASSERT_OK(TranslateSnadd(frame.input, Block(tuning), output, EdgeMode::kHighQuality));
  EXPECT_THAT(output.face_margin_grade_x, Each(0u));
}

// --- Face controls ------------------------------------------------------------------------------

TEST(TranslateSnaddTest, FaceLevelsAreOneForAllFaces) {
  struct Case {
    float level;
    uint16_t sharp_or_noise;
    uint16_t brightness;
  };
  for (const Case& c : {Case{0.25f, 0, 8}, Case{1.5f, 64, 32}, Case{0.75f, 16, 24},
                        Case{0.5f, 0, 16}, Case{-1.0f, 0, 0}}) {
    SCOPED_TRACE(c.level);
    const Frame frame;
    zm::SnaddTuning tuning = DefaultValuedTuning();
    tuning.mutable_dynamic_param()->set_face_sharp_level(c.level);
    tuning.mutable_dynamic_param()->set_face_noise_level(c.level);
    tuning.mutable_dynamic_param()->set_face_brightness_level(c.level);
    SnaddItpOutput output = {};
    TAVIK_ASSERT_OK(TranslateSnadd(frame.input, Block(tuning), output, EdgeMode::kHighQuality));
    EXPECT_THAT(output.face_sharp_levels, Each(c.sharp_or_noise));
    EXPECT_THAT(output.face_noise_levels, Each(c.sharp_or_noise));
    EXPECT_THAT(output.face_brightness_levels, Each(c.brightness));
  }
}

TEST(TranslateSnaddTest, BrightnessGainIsQ10UpToOne) {
  const Frame frame;
  zm::SnaddTuning tuning = DefaultValuedTuning();
  tuning.mutable_dynamic_param()->set_face_brightness_gain(1.0f);
  SnaddItpOutput output = PatternFilled<SnaddItpOutput>();
  TAVIK_ASSERT_OK(TranslateSnadd(frame.input, Block(tuning), output, EdgeMode::kHighQuality));
  EXPECT_EQ(output.face_brightness_gain_code, 1024u);
  tuning.mutable_dynamic_param()->set_face_brightness_gain(3.0f);
  TAVIK_ASSERT_OK(TranslateSnadd(frame.input, Block(tuning), output, EdgeMode::kHighQuality));
  EXPECT_EQ(output.face_brightness_gain_code, 1024u);
}

TEST(TranslateSnaddTest, LevelControlsZeroTheSkinReductionsAndSetTheirFlags) {
  const Frame frame;
  zm::SnaddTuning tuning = DefaultValuedTuning();
  zm::SnaddStaticParam& s = *tuning.mutable_static_param();
  s.set_enable_face_beautification(true);
  s.set_enable_face_beautification_sharp_level_control(true);
  SnaddItpOutput output = PatternFilled<SnaddItpOutput>();
  TAVIK_ASSERT_OK(TranslateSnadd(frame.input, Block(tuning), output, EdgeMode::kHighQuality));
  EXPECT_EQ(output.skin_sharpening_reduction, 0u);
  EXPECT_EQ(output.skin_noise_add_reduction, 6u);
  EXPECT_EQ(output.skin_b_sharpening_reduction, 12u);  // Skin B keeps its own.
  EXPECT_EQ(Words(output)[10], 0xA40637BDu);           // Bits 17 and 18.

  s.set_enable_face_beautification_sharp_level_control(false);
  s.set_enable_face_beautification_noise_level_control(true);
  s.set_enable_face_beautification_brightness_gain_control(true);
  s.set_face_brightness_gain_luminance_only(true);
  s.set_enable_low_power(true);
  TAVIK_ASSERT_OK(TranslateSnadd(frame.input, Block(tuning), output, EdgeMode::kHighQuality));
  EXPECT_EQ(output.skin_sharpening_reduction, 12u);
  EXPECT_EQ(output.skin_noise_add_reduction, 0u);
  EXPECT_EQ(output.enable_low_power, 1u);
  EXPECT_EQ(Words(output)[10], 0xA51A37BDu);  // Bits 17, 19, 20 and 24.
}

TEST(TranslateSnaddTest, GrassTextureIndexIsStoredAsItsComplement) {
  const Frame frame;
  zm::SnaddTuning tuning = DefaultValuedTuning();
  SnaddItpOutput output = {};
  tuning.mutable_dynamic_param()->set_extend_grass_map_by_texture_index(0.0f);
  TAVIK_ASSERT_OK(TranslateSnadd(frame.input, Block(tuning), output, EdgeMode::kHighQuality));
  EXPECT_EQ(output.extend_grass_map_by_texture_index, 255u);
  tuning.mutable_dynamic_param()->set_extend_grass_map_by_texture_index(1.0f);
  TAVIK_ASSERT_OK(TranslateSnadd(frame.input, Block(tuning), output, EdgeMode::kHighQuality));
  EXPECT_EQ(output.extend_grass_map_by_texture_index, 0u);
  EXPECT_EQ(output.extend_grass_map_by_edge_index, 75u);  // The edge index is not complemented.
}

TEST(TranslateSnaddTest, ExtremeValuesConvertWithoutOverflow) {
  constexpr float kInf = std::numeric_limits<float>::infinity();
  constexpr int32_t kMax = std::numeric_limits<int32_t>::max();
  // Regions reaching beyond 32 bits and the 16-bit entries keep their low bits.
  Frame frame({Roi(kMax, kMax, kMax, kMax), Roi(-5, -5, 10, 10)});
  for (float value : {kInf, -kInf, 3e38f, -3e38f, std::numeric_limits<float>::quiet_NaN()}) {
    SCOPED_TRACE(value);
    zm::SnaddTuning tuning = DefaultValuedTuning();
    test::SetEveryFloat(tuning, value);
    SnaddItpOutput output = {};
    TAVIK_ASSERT_OK(TranslateSnadd(frame.input, Block(tuning), output, EdgeMode::kHighQuality));
    const bool high = value > 0;
    EXPECT_EQ(output.extend_skin_map_by_texture_index, high ? 255u : 0u);
    EXPECT_EQ(output.extend_grass_map_by_texture_index, value < 0 ? 255u : 0u);
    EXPECT_EQ(output.face_margin_grade_x[0], high ? 0xFFFFFu : 0u);
    EXPECT_EQ(output.face_sharp_levels[0], high ? 64u : 0u);
    EXPECT_EQ(output.face_brightness_gain_code, high ? 1024u : 0u);
    EXPECT_EQ(output.face_region_left[0], 0xFFFFu);
    EXPECT_EQ(output.face_region_right[0], 0xFFFEu);  // 2^32 - 2, low 16 bits.
    EXPECT_EQ(output.face_region_left[1], 0xFFFBu);   // -5.
    EXPECT_LE(output.face_margin_right[0], 4032u);
    EXPECT_LE(output.face_margin_bottom[1], 3024u);
  }
}

TEST(TranslateSnaddTest, BitsOutsideTheFieldsSurviveAndFixedBitsAreOredIn) {
  const Frame frame;
  zm::SnaddTuning tuning = DefaultValuedTuning();
  tuning.set_enable(false);
  SnaddItpOutput output = PatternFilled<SnaddItpOutput>(0);
  TAVIK_ASSERT_OK(TranslateSnadd(frame.input, Block(tuning), output, EdgeMode::kHighQuality));
  // Over zeros: the codes and the fixed bits alone.
  EXPECT_THAT(Words(output),
              ElementsAre(1u, 0u, 0x07A00734u, 0x070A060Cu, 0x000C077Au, 6u, 0x08C10761u,
                          0x00000909u, 0x074B071Bu, 0x0000070Au, 0x000037BDu));
  const uint32_t face_gain_word = [&] {
    uint32_t word;
    std::memcpy(&word, reinterpret_cast<const char*>(&output) + 264, 4);
    return word;
  }();
  EXPECT_EQ(face_gain_word, 256u);

  // Over the pattern: the spare bits keep it.
  output = PatternFilled<SnaddItpOutput>();
  TAVIK_ASSERT_OK(TranslateSnadd(frame.input, Block(tuning), output, EdgeMode::kHighQuality));
  HeaderWords expected = kDefaultWords;
  expected[0] |= 1u;
  EXPECT_EQ(Words(output), expected);
}

TEST(TranslateSnaddTest, TheTableFormPadsTheFramesFacesToTen) {
  const vosbrine::Roi faces[] = {Roi(100, 200, 300, 400), Roi(1000, 1000, 50, 60)};
  TranslatorFrame frame;
  const auto block = Block(DefaultValuedTuning());
  frame.blocks[kZelBlockPosition<zm::SnaddTuning>] = &block;
  frame.facts.face_regions = faces;
  SnaddItpOutput output = PatternFilled<SnaddItpOutput>();
  void* records[] = {&output};
  TAVIK_ASSERT_OK(translator_forms::kSnadd.translate(frame, records));
  EXPECT_THAT(output.face_region_right, ElementsAre(400, 1050, 0, 0, 0, 0, 0, 0, 0, 0));
  EXPECT_THAT(output.face_margin_top, ElementsAre(80, 982, 0, 0, 0, 0, 0, 0, 0, 0));

  frame.facts.edge_mode = EdgeMode::kOff;
  output = PatternFilled<SnaddItpOutput>(0);
  TAVIK_ASSERT_OK(translator_forms::kSnadd.translate(frame, records));
  EXPECT_EQ(Words(output)[0], 1u);
  EXPECT_EQ(Words(output)[2], 0u);
}

TEST(TranslateSnaddTest, SampleSetTranslatesWithTwoFaces) {
  const Frame frame({Roi(1500, 900, 600, 700), Roi(3700, 100, 400, 500)});
  const int leaves = test::ForEachSampleLeaf<zm::SnaddTuning>(
      [&](const ZelTuningBlock<zm::SnaddTuning>& block, const std::string&) {
        SnaddItpOutput output = {};
        TAVIK_EXPECT_OK(TranslateSnadd(frame.input, block, output, EdgeMode::kHighQuality));
        EXPECT_EQ(output.face_region_right[1], 4100u);
        EXPECT_EQ(output.face_margin_right[1], 4032u);  // Limited to the image.
      });
  if (::testing::Test::IsSkipped()) return;
  EXPECT_GT(leaves, 0);
}

}  // namespace
}  // namespace tavik
