#include "tavik/iq/zel/translators/dg_online_translator.h"

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
#include "tavik/base/trace.h"
#include "tavik/iq/testing/blc_tunings.h"
#include "tavik/iq/testing/translator_testing.h"
#include "tavik/iq/zel/zel_tuning_block.h"

namespace tavik {
namespace {

using ::tavik::test::ScopedLogCapture;
using ::tavik::test::StatusIs;
using ::tavik_registers::zel::g3aa::DgConfigValue;
using ::testing::ElementsAre;
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

DgConfigValue Filled() { return PatternFilled<DgConfigValue>(); }

std::array<uint64_t, 2> Words(const DgConfigValue& value) {
  std::array<uint64_t, 2> words;
  std::memcpy(words.data(), &value, sizeof(value));
  return words;
}

TEST(GetDefaultDgTest, GainsAre69905AndWordOneHighBitsSurvive) {
  DgConfigValue value = Filled();
  TAVIK_ASSERT_OK(GetDefaultDg(value));
  EXPECT_EQ(value.enable, 1u);
  EXPECT_EQ(value.pixel_order, 0u);
  EXPECT_EQ(value.gain_r, 69905u);
  EXPECT_EQ(value.gain_gr, 69905u);
  EXPECT_EQ(value.GainGb(), 69905u);
  EXPECT_EQ(value.gain_b, 69905u);
  EXPECT_THAT(Words(value), ElementsAre(0x8888088888088889u, 0xA5A5A5A008888808u));
}

TEST(GetDefaultDgTest, TracesItselfAroundTheTranslation) {
  RecordingTraceSink sink;
  DgConfigValue value;
  TAVIK_ASSERT_OK(GetDefaultDg(value));
  EXPECT_THAT(sink.spans(), ElementsAre(std::pair<int, std::string>(5, "TranslateDg"),
                                        std::pair<int, std::string>(5, "GetDefaultDg")));
}

TEST(TranslateDgTest, BlockOfAnotherTypeIsInvalid) {
  ScopedLogCapture log;
  DgConfigValue value = Filled();
  const DgConfigValue before = value;
  EXPECT_THAT(TranslateDg(ForeignBlock(), DgInput{vosbrine::RGGB, 10, 1.0f}, value),
              StatusIs(kInvalid, "Invalid TuningBlock!"));
  EXPECT_TRUE(log.Contains("Incorrect tuning block type: Foreign"));
  EXPECT_TRUE(SameBytes(value, before));
}

TEST(TranslateDgTest, MissingDynamicParamIsRefusedButStaticParamIsNotNeeded) {
  DgConfigValue value = Filled();
  const DgConfigValue before = value;
  zm::BlcTuning no_dynamic = UniformBlcTuning(64);
  no_dynamic.clear_dynamic_param();
  EXPECT_THAT(TranslateDg(BlcBlock(no_dynamic), DgInput{vosbrine::RGGB, 10, 1.0f}, value),
              StatusIs(kInvalid, "BlcTuning proto doesn't have dynamic param!"));
  EXPECT_TRUE(SameBytes(value, before));

  zm::BlcTuning no_static = UniformBlcTuning(64);
  no_static.clear_static_param();
  TAVIK_ASSERT_OK(TranslateDg(BlcBlock(no_static), DgInput{vosbrine::RGGB, 10, 1.0f}, value));
  EXPECT_EQ(value.gain_r, 69905u);
}

TEST(TranslateDgTest, DepthIsTestedBeforeEmptyArrays) {
  DgConfigValue value = Filled();
  const DgConfigValue before = value;
  EXPECT_THAT(TranslateDg(BlcBlock(MakeBlcTuning({}, {}, {}, {})),
                          DgInput{vosbrine::RGGB, 16, 1.0f}, value),
              StatusIs(kInvalid, "Sensor bit depth is larger than g3aa pipeline!16"));
  EXPECT_TRUE(SameBytes(value, before));
}

TEST(TranslateDgTest, AnyEmptyArrayIsRefused) {
  const std::vector<float> one = {64};
  for (int empty = 0; empty < 4; ++empty) {
    SCOPED_TRACE(empty);
    DgConfigValue value = Filled();
    const DgConfigValue before = value;
    zm::BlcTuning tuning = MakeBlcTuning(
        empty == 0 ? std::vector<float>{} : one, empty == 1 ? std::vector<float>{} : one,
        empty == 2 ? std::vector<float>{} : one, empty == 3 ? std::vector<float>{} : one);
    EXPECT_THAT(TranslateDg(BlcBlock(tuning), DgInput{vosbrine::RGGB, 15, 1.0f}, value),
                StatusIs(kInvalid, "Offsets can't be empty in blc dynamic parameters."));
    EXPECT_TRUE(SameBytes(value, before));
  }
}

TEST(TranslateDgTest, OffsetTestComesBeforeTheGainTest) {
  DgConfigValue value = Filled();
  const DgConfigValue before = value;
  // 2000 x 32 = 64000.
  EXPECT_THAT(TranslateDg(BlcBlock(MakeBlcTuning({64}, {64}, {2000}, {64})),
                          DgInput{vosbrine::RGGB, 10, 0.5f}, value),
              StatusIs(kInvalid, "Offset is too large to calculate stretch gain! 64000"));
  EXPECT_THAT(TranslateDg(BlcBlock(UniformBlcTuning(64)), DgInput{vosbrine::RGGB, 10, 0.5f}, value),
              StatusIs(kInvalid, "Digital gain is lower than 1!"));
  EXPECT_THAT(
      TranslateDg(BlcBlock(UniformBlcTuning(64)),
                  DgInput{vosbrine::RGGB, 10, std::numeric_limits<float>::quiet_NaN()}, value),
      StatusIs(kInvalid, "Digital gain is lower than 1!"));
  EXPECT_TRUE(SameBytes(value, before));
}

TEST(TranslateDgTest, DepthFifteenPassesWithScaleOneAndFourteenHasScaleTwo) {
  DgConfigValue value = {};
  // 32768 / (32768 - 64) x 65536 = 65664.25.
  TAVIK_ASSERT_OK(
      TranslateDg(BlcBlock(UniformBlcTuning(64)), DgInput{vosbrine::RGGB, 15, 1.0f}, value));
  EXPECT_EQ(value.gain_r, 65664u);
  // 32768 / (32768 - 128) x 65536 = 65793.004.
  TAVIK_ASSERT_OK(
      TranslateDg(BlcBlock(UniformBlcTuning(64)), DgInput{vosbrine::RGGB, 14, 1.0f}, value));
  EXPECT_EQ(value.gain_r, 65793u);
}

TEST(TranslateDgTest, UsesElementZeroOfArraysOfAnySize) {
  DgConfigValue value = {};
  TAVIK_ASSERT_OK(TranslateDg(BlcBlock(MakeBlcTuning({0, 64}, {64}, {512, 1, 2}, {0})),
                              DgInput{vosbrine::RGGB, 10, 1.0f}, value));
  EXPECT_EQ(value.gain_r, 65536u);
  EXPECT_EQ(value.gain_gr, 69905u);
  EXPECT_EQ(value.GainGb(), 131072u);  // Stretch 2.
  EXPECT_EQ(value.gain_b, 65536u);
}

TEST(TranslateDgTest, EnablesAndWritesThePixelOrderWhateverTheTuningSays) {
  struct Case {
    vosbrine::BayerPattern pattern;
    uint32_t code;
  };
  for (const Case& c : {Case{vosbrine::RGGB, 0}, Case{vosbrine::BGGR, 3}, Case{vosbrine::GRBG, 1},
                        Case{vosbrine::GBRG, 2}}) {
    DgConfigValue value = Filled();
    TAVIK_ASSERT_OK(TranslateDg(BlcBlock(UniformBlcTuning(64, /*enable=*/false)),
                                DgInput{c.pattern, 10, 1.0f}, value));
    EXPECT_EQ(value.enable, 1u);
    EXPECT_EQ(value.pixel_order, c.code);
    EXPECT_EQ(Words(value)[1] >> 35, 0xA5A5A5A5A5A5A5A5u >> 35);
  }
}

TEST(TranslateDgTest, CapLineHasABlankAfterUnder) {
  ScopedLogCapture log;
  DgConfigValue value = {};
  TAVIK_ASSERT_OK(TranslateDg(BlcBlock(MakeBlcTuning({64}, {0}, {64}, {0})),
                              DgInput{vosbrine::RGGB, 10, 31.0f}, value));
  constexpr char kLine[] =
      "Max digital gain * stretch_gain should be under 32. If not, it is capped to "
      "kMaxDigitalGain: 31 1.06667";
  EXPECT_THAT(log.messages(android::base::ERROR), ElementsAre(kLine, kLine));
  EXPECT_EQ(value.gain_r, 2097152u);   // 32 x 65536.
  EXPECT_EQ(value.gain_gr, 2031616u);  // 31 x 65536.
  EXPECT_EQ(value.GainGb(), 2097152u);
  EXPECT_EQ(value.gain_b, 2031616u);
}

TEST(TranslateDgTest, NoCapNoLog) {
  ScopedLogCapture log;
  DgConfigValue value = {};
  TAVIK_ASSERT_OK(
      TranslateDg(BlcBlock(UniformBlcTuning(64)), DgInput{vosbrine::RGGB, 10, 20.0f}, value));
  EXPECT_THAT(log.messages(android::base::ERROR), IsEmpty());
  EXPECT_EQ(value.gain_r, 1398101u);  // 32768 / 30720 x 20 x 65536 = 1398101.3.
}

TEST(TranslateDgTest, ComputedZeroBecomesOne) {
  DgConfigValue value = {};
  TAVIK_ASSERT_OK(TranslateDg(BlcBlock(MakeBlcTuning({-1e10f}, {64}, {64}, {64})),
                              DgInput{vosbrine::RGGB, 15, 1.0f}, value));
  EXPECT_EQ(value.gain_r, 1u);
  EXPECT_EQ(value.gain_gr, 65664u);
}

}  // namespace
}  // namespace tavik
