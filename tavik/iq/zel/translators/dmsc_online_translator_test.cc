#include "tavik/iq/zel/translators/dmsc_online_translator.h"

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
using ::testing::ElementsAre;
using ::testing::ElementsAreArray;

constexpr absl::StatusCode kInvalid = absl::StatusCode::kInvalidArgument;

using OutputWords = std::array<uint32_t, 31>;

OutputWords Words(const DmscOutput& output) {
  OutputWords words;
  std::memcpy(words.data(), &output, sizeof(output));
  return words;
}

// An enabled tuning whose dynamic fields are all zero.
zm::DmscTuning ZeroTuning() {
  zm::DmscTuning tuning;
  tuning.set_enable(true);
  tuning.mutable_static_param();
  tuning.mutable_dynamic_param();
  return tuning;
}

// `tuning` with dynamic field number `number` set to `value`.
zm::DmscTuning WithField(zm::DmscTuning tuning, int number, float value) {
  zm::DmscDynamicParam& dynamic = *tuning.mutable_dynamic_param();
  const google::protobuf::FieldDescriptor* field =
      dynamic.GetDescriptor()->FindFieldByNumber(number);
  dynamic.GetReflection()->SetFloat(&dynamic, field, value);
  return tuning;
}

ZelTuningBlock<zm::DmscTuning> Block(zm::DmscTuning tuning) {
  return ZelTuningBlock<zm::DmscTuning>(std::move(tuning));
}

DmscInput Input(vosbrine::BayerPattern pattern = vosbrine::RGGB,
                vosbrine::SensorType type = vosbrine::SENSOR_TYPE_BAYER, int32_t width = 4032) {
  return DmscInput{pattern, type, width};
}

// The 31 words of the default tuning's translation, from a zeroed record.
constexpr uint32_t kDefaultWords[31] = {
    0x0u,        // Enabled.
    0x0u,        // Full power.
    0x0u,        // Bayer sensor.
    0xAu,        // hpf_power: 0.3226 x 31 = 10.0006.
    0x6001040u,  // Weights 64 (0.5039 x 127 = 63.995), 16 (0.126 x 127 = 16.002), 0; mode 6.
    0x80010u,    // merge_dir_contrast_threshold: 0.0625 x 256 = 16; mode 8.
    0x140040u,   // desat_strength 64; alias_detect_threshold: 0.0049 x 4095 = 20.07.
    0x8u,        // desat_limit: 0.5 x 16.
    0x8014u,     // extract_sat_power: 0.0784 x 255 = 19.99; bit 15.
    0xCu,        // green_detect_power: 0.0471 x 255 = 12.01.
    0x63228u,    // 40 (0.1569 x 255), 50 (0.1961 x 255), 6 (0.0236 x 255).
    0x14u,       // extract_dir_hv_threshold: 0.0049 x 4095.
    0x220u,      // add_colors_saturation_power: 0.1255 x 255 = 32.002; 2 at bit 8.
    0x1000100u,  // clean_f gains: 0.2502 x 1023 = 255.95, two to a word.
    0x1000100u, 0x1000100u, 0x1000100u, 0x1000100u, 0x1000100u,
    0x1000100u,  // clean_f thresholds: 0.0625 x 4095 = 255.94.
    0x1000100u, 0x1000100u,
    0x100u,      // clean_f_gain_grid_dir.
    0xC000C0u,   // fsharp gains: 0.1877 x 1023 = 192.02.
    0x400040u,   // fsharp thresholds: 0.0156 x 4095 = 63.88.
    0xC000C0u,   // ogsharp gains.
    0x400040u,   // ogsharp thresholds.
    0xC000080u,  // Edge desaturation limits: 0.03125 x 4096 = 128, 0.75 x 4096 = 3072.
    0x100u,      // edge_desat_red_preserve_gain.
    0x1u,        // RGGB's code.
    0xFC0u,      // Width 4032.
};

// Where each dynamic field lands, by field number, and its code at 1.0 (its full scale).
struct Placement {
  int number;
  int word;
  int shift;
  uint32_t full_scale;
};
constexpr Placement kPlacements[] = {
    {1, 3, 0, 31},      {13, 4, 0, 127},    {14, 4, 8, 127},    {15, 4, 16, 127},
    {2, 5, 0, 256},     {3, 6, 0, 127},     {4, 6, 16, 4095},   {5, 7, 0, 16},
    {6, 8, 0, 255},     {7, 9, 0, 255},     {8, 10, 0, 255},    {9, 10, 8, 255},
    {10, 10, 16, 255},  {11, 11, 0, 4095},  {12, 12, 0, 255},   {16, 13, 0, 1023},
    {17, 13, 16, 1023}, {18, 14, 0, 1023},  {19, 14, 16, 1023}, {20, 15, 0, 1023},
    {21, 15, 16, 1023}, {22, 16, 0, 1023},  {23, 16, 16, 1023}, {24, 17, 0, 1023},
    {25, 17, 16, 1023}, {26, 18, 0, 1023},  {27, 18, 16, 1023}, {28, 19, 0, 4095},
    {29, 19, 16, 4095}, {30, 20, 0, 4095},  {31, 20, 16, 4095}, {32, 21, 0, 4095},
    {33, 21, 16, 4095}, {34, 22, 0, 1023},  {35, 23, 0, 1023},  {36, 23, 16, 1023},
    {37, 24, 0, 4095},  {38, 24, 16, 4095}, {39, 25, 0, 1023},  {40, 25, 16, 1023},
    {41, 26, 0, 4095},  {42, 26, 16, 4095}, {43, 27, 0, 4096},  {44, 27, 16, 4096},
    {45, 28, 0, 1023},
};
static_assert(std::size(kPlacements) == 45);

