#include "tavik/iq/private/blend_plan.h"

#include <map>
#include <memory>
#include <string>
#include <vector>

#include "android-base/logging.h"
#include "gmock/gmock.h"
#include "google/protobuf/io/coded_stream.h"
#include "google/protobuf/io/zero_copy_stream_impl_lite.h"
#include "gtest/gtest.h"
#include "tavik/base/testing/log_capture.h"
#include "tavik/iq/private/interpolator.h"
#include "tavik/iq/protos/tuning_tree.pb.h"
#include "tavik/iq/testing/sample_set.h"
#include "tavik/iq/testing/tuning_builders.h"
#include "tavik/iq/zel/protos/clut_param.pb.h"
#include "tavik/iq/zel/protos/lsc_param.pb.h"

namespace tavik {
namespace {

using ::google::protobuf::Descriptor;
using ::google::protobuf::Message;
using ::tavik::test::ParseText;
using ::tavik::test::ScopedLogCapture;
using ::testing::ElementsAre;
using ::vosbrine::zelmondrake::ClutStaticParam;

// The lines and bytes of one blend.
struct Outcome {
  std::string bytes;
  std::vector<std::string> lines;
};

std::string Bytes(const Message& message) {
  std::string bytes;
  google::protobuf::io::StringOutputStream stream(&bytes);
  google::protobuf::io::CodedOutputStream coded(&stream);
  coded.SetSerializationDeterministic(true);
  message.SerializeToCodedStream(&coded);
  return bytes;
}

Outcome BlendByPlan(const BlendPlan& plan, const Message& out, const Message& source, float t) {
  std::unique_ptr<Message> result(out.New());
  result->CopyFrom(out);
  ScopedLogCapture log;
  plan.Blend(result.get(), source, t);
  return {Bytes(*result), log.messages(android::base::ERROR)};
}

Outcome BlendByWalk(const Message& out, const Message& source, float t) {
  std::unique_ptr<Message> result(out.New());
  result->CopyFrom(out);
  ScopedLogCapture log;
  BlendMessagesByReflection(source, t, result.get());
  return {Bytes(*result), log.messages(android::base::ERROR)};
}

// Blends `out` with `source` both ways and expects the same bits and the same error lines.
void ExpectSameBlend(const Message& out, const Message& source, float t) {
  const BlendPlan* plan = BlendPlan::ForGeneratedType(out.GetDescriptor());
  ASSERT_NE(plan, nullptr) << out.GetDescriptor()->full_name();
  const Outcome by_plan = BlendByPlan(*plan, out, source, t);
  const Outcome by_walk = BlendByWalk(out, source, t);
  EXPECT_EQ(by_plan.bytes, by_walk.bytes) << out.GetDescriptor()->full_name() << " t=" << t;
  EXPECT_EQ(by_plan.lines, by_walk.lines) << out.GetDescriptor()->full_name() << " t=" << t;
}

TEST(BlendPlanTest, EveryLeafPairOfTheSampleSetBlendsAsTheReflectionWalkDoes) {
  // Leaves by type, each distinct leaf once.
  std::map<const Descriptor*, std::map<std::string, std::unique_ptr<Message>>> leaves;
  for (const vosbrine::TuningTree& tree : test::SampleTrees()) {
    std::vector<std::unique_ptr<Message>> tree_leaves;
    test::AppendLeaves(tree.dynamic_top_level(), &tree_leaves);
    for (auto& leaf : tree_leaves) {
      auto& of_type = leaves[leaf->GetDescriptor()];
      of_type.try_emplace(Bytes(*leaf), std::move(leaf));
    }
  }
  ASSERT_GE(leaves.size(), 20u);
  int pairs = 0;
  for (const auto& [type, of_type] : leaves) {
    for (auto a = of_type.begin(); a != of_type.end(); ++a) {
      for (auto b = std::next(a); b != of_type.end(); ++b) {
        ExpectSameBlend(*a->second, *b->second, 0.25f);
        ExpectSameBlend(*b->second, *a->second, 0.625f);
        ++pairs;
      }
    }
  }
  EXPECT_GT(pairs, 100);
}

TEST(BlendPlanTest, SingularAndRepeatedFloatsBlendAsTwoProductsAndASum) {
  const auto out = ParseText<ClutStaticParam>(R"pb(
    yuv2rgb { matrix: [ 1, 2 ] }
    input_lut {
      channel_index: 1
      lut: [ 10, 20 ]
    }
  )pb");
  const auto source = ParseText<ClutStaticParam>(R"pb(
    yuv2rgb { matrix: [ 3, 6 ] }
    input_lut {
      channel_index: 2
      lut: [ 30, 60 ]
    }
  )pb");
  ClutStaticParam result = out;
  BlendPlan::ForGeneratedType(ClutStaticParam::descriptor())->Blend(&result, source, 0.5f);
  EXPECT_THAT(result.yuv2rgb().matrix(), ElementsAre(2.0f, 4.0f));
  EXPECT_THAT(result.input_lut(0).lut(), ElementsAre(20.0f, 40.0f));
  // Not a float: the first message's value stays.
  EXPECT_EQ(result.input_lut(0).channel_index(), 1);
  ExpectSameBlend(out, source, 0.5f);
}

TEST(BlendPlanTest, ElementMissingFromTheSourceIsLoggedPerFloatAndKept) {
  const auto out = ParseText<ClutStaticParam>(R"pb(
    input_lut { lut: [ 1 ] }
    input_lut { lut: [ 2 ] }
    input_lut { lut: [ 3 ] }
  )pb");
  const auto source = ParseText<ClutStaticParam>(R"pb(input_lut { lut: [ 5 ] })pb");
  const Outcome by_plan =
      BlendByPlan(*BlendPlan::ForGeneratedType(ClutStaticParam::descriptor()), out, source, 0.5f);
  EXPECT_THAT(by_plan.lines, ElementsAre("field is not found: input_lut[1].lut",
                                         "field is not found: input_lut[2].lut"));
  ExpectSameBlend(out, source, 0.5f);
}

TEST(BlendPlanTest, RepeatedFloatsOfDifferentLengthsAreLoggedAndKept) {
  const auto out = ParseText<ClutStaticParam>(R"pb(input_lut { lut: [ 1, 2 ] })pb");
  const auto source = ParseText<ClutStaticParam>(R"pb(input_lut { lut: [ 5 ] })pb");
  const Outcome by_plan =
      BlendByPlan(*BlendPlan::ForGeneratedType(ClutStaticParam::descriptor()), out, source, 0.5f);
  EXPECT_THAT(by_plan.lines,
              ElementsAre("Mismatched sizes found at the repeated field input_lut.lut"));
  EXPECT_EQ(by_plan.bytes, Bytes(out));
  ExpectSameBlend(out, source, 0.5f);
}

TEST(BlendPlanTest, SubmessageUnsetInTheFirstMessageIsNotEnteredNorMade) {
  const auto out = ParseText<ClutStaticParam>(R"pb(input_lut { lut: [ 1 ] })pb");
  const auto source = ParseText<ClutStaticParam>(R"pb(yuv2rgb { matrix: [ 5 ] })pb");
  ClutStaticParam result = out;
  BlendPlan::ForGeneratedType(ClutStaticParam::descriptor())->Blend(&result, source, 0.5f);
  EXPECT_FALSE(result.has_yuv2rgb());
  ExpectSameBlend(out, source, 0.5f);
}

TEST(BlendPlanTest, SubmessageUnsetInTheSourceBlendsWithZeros) {
  const auto out = ParseText<ClutStaticParam>(R"pb(yuv2rgb { matrix: [] })pb");
  const auto with_values = ParseText<ClutStaticParam>(R"pb(yuv2rgb { matrix: [ 4 ] })pb");
  // Lengths differ from the unset source's empty list: logged, kept.
  ExpectSameBlend(with_values, ClutStaticParam(), 0.5f);
  ExpectSameBlend(out, ClutStaticParam(), 0.5f);
}

TEST(BlendPlanTest, DeprecatedFieldsAreLeftAlone) {
  const auto out = ParseText<ClutStaticParam>(R"pb(enable: true)pb");
  ClutStaticParam result = out;
  BlendPlan::ForGeneratedType(ClutStaticParam::descriptor())
      ->Blend(&result, ClutStaticParam(), 0.5f);
  EXPECT_TRUE(test::ProtoEquals(out, result));
}

TEST(BlendPlanTest, TypesWhoseWalkHasQuirksHaveNoPlan) {
  // A oneof: the walk sets every member it blends.
  EXPECT_EQ(BlendPlan::Compile(vosbrine::Node::descriptor()), nullptr);
  // Messages inside repeated messages, which the walk matches by skipping a level.
  EXPECT_EQ(BlendPlan::Compile(vosbrine::Level::descriptor()), nullptr);
  EXPECT_EQ(BlendPlan::Compile(vosbrine::TuningTree::descriptor()), nullptr);
}

TEST(BlendPlanTest, BlockParametersHavePlans) {
  EXPECT_NE(BlendPlan::Compile(vosbrine::zelmondrake::LscDynamicParam::descriptor()), nullptr);
  EXPECT_NE(BlendPlan::Compile(ClutStaticParam::descriptor()), nullptr);
  EXPECT_EQ(BlendPlan::ForGeneratedType(ClutStaticParam::descriptor()),
            BlendPlan::ForGeneratedType(ClutStaticParam::descriptor()));
}

}  // namespace
}  // namespace tavik
