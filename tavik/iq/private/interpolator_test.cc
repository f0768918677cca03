#include "tavik/iq/private/interpolator.h"

#include <cmath>
#include <limits>
#include <memory>
#include <optional>
#include <ostream>
#include <string>
#include <utility>
#include <vector>

#include "gmock/gmock.h"
#include "gtest/gtest.h"
#include "tavik/base/testing/log_capture.h"
#include "tavik/base/testing/status_matchers.h"
#include "tavik/iq/protos/camera_state.pb.h"
#include "tavik/iq/protos/tuning_tree.pb.h"
#include "tavik/iq/testing/tuning_builders.h"
#include "tavik/iq/zel/protos/ccm_param.pb.h"
#include "tavik/iq/zel/protos/dmsc_param.pb.h"
#include "tavik/iq/zel/protos/hqdns_param.pb.h"
#include "tavik/iq/zel/protos/lsc_param.pb.h"
#include "tavik/iq/zel/protos/vorel_debug_param.pb.h"
#include "tavik/iq/zel/protos/wb_param.pb.h"

namespace tavik {
namespace {

using ::google::protobuf::FieldDescriptor;
using ::google::protobuf::Message;
using ::tavik::test::ChildNode;
using ::tavik::test::DynamicSchema;
using ::tavik::test::EmptyNode;
using ::tavik::test::LeafNode;
using ::tavik::test::MakeLevel;
using ::tavik::test::ParseText;
using ::tavik::test::ParseTextInto;
using ::tavik::test::ProtoEquals;
using ::tavik::test::ScopedLogCapture;
using ::tavik::test::StateWith;
using ::tavik::test::StatusIs;
using ::testing::ElementsAre;
using ::testing::IsEmpty;
using ::vosbrine::CameraState;
using ::vosbrine::Level;
using ::vosbrine::TuningTree;
using ::vosbrine::zelmondrake::CcmDynamicParam;
using ::vosbrine::zelmondrake::DebugParameters;
using ::vosbrine::zelmondrake::DmscDynamicParam;
using ::vosbrine::zelmondrake::HqdnsDynamicParam;
using ::vosbrine::zelmondrake::LscDynamicParam;
using ::vosbrine::zelmondrake::LscStaticParam;
using ::vosbrine::zelmondrake::VorelDebugConfig;
using ::vosbrine::zelmondrake::VorelDynamicParam;
using ::vosbrine::zelmondrake::WbDynamicParam;

constexpr absl::StatusCode kInvalidArgument = absl::StatusCode::kInvalidArgument;
constexpr android::base::LogSeverity kVerbose = android::base::VERBOSE;
constexpr android::base::LogSeverity kError = android::base::ERROR;

// The blend as the tuning data defines it, step by step in single precision: t from the region
// ends, then (1 - t) * a + t * b as two products and one sum. `volatile` keeps every step rounded
// to float and unfused.
float ReferenceT(float x1, float x2, float x) {
  volatile float delta = x2 - x1;
  volatile float offset = x - x1;
  volatile float t = offset / delta;
  return t;
}

float ReferenceBlend(float a, float b, float t) {
  volatile float one_minus_t = 1.0f - t;
  volatile float weighted_a = one_minus_t * a;
  volatile float weighted_b = t * b;
  volatile float sum = weighted_a + weighted_b;
  return sum;
}

VorelDynamicParam Vorel(float gradient_threshold) {
  VorelDynamicParam param;
  param.set_gradient_threshold(gradient_threshold);
  return param;
}

TuningTree TreeWithTop(Level top_level) {
  TuningTree tree;
  *tree.mutable_dynamic_top_level() = std::move(top_level);
  return tree;
}

// Regions [0, 10] and [20, 30] of `type`, valued `low` and `high`.
TuningTree TwoRegionTree(Level::Type type, const Message& low, const Message& high) {
  return TreeWithTop(MakeLevel(type, {LeafNode(0, 10, low), LeafNode(20, 30, high)}));
}

// gradient_threshold of the two-region CCT tree with leaves 2 and 6, evaluated at `cct`.
float EvaluateTwoRegionCctAt(float cct) {
  VorelDynamicParam out;
  const Status status =
      InterpolateTree(TwoRegionTree(Level::CCT, Vorel(2), Vorel(6)), StateWith("cct", cct), &out);
  EXPECT_THAT(status, test::IsOk());
  return out.gradient_threshold();
}

// ---------------------------------------------------------------------------------------------
// Region search and blending through a tree.

TEST(InterpolateTreeTest, GapBetweenZeroToTenAndTwentyToThirtyBlendsHalfWayAtFifteen) {
  EXPECT_EQ(EvaluateTwoRegionCctAt(15), 4.0f);
}

TEST(InterpolateTreeTest, CoordinateOnARegionEndTakesThatRegionAlone) {
  ScopedLogCapture capture;
  EXPECT_EQ(EvaluateTwoRegionCctAt(10), 2.0f);
  EXPECT_EQ(EvaluateTwoRegionCctAt(20), 6.0f);
  // No blend was tried, not even one that gives a region's value.
  EXPECT_THAT(capture.lines(), IsEmpty());
}

TEST(InterpolateTreeTest, CoordinateEqualToAnUpperIsInsideThatRegion) {
  // The second region reaches back over the first's upper end; the first still holds it.
  const TuningTree tree =
      TreeWithTop(MakeLevel(Level::CCT, {LeafNode(0, 10, Vorel(2)), LeafNode(5, 30, Vorel(6))}));
  VorelDynamicParam out;
  TAVIK_ASSERT_OK(InterpolateTree(tree, StateWith("cct", 10), &out));
  EXPECT_EQ(out.gradient_threshold(), 2.0f);
}

TEST(InterpolateTreeTest, CoordinateOutsideAllRegionsTakesTheEndRegionAlone) {
  EXPECT_EQ(EvaluateTwoRegionCctAt(-5), 2.0f);
  EXPECT_EQ(EvaluateTwoRegionCctAt(40), 6.0f);
}

TEST(InterpolateTreeTest, CoordinateInsideARegionTakesItsValueFlat) {
  EXPECT_EQ(EvaluateTwoRegionCctAt(0), 2.0f);
  EXPECT_EQ(EvaluateTwoRegionCctAt(5), 2.0f);
  EXPECT_EQ(EvaluateTwoRegionCctAt(25), 6.0f);
  EXPECT_EQ(EvaluateTwoRegionCctAt(30), 6.0f);
}

TEST(InterpolateTreeTest, GapBlendIsTwoSinglePrecisionProductsAndOneSum) {
  // At 13 between regions ending at 10 and starting at 20, t is 3 / 10 in single precision. These
  // values round differently when the products are fused or computed in double precision, so
  // the test tells those apart.
  const float a = 0.2f;
  const float b = 0.7f;
  const float t = ReferenceT(10, 20, 13);
  const float expected = ReferenceBlend(a, b, t);
  ASSERT_NE(expected, std::fma(1.0f - t, a, t * b));
  ASSERT_NE(expected, std::fma(t, b, (1.0f - t) * a));
  ASSERT_NE(expected, static_cast<float>((1.0 - 0.3) * 0.2 + 0.3 * 0.7));

  VorelDynamicParam out;
  TAVIK_ASSERT_OK(
      InterpolateTree(TwoRegionTree(Level::CCT, Vorel(a), Vorel(b)), StateWith("cct", 13), &out));
  EXPECT_EQ(out.gradient_threshold(), expected);
}

TEST(InterpolateTreeTest, WholeLeafIsTakenWhenOneRegionHoldsTheCoordinate) {
  VorelDynamicParam low;
  low.set_gradient_threshold(1);
  low.set_tint_update_gain(0.5f);
  VorelDynamicParam high;
  high.set_limiter_threshold(9);
  VorelDynamicParam out;
  out.set_prj_delta_threshold(7);  // Replaced: the leaf is unpacked into `out`, not merged.
  TAVIK_ASSERT_OK(InterpolateTree(TwoRegionTree(Level::CCT, low, high), StateWith("cct", 3), &out));
  EXPECT_TRUE(ProtoEquals(low, out));
}

TEST(InterpolateTreeTest, NanCoordinateTakesTheFirstRegionAlone) {
  const TuningTree tree =
      TreeWithTop(MakeLevel(Level::CCT, {LeafNode(0, 10, Vorel(2)), LeafNode(20, 30, Vorel(6)),
                                         LeafNode(40, 50, Vorel(8))}));
  VorelDynamicParam out;
  TAVIK_ASSERT_OK(
      InterpolateTree(tree, StateWith("cct", std::numeric_limits<float>::quiet_NaN()), &out));
  EXPECT_EQ(out.gradient_threshold(), 2.0f);
}

TEST(InterpolateTreeTest, OverlappingRegionsGiveTheFirstWhoseUpperReachesTheCoordinate) {
  const TuningTree tree =
      TreeWithTop(MakeLevel(Level::CCT, {LeafNode(0, 20, Vorel(2)), LeafNode(10, 30, Vorel(6))}));
  VorelDynamicParam out;
  TAVIK_ASSERT_OK(InterpolateTree(tree, StateWith("cct", 15), &out));
  EXPECT_EQ(out.gradient_threshold(), 2.0f);
  TAVIK_ASSERT_OK(InterpolateTree(tree, StateWith("cct", 25), &out));
  EXPECT_EQ(out.gradient_threshold(), 6.0f);
}

TEST(InterpolateTreeTest, RegionsLessThanOneMillionthApartGiveTheFirstRegionInTheGap) {
  // Four float steps above 1 is about 4.8e-7, below the smallest gap that is blended across.
  const float first_upper = 1.0f;
  const float second_lower = std::nextafter(
      std::nextafter(std::nextafter(std::nextafter(first_upper, 2.0f), 2.0f), 2.0f), 2.0f);
  const float in_gap = std::nextafter(std::nextafter(first_upper, 2.0f), 2.0f);
  ASSERT_LT(first_upper, in_gap);
  ASSERT_LT(in_gap, second_lower);
  const TuningTree tree = TreeWithTop(MakeLevel(
      Level::CCT, {LeafNode(0, first_upper, Vorel(2)), LeafNode(second_lower, 3, Vorel(6))}));

  ScopedLogCapture capture;
  VorelDynamicParam out;
  TAVIK_ASSERT_OK(InterpolateTree(tree, StateWith("cct", in_gap), &out));
  EXPECT_EQ(out.gradient_threshold(), 2.0f);
  EXPECT_THAT(capture.messages(kVerbose), ElementsAre("x2 <= x1, no interpolation was done."));
}

TEST(InterpolateTreeTest, TwoNestedLevelsBlendFourLeavesWithThreeBlends) {
  // CCT splits into two regions, each split by BV into two leaves.
  const Level low_cct =
      MakeLevel(Level::BV, {LeafNode(0, 10, Vorel(0)), LeafNode(20, 30, Vorel(8))});
  const Level high_cct =
      MakeLevel(Level::BV, {LeafNode(0, 10, Vorel(4)), LeafNode(20, 30, Vorel(12))});
  const TuningTree tree =
      TreeWithTop(MakeLevel(Level::CCT, {ChildNode(0, 10, low_cct), ChildNode(20, 30, high_cct)}));
  CameraState state;
  state.mutable_level_coordinates()->set_cct(17.5f);  // t = 0.75
  state.mutable_level_coordinates()->set_bv(12.5f);   // t = 0.25

  ScopedLogCapture capture;
  VorelDynamicParam out;
  TAVIK_ASSERT_OK(InterpolateTree(tree, state, &out));
  // Low CCT: 0.75 * 0 + 0.25 * 8 = 2. High CCT: 0.75 * 4 + 0.25 * 12 = 6.
  // Across CCT: 0.25 * 2 + 0.75 * 6 = 5.
  EXPECT_EQ(out.gradient_threshold(), 5.0f);
  EXPECT_EQ(capture.Count("gradient_threshold is interpolated."), 3);
}

TEST(InterpolateTreeTest, SiblingRegionsMayHoldLeavesAtDifferentDepthsAndOtherLevelTypes) {
  const Level high_cct =
      MakeLevel(Level::GAIN, {LeafNode(0, 10, Vorel(100)), LeafNode(20, 30, Vorel(6))});
  const TuningTree tree =
      TreeWithTop(MakeLevel(Level::CCT, {LeafNode(0, 10, Vorel(2)), ChildNode(20, 30, high_cct)}));
  CameraState state;
  state.mutable_level_coordinates()->set_cct(15);
  state.mutable_level_coordinates()->set_real_gain(25);
  VorelDynamicParam out;
  TAVIK_ASSERT_OK(InterpolateTree(tree, state, &out));
  EXPECT_EQ(out.gradient_threshold(), 4.0f);  // 0.5 * 2 + 0.5 * 6
}

TEST(InterpolateTreeTest, UnsetLevelCoordinatesEvaluateEveryLevelAtZero) {
  const Level high_bv =
      MakeLevel(Level::GAIN, {LeafNode(-1, 1, Vorel(6)), LeafNode(5, 6, Vorel(100))});
  const TuningTree tree =
      TreeWithTop(MakeLevel(Level::BV, {LeafNode(-10, -10, Vorel(2)), ChildNode(10, 10, high_bv)}));
  VorelDynamicParam out;
  TAVIK_ASSERT_OK(InterpolateTree(tree, CameraState::default_instance(), &out));
  // BV 0 lies half way between -10 and 10; GAIN 0 lies inside [-1, 1].
  EXPECT_EQ(out.gradient_threshold(), 4.0f);
}

TEST(InterpolateTreeTest, FrameCountIsAFloatCoordinate) {
  const FieldDescriptor* frame_count =
      vosbrine::LevelCoordinates::descriptor()->FindFieldByName("frame_count");
  ASSERT_NE(frame_count, nullptr);
  EXPECT_EQ(frame_count->cpp_type(), FieldDescriptor::CPPTYPE_FLOAT);

  VorelDynamicParam out;
  TAVIK_ASSERT_OK(InterpolateTree(TwoRegionTree(Level::FRAME_COUNT, Vorel(2), Vorel(6)),
                                  StateWith("frame_count", 12.5f), &out));
  EXPECT_EQ(out.gradient_threshold(), 3.0f);  // t = 0.25: 0.75 * 2 + 0.25 * 6
}

struct LevelCoordinateCase {
  Level::Type type;
  const char* coordinate;
};

void PrintTo(const LevelCoordinateCase& level_case, std::ostream* os) {
  *os << level_case.coordinate;
}

class LevelCoordinateTest : public ::testing::TestWithParam<LevelCoordinateCase> {};

TEST_P(LevelCoordinateTest, LevelReadsTheCoordinateNamedForItsType) {
  // Every coordinate lies above all regions except the one of the level's type, which lies half
  // way in the gap: reading any other coordinate would give the high region alone.
  CameraState state;
  vosbrine::LevelCoordinates* coordinates = state.mutable_level_coordinates();
  const google::protobuf::Descriptor* descriptor = coordinates->GetDescriptor();
  for (int i = 0; i < descriptor->field_count(); ++i) {
    const FieldDescriptor* field = descriptor->field(i);
    coordinates->GetReflection()->SetFloat(coordinates, field,
                                           field->name() == GetParam().coordinate ? 15.0f : 40.0f);
  }
  VorelDynamicParam out;
  TAVIK_ASSERT_OK(InterpolateTree(TwoRegionTree(GetParam().type, Vorel(2), Vorel(6)), state, &out));
  EXPECT_EQ(out.gradient_threshold(), 4.0f);
}

INSTANTIATE_TEST_SUITE_P(
    AllLevelTypes, LevelCoordinateTest,
    ::testing::Values(LevelCoordinateCase{Level::LED, "led_influence"},
                      LevelCoordinateCase{Level::CCT, "cct"}, LevelCoordinateCase{Level::BV, "bv"},
                      LevelCoordinateCase{Level::GAIN, "real_gain"},
                      LevelCoordinateCase{Level::EXP_RATIO, "exp_ratio"},
                      LevelCoordinateCase{Level::SCALER_RATIO, "scaler_ratio"},
                      LevelCoordinateCase{Level::MIRED_CCT, "mired_cct"},
                      LevelCoordinateCase{Level::PRE_SCALER_RATIO, "pre_scaler_ratio"},
                      LevelCoordinateCase{Level::FRAME_COUNT, "frame_count"},
                      LevelCoordinateCase{Level::EXPOSURE_TIME_MSECS, "exposure_time_msecs"}),
    [](const ::testing::TestParamInfo<LevelCoordinateCase>& info) {
      return std::string(info.param.coordinate);
    });

TEST(InterpolateTreeTest, RepeatedFloatsOfDifferentLengthsKeepTheFirstRegionsListAndSucceed) {
  const CcmDynamicParam low = ParseText<CcmDynamicParam>("ccm_gains: [1, 2, 3]");
  const CcmDynamicParam high = ParseText<CcmDynamicParam>("ccm_gains: [5, 6]");
  ScopedLogCapture capture;
  CcmDynamicParam out;
  TAVIK_ASSERT_OK(
      InterpolateTree(TwoRegionTree(Level::CCT, low, high), StateWith("cct", 15), &out));
  EXPECT_THAT(out.ccm_gains(), ElementsAre(1.0f, 2.0f, 3.0f));
  EXPECT_THAT(capture.messages(kError),
              ElementsAre("Mismatched sizes found at the repeated field ccm_gains"));
}

// ---------------------------------------------------------------------------------------------
// Failures of a tree.

TEST(InterpolateTreeTest, NullOutputFails) {
  EXPECT_THAT(
      InterpolateTree(TwoRegionTree(Level::CCT, Vorel(2), Vorel(6)), StateWith("cct", 15), nullptr),
      StatusIs(kInvalidArgument, "out_dynamic_msg is nullptr."));
}

TEST(InterpolateTreeTest, TreeWithoutDynamicTopLevelFails) {
  VorelDynamicParam out;
  EXPECT_THAT(InterpolateTree(TuningTree::default_instance(), CameraState(), &out),
              StatusIs(kInvalidArgument, "Tree does not have dynamic_top_level."));
  TuningTree tree;
  tree.set_enable(true);
  tree.mutable_static_param()->PackFrom(Vorel(1));
  EXPECT_THAT(InterpolateTree(tree, CameraState(), &out),
              StatusIs(kInvalidArgument, "Tree does not have dynamic_top_level."));
}

TEST(InterpolateTreeTest, LevelWithoutNodesFailsAsEmptyLevelNamingTheOutputType) {
  VorelDynamicParam out;
  EXPECT_THAT(InterpolateTree(TreeWithTop(MakeLevel(Level::CCT, {})), CameraState(), &out),
              StatusIs(kInvalidArgument, "Empty level. vosbrine.zelmondrake.VorelDynamicParam"));
}

TEST(InterpolateTreeTest, UnknownLevelTypeWithNodesFailsAsUnexpectedNodeType) {
  VorelDynamicParam out;
  EXPECT_THAT(
      InterpolateTree(TwoRegionTree(Level::UNKNOWN, Vorel(2), Vorel(6)), CameraState(), &out),
      StatusIs(kInvalidArgument, "Unexpected node type."));
}

TEST(InterpolateTreeTest, UnknownLevelTypeWithoutNodesFailsAsEmptyLevelFirst) {
  VorelDynamicParam out;
  EXPECT_THAT(InterpolateTree(TreeWithTop(MakeLevel(Level::UNKNOWN, {})), CameraState(), &out),
              StatusIs(kInvalidArgument, "Empty level. vosbrine.zelmondrake.VorelDynamicParam"));
}

TEST(InterpolateTreeTest, LevelTypeBeyondTheKnownOnesFailsAsUnexpectedNodeType) {
  VorelDynamicParam out;
  EXPECT_THAT(InterpolateTree(TwoRegionTree(static_cast<Level::Type>(11), Vorel(2), Vorel(6)),
                              CameraState(), &out),
              StatusIs(kInvalidArgument, "Unexpected node type."));
}

TEST(InterpolateTreeTest, RegionWithNeitherLeafNorChildLevelFailsAsEmptyLevel) {
  const TuningTree tree =
      TreeWithTop(MakeLevel(Level::CCT, {EmptyNode(0, 10), LeafNode(20, 30, Vorel(6))}));
  VorelDynamicParam out;
  EXPECT_THAT(InterpolateTree(tree, StateWith("cct", 5), &out),
              StatusIs(kInvalidArgument, "Empty level. vosbrine.zelmondrake.VorelDynamicParam"));
}

TEST(InterpolateTreeTest, FirstRegionOfAnotherTypeFailsToUnpack) {
  VorelDynamicParam out;
  EXPECT_THAT(
      InterpolateTree(TwoRegionTree(Level::CCT, ParseText<WbDynamicParam>("wb_gains: 1"), Vorel(6)),
                      StateWith("cct", 5), &out),
      StatusIs(kInvalidArgument,
               "Failed to Unpack first_region. vosbrine.zelmondrake.VorelDynamicParam"));
}

TEST(InterpolateTreeTest, LeavesOfDifferentTypesFailToUnpackTheSecondRegionKeepingTheFirst) {
  VorelDynamicParam out;
  EXPECT_THAT(
      InterpolateTree(TwoRegionTree(Level::CCT, Vorel(2), ParseText<WbDynamicParam>("wb_gains: 1")),
                      StateWith("cct", 15), &out),
      StatusIs(kInvalidArgument,
               "Failed to Unpack second_region. vosbrine.zelmondrake.VorelDynamicParam"));
  EXPECT_EQ(out.gradient_threshold(), 2.0f);
}

TEST(InterpolateTreeTest, FailureOfAChildLevelIsReturnedAsItIs) {
  const TuningTree first_fails = TreeWithTop(MakeLevel(
      Level::CCT, {ChildNode(0, 10, MakeLevel(Level::UNKNOWN, {LeafNode(0, 1, Vorel(1))})),
                   LeafNode(20, 30, Vorel(6))}));
  VorelDynamicParam out;
  EXPECT_THAT(InterpolateTree(first_fails, StateWith("cct", 5), &out),
              StatusIs(kInvalidArgument, "Unexpected node type."));

  const TuningTree second_fails = TreeWithTop(MakeLevel(
      Level::CCT, {LeafNode(0, 10, Vorel(2)), ChildNode(20, 30, MakeLevel(Level::BV, {}))}));
  EXPECT_THAT(InterpolateTree(second_fails, StateWith("cct", 15), &out),
              StatusIs(kInvalidArgument, "Empty level. vosbrine.zelmondrake.VorelDynamicParam"));
  EXPECT_EQ(out.gradient_threshold(), 2.0f);  // What was reached stays.
}

// ---------------------------------------------------------------------------------------------
// Blending of two messages.

TEST(LinearInterpolateMessageTest, NullOutputLogsAnErrorAndFails) {
  ScopedLogCapture capture;
  EXPECT_FALSE(LinearInterpolateMessage(Vorel(2), Vorel(6), 10, 20, 15, nullptr));
  EXPECT_THAT(capture.messages(kError), ElementsAre("Output messages pointer is nullptr."));
}

TEST(LinearInterpolateMessageTest, MessagesOfDifferentTypesLogAnErrorAndFailLeavingOutput) {
  const WbDynamicParam wb = ParseText<WbDynamicParam>("wb_gains: 1");
  VorelDynamicParam out = Vorel(9);
  {
    ScopedLogCapture capture;
    EXPECT_FALSE(LinearInterpolateMessage(Vorel(2), wb, 10, 20, 15, &out));
    EXPECT_THAT(capture.messages(kError),
                ElementsAre("Input and output messages are not the same type."));
  }
  {
    ScopedLogCapture capture;
    EXPECT_FALSE(LinearInterpolateMessage(wb, Vorel(6), 10, 20, 15, &out));
    EXPECT_THAT(capture.messages(kError),
                ElementsAre("Input and output messages are not the same type."));
  }
  {
    ScopedLogCapture capture;
    WbDynamicParam wb_out;
    EXPECT_FALSE(LinearInterpolateMessage(Vorel(2), Vorel(6), 10, 20, 15, &wb_out));
    EXPECT_THAT(capture.messages(kError),
                ElementsAre("Input and output messages are not the same type."));
  }
  EXPECT_EQ(out.gradient_threshold(), 9.0f);
}

TEST(LinearInterpolateMessageTest, RegionEndsNotApartGiveMsg1) {
  for (const float x2 : {10.0f, 5.0f}) {
    ScopedLogCapture capture;
    VorelDynamicParam out;
    EXPECT_TRUE(LinearInterpolateMessage(Vorel(2), Vorel(6), 10, x2, 7, &out));
    EXPECT_EQ(out.gradient_threshold(), 2.0f) << x2;
    EXPECT_THAT(capture.messages(kVerbose), ElementsAre("x2 <= x1, no interpolation was done."));
  }
}

TEST(LinearInterpolateMessageTest, CoordinateAtOrBelowX1GivesMsg1) {
  for (const float x : {10.0f, 5.0f}) {
    ScopedLogCapture capture;
    VorelDynamicParam out;
    EXPECT_TRUE(LinearInterpolateMessage(Vorel(2), Vorel(6), 10, 20, x, &out));
    EXPECT_EQ(out.gradient_threshold(), 2.0f) << x;
    EXPECT_THAT(capture.messages(kVerbose),
                ElementsAre("t <= 0.0, no interpolation was done. out = msg1."));
  }
}

TEST(LinearInterpolateMessageTest, CoordinateAtOrAboveX2GivesAllOfMsg2) {
  DebugParameters msg1;
  msg1.set_gradient_threshold(2);
  msg1.set_enable_vorel(true);
  DebugParameters msg2;
  msg2.set_gradient_threshold(6);
  msg2.set_limiter_threshold(3);
  for (const float x : {20.0f, 25.0f}) {
    ScopedLogCapture capture;
    DebugParameters out;
    EXPECT_TRUE(LinearInterpolateMessage(msg1, msg2, 10, 20, x, &out));
    EXPECT_TRUE(ProtoEquals(msg2, out)) << x;
    EXPECT_THAT(capture.messages(kVerbose),
                ElementsAre("t >= 1.0f, no interpolation was done. out = msg2."));
  }
}

TEST(LinearInterpolateMessageTest, OutputStartsAsACopyOfMsg1) {
  VorelDynamicParam msg1 = Vorel(2);
  msg1.set_tint_update_gain(3);
  VorelDynamicParam msg2 = Vorel(6);
  msg2.set_tint_update_gain(3);
  VorelDynamicParam out;
  out.set_limiter_threshold(100);
  EXPECT_TRUE(LinearInterpolateMessage(msg1, msg2, 10, 20, 15, &out));
  EXPECT_TRUE(
      ProtoEquals(ParseText<VorelDynamicParam>("gradient_threshold: 4 tint_update_gain: 3"), out));
}

TEST(LinearInterpolateMessageTest, OutputMayBeMsg1Itself) {
  VorelDynamicParam msg1 = Vorel(2);
  EXPECT_TRUE(LinearInterpolateMessage(msg1, Vorel(6), 10, 20, 15, &msg1));
  EXPECT_EQ(msg1.gradient_threshold(), 4.0f);
}

TEST(LinearInterpolateMessageTest, FloatBlendIsTwoSinglePrecisionProductsAndOneSum) {
  const float a = 0.2f;
  const float b = 0.7f;
  const float t = ReferenceT(10, 20, 13);
  const float expected = ReferenceBlend(a, b, t);
  ASSERT_NE(expected, std::fma(1.0f - t, a, t * b));
  VorelDynamicParam out;
  EXPECT_TRUE(LinearInterpolateMessage(Vorel(a), Vorel(b), 10, 20, 13, &out));
  EXPECT_EQ(out.gradient_threshold(), expected);
}

TEST(LinearInterpolateMessageTest, RepeatedFloatsBlendElementByElement) {
  const std::vector<float> a = {0.2f, 1.0f, -3.5f, 100.25f, 0.1f};
  const std::vector<float> b = {0.7f, 3.0f, 2.5f, -50.5f, 0.3f};
  CcmDynamicParam msg1;
  CcmDynamicParam msg2;
  for (float value : a) msg1.add_ccm_gains(value);
  for (float value : b) msg2.add_ccm_gains(value);
  const float t = ReferenceT(10, 20, 13);
  CcmDynamicParam out;
  ScopedLogCapture capture;
  EXPECT_TRUE(LinearInterpolateMessage(msg1, msg2, 10, 20, 13, &out));
  ASSERT_EQ(out.ccm_gains_size(), 5);
  for (int i = 0; i < 5; ++i) {
    EXPECT_EQ(out.ccm_gains(i), ReferenceBlend(a[i], b[i], t)) << i;
  }
  EXPECT_THAT(capture.messages(kVerbose), ElementsAre("ccm_gains is interpolated."));
}

TEST(LinearInterpolateMessageTest, RepeatedFloatsOfDifferentLengthsKeepMsg1AndLogTheFieldPath) {
  const LscDynamicParam msg1 = ParseText<LscDynamicParam>(
      "lsc_tables { width: 2 lsc_grid_gain_r: [1, 2] lsc_grid_gain_b: [2] }");
  const LscDynamicParam msg2 = ParseText<LscDynamicParam>(
      "lsc_tables { width: 4 lsc_grid_gain_r: [3, 4, 5] lsc_grid_gain_b: [6] }");
  ScopedLogCapture capture;
  LscDynamicParam out;
  EXPECT_TRUE(LinearInterpolateMessage(msg1, msg2, 10, 20, 15, &out));
  EXPECT_TRUE(
      ProtoEquals(ParseText<LscDynamicParam>(
                      "lsc_tables { width: 2 lsc_grid_gain_r: [1, 2] lsc_grid_gain_b: [4] }"),
                  out));
  EXPECT_THAT(
      capture.messages(kError),
      ElementsAre("Mismatched sizes found at the repeated field lsc_tables.lsc_grid_gain_r"));
}

TEST(LinearInterpolateMessageTest, DeprecatedFloatIsNotBlended) {
  const HqdnsDynamicParam msg1 = ParseText<HqdnsDynamicParam>("thres_low_g: 2 std_factor_r: 2");
  const HqdnsDynamicParam msg2 = ParseText<HqdnsDynamicParam>("thres_low_g: 6 std_factor_r: 6");
  ScopedLogCapture capture;
  HqdnsDynamicParam out;
  EXPECT_TRUE(LinearInterpolateMessage(msg1, msg2, 10, 20, 15, &out));
  EXPECT_TRUE(ProtoEquals(ParseText<HqdnsDynamicParam>("thres_low_g: 2 std_factor_r: 4"), out));
  EXPECT_EQ(capture.Count("thres_low_g is deprecated."), 1);
  EXPECT_EQ(capture.Count("thres_low_g is interpolated."), 0);
  EXPECT_EQ(capture.Count("std_factor_r is interpolated."), 1);
}

TEST(LinearInterpolateMessageTest, DeprecatedMessageFieldIsNotEntered) {
  const LscStaticParam msg1 = ParseText<LscStaticParam>(
      "golden_eeprom_data { lsc_grid_gain_r: 1 } vorel_static_param { min_level_threshold: 2 }");
  const LscStaticParam msg2 = ParseText<LscStaticParam>(
      "golden_eeprom_data { lsc_grid_gain_r: 3 } vorel_static_param { min_level_threshold: 6 }");
  ScopedLogCapture capture;
  LscStaticParam out;
  EXPECT_TRUE(LinearInterpolateMessage(msg1, msg2, 10, 20, 15, &out));
  EXPECT_TRUE(
      ProtoEquals(ParseText<LscStaticParam>("golden_eeprom_data { lsc_grid_gain_r: 1 } "
                                            "vorel_static_param { min_level_threshold: 4 }"),
                  out));
  EXPECT_EQ(capture.Count("golden_eeprom_data is deprecated."), 1);
  EXPECT_FALSE(capture.Contains("golden_eeprom_data."));
}

TEST(LinearInterpolateMessageTest, UnsetProto3FloatStillBlends) {
  HqdnsDynamicParam set;
  set.set_shading_param_a(8);
  const HqdnsDynamicParam unset;
  HqdnsDynamicParam out;
  EXPECT_TRUE(LinearInterpolateMessage(unset, set, 10, 20, 15, &out));
  EXPECT_EQ(out.shading_param_a(), 4.0f);
  EXPECT_TRUE(LinearInterpolateMessage(set, unset, 10, 20, 15, &out));
  EXPECT_EQ(out.shading_param_a(), 4.0f);
}

TEST(LinearInterpolateMessageTest, SubmessageAbsentFromMsg1StaysAbsent) {
  const LscDynamicParam msg1;
  const LscDynamicParam msg2 =
      ParseText<LscDynamicParam>("vorel_dynamic_param { gradient_threshold: 6 }");
  LscDynamicParam out;
  EXPECT_TRUE(LinearInterpolateMessage(msg1, msg2, 10, 20, 15, &out));
  EXPECT_FALSE(out.has_vorel_dynamic_param());
  EXPECT_FALSE(out.has_lsc_tables());
}

TEST(LinearInterpolateMessageTest, SubmessageAbsentFromMsg2BlendsAgainstItsZeroValues) {
  const LscDynamicParam msg1 =
      ParseText<LscDynamicParam>("vorel_dynamic_param { gradient_threshold: 2 }");
  const LscDynamicParam msg2;
  LscDynamicParam out;
  EXPECT_TRUE(LinearInterpolateMessage(msg1, msg2, 10, 20, 15, &out));
  EXPECT_EQ(out.vorel_dynamic_param().gradient_threshold(), 1.0f);
}

TEST(LinearInterpolateMessageTest, FloatInsideARepeatedElementIsBlended) {
  const VorelDebugConfig msg1 = ParseText<VorelDebugConfig>(
      "debug_parameters { gradient_threshold: 2 } debug_parameters { gradient_threshold: 10 }");
  const VorelDebugConfig msg2 = ParseText<VorelDebugConfig>(
      "debug_parameters { gradient_threshold: 6 } debug_parameters { gradient_threshold: 20 }");
  VorelDebugConfig out;
  ScopedLogCapture capture;
  EXPECT_TRUE(LinearInterpolateMessage(msg1, msg2, 10, 20, 15, &out));
  ASSERT_EQ(out.debug_parameters_size(), 2);
  EXPECT_EQ(out.debug_parameters(0).gradient_threshold(), 4.0f);
  EXPECT_EQ(out.debug_parameters(1).gradient_threshold(), 15.0f);
  EXPECT_THAT(capture.messages(kError), IsEmpty());
}

TEST(LinearInterpolateMessageTest, FloatTwoLevelsBelowARepeatedMessageKeepsMsg1AndLogsItsPath) {
  // debug_parameters is repeated; base_tables a message inside each element; its gains floats.
  const VorelDebugConfig msg1 = ParseText<VorelDebugConfig>(R"pb(
    debug_parameters {
      gradient_threshold: 2
      base_tables { width: 1 lsc_grid_gain_r: 1 }
    }
    debug_parameters {
      gradient_threshold: 2
      base_tables { width: 1 lsc_grid_gain_r: 1 }
    }
    debug_parameters {
      gradient_threshold: 2
      base_tables { width: 1 lsc_grid_gain_r: 1 }
    }
  )pb");
  const VorelDebugConfig msg2 = ParseText<VorelDebugConfig>(R"pb(
    debug_parameters {
      gradient_threshold: 6
      base_tables { width: 3 lsc_grid_gain_r: 3 }
    }
    debug_parameters {
      gradient_threshold: 6
      base_tables { width: 3 lsc_grid_gain_r: 3 }
    }
    debug_parameters {
      gradient_threshold: 6
      base_tables { width: 3 lsc_grid_gain_r: 3 }
    }
  )pb");
  ScopedLogCapture capture;
  VorelDebugConfig out;
  EXPECT_TRUE(LinearInterpolateMessage(msg1, msg2, 10, 20, 15, &out));
  ASSERT_EQ(out.debug_parameters_size(), 3);
  for (int i = 0; i < 3; ++i) {
    EXPECT_EQ(out.debug_parameters(i).gradient_threshold(), 4.0f) << i;
    EXPECT_THAT(out.debug_parameters(i).base_tables().lsc_grid_gain_r(), ElementsAre(1.0f)) << i;
    EXPECT_EQ(out.debug_parameters(i).base_tables().width(), 1) << i;
  }
  // Each of the four gain lists of each element is out of reach.
  EXPECT_EQ(capture.messages(kError).size(), 12u);
  EXPECT_EQ(capture.Count("field is not found: debug_parameters[0].base_tables.lsc_grid_gain_r"),
            1);
  EXPECT_EQ(capture.Count("field is not found: debug_parameters[2].base_tables.lsc_grid_gain_r"),
            1);
  EXPECT_EQ(capture.Count("field is not found: debug_parameters[2].base_tables.lsc_grid_gain_b"),
            1);
  for (const test::CapturedLogLine& line : capture.lines()) {
    if (line.message.rfind("field is not found: ", 0) == 0) {
      EXPECT_EQ(line.severity, kError);
    }
  }
}

TEST(LinearInterpolateMessageTest, RepeatedElementMissingFromMsg2KeepsMsg1AndLogsItsPath) {
  const VorelDebugConfig msg1 = ParseText<VorelDebugConfig>(R"pb(
    debug_parameters { gradient_threshold: 2 }
    debug_parameters { gradient_threshold: 2 }
    debug_parameters { gradient_threshold: 10 }
  )pb");
  const VorelDebugConfig msg2 = ParseText<VorelDebugConfig>(
      "debug_parameters { gradient_threshold: 6 } debug_parameters { gradient_threshold: 6 }");
  ScopedLogCapture capture;
  VorelDebugConfig out;
  EXPECT_TRUE(LinearInterpolateMessage(msg1, msg2, 10, 20, 15, &out));
  ASSERT_EQ(out.debug_parameters_size(), 3);
  EXPECT_EQ(out.debug_parameters(0).gradient_threshold(), 4.0f);
  EXPECT_EQ(out.debug_parameters(1).gradient_threshold(), 4.0f);
  EXPECT_EQ(out.debug_parameters(2).gradient_threshold(), 10.0f);
  EXPECT_EQ(capture.Count("field is not found: debug_parameters[2].gradient_threshold"), 1);
}

TEST(LinearInterpolateMessageTest, VerboseLinesNameEachVisitedField) {
  const VorelDebugConfig msg1 =
      ParseText<VorelDebugConfig>("debug_parameters { gradient_threshold: 2 }");
  const VorelDebugConfig msg2 =
      ParseText<VorelDebugConfig>("debug_parameters { gradient_threshold: 6 }");
  ScopedLogCapture capture;
  VorelDebugConfig out;
  EXPECT_TRUE(LinearInterpolateMessage(msg1, msg2, 10, 20, 15, &out));
  EXPECT_THAT(capture.messages(kVerbose),
              ElementsAre("debug_parameters not float field, going deeper.",
                          "debug_parameters.enable_vorel not float field, going deeper.",
                          "debug_parameters.enable_alsc not float field, going deeper.",
                          "debug_parameters.filter_residuals not float field, going deeper.",
                          "debug_parameters.enable_temporal_filter not float field, going deeper.",
                          "debug_parameters.gradient_threshold is interpolated.",
                          "debug_parameters.limiter_threshold is interpolated.",
                          "debug_parameters.prj_delta_threshold is interpolated.",
                          "debug_parameters.tint_update_gain is interpolated.",
                          "debug_parameters.tint_visualization_gain is interpolated.",
                          "debug_parameters.base_tables not float field, going deeper.",
                          "debug_parameters.sat_ratio_threshold is interpolated.",
                          "duration_frames not float field, going deeper.",
                          "dump_counter not float field, going deeper."));
}

// Field kinds that no block schema holds side by side, and an extension.
constexpr char kMixedSchema[] = R"pb(
  name: "tavik/iq/private/mixed_fields_for_blending.proto"
  package: "tavik_test"
  syntax: "proto2"
  enum_type {
    name: "Kind"
    value { name: "KIND_LOW" number: 0 }
    value { name: "KIND_HIGH" number: 1 }
  }
  message_type {
    name: "Inner"
    field { name: "gain" number: 1 label: LABEL_OPTIONAL type: TYPE_FLOAT }
    field {
      name: "kind"
      number: 2
      label: LABEL_OPTIONAL
      type: TYPE_ENUM
      type_name: ".tavik_test.Kind"
    }
    field { name: "count" number: 3 label: LABEL_OPTIONAL type: TYPE_INT32 }
  }
  message_type {
    name: "Mixed"
    field { name: "gain" number: 1 label: LABEL_OPTIONAL type: TYPE_FLOAT }
    field { name: "flag" number: 2 label: LABEL_OPTIONAL type: TYPE_BOOL }
    field {
      name: "kind"
      number: 3
      label: LABEL_OPTIONAL
      type: TYPE_ENUM
      type_name: ".tavik_test.Kind"
    }
    field { name: "count" number: 4 label: LABEL_OPTIONAL type: TYPE_INT32 }
    field { name: "precise" number: 5 label: LABEL_OPTIONAL type: TYPE_DOUBLE }
    field { name: "label" number: 6 label: LABEL_OPTIONAL type: TYPE_STRING }
    field {
      name: "inner"
      number: 7
      label: LABEL_OPTIONAL
      type: TYPE_MESSAGE
      type_name: ".tavik_test.Inner"
    }
    extension_range { start: 100 end: 200 }
  }
  extension {
    name: "extra_gain"
    number: 100
    label: LABEL_OPTIONAL
    type: TYPE_FLOAT
    extendee: ".tavik_test.Mixed"
  }
)pb";

class BlendFieldKindsTest : public ::testing::Test {
 protected:
  std::unique_ptr<Message> Mixed(std::string_view text) {
    std::unique_ptr<Message> message = schema_.New("tavik_test.Mixed");
    ParseTextInto(text, message.get());
    return message;
  }

