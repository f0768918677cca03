#include "tavik/iq/zel/translators/gamma_online_translator.h"

#include <algorithm>
#include <cmath>
#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <string>
#include <utility>
#include <vector>

#include "gmock/gmock.h"
#include "gtest/gtest.h"
#include "tavik/base/camera_types.h"
#include "tavik/base/status.h"
#include "tavik/base/testing/log_capture.h"
#include "tavik/base/testing/status_matchers.h"
#include "tavik/base/trace.h"
#include "tavik/iq/testing/translator_testing.h"
#include "tavik/iq/zel/protos/blc_param.pb.h"
#include "tavik/iq/zel/protos/gamma_param.pb.h"
#include "tavik/iq/zel/translators/internal/gamma_curves.h"
#include "tavik/iq/zel/zel_tuning_block.h"

namespace tavik {
namespace {

using ::tavik::test::IsOk;
using ::tavik::test::PatternFilled;
using ::tavik::test::RecordingTraceSink;
using ::tavik::test::SameBytes;
using ::tavik::test::ScopedLogCapture;
using ::tavik::test::StatusIs;
using ::tavik_registers::zel::g3aa::GammaLutValue;
using ::tavik_registers::zel::g3aa_generic::GammaConfigValue;
using ::testing::ElementsAre;
using ::testing::IsEmpty;
using ::vosbrine::zelmondrake::GammaTuning;

using Point = tavik_api::GenericPoint<float>;
using Points = TonemapCurve::Points;

constexpr StatusCode kInvalid = StatusCode::kInvalidArgument;

// The default tuning's curve, (i/64)^(1/2.2) to six decimals.
constexpr float kDefaultCurve[65] = {
    0.0f,      0.151011f, 0.206938f, 0.248818f, 0.283578f, 0.31385f,  0.340968f, 0.365717f,
    0.388602f, 0.409973f, 0.430085f, 0.449127f, 0.467246f, 0.484559f, 0.50116f,  0.517126f,
    0.532521f, 0.547399f, 0.561807f, 0.575786f, 0.589368f, 0.602584f, 0.615462f, 0.628024f,
    0.640292f, 0.652283f, 0.664016f, 0.675506f, 0.686765f, 0.697807f, 0.708644f, 0.719285f,
    0.72974f,  0.740019f, 0.750129f, 0.760078f, 0.769873f, 0.779521f, 0.789028f, 0.7984f,
    0.807641f, 0.816757f, 0.825752f, 0.834631f, 0.843399f, 0.852058f, 0.860613f, 0.869068f,
    0.877424f, 0.885687f, 0.893857f, 0.901939f, 0.909936f, 0.917848f, 0.92568f,  0.933433f,
    0.941109f, 0.948711f, 0.956241f, 0.9637f,   0.97109f,  0.978414f, 0.985672f, 0.992867f,
    1.0f};

// --- Helpers -------------------------------------------------------------------------------------

std::vector<float> Knots64() {
  std::vector<float> x;
  for (int i = 0; i <= 64; ++i) x.push_back(static_cast<float>(i) / 64.0f);
  return x;
}

GammaTuning MakeTuning(const std::vector<float>& x, const std::vector<float>& r,
                       const std::vector<float>& g, const std::vector<float>& b,
                       bool enable = true) {
  GammaTuning tuning;
  tuning.set_enable(enable);
  for (float v : x) tuning.mutable_static_param()->add_gamma_x(v);
  for (float v : r) tuning.mutable_dynamic_param()->add_gamma_r(v);
  for (float v : g) tuning.mutable_dynamic_param()->add_gamma_g(v);
  for (float v : b) tuning.mutable_dynamic_param()->add_gamma_b(v);
  return tuning;
}

// Knots i/64 and every channel the identity.
GammaTuning IdentityTuning() {
  const std::vector<float> x = Knots64();
  return MakeTuning(x, x, x, x);
}

Tonemap TuningRules() {
  Tonemap tonemap;
  tonemap.mode = TonemapMode::kHighQuality;
  return tonemap;
}

Tonemap CurveRules(Points red, Points green, Points blue) {
  Tonemap tonemap;
  tonemap.mode = TonemapMode::kContrastCurve;
  tonemap.curve.red = std::move(red);
  tonemap.curve.green = std::move(green);
  tonemap.curve.blue = std::move(blue);
  return tonemap;
}

Tonemap IdentityCurveRules() {
  const Points identity = {{0.0f, 0.0f}, {1.0f, 1.0f}};
  return CurveRules(identity, identity, identity);
}

template <typename Record>
uint32_t Word(const Record& record, int index) {
  uint32_t word;
  std::memcpy(&word, reinterpret_cast<const char*>(&record) + 4 * index, 4);
  return word;
}

template <typename Record>
uint16_t Slot16(const Record& record, int byte_offset) {
  uint16_t slot;
  std::memcpy(&slot, reinterpret_cast<const char*>(&record) + byte_offset, 2);
  return slot;
}

// Q14 code of the ITP tables, step by step: scale, round half away, 15 low bits, limit.
uint16_t ExpectedItpCode(float value) {
  const float scaled = value * 16384.0f;
  const int32_t rounded = static_cast<int32_t>(std::round(scaled));
  const uint32_t low = static_cast<uint32_t>(rounded) & 0x7FFFu;
  return static_cast<uint16_t>(low > 16384u ? 16384u : low);
}

// A bracket found by a plain scan: the first knot not below the sample, moved into 1..n-1.
int ScanBracket(const std::vector<float>& x, float sample) {
  int k = 0;
  while (k < static_cast<int>(x.size()) && x[k] < sample) ++k;
  if (k == 0) k = 1;
  if (k == static_cast<int>(x.size())) k = static_cast<int>(x.size()) - 1;
  return k;
}

float ExpectedResample(const std::vector<float>& x, const std::vector<float>& y, float sample) {
  const int k = ScanBracket(x, sample);
  const float t = (x[k] - sample) / (x[k] - x[k - 1]);
  const float value = t * y[k - 1] + (1.0f - t) * y[k];
  return value < 0.0f ? 0.0f : value > 1.0f ? 1.0f : value;
}

uint16_t ExpectedG3aaCode(float value) {
  const float clamped = value < 0.0f ? 0.0f : value > 1.0f ? 1.0f : value;
  const float rounded = std::round(clamped * 32768.0f);
  return static_cast<uint16_t>(rounded > 32767.0f ? 32767.0f : rounded);
}

// The G3AA knots as a tuning engineer would write them down: the segment formula, printed with
// six decimals.
std::vector<float> ExpectedG3aaKnots() {
  std::vector<float> knots;
  for (int i = 0; i <= 80; ++i) {
    double v;
    if (i <= 32) {
      v = i / 256.0;
    } else if (i <= 48) {
      v = 0.125 + (i - 32) / 128.0;
    } else if (i <= 64) {
      v = 0.25 + (i - 48) / 64.0;
    } else {
      v = 0.5 + (i - 64) / 32.0;
    }
    char text[32];
    std::snprintf(text, sizeof(text), "%.6f", v);
    knots.push_back(std::strtof(text, nullptr));
  }
  return knots;
}

// --- Records -------------------------------------------------------------------------------------

TEST(GammaRecordsTest, ItpOutputBitFieldsSitAtBitZeroOfTheirWords) {
  GammaItpOutput output{};
  output.bypass = 1;
  output.gamma_g_last_negative = 1;
  EXPECT_EQ(Word(output, 0), 1u);
  EXPECT_EQ(Word(output, 1), 0u);
  EXPECT_EQ(Word(output, 2), 1u);
  EXPECT_EQ(Word(output, 3), 0u);
  output.gamma_x_last_step = 0x1234;
  output.gamma_b[63] = 0x5678;
  EXPECT_EQ(Slot16(output, 144), 0x1234);
  EXPECT_EQ(Slot16(output, 532), 0x5678);
}

TEST(GammaRecordsTest, FixedOutputFieldsAreFifteenBitsUnderAKeptTopBit) {
  GammaItpFixedOutput fixed{};
  fixed.flag = 1;
  fixed.value_0 = 0x7FFF;
  fixed.value_1 = 0x1234;
  EXPECT_EQ(Word(fixed, 0), 1u);
  EXPECT_EQ(Slot16(fixed, 4), 0x7FFF);
  EXPECT_EQ(Slot16(fixed, 6), 0x1234);
}

TEST(GammaRecordsTest, ConfigEnableIsTheFirstByte) {
  GammaConfigValue config{};
  config.enable = 0xFF;
  EXPECT_EQ(Word(config, 0), 0xFFu);
}

// --- TonemapCurve --------------------------------------------------------------------------------

TEST(TonemapCurveTest, MoveAssignmentTakesTheSourcePointsAndLeavesItEmpty) {
  TonemapCurve target;
  target.red = {{0.0f, 0.1f}, {1.0f, 0.9f}};
  target.green = {{0.0f, 0.2f}};
  target.blue = {{0.5f, 0.5f}, {0.6f, 0.6f}, {0.7f, 0.7f}};
  TonemapCurve source;
  source.red = {{0.0f, 0.0f}, {0.5f, 0.25f}, {1.0f, 1.0f}};
  source.green = {{0.0f, 0.0f}};
  source.blue = {{0.25f, 0.75f}};
  const Point* red_storage = source.red.data();

  target = std::move(source);

  EXPECT_THAT(target.red, ElementsAre(Point{0.0f, 0.0f}, Point{0.5f, 0.25f}, Point{1.0f, 1.0f}));
  EXPECT_THAT(target.green, ElementsAre(Point{0.0f, 0.0f}));
  EXPECT_THAT(target.blue, ElementsAre(Point{0.25f, 0.75f}));
  EXPECT_EQ(target.red.data(), red_storage);  // Taken over, not copied.
  EXPECT_THAT(source.red, IsEmpty());         // NOLINT(bugprone-use-after-move)
  EXPECT_THAT(source.green, IsEmpty());
  EXPECT_THAT(source.blue, IsEmpty());
}

TEST(TonemapCurveTest, MoveConstructionLeavesTheSourceEmpty) {
  TonemapCurve source;
  source.red = {{0.0f, 0.0f}, {1.0f, 1.0f}};
  source.green = {{0.0f, 0.0f}};
  source.blue = {{1.0f, 1.0f}};
  const TonemapCurve taken(std::move(source));
  EXPECT_EQ(taken.red.size(), 2u);
  EXPECT_EQ(taken.green.size(), 1u);
  EXPECT_EQ(taken.blue.size(), 1u);
  EXPECT_THAT(source.red, IsEmpty());  // NOLINT(bugprone-use-after-move)
  EXPECT_THAT(source.green, IsEmpty());
  EXPECT_THAT(source.blue, IsEmpty());
}

TEST(TonemapCurveTest, MoveAssignmentToItselfKeepsThePoints) {
  TonemapCurve curve;
  curve.red = {{0.0f, 0.0f}, {1.0f, 1.0f}};
  TonemapCurve& same = curve;
  curve = std::move(same);
  EXPECT_EQ(curve.red.size(), 2u);
}

// --- Default tuning and the G3AA knots -----------------------------------------------------------

TEST(GammaDefaultTuningTest, IsAnEnabledPowerCurveOnKnotsOfOneSixtyFourth) {
  GammaTuning tuning;
  gamma_internal::SetDefaultTuning(tuning);
  EXPECT_TRUE(tuning.enable());
  ASSERT_EQ(tuning.static_param().gamma_x_size(), 65);
  for (int i = 0; i <= 64; ++i) {
    EXPECT_EQ(tuning.static_param().gamma_x(i), static_cast<float>(i) / 64.0f) << i;
  }
  for (const auto* channel : {&tuning.dynamic_param().gamma_r(), &tuning.dynamic_param().gamma_g(),
                              &tuning.dynamic_param().gamma_b()}) {
    ASSERT_EQ(channel->size(), 65);
    EXPECT_EQ(channel->Get(0), 0.0f);
    EXPECT_EQ(channel->Get(1), 0.151011f);
    EXPECT_EQ(channel->Get(2), 0.206938f);
    EXPECT_EQ(channel->Get(3), 0.248818f);
    EXPECT_EQ(channel->Get(63), 0.992867f);
    EXPECT_EQ(channel->Get(64), 1.0f);
    for (int i = 0; i <= 64; ++i) {
      EXPECT_EQ(channel->Get(i), kDefaultCurve[i]) << i;
      // The power curve itself, to six decimals.
      const double six_decimals = std::round(std::pow(i / 64.0, 1.0 / 2.2) * 1e6) / 1e6;
      EXPECT_EQ(channel->Get(i), static_cast<float>(six_decimals)) << i;
    }
  }
}

TEST(GammaDefaultTuningTest, ReplacesWhatTheMessageHeld) {
  GammaTuning tuning = MakeTuning({0.5f}, {0.5f}, {0.5f}, {0.5f}, /*enable=*/false);
  gamma_internal::SetDefaultTuning(tuning);
  EXPECT_TRUE(tuning.enable());
  EXPECT_EQ(tuning.static_param().gamma_x_size(), 65);
  EXPECT_EQ(tuning.dynamic_param().gamma_r_size(), 65);
}

TEST(GammaG3aaKnotsTest, AreStoredRoundedToSixDecimals) {
  const float* knots = gamma_internal::kG3aaGammaKnots;
  EXPECT_EQ(knots[0], 0.0f);
  EXPECT_EQ(knots[1], 0.003906f);
  EXPECT_EQ(knots[2], 0.007812f);
  EXPECT_NE(knots[1], 1.0f / 256.0f);
  EXPECT_EQ(knots[32], 0.125f);
  EXPECT_EQ(knots[33], 0.132812f);
  EXPECT_EQ(knots[48], 0.25f);
  EXPECT_EQ(knots[49], 0.265625f);
  EXPECT_EQ(knots[64], 0.5f);
  EXPECT_EQ(knots[65], 0.53125f);
  EXPECT_EQ(knots[80], 1.0f);
  const std::vector<float> expected = ExpectedG3aaKnots();
  for (int i = 0; i < gamma_internal::kG3aaGammaKnotCount; ++i) {
    EXPECT_EQ(knots[i], expected[i]) << i;
  }
}

// --- The application's curve --------------------------------------------------------------------

TEST(GammaGenerateTuningParamsTest, SamplesSixtyFiveKnotsAtOneSixtyFifth) {
  TAVIK_ASSERT_OK_AND_ASSIGN(GammaTuning tuning,
                             gamma_internal::GenerateTuningParams(IdentityCurveRules().curve));
  EXPECT_TRUE(tuning.enable());
  ASSERT_EQ(tuning.static_param().gamma_x_size(), 65);
  ASSERT_EQ(tuning.dynamic_param().gamma_r_size(), 65);
  ASSERT_EQ(tuning.dynamic_param().gamma_g_size(), 65);
  ASSERT_EQ(tuning.dynamic_param().gamma_b_size(), 65);
  for (int i = 0; i <= 64; ++i) {
    EXPECT_EQ(tuning.static_param().gamma_x(i), static_cast<float>(i) / 65.0f) << i;
  }
  // Never sampled at 1.0.
  EXPECT_EQ(tuning.static_param().gamma_x(64), 64.0f / 65.0f);
}

TEST(GammaGenerateTuningParamsTest, SamplesBelowTheFirstPointExtrapolateThenClamp) {
  const Points red = {{0.5f, 0.2f}, {1.0f, 1.0f}};
  const Points identity = {{0.0f, 0.0f}, {1.0f, 1.0f}};
  TAVIK_ASSERT_OK_AND_ASSIGN(GammaTuning tuning, gamma_internal::GenerateTuningParams(
                                                     CurveRules(red, identity, identity).curve));
  for (int i = 0; i <= 64; ++i) {
    const float x = static_cast<float>(i) / 65.0f;
    // Every sample uses the one segment, inside the span or not.
    const float t = (1.0f - x) / (1.0f - 0.5f);
    float y = t * 0.2f + (1.0f - t) * 1.0f;
    y = y < 0.0f ? 0.0f : y > 1.0f ? 1.0f : y;
    EXPECT_EQ(tuning.dynamic_param().gamma_r(i), y) << i;
  }
  // The line 1.6x - 0.6 falls below zero under x = 0.375: samples 0..24 clamp to 0.
  for (int i = 0; i <= 24; ++i) EXPECT_EQ(tuning.dynamic_param().gamma_r(i), 0.0f) << i;
  EXPECT_GT(tuning.dynamic_param().gamma_r(25), 0.0f);
  EXPECT_LT(tuning.dynamic_param().gamma_r(32), 0.2f);  // Still below the first point.
}

TEST(GammaGenerateTuningParamsTest, SamplesBeyondTheLastPointExtrapolateThenClamp) {
  const Points red = {{0.0f, 0.0f}, {0.25f, 0.5f}};  // Slope 2: reaches 1.0 at x = 0.5.
  const Points identity = {{0.0f, 0.0f}, {1.0f, 1.0f}};
  TAVIK_ASSERT_OK_AND_ASSIGN(GammaTuning tuning, gamma_internal::GenerateTuningParams(
                                                     CurveRules(red, identity, identity).curve));
  for (int i = 0; i <= 64; ++i) {
    const float x = static_cast<float>(i) / 65.0f;
    const float t = (0.25f - x) / (0.25f - 0.0f);
    float y = t * 0.0f + (1.0f - t) * 0.5f;
    y = y < 0.0f ? 0.0f : y > 1.0f ? 1.0f : y;
    EXPECT_EQ(tuning.dynamic_param().gamma_r(i), y) << i;
  }
  EXPECT_EQ(tuning.dynamic_param().gamma_r(64), 1.0f);
}

TEST(GammaGenerateTuningParamsTest, FollowsEachChannelsSegmentsForward) {
  const Points red = {{0.0f, 0.0f}, {0.25f, 0.5f}, {0.5f, 0.75f}, {1.0f, 1.0f}};
  const Points green = {{0.0f, 1.0f}, {1.0f, 0.0f}};
  const Points blue = {{0.0f, 0.25f}, {0.75f, 0.25f}, {1.0f, 0.5f}};
  TAVIK_ASSERT_OK_AND_ASSIGN(
      GammaTuning tuning, gamma_internal::GenerateTuningParams(CurveRules(red, green, blue).curve));
  const auto expect_channel = [](const Points& points, const auto& samples) {
    for (int i = 0; i <= 64; ++i) {
      const float x = static_cast<float>(i) / 65.0f;
      size_t k = 0;
      while (k + 2 < points.size() && x > points[k + 1].x) ++k;
      const Point& p0 = points[k];
      const Point& p1 = points[k + 1];
      const float t = (p1.x - x) / (p1.x - p0.x);
      float y = t * p0.y + (1.0f - t) * p1.y;
      y = y < 0.0f ? 0.0f : y > 1.0f ? 1.0f : y;
      EXPECT_EQ(samples.Get(i), y) << i;
    }
  };
  expect_channel(red, tuning.dynamic_param().gamma_r());
  expect_channel(green, tuning.dynamic_param().gamma_g());
  expect_channel(blue, tuning.dynamic_param().gamma_b());
}

TEST(GammaGenerateTuningParamsTest, NeedsTwoPointsInEveryChannel) {
  const Points two = {{0.0f, 0.0f}, {1.0f, 1.0f}};
  const Points one = {{0.5f, 0.5f}};
  constexpr char kText[] = "Tone map curve should have at least 2 data!";
  EXPECT_THAT(gamma_internal::GenerateTuningParams(CurveRules(one, two, two).curve),
              StatusIs(kInvalid, kText));
  EXPECT_THAT(gamma_internal::GenerateTuningParams(CurveRules(two, one, two).curve),
              StatusIs(kInvalid, kText));
  EXPECT_THAT(gamma_internal::GenerateTuningParams(CurveRules(two, two, {}).curve),
              StatusIs(kInvalid, kText));
}

TEST(GammaGenerateTuningParamsTest, EqualAbscissaePassWhenNoSampleLandsBetweenThem) {
  const Points red = {{0.0f, 0.0f}, {0.5f, 0.5f}, {0.5f, 0.7f}, {1.0f, 1.0f}};
  const Points identity = {{0.0f, 0.0f}, {1.0f, 1.0f}};
  TAVIK_ASSERT_OK_AND_ASSIGN(GammaTuning tuning, gamma_internal::GenerateTuningParams(
                                                     CurveRules(red, identity, identity).curve));
  // Above 0.5 the samples use the last segment, from (0.5, 0.7).
  const float x = 40.0f / 65.0f;
  const float t = (1.0f - x) / (1.0f - 0.5f);
  EXPECT_EQ(tuning.dynamic_param().gamma_r(40), t * 0.7f + (1.0f - t) * 1.0f);
}

TEST(GammaGenerateTuningParamsTest, EqualAbscissaeFailWhereASampleLandsLaterIndexFirst) {
  const Points identity = {{0.0f, 0.0f}, {1.0f, 1.0f}};
  // The sample at 0 lands in the first segment, which has no width.
  const Points flat_start = {{0.0f, 0.0f}, {0.0f, 0.5f}, {1.0f, 1.0f}};
  EXPECT_THAT(
      gamma_internal::GenerateTuningParams(CurveRules(flat_start, identity, identity).curve),
      StatusIs(kInvalid, "tonemap_curve.red[1].x must be larger than [0].x in tuning data. 0 0"));
  // Samples before 0.5 extrapolate from the first segment.
  const Points late_start = {{0.5f, 0.2f}, {0.5f, 0.4f}, {1.0f, 1.0f}};
  EXPECT_THAT(
      gamma_internal::GenerateTuningParams(CurveRules(identity, late_start, identity).curve),
      StatusIs(kInvalid,
               "tonemap_curve.green[1].x must be larger than [0].x in tuning data. 0.5 0.5"));
  // Samples after 0.25 extrapolate from the last segment.
  const Points early_end = {{0.0f, 0.0f}, {0.25f, 0.5f}, {0.25f, 0.6f}};
  EXPECT_THAT(
      gamma_internal::GenerateTuningParams(CurveRules(identity, identity, early_end).curve),
      StatusIs(kInvalid,
               "tonemap_curve.blue[2].x must be larger than [1].x in tuning data. 0.25 0.25"));
  // Falling abscissae, with six significant digits.
  const Points falling = {{0.0f, 0.0f}, {0.123456789f, 0.5f}, {0.1f, 1.0f}};
  EXPECT_THAT(
      gamma_internal::GenerateTuningParams(CurveRules(identity, identity, falling).curve),
      StatusIs(kInvalid,
               "tonemap_curve.blue[2].x must be larger than [1].x in tuning data. 0.1 0.123457"));
}

TEST(GammaGenerateTuningParamsTest, ChecksRedBeforeGreenBeforeBlueAtEachSample) {
  const Points flat_start = {{0.0f, 0.0f}, {0.0f, 0.5f}, {1.0f, 1.0f}};
  EXPECT_THAT(
      gamma_internal::GenerateTuningParams(CurveRules(flat_start, flat_start, flat_start).curve),
      StatusIs(kInvalid, "tonemap_curve.red[1].x must be larger than [0].x in tuning data. 0 0"));
}

// --- Resampling the tuning -----------------------------------------------------------------------

TEST(GammaResampleTonemapTest, SamplesSixtyFourPointsEndingAtExactlyOne) {
  const std::vector<float> x = Knots64();
  std::vector<float> r, g, b;
  for (float v : x) {
    r.push_back(v * v);
    g.push_back(std::sqrt(v));
    b.push_back(1.0f - v);
  }
  TAVIK_ASSERT_OK_AND_ASSIGN(TonemapCurve curve,
                             gamma_internal::ResampleTonemap(MakeTuning(x, r, g, b), 64));
  ASSERT_EQ(curve.red.size(), 64u);
  ASSERT_EQ(curve.green.size(), 64u);
  ASSERT_EQ(curve.blue.size(), 64u);
  for (int i = 0; i < 64; ++i) {
    const float sample = static_cast<float>(i) / 63.0f;
    EXPECT_EQ(curve.red[i].x, sample) << i;
    EXPECT_EQ(curve.green[i].x, sample) << i;
    EXPECT_EQ(curve.blue[i].x, sample) << i;
    EXPECT_EQ(curve.red[i].y, ExpectedResample(x, r, sample)) << i;
    EXPECT_EQ(curve.green[i].y, ExpectedResample(x, g, sample)) << i;
    EXPECT_EQ(curve.blue[i].y, ExpectedResample(x, b, sample)) << i;
  }
  EXPECT_EQ(curve.red[63].x, 1.0f);
  EXPECT_EQ(curve.red[63].y, 1.0f);
  EXPECT_EQ(curve.blue[63].y, 0.0f);
}

TEST(GammaResampleTonemapTest, ClampsValuesOutsideZeroToOne) {
  const std::vector<float> x = Knots64();
  std::vector<float> r(65, 1.5f), g(65, -0.5f), b = x;
  TAVIK_ASSERT_OK_AND_ASSIGN(TonemapCurve curve,
                             gamma_internal::ResampleTonemap(MakeTuning(x, r, g, b), 64));
  for (int i = 0; i < 64; ++i) {
    EXPECT_EQ(curve.red[i].y, 1.0f) << i;
    EXPECT_EQ(curve.green[i].y, 0.0f) << i;
  }
}

TEST(GammaResampleTonemapTest, EqualKnotsOnlyFailWhereASampleFallsBetweenThem) {
  std::vector<float> x = Knots64();
  x[10] = x[9];  // A lower bound never stops on the second of two equal knots.
  TAVIK_EXPECT_OK(gamma_internal::ResampleTonemap(MakeTuning(x, x, x, x), 64).status());

  std::vector<float> flat_start = Knots64();
  flat_start[1] = 0.0f;
  EXPECT_THAT(gamma_internal::ResampleTonemap(
                  MakeTuning(flat_start, flat_start, flat_start, flat_start), 64),
              StatusIs(kInvalid, "gamma_x[1] must be larger than [0] in tuning data. 0 0"));

  // Knots that end at 63/128: the samples above it take the last bracket, which has no width.
  std::vector<float> short_end;
  for (int i = 0; i <= 63; ++i) short_end.push_back(static_cast<float>(i) / 128.0f);
  short_end.push_back(short_end.back());
  EXPECT_THAT(
      gamma_internal::ResampleTonemap(MakeTuning(short_end, short_end, short_end, short_end), 64),
      StatusIs(kInvalid, "gamma_x[64] must be larger than [63] in tuning data. 0.492188 0.492188"));
}

// --- ITP translation -----------------------------------------------------------------------------

TEST(TranslateGammaItpTest, IdentityCurveGivesTheKnotCodesAndALastStepOf252) {
  auto output = PatternFilled<GammaItpOutput>();
  TonemapCurve curve;
  const ZelTuningBlock<GammaTuning> unused_block;
  const Tonemap tonemap = IdentityCurveRules();
  TAVIK_ASSERT_OK(TranslateGamma(unused_block, tonemap, output, curve));

  EXPECT_EQ(output.bypass, 0u);
  for (int i = 0; i < 64; ++i) {
    EXPECT_EQ(output.gamma_x[i], ExpectedItpCode(static_cast<float>(i) / 65.0f)) << i;
    EXPECT_EQ(output.gamma_r[i], output.gamma_x[i]) << i;
    EXPECT_EQ(output.gamma_g[i], output.gamma_x[i]) << i;
    EXPECT_EQ(output.gamma_b[i], output.gamma_x[i]) << i;
  }
  EXPECT_EQ(output.gamma_x[63], 15880);  // 63/65 in Q14; 64/65 codes as 16132.
  EXPECT_EQ(output.gamma_x_last_step, 252);
  EXPECT_EQ(output.gamma_r_last_step, 252);
  EXPECT_EQ(output.gamma_g_last_step, 252);
  EXPECT_EQ(output.gamma_b_last_step, 252);
  EXPECT_EQ(output.gamma_r_last_negative, 0u);
  EXPECT_EQ(output.gamma_g_last_negative, 0u);
  EXPECT_EQ(output.gamma_b_last_negative, 0u);
  // The curve in force is the application's own.
  EXPECT_EQ(curve.red, tonemap.curve.red);
  EXPECT_EQ(curve.green, tonemap.curve.green);
  EXPECT_EQ(curve.blue, tonemap.curve.blue);
}

TEST(TranslateGammaItpTest, ApplicationCurveDoesNotReadTheBlock) {
  ScopedLogCapture capture;
  const ZelTuningBlock<vosbrine::zelmondrake::BlcTuning> other_block;
  GammaItpOutput output{};
  TonemapCurve curve;
  TAVIK_EXPECT_OK(TranslateGamma(other_block, IdentityCurveRules(), output, curve));
  EXPECT_THAT(capture.messages(), IsEmpty());
}

TEST(TranslateGammaItpTest, ApplicationCurveMayBeTheOutCurveItself) {
  Tonemap tonemap = IdentityCurveRules();
  const Points before = tonemap.curve.red;
  GammaItpOutput output{};
  TAVIK_ASSERT_OK(TranslateGamma(ZelTuningBlock<GammaTuning>(), tonemap, output, tonemap.curve));
  EXPECT_EQ(tonemap.curve.red, before);
  EXPECT_EQ(tonemap.curve.green, before);
  EXPECT_EQ(tonemap.curve.blue, before);
}

TEST(TranslateGammaItpTest, ApplicationCurveWithOnePointFailsAndLeavesTheOutputUntouched) {
  auto output = PatternFilled<GammaItpOutput>();
  const auto before = output;
  TonemapCurve curve;
  const Tonemap tonemap =
      CurveRules({{0.0f, 0.0f}, {1.0f, 1.0f}}, {{0.5f, 0.5f}}, {{0.0f, 0.0f}, {1.0f, 1.0f}});
  EXPECT_THAT(TranslateGamma(ZelTuningBlock<GammaTuning>(), tonemap, output, curve),
              StatusIs(kInvalid, "Tone map curve should have at least 2 data!"));
  EXPECT_TRUE(SameBytes(output, before));
}

TEST(TranslateGammaItpTest, ApplicationCurveWithAFlatSegmentFailsWithItsIndices) {
  auto output = PatternFilled<GammaItpOutput>();
  const auto before = output;
  TonemapCurve curve;
  const Points identity = {{0.0f, 0.0f}, {1.0f, 1.0f}};
  const Tonemap tonemap =
      CurveRules(identity, {{0.0f, 0.0f}, {0.0f, 0.5f}, {1.0f, 1.0f}}, identity);
  EXPECT_THAT(
      TranslateGamma(ZelTuningBlock<GammaTuning>(), tonemap, output, curve),
      StatusIs(kInvalid, "tonemap_curve.green[1].x must be larger than [0].x in tuning data. 0 0"));
  EXPECT_TRUE(SameBytes(output, before));
}

TEST(TranslateGammaItpTest, TuningGivesItsCodesAndHandsBackItsResampledCurve) {
  const std::vector<float> x = Knots64();
  std::vector<float> r, g, b;
  for (float v : x) {
    r.push_back(v * v);
    g.push_back(std::sqrt(v));
    b.push_back(v * 0.5f);
  }
  const ZelTuningBlock<GammaTuning> block(MakeTuning(x, r, g, b));
  auto output = PatternFilled<GammaItpOutput>();
  TonemapCurve curve;
  curve.red = {{0.25f, 0.25f}};  // Replaced.
  TAVIK_ASSERT_OK(TranslateGamma(block, TuningRules(), output, curve));

  EXPECT_EQ(output.bypass, 0u);
  for (int i = 0; i < 64; ++i) {
    EXPECT_EQ(output.gamma_x[i], i * 256) << i;
    EXPECT_EQ(output.gamma_r[i], ExpectedItpCode(r[i])) << i;
    EXPECT_EQ(output.gamma_g[i], ExpectedItpCode(g[i])) << i;
    EXPECT_EQ(output.gamma_b[i], ExpectedItpCode(b[i])) << i;
  }
  EXPECT_EQ(output.gamma_x_last_step, 256);
  EXPECT_EQ(output.gamma_r_last_step, 16384 - ExpectedItpCode(r[63]));
  EXPECT_EQ(output.gamma_g_last_step, 16384 - ExpectedItpCode(g[63]));
  EXPECT_EQ(output.gamma_b_last_step, 8192 - ExpectedItpCode(b[63]));
  EXPECT_EQ(output.gamma_b_last_step, 128);  // 0.5 and 63/128: 8192 - 8064.

  ASSERT_EQ(curve.red.size(), 64u);
  ASSERT_EQ(curve.green.size(), 64u);
  ASSERT_EQ(curve.blue.size(), 64u);
  for (int i = 0; i < 64; ++i) {
    const float sample = static_cast<float>(i) / 63.0f;
    EXPECT_EQ(curve.red[i], (Point{sample, ExpectedResample(x, r, sample)})) << i;
    EXPECT_EQ(curve.green[i], (Point{sample, ExpectedResample(x, g, sample)})) << i;
    EXPECT_EQ(curve.blue[i], (Point{sample, ExpectedResample(x, b, sample)})) << i;
  }
}

TEST(TranslateGammaItpTest, EveryModeButZeroLetsTheTuningRule) {
  ScopedLogCapture capture;
  const ZelTuningBlock<vosbrine::zelmondrake::BlcTuning> other_block;
  for (int32_t mode : {1, 2, 3, 4, -1}) {
    Tonemap tonemap = IdentityCurveRules();
    tonemap.mode = static_cast<TonemapMode>(mode);
    GammaItpOutput output{};
    TonemapCurve curve;
    EXPECT_THAT(TranslateGamma(other_block, tonemap, output, curve),
                StatusIs(kInvalid, "Invalid TuningBlock!"))
        << mode;
  }
  EXPECT_EQ(capture.Count("Incorrect tuning block type: BlcTuning, expected: GammaTuning"), 5);
}

TEST(TranslateGammaItpTest, BlockOfAnotherTypeIsLoggedThenRefused) {
  ScopedLogCapture capture;
  const ZelTuningBlock<vosbrine::zelmondrake::BlcTuning> other_block;
  auto output = PatternFilled<GammaItpOutput>();
  const auto before = output;
  TonemapCurve curve;
  EXPECT_THAT(TranslateGamma(other_block, TuningRules(), output, curve),
              StatusIs(kInvalid, "Invalid TuningBlock!"));
  EXPECT_THAT(capture.messages(android::base::ERROR),
              ElementsAre("Incorrect tuning block type: BlcTuning, expected: GammaTuning"));
  EXPECT_TRUE(SameBytes(output, before));
}

TEST(TranslateGammaItpTest, MissingPartsAreRefusedRegionInfoFirst) {
  GammaTuning no_dynamic = IdentityTuning();
  no_dynamic.clear_dynamic_param();
  GammaTuning no_static = IdentityTuning();
  no_static.clear_static_param();
  GammaTuning empty;
  empty.set_enable(true);

  auto output = PatternFilled<GammaItpOutput>();
  const auto before = output;
  TonemapCurve curve;
  EXPECT_THAT(TranslateGamma(ZelTuningBlock<GammaTuning>(no_dynamic), TuningRules(), output, curve),
              StatusIs(kInvalid, "Tuning data doesn't have region info."));
  EXPECT_THAT(TranslateGamma(ZelTuningBlock<GammaTuning>(no_static), TuningRules(), output, curve),
              StatusIs(kInvalid, "Tuning data doesn't have static info."));
  EXPECT_THAT(TranslateGamma(ZelTuningBlock<GammaTuning>(empty), TuningRules(), output, curve),
              StatusIs(kInvalid, "Tuning data doesn't have region info."));
  EXPECT_TRUE(SameBytes(output, before));
}

TEST(TranslateGammaItpTest, AShortListGivesTheSizeOfTheKnots) {
  const std::vector<float> x = Knots64();
  std::vector<float> short_r = x;
  short_r.pop_back();
  auto output = PatternFilled<GammaItpOutput>();
  const auto before = output;
  TonemapCurve curve;
  EXPECT_THAT(TranslateGamma(ZelTuningBlock<GammaTuning>(MakeTuning(x, short_r, x, x)),
                             TuningRules(), output, curve),
              StatusIs(kInvalid, "Gamma size is wrong: 65"));
  std::vector<float> short_x = x;
  short_x.pop_back();
  EXPECT_THAT(TranslateGamma(ZelTuningBlock<GammaTuning>(MakeTuning(short_x, x, x, x)),
                             TuningRules(), output, curve),
              StatusIs(kInvalid, "Gamma size is wrong: 64"));
  std::vector<float> long_b = x;
  long_b.push_back(1.0f);
  EXPECT_THAT(TranslateGamma(ZelTuningBlock<GammaTuning>(MakeTuning(x, x, x, long_b)),
                             TuningRules(), output, curve),
              StatusIs(kInvalid, "Gamma size is wrong: 65"));
  EXPECT_TRUE(SameBytes(output, before));
}

TEST(TranslateGammaItpTest, ResamplingFailuresPassThrough) {
  std::vector<float> x = Knots64();
  x[1] = 0.0f;
  GammaItpOutput output{};
  TonemapCurve curve;
  EXPECT_THAT(TranslateGamma(ZelTuningBlock<GammaTuning>(MakeTuning(x, x, x, x)), TuningRules(),
                             output, curve),
              StatusIs(kInvalid, "gamma_x[1] must be larger than [0] in tuning data. 0 0"));
}

TEST(TranslateGammaItpTest, CodesAreMaskedToFifteenBitsBeforeTheLimit) {
  const std::vector<float> x = Knots64();
  std::vector<float> r = x;
  r[5] = 2.0f;               // 32768: the low 15 bits are 0.
  r[6] = -0.1f;              // -1638: 31130 once masked, limited to 16384.
  r[7] = -2.0f;              // -32768: masked to 0.
  r[8] = 1.5f;               // 24576, limited.
  r[9] = 0.5f;               // 8192.
  r[10] = 1.0f / 32768.0f;   // Half a code rounds away from zero: 1.
  r[11] = -1.0f / 32768.0f;  // -1: 32767 once masked, limited.
  r[12] = 3.0f / 32768.0f;   // 1.5 codes: 2.
  r[13] = 1.0f / 65536.0f;   // A quarter code: 0.
  auto output = PatternFilled<GammaItpOutput>();
  TonemapCurve curve;
  TAVIK_ASSERT_OK(TranslateGamma(ZelTuningBlock<GammaTuning>(MakeTuning(x, r, x, x)), TuningRules(),
                                 output, curve));
  EXPECT_EQ(output.gamma_r[5], 0);
  EXPECT_EQ(output.gamma_r[6], 16384);
  EXPECT_EQ(output.gamma_r[7], 0);
  EXPECT_EQ(output.gamma_r[8], 16384);
  EXPECT_EQ(output.gamma_r[9], 8192);
  EXPECT_EQ(output.gamma_r[10], 1);
  EXPECT_EQ(output.gamma_r[11], 16384);
  EXPECT_EQ(output.gamma_r[12], 2);
  EXPECT_EQ(output.gamma_r[13], 0);
}

TEST(TranslateGammaItpTest, FallingLastStepsSetTheSignBitsAndKeepTheirMagnitudes) {
  const std::vector<float> x = Knots64();
  std::vector<float> r = x, g = x, b = x;
  r[64] = 0.5f;   // 8192 - 16128: falls by 7936.
  g[64] = 2.0f;   // Masked to 0: falls by 16128.
  b[63] = -1.0f;  // -16384 masked: 16384, so the step 16384 -> 16384 is flat.
  auto output = PatternFilled<GammaItpOutput>();
  TonemapCurve curve;
  TAVIK_ASSERT_OK(TranslateGamma(ZelTuningBlock<GammaTuning>(MakeTuning(x, r, g, b)), TuningRules(),
                                 output, curve));
  EXPECT_EQ(output.gamma_r_last_negative, 1u);
  EXPECT_EQ(output.gamma_r_last_step, 7936);
  EXPECT_EQ(output.gamma_g_last_negative, 1u);
  EXPECT_EQ(output.gamma_g_last_step, 16128);
  EXPECT_EQ(output.gamma_b[63], 16384);
  EXPECT_EQ(output.gamma_b_last_negative, 0u);
  EXPECT_EQ(output.gamma_b_last_step, 0);
}

TEST(TranslateGammaItpTest, FallingLastKnotFailsWithTheTablesWritten) {
  std::vector<float> x = Knots64();
  x[64] = 2.0f;  // Codes as 0, below the 16128 of knot 63.
  std::vector<float> r = Knots64();
  r[64] = 0.0f;
  auto output = PatternFilled<GammaItpOutput>();
  TonemapCurve curve;
  EXPECT_THAT(TranslateGamma(ZelTuningBlock<GammaTuning>(MakeTuning(x, r, x, x, false)),
                             TuningRules(), output, curve),
              StatusIs(kInvalid, "Last gamma_x can't be negative!"));
  EXPECT_EQ(output.bypass, 1u);
  EXPECT_EQ(output.gamma_x[63], 16128);
  // The last slots still hold the codes of entry 64, not steps.
  EXPECT_EQ(output.gamma_x_last_step, 0);
  EXPECT_EQ(output.gamma_r_last_step, 0);
  EXPECT_EQ(output.gamma_g_last_step, 0);
  EXPECT_EQ(output.gamma_r_last_negative, 1u);
  EXPECT_EQ(output.gamma_g_last_negative, 1u);
}

TEST(TranslateGammaItpTest, DisabledTuningSetsBypassAndStillWritesTheTables) {
  GammaTuning tuning = IdentityTuning();
  tuning.set_enable(false);
  auto output = PatternFilled<GammaItpOutput>();
  TonemapCurve curve;
  TAVIK_ASSERT_OK(
      TranslateGamma(ZelTuningBlock<GammaTuning>(tuning), TuningRules(), output, curve));
  EXPECT_EQ(output.bypass, 1u);
  EXPECT_EQ(output.gamma_x[32], 8192);
  EXPECT_EQ(output.gamma_r[32], 8192);
  EXPECT_EQ(output.gamma_x_last_step, 256);
}

TEST(TranslateGammaItpTest, BitsOutsideTheFieldsSurvive) {
  auto output = PatternFilled<GammaItpOutput>();
  TonemapCurve curve;
  TAVIK_ASSERT_OK(
      TranslateGamma(ZelTuningBlock<GammaTuning>(IdentityTuning()), TuningRules(), output, curve));
  // 0xA5A5A5A5 with bit 0 cleared: bypass 0, sign bits 0.
  EXPECT_EQ(Word(output, 0), 0xA5A5A5A4u);
  EXPECT_EQ(Word(output, 1), 0xA5A5A5A4u);
  EXPECT_EQ(Word(output, 2), 0xA5A5A5A4u);
  EXPECT_EQ(Word(output, 3), 0xA5A5A5A4u);
}

TEST(TranslateGammaItpTest, OpensATraceNamedAfterItself) {
  RecordingTraceSink sink;
  GammaItpOutput output{};
  TonemapCurve curve;
  const Status status =
      TranslateGamma(ZelTuningBlock<GammaTuning>(IdentityTuning()), TuningRules(), output, curve);
  TAVIK_EXPECT_OK(status);
  EXPECT_THAT(sink.spans(), ElementsAre(std::pair<int, std::string>(5, "TranslateGamma")));
}

// --- G3AA translation ----------------------------------------------------------------------------

TEST(TranslateGammaG3aaTest, WritesTheGreenCurveAtTheStageKnots) {
  const std::vector<float> x = Knots64();
  std::vector<float> r(65, 0.0f), g, b(65, 1.0f);
  for (float v : x) g.push_back(std::sqrt(v));
  auto config = PatternFilled<GammaConfigValue>();
  auto lut = PatternFilled<GammaLutValue>();
  TAVIK_ASSERT_OK(TranslateGamma(ZelTuningBlock<GammaTuning>(MakeTuning(x, r, g, b)), TuningRules(),
                                 config, lut));
  EXPECT_EQ(config.enable, 1u);
  EXPECT_EQ(Word(config, 0), 0xA5A5A501u);
  const std::vector<float> knots = ExpectedG3aaKnots();
  for (int i = 0; i <= 80; ++i) {
    EXPECT_EQ(lut.gamma_lut_values[i], ExpectedG3aaCode(ExpectedResample(x, g, knots[i]))) << i;
  }
  EXPECT_EQ(lut.gamma_lut_values[0], 0);
  EXPECT_EQ(lut.gamma_lut_values[80], 32767);
  for (int i = 81; i < 96; ++i) EXPECT_EQ(lut.gamma_lut_values[i], 0) << i;
}

TEST(TranslateGammaG3aaTest, KnotsAreTheSixDecimalValuesNotThePowersOfTwo) {
  // A curve that rises by 1.0 over the first knot gap magnifies the knots' rounding: 1/256 would
  // give 8192 and 2/256 16384.
  const std::vector<float> x = Knots64();
  std::vector<float> g(65, 1.0f);
  g[0] = 0.0f;
  GammaConfigValue config{};
  GammaLutValue lut{};
  TAVIK_ASSERT_OK(TranslateGamma(ZelTuningBlock<GammaTuning>(MakeTuning(x, x, g, x)), TuningRules(),
                                 config, lut));
  EXPECT_EQ(lut.gamma_lut_values[1], 8191);
  EXPECT_EQ(lut.gamma_lut_values[2], 16383);
  EXPECT_EQ(lut.gamma_lut_values[4], 32767);  // 0.015625 is exact.
}

TEST(TranslateGammaG3aaTest, DisabledBlockWritesTheEnableByteAndKeepsTheOldTable) {
  GammaTuning tuning;
  tuning.set_enable(false);
  for (float v : Knots64()) tuning.mutable_static_param()->add_gamma_x(v);
  tuning.mutable_dynamic_param();
  auto config = PatternFilled<GammaConfigValue>();
  auto lut = PatternFilled<GammaLutValue>();
  const auto old_lut = lut;
  TAVIK_ASSERT_OK(TranslateGamma(ZelTuningBlock<GammaTuning>(tuning), TuningRules(), config, lut));
  EXPECT_EQ(config.enable, 0u);
  EXPECT_EQ(Word(config, 0), 0xA5A5A500u);
  EXPECT_TRUE(SameBytes(lut, old_lut));
}

TEST(TranslateGammaG3aaTest, ApplicationCurveEnablesTheStage) {
  const Points identity = {{0.0f, 0.0f}, {1.0f, 1.0f}};
  const Points half = {{0.0f, 0.0f}, {1.0f, 0.5f}};
  const ZelTuningBlock<vosbrine::zelmondrake::BlcTuning> unused_block;
  auto config = PatternFilled<GammaConfigValue>();
  auto lut = PatternFilled<GammaLutValue>();
  TAVIK_ASSERT_OK(TranslateGamma(unused_block, CurveRules(identity, half, identity), config, lut));
  EXPECT_EQ(config.enable, 1u);
  // The stage reads the tuning sampled at i/65, beyond 64/65 extrapolated.
  std::vector<float> x, g;
  for (int i = 0; i <= 64; ++i) {
    const float xi = static_cast<float>(i) / 65.0f;
    const float t = (1.0f - xi) / 1.0f;
    x.push_back(xi);
    g.push_back(t * 0.0f + (1.0f - t) * 0.5f);
  }
  const std::vector<float> knots = ExpectedG3aaKnots();
  for (int i = 0; i <= 80; ++i) {
    EXPECT_EQ(lut.gamma_lut_values[i], ExpectedG3aaCode(ExpectedResample(x, g, knots[i]))) << i;
  }
  EXPECT_EQ(lut.gamma_lut_values[80], 16384);
  for (int i = 81; i < 96; ++i) EXPECT_EQ(lut.gamma_lut_values[i], 0) << i;
}

TEST(TranslateGammaG3aaTest, FailuresOfTheTuningAndTheCurveLeaveTheRecordsUntouched) {
  ScopedLogCapture capture;
  auto config = PatternFilled<GammaConfigValue>();
  auto lut = PatternFilled<GammaLutValue>();
  const auto old_config = config;
  const auto old_lut = lut;
  GammaTuning no_dynamic = IdentityTuning();
  no_dynamic.clear_dynamic_param();
  GammaTuning no_static = IdentityTuning();
  no_static.clear_static_param();
  EXPECT_THAT(TranslateGamma(ZelTuningBlock<vosbrine::zelmondrake::BlcTuning>(), TuningRules(),
                             config, lut),
              StatusIs(kInvalid, "Invalid TuningBlock!"));
  EXPECT_THAT(TranslateGamma(ZelTuningBlock<GammaTuning>(no_dynamic), TuningRules(), config, lut),
              StatusIs(kInvalid, "Tuning data doesn't have region info."));
  EXPECT_THAT(TranslateGamma(ZelTuningBlock<GammaTuning>(no_static), TuningRules(), config, lut),
              StatusIs(kInvalid, "Tuning data doesn't have static info."));
  EXPECT_THAT(TranslateGamma(ZelTuningBlock<GammaTuning>(), CurveRules({}, {}, {}), config, lut),
              StatusIs(kInvalid, "Tone map curve should have at least 2 data!"));
  EXPECT_TRUE(SameBytes(config, old_config));
  EXPECT_TRUE(SameBytes(lut, old_lut));
}

TEST(TranslateGammaG3aaTest, ReadsNoListLengthsUntilTheTableIsBuilt) {
  // Sixty-five knots and nothing else: fine while the stage is off.
  GammaTuning tuning;
  for (float v : Knots64()) tuning.mutable_static_param()->add_gamma_x(v);
  tuning.mutable_dynamic_param()->add_gamma_r(0.0f);
  tuning.set_enable(false);
  GammaConfigValue config{};
  GammaLutValue lut{};
  TAVIK_EXPECT_OK(TranslateGamma(ZelTuningBlock<GammaTuning>(tuning), TuningRules(), config, lut));
  // Sixty-five knots and 129 green values: every bracket lies within both lists.
  std::vector<float> long_g(129, 0.5f);
  tuning = MakeTuning(Knots64(), {}, long_g, {});
  TAVIK_ASSERT_OK(TranslateGamma(ZelTuningBlock<GammaTuning>(tuning), TuningRules(), config, lut));
  EXPECT_EQ(lut.gamma_lut_values[40], 16384);
}

TEST(TranslateGammaG3aaTest, AGreenCurveShorterThanTheKnotsIsRefused) {
  std::vector<float> short_g = Knots64();
  short_g.pop_back();
  GammaConfigValue config{};
  auto lut = PatternFilled<GammaLutValue>();
  EXPECT_THAT(TranslateGamma(ZelTuningBlock<GammaTuning>(MakeTuning(Knots64(), {}, short_g, {})),
                             TuningRules(), config, lut),
              StatusIs(kInvalid, "Gamma size is wrong: 65"));
  EXPECT_EQ(config.enable, 1u);
}

TEST(TranslateGammaG3aaTest, FlatBracketFailsAfterTheTableIsCleared) {
  std::vector<float> x = Knots64();
  x[1] = 0.0f;
  GammaConfigValue config{};
  auto lut = PatternFilled<GammaLutValue>();
  EXPECT_THAT(TranslateGamma(ZelTuningBlock<GammaTuning>(MakeTuning(x, x, x, x)), TuningRules(),
                             config, lut),
              StatusIs(kInvalid, "gamma_x[1] must be larger than [0] in tuning data. 0 0"));
  EXPECT_EQ(config.enable, 1u);
  for (int i = 0; i < 96; ++i) EXPECT_EQ(lut.gamma_lut_values[i], 0) << i;
}

// --- Defaults ------------------------------------------------------------------------------------

TEST(GetDefaultGammaItpTest, GivesThePowerCurveWithoutBypass) {
  auto output = PatternFilled<GammaItpOutput>();
  auto fixed = PatternFilled<GammaItpFixedOutput>();
  TAVIK_ASSERT_OK(GetDefaultGamma(output, fixed));
  EXPECT_EQ(output.bypass, 0u);
  EXPECT_EQ(output.gamma_r_last_negative, 0u);
  EXPECT_EQ(output.gamma_g_last_negative, 0u);
  EXPECT_EQ(output.gamma_b_last_negative, 0u);
  EXPECT_EQ(output.gamma_x_last_step, 256);  // 1/64 in Q14.
  for (int i = 0; i < 64; ++i) {
    EXPECT_EQ(output.gamma_x[i], 256 * i) << i;
    EXPECT_EQ(output.gamma_r[i], ExpectedItpCode(kDefaultCurve[i])) << i;
    EXPECT_EQ(output.gamma_g[i], output.gamma_r[i]) << i;
    EXPECT_EQ(output.gamma_b[i], output.gamma_r[i]) << i;
  }
  EXPECT_EQ(output.gamma_r[1], 2474);    // 0.151011 * 16384 = 2474.16.
  EXPECT_EQ(output.gamma_r[63], 16267);  // 0.992867 * 16384 = 16267.13.
  EXPECT_EQ(output.gamma_r_last_step, 117);
  EXPECT_EQ(output.gamma_g_last_step, 117);
  EXPECT_EQ(output.gamma_b_last_step, 117);
  EXPECT_EQ(Word(output, 0), 0xA5A5A5A4u);
}

TEST(GetDefaultGammaItpTest, ClearsTheFixedFieldsAndKeepsTheirNeighbours) {
  GammaItpOutput output{};
  auto fixed = PatternFilled<GammaItpFixedOutput>();
  TAVIK_ASSERT_OK(GetDefaultGamma(output, fixed));
  EXPECT_EQ(fixed.flag, 0u);
  EXPECT_EQ(fixed.value_0, 0u);
  EXPECT_EQ(fixed.value_1, 0u);
  EXPECT_EQ(Word(fixed, 0), 0xA5A5A5A4u);
  EXPECT_EQ(Slot16(fixed, 4), 0x8000);
  EXPECT_EQ(Slot16(fixed, 6), 0x8000);
}

TEST(GetDefaultGammaItpTest, OpensItsOwnTraceAroundTheTranslation) {
  RecordingTraceSink sink;
  GammaItpOutput output{};
  GammaItpFixedOutput fixed{};
  const Status status = GetDefaultGamma(output, fixed);
  TAVIK_EXPECT_OK(status);
  EXPECT_THAT(sink.spans(), ElementsAre(std::pair<int, std::string>(5, "TranslateGamma"),
                                        std::pair<int, std::string>(5, "GetDefaultGamma")));
}

TEST(GetDefaultGammaG3aaTest, EnablesTheStageAndLimitsTheTopSlot) {
  auto config = PatternFilled<GammaConfigValue>();
  auto lut = PatternFilled<GammaLutValue>();
  TAVIK_ASSERT_OK(GetDefaultGamma(config, lut));
  EXPECT_EQ(config.enable, 1u);
  EXPECT_EQ(lut.gamma_lut_values[0], 0);
  EXPECT_EQ(lut.gamma_lut_values[80], 32767);  // 1.0 codes as 32768.
  const std::vector<float> x = Knots64();
  const std::vector<float> curve(std::begin(kDefaultCurve), std::end(kDefaultCurve));
  const std::vector<float> knots = ExpectedG3aaKnots();
  for (int i = 0; i <= 80; ++i) {
    EXPECT_EQ(lut.gamma_lut_values[i], ExpectedG3aaCode(ExpectedResample(x, curve, knots[i]))) << i;
  }
  for (int i = 81; i < 96; ++i) EXPECT_EQ(lut.gamma_lut_values[i], 0) << i;
}

// --- The sample tuning set -----------------------------------------------------------------------

// The curve handed back for every leaf is the tuning's, resampled at 64 points.
TEST(GammaSampleTuningTest, EveryLeafHandsBackA64PointCurve) {
  const int leaves = test::ForEachSampleLeaf<GammaTuning>(
      [](const ZelTuningBlock<GammaTuning>& block, const std::string&) {
        GammaItpOutput output{};
        TonemapCurve curve;
        EXPECT_THAT(TranslateGamma(block, TuningRules(), output, curve), IsOk());
        EXPECT_EQ(curve.red.size(), 64u);
        EXPECT_EQ(curve.green.size(), 64u);
        EXPECT_EQ(curve.blue.size(), 64u);
      });
  if (::testing::Test::IsSkipped()) return;
  EXPECT_GT(leaves, 0);
}

}  // namespace
}  // namespace tavik