// --- Defaults ----------------------------------------------------------------------------------

TEST(GetDefaultDmscTest, DefaultsAreTheDefaultTuningsCodes) {
  DmscOutput output = {};
  DmscFixedOutput fixed = PatternFilled<DmscFixedOutput>();
  TAVIK_ASSERT_OK(GetDefaultDmsc(output, fixed));
  EXPECT_THAT(Words(output), ElementsAreArray(kDefaultWords));
  EXPECT_THAT(fixed.reserved, ElementsAre(0u, 0u, 0u, 0u));
}

TEST(GetDefaultDmscTest, DefaultsKeepTheSpareBitsOfEveryWord) {
  DmscOutput output = PatternFilled<DmscOutput>();
  DmscFixedOutput fixed;
  TAVIK_ASSERT_OK(GetDefaultDmsc(output, fixed));
  EXPECT_THAT(Words(output),
              ElementsAre(0xA5A5A5A4u, 0xA5A5A5A4u, 0xA5A5A5A4u, 0xA5A5A5AAu, 0xA68090C0u,
                          0xA508A410u, 0xA014A5C0u, 0xA5A5A5A8u, 0xA5A58014u, 0xCu, 0xA5063228u,
                          0xA5A5A014u, 0xA5000220u, 0xA500A500u, 0xA500A500u, 0xA500A500u,
                          0xA500A500u, 0xA500A500u, 0xA500A500u, 0xA100A100u, 0xA100A100u,
                          0xA100A100u, 0xA5A5A500u, 0xA4C0A4C0u, 0xA040A040u, 0xA4C0A4C0u,
                          0xA040A040u, 0xAC00A080u, 0xA5A5A500u, 0xA5A5A5A5u, 0xA5A58FC0u));
}

TEST(GetDefaultDmscTest, TracesItselfAroundTheTranslation) {
  RecordingTraceSink sink;
  DmscOutput output;
  DmscFixedOutput fixed;
  TAVIK_ASSERT_OK(GetDefaultDmsc(output, fixed));
  using Span = RecordingTraceSink::Span;
  EXPECT_THAT(sink.spans(), ElementsAre(Span(5, "TranslateDmsc"), Span(5, "GetDefaultDmsc")));
}

// --- TranslateDmsc -----------------------------------------------------------------------------

TEST(TranslateDmscTest, EachFieldLandsInItsOwnBitsAtItsFullScale) {
  DmscOutput baseline = {};
  TAVIK_ASSERT_OK(TranslateDmsc(Block(ZeroTuning()), Input(), baseline));
  const OutputWords before = Words(baseline);
  for (const Placement& placement : kPlacements) {
    SCOPED_TRACE(testing::Message() << "field " << placement.number);
    DmscOutput output = {};
    TAVIK_ASSERT_OK(
        TranslateDmsc(Block(WithField(ZeroTuning(), placement.number, 1.0f)), Input(), output));
    OutputWords expected = before;
    expected[placement.word] |= placement.full_scale << placement.shift;
    EXPECT_THAT(Words(output), ElementsAreArray(expected));
  }
}

TEST(TranslateDmscTest, FullScalesOf256And16And4096TakeTheirWiderFields) {
  zm::DmscTuning tuning = WithField(ZeroTuning(), 2, 1.0f);  // merge_dir_contrast_threshold.
  tuning = WithField(std::move(tuning), 5, 1.0f);            // desat_limit.
  tuning = WithField(std::move(tuning), 43, 1.0f);           // edge_desat_limit_p.
  DmscOutput output = {};
  TAVIK_ASSERT_OK(TranslateDmsc(Block(tuning), Input(), output));
  EXPECT_EQ(output.merge_dir_contrast_threshold, 256u);  // 9 bits.
  EXPECT_EQ(output.desat_limit, 16u);                    // 5 bits.
  EXPECT_EQ(output.edge_desat_limit_p, 4096u);           // 13 bits.
}

TEST(TranslateDmscTest, CodesAreLimitedToZeroAndTheirScale) {
  zm::DmscTuning tuning = WithField(ZeroTuning(), 1, 2.0f);
  tuning = WithField(std::move(tuning), 7, 100.0f);  // The whole-word field too.
  tuning = WithField(std::move(tuning), 13, -1.0f);
  tuning = WithField(std::move(tuning), 44, 1.5f);
  DmscOutput output = {};
  TAVIK_ASSERT_OK(TranslateDmsc(Block(tuning), Input(), output));
  EXPECT_EQ(output.hpf_power, 31u);
  EXPECT_EQ(output.green_detect_power, 255u);
  EXPECT_EQ(output.gradient_weight, 0u);
  EXPECT_EQ(output.edge_desat_limit_m, 4096u);
}