  DynamicSchema schema_{kMixedSchema};
};

TEST_F(BlendFieldKindsTest, BoolEnumIntegerDoubleAndStringInAGapKeepTheFirstRegionsValue) {
  const std::unique_ptr<Message> low = Mixed(R"pb(
    gain: 2
    flag: true
    kind: KIND_HIGH
    count: 3
    precise: 0.25
    label: "low"
    inner { gain: 2 kind: KIND_HIGH count: 3 }
  )pb");
  const std::unique_ptr<Message> high = Mixed(R"pb(
    gain: 6
    flag: false
    kind: KIND_LOW
    count: 7
    precise: 0.75
    label: "high"
    inner { gain: 6 kind: KIND_LOW count: 7 }
  )pb");
  std::unique_ptr<Message> out = Mixed("");
  TAVIK_ASSERT_OK(
      InterpolateTree(TwoRegionTree(Level::CCT, *low, *high), StateWith("cct", 15), out.get()));
  EXPECT_TRUE(ProtoEquals(*Mixed(R"pb(
    gain: 4
    flag: true
    kind: KIND_HIGH
    count: 3
    precise: 0.25
    label: "low"
    inner { gain: 4 kind: KIND_HIGH count: 3 }
  )pb"),
                          *out));
}

TEST_F(BlendFieldKindsTest, SetFloatExtensionIsBlendedUnderItsBracketedName) {
  const std::unique_ptr<Message> low = Mixed("gain: 2 [tavik_test.extra_gain]: 2");
  const std::unique_ptr<Message> high = Mixed("gain: 6 [tavik_test.extra_gain]: 6");
  std::unique_ptr<Message> out = Mixed("");
  ScopedLogCapture capture;
  EXPECT_TRUE(LinearInterpolateMessage(*low, *high, 10, 20, 15, out.get()));
  EXPECT_TRUE(ProtoEquals(*Mixed("gain: 4 [tavik_test.extra_gain]: 4"), *out));
  EXPECT_EQ(capture.Count("<tavik_test.extra_gain> is interpolated."), 1);
}

TEST_F(BlendFieldKindsTest, TraversalVisitsSetExtensionsAfterTheDeclaredFields) {
  std::unique_ptr<Message> message = Mixed("[tavik_test.extra_gain]: 1");
  std::vector<std::string> names;
  TraverseMutableMessageWithPath(
      message.get(), [&names](const std::string* field_path, std::vector<MutableTraversalPathNode>*,
                              const FieldDescriptor*, Message*) {
        names.push_back(*field_path);
        return false;
      });
  EXPECT_THAT(names, ElementsAre("gain", "flag", "kind", "count", "precise", "label", "inner",
                                 "<tavik_test.extra_gain>"));
  std::unique_ptr<Message> without_extension = Mixed("gain: 1");
  names.clear();
  TraverseMutableMessageWithPath(
      without_extension.get(),
      [&names](const std::string* field_path, std::vector<MutableTraversalPathNode>*,
               const FieldDescriptor*, Message*) {
        names.push_back(*field_path);
        return false;
      });
  EXPECT_THAT(names, ElementsAre("gain", "flag", "kind", "count", "precise", "label", "inner"));
}

// ---------------------------------------------------------------------------------------------
// The traversal.

// Every visited field's dotted name.
std::vector<std::string> VisitedNames(Message* message, bool go_deeper) {
  std::vector<std::string> names;
  TraverseMutableMessageWithPath(
      message,
      [&names, go_deeper](const std::string* field_path, std::vector<MutableTraversalPathNode>*,
                          const FieldDescriptor*, Message*) {
        names.push_back(*field_path);
        return go_deeper;
      });
  return names;
}

TEST(TraverseMutableMessageWithPathTest, VisitsEveryFieldInDeclarationOrderSetOrNot) {
  DmscDynamicParam message;
  const std::vector<std::string> names = VisitedNames(&message, true);
  ASSERT_EQ(names.size(), 45u);
  // Declaration order, not number order: gradient_weight is number 13.
  EXPECT_THAT(std::vector<std::string>(names.begin(), names.begin() + 4),
              ElementsAre("hpf_power", "gradient_weight", "mono_weight", "diagonal_weight"));
  EXPECT_EQ(names.back(), "edge_desat_red_preserve_gain");
}

TEST(TraverseMutableMessageWithPathTest, EntersSetSubmessagesWhenAskedAndNeverCreatesUnsetOnes) {
  LscDynamicParam message = ParseText<LscDynamicParam>("lsc_tables { width: 1 }");
  EXPECT_THAT(VisitedNames(&message, true),
              ElementsAre("lsc_tables", "lsc_tables.width", "lsc_tables.height",
                          "lsc_tables.lsc_grid_gain_r", "lsc_tables.lsc_grid_gain_gr",
                          "lsc_tables.lsc_grid_gain_gb", "lsc_tables.lsc_grid_gain_b",
                          "vorel_dynamic_param"));
  EXPECT_FALSE(message.has_vorel_dynamic_param());
  EXPECT_THAT(VisitedNames(&message, false), ElementsAre("lsc_tables", "vorel_dynamic_param"));
}

// One visit: the dotted name, then each path node's field and index ("-" for none).
std::string DescribeVisit(const std::string& field_path,
                          const std::vector<MutableTraversalPathNode>& path) {
  std::string text = field_path + " :";
  for (const MutableTraversalPathNode& node : path) {
    text += " " + node.field->name() + "@" +
            (node.index.has_value() ? std::to_string(*node.index) : std::string("-"));
  }
  return text;
}

TEST(TraverseMutableMessageWithPathTest, ElementIndexStandsOnTheNodesOfTheFieldsInsideTheElement) {
  VorelDebugConfig config = ParseText<VorelDebugConfig>(R"pb(
    debug_parameters { gradient_threshold: 1 }
    debug_parameters { base_tables { width: 1 } }
  )pb");
  std::vector<std::string> visits;
  std::vector<bool> holders_match;
  TraverseMutableMessageWithPath(
      &config, [&](const std::string* field_path, std::vector<MutableTraversalPathNode>* path,
                   const FieldDescriptor* field, Message* message) {
        visits.push_back(DescribeVisit(*field_path, *path));
        holders_match.push_back(path->back().field == field && path->back().message == message);
        return field->name() == "debug_parameters" || field->name() == "base_tables";
      });
  std::vector<std::string> wanted;
  for (int i = 0; i < 2; ++i) {
    const std::string element = " debug_parameters@- ";
    const std::string at = "@" + std::to_string(i);
    for (const char* name :
         {"enable_vorel", "enable_alsc", "filter_residuals", "enable_temporal_filter",
          "gradient_threshold", "limiter_threshold", "prj_delta_threshold", "tint_update_gain",
          "tint_visualization_gain", "base_tables", "sat_ratio_threshold"}) {
      wanted.push_back(std::string("debug_parameters.") + name + " :" + element + name + at);
      if (i == 1 && std::string(name) == "base_tables") {
        for (const char* table_field : {"width", "height", "lsc_grid_gain_r", "lsc_grid_gain_gr",
                                        "lsc_grid_gain_gb", "lsc_grid_gain_b"}) {
          wanted.push_back(std::string("debug_parameters.base_tables.") + table_field + " :" +
                           element + "base_tables@1 " + table_field + "@-");
        }
      }
    }
  }
  wanted.insert(wanted.begin(), "debug_parameters : debug_parameters@-");
  wanted.push_back("duration_frames : duration_frames@-");
  wanted.push_back("dump_counter : dump_counter@-");
  EXPECT_THAT(visits, ::testing::ElementsAreArray(wanted));
  EXPECT_THAT(holders_match, ::testing::Each(true));
}

TEST(TraverseMutableMessageWithPathTest, PathNodesPointAtTheMutableHolders) {
  VorelDebugConfig config = ParseText<VorelDebugConfig>(
      "debug_parameters { gradient_threshold: 1 } debug_parameters { gradient_threshold: 2 }");
  std::vector<std::pair<const Message*, const Message*>> holders;
  TraverseMutableMessageWithPath(
      &config, [&](const std::string*, std::vector<MutableTraversalPathNode>* path,
                   const FieldDescriptor* field, Message*) {
        if (field->name() == "gradient_threshold") {
          holders.emplace_back((*path)[0].message, (*path)[1].message);
          // Writes through the path reach the traversed message.
          (*path)[1].message->GetReflection()->SetFloat((*path)[1].message, field, 9);
        }
        return true;
      });
  ASSERT_EQ(holders.size(), 2u);
  EXPECT_EQ(holders[0].first, &config);
  EXPECT_EQ(holders[0].second, &config.debug_parameters(0));
  EXPECT_EQ(holders[1].second, &config.debug_parameters(1));
  EXPECT_EQ(config.debug_parameters(0).gradient_threshold(), 9.0f);
  EXPECT_EQ(config.debug_parameters(1).gradient_threshold(), 9.0f);
}

}  // namespace
}  // namespace tavik