TEST(TranslateDmscTest, BitElevenOfWordEightIsNotTheStagesToSet) {
  DmscOutput output = PatternFilled<DmscOutput>(0xFF);
  TAVIK_ASSERT_OK(TranslateDmsc(Block(ZeroTuning()), Input(), output));
  // Bits 8-15 hold 0x80 but for bit 11, which stays as found.
  EXPECT_EQ(Words(output)[8], 0xFFFF8800u);
  output = PatternFilled<DmscOutput>(0x00);
  TAVIK_ASSERT_OK(TranslateDmsc(Block(ZeroTuning()), Input(), output));
  EXPECT_EQ(Words(output)[8], 0x8000u);
}

TEST(TranslateDmscTest, SwitchesPatternSensorAndWidth) {
  zm::DmscTuning tuning = ZeroTuning();
  tuning.set_enable(false);
  tuning.mutable_static_param()->set_enable_low_power(true);
  DmscOutput output = {};
  TAVIK_ASSERT_OK(TranslateDmsc(
      Block(tuning), Input(vosbrine::BGGR, vosbrine::SENSOR_TYPE_MONO, 0x8000 | 1920), output));
  EXPECT_EQ(output.bypass, 1u);
  EXPECT_EQ(output.enable_low_power, 1u);
  EXPECT_EQ(output.mono_sensor, 1u);
  EXPECT_EQ(output.pixel_order, 2u);  // BGGR.
  EXPECT_EQ(output.bayer_width, 1920u);
  TAVIK_ASSERT_OK(TranslateDmsc(Block(ZeroTuning()),
                                Input(vosbrine::GBRG, vosbrine::SENSOR_TYPE_QUAD_BAYER), output));
  EXPECT_EQ(output.mono_sensor, 0u);
  EXPECT_EQ(output.pixel_order, 3u);  // GBRG.
}

TEST(TranslateDmscTest, NoStaticPartFailsBeforeAnythingIsWritten) {
  zm::DmscTuning tuning = ZeroTuning();
  tuning.clear_static_param();
  DmscOutput output = PatternFilled<DmscOutput>();
  EXPECT_THAT(TranslateDmsc(Block(tuning), Input(), output),
              StatusIs(kInvalid, "Tuning data doesn't have static info."));
  EXPECT_TRUE(SameBytes(output, PatternFilled<DmscOutput>()));
}

TEST(TranslateDmscTest, RegionInfoIsCheckedFirst) {
  zm::DmscTuning tuning = ZeroTuning();
  tuning.clear_static_param();
  tuning.clear_dynamic_param();
  DmscOutput output = PatternFilled<DmscOutput>();
  EXPECT_THAT(TranslateDmsc(Block(tuning), Input(), output),
              StatusIs(kInvalid, "Tuning data doesn't have region info."));
  EXPECT_THAT(TranslateDmsc(Block(zm::DmscTuning()), Input(), output),
              StatusIs(kInvalid, "Tuning data doesn't have region info."));
  EXPECT_TRUE(SameBytes(output, PatternFilled<DmscOutput>()));
}

// A block of another type is the caller's mistake; it is refused, not read, and nothing is
// written.
TEST(TranslateDmscTest, BlockOfAnotherTypeIsRefusedLikeEverywhereElse) {
  ScopedLogCapture log;
  DmscOutput output = PatternFilled<DmscOutput>();
  EXPECT_THAT(TranslateDmsc(ForeignBlock(), Input(), output),
              StatusIs(kInvalid, "Invalid TuningBlock!"));
  EXPECT_TRUE(log.Contains("Incorrect tuning block type: Foreign, expected: DmscTuning"));
  EXPECT_TRUE(SameBytes(output, PatternFilled<DmscOutput>()));
}

// --- The sample tuning set ---------------------------------------------------------------------

TEST(DmscSampleSetTest, EveryLeafTranslatesForAMonoFrameOfAnotherWidth) {
  const int leaves = test::ForEachSampleLeaf<zm::DmscTuning>(
      [&](const ZelTuningBlock<zm::DmscTuning>& block, const std::string&) {
        DmscOutput output = {};
        TAVIK_EXPECT_OK(
            TranslateDmsc(block, Input(vosbrine::GRBG, vosbrine::SENSOR_TYPE_MONO, 1920), output));
        EXPECT_EQ(output.mono_sensor, 1u);
        EXPECT_EQ(output.pixel_order, 0u);
        EXPECT_EQ(output.bayer_width, 1920u);
        EXPECT_GT(output.hpf_power, 0u);
      });
  if (::testing::Test::IsSkipped()) return;
  EXPECT_GT(leaves, 0);
}

}  // namespace
}  // namespace tavik
