#include "tavik/iq/private/prepared_tree.h"

#include <algorithm>
#include <atomic>
#include <map>
#include <memory>
#include <string>
#include <thread>
#include <vector>

#include "android-base/logging.h"
#include "gmock/gmock.h"
#include "gtest/gtest.h"
#include "tavik/base/testing/log_capture.h"
#include "tavik/base/testing/status_matchers.h"
#include "tavik/iq/private/interpolator.h"
#include "tavik/iq/testing/sample_set.h"
#include "tavik/iq/testing/tuning_builders.h"
#include "tavik/iq/zel/protos/blc_param.pb.h"
#include "tavik/iq/zel/protos/tuning_tree_set.pb.h"
#include "tavik/iq/zel/protos/wb_param.pb.h"

namespace tavik {
namespace {

using ::google::protobuf::Message;
using ::tavik::test::LeafNode;
using ::tavik::test::MakeLevel;
using ::tavik::test::MakeTree;
using ::tavik::test::ScopedLogCapture;
using ::tavik::test::StateWith;
using ::tavik::test::StatusIs;
using ::vosbrine::CameraState;
using ::vosbrine::Level;
using ::vosbrine::TuningTree;
using ::vosbrine::zelmondrake::BlcDynamicParam;
using ::vosbrine::zelmondrake::BlcStaticParam;
using ::vosbrine::zelmondrake::WbDynamicParam;

// The lowest severity logged, for a scope (a log capture lowers it to VERBOSE).
class MinimumSeverity {
 public:
  explicit MinimumSeverity(android::base::LogSeverity severity)
      : previous_(android::base::SetMinimumLogSeverity(severity)) {}
  ~MinimumSeverity() { android::base::SetMinimumLogSeverity(previous_); }

 private:
  android::base::LogSeverity previous_;
};

struct Evaluation {
  Status status;
  std::string bytes;
  std::vector<std::string> lines;
};

// The leaf type of a tree: that of its first leaf.
const google::protobuf::Descriptor* LeafType(const TuningTree& tree) {
  std::vector<std::unique_ptr<Message>> leaves;
  test::AppendLeaves(tree.dynamic_top_level(), &leaves);
  return leaves.empty() ? nullptr : leaves.front()->GetDescriptor();
}

template <typename Tree>
Evaluation Evaluate(const Tree& tree, const CameraState& state,
                    const google::protobuf::Descriptor* type, android::base::LogSeverity minimum) {
  std::unique_ptr<Message> out(
      google::protobuf::MessageFactory::generated_factory()->GetPrototype(type)->New());
  ScopedLogCapture log;
  MinimumSeverity severity(minimum);
  Evaluation evaluation;
  evaluation.status = InterpolateTree(tree, state, out.get());
  evaluation.bytes = out->SerializeAsString();
  evaluation.lines = log.messages();
  return evaluation;
}

// States that put every level of `tree` at each of its bounds, between them and beyond them.
std::vector<CameraState> StatesAround(const TuningTree& tree) {
  std::map<int, std::vector<float>> bounds;
  std::vector<const Level*> levels = {&tree.dynamic_top_level()};
  while (!levels.empty()) {
    const Level* level = levels.back();
    levels.pop_back();
    for (const vosbrine::Node& node : level->nodes()) {
      bounds[level->type()].push_back(node.lower());
      bounds[level->type()].push_back(node.upper());
      if (node.has_child_level()) levels.push_back(&node.child_level());
    }
  }
  std::map<int, std::vector<float>> values;
  size_t count = 1;
  for (auto& [type, of_type] : bounds) {
    std::sort(of_type.begin(), of_type.end());
    std::vector<float>& candidates = values[type];
    candidates.push_back(of_type.front() - 1.0f);
    for (size_t i = 0; i < of_type.size(); ++i) {
      candidates.push_back(of_type[i]);
      if (i + 1 < of_type.size()) candidates.push_back(0.5f * (of_type[i] + of_type[i + 1]));
    }
    candidates.push_back(of_type.back() + 1.0f);
    count = std::max(count, candidates.size());
  }
  std::vector<CameraState> states(count);
  for (size_t s = 0; s < count; ++s) {
    for (const auto& [type, candidates] : values) {
      const std::string name = Level::Type_Name(static_cast<Level::Type>(type));
      const float value = candidates[s % candidates.size()];
      // Level types are named after their coordinates, but for these.
      const std::string coordinate = name == "LED"                   ? "led_influence"
                                     : name == "GAIN"                ? "real_gain"
                                     : name == "EXPOSURE_TIME_MSECS" ? "exposure_time_msecs"
                                                                     : "";
      std::string field = coordinate;
      if (field.empty()) {
        for (char c : name) field.push_back(static_cast<char>(std::tolower(c)));
      }
      CameraState with = StateWith(field, value);
      states[s].mutable_level_coordinates()->MergeFrom(with.level_coordinates());
    }
  }
  return states;
}

TEST(PreparedTreeTest, EverySampleTreeEvaluatesAsItsPackedFormAtEveryBoundAndGap) {
  int evaluations = 0;
  for (const TuningTree& tree : test::SampleTrees()) {
    const google::protobuf::Descriptor* type = LeafType(tree);
    if (type == nullptr) continue;
    const PreparedTree prepared(tree);
    const std::vector<CameraState> states = StatesAround(tree);
    for (size_t s = 0; s < states.size(); ++s) {
      // The plan's blend with verbose logging off; the walk, with its lines, when it is on.
      for (android::base::LogSeverity minimum : {android::base::INFO, android::base::VERBOSE}) {
        if (minimum == android::base::VERBOSE && s >= 3) continue;
        const Evaluation packed = Evaluate(tree, states[s], type, minimum);
        const Evaluation unpacked = Evaluate(prepared, states[s], type, minimum);
        EXPECT_EQ(unpacked.status, packed.status) << type->full_name();
        EXPECT_EQ(unpacked.bytes, packed.bytes) << type->full_name() << " state " << s;
        EXPECT_EQ(unpacked.lines, packed.lines) << type->full_name() << " state " << s;
        ++evaluations;
      }
    }
  }
  EXPECT_GT(evaluations, 500);
}

WbDynamicParam Gains(float gain) {
  WbDynamicParam gains;
  gains.add_wb_gains(gain);
  return gains;
}

TEST(PreparedTreeTest, LeafThatDoesNotParseFailsWhenEvaluatedAsItAlwaysDid) {
  vosbrine::Node broken = LeafNode(10, 20, Gains(1));
  broken.mutable_dynamic_param()->set_value("\xff\xff\xff");
  const TuningTree tree =
      MakeTree(true, BlcStaticParam(), MakeLevel(Level::CCT, {LeafNode(0, 5, Gains(2)), broken}));
  const PreparedTree prepared(tree);

  WbDynamicParam out;
  EXPECT_THAT(InterpolateTree(prepared, StateWith("cct", 15), &out),
              StatusIs(absl::StatusCode::kInvalidArgument,
                       "Failed to Unpack first_region. vosbrine.zelmondrake.WbDynamicParam"));
  EXPECT_THAT(InterpolateTree(prepared, StateWith("cct", 8), &out),
              StatusIs(absl::StatusCode::kInvalidArgument,
                       "Failed to Unpack second_region. vosbrine.zelmondrake.WbDynamicParam"));
  // The good leaf is still there.
  TAVIK_EXPECT_OK(InterpolateTree(prepared, StateWith("cct", 2), &out));
  EXPECT_THAT(out.wb_gains(), ::testing::ElementsAre(2.0f));
}

TEST(PreparedTreeTest, LeafOfAnotherTypeIsNotCopiedIntoTheRequestedType) {
  const TuningTree tree =
      MakeTree(true, BlcStaticParam(), MakeLevel(Level::CCT, {LeafNode(0, 5, Gains(2))}));
  const PreparedTree prepared(tree);
  BlcDynamicParam out;
  EXPECT_THAT(InterpolateTree(prepared, StateWith("cct", 2), &out),
              StatusIs(absl::StatusCode::kInvalidArgument,
                       "Failed to Unpack first_region. vosbrine.zelmondrake.BlcDynamicParam"));
  EXPECT_EQ(prepared.Unpacked(tree.dynamic_top_level().nodes(0).dynamic_param(),
                              BlcDynamicParam::descriptor()),
            nullptr);
  EXPECT_NE(prepared.Unpacked(tree.dynamic_top_level().nodes(0).dynamic_param(),
                              WbDynamicParam::descriptor()),
            nullptr);
}

TEST(PreparedTreeTest, UnpackFromPreparedCopiesOrUnpacksAsAnyDoes) {
  const TuningTree tree =
      MakeTree(true, BlcStaticParam(), MakeLevel(Level::CCT, {LeafNode(0, 5, Gains(3))}));
  const PreparedTree prepared(tree);
  const google::protobuf::Any& packed = tree.dynamic_top_level().nodes(0).dynamic_param();
  WbDynamicParam copied;
  copied.add_wb_gains(9);  // Cleared, as parsing clears.
  EXPECT_TRUE(UnpackFromPrepared(packed, &prepared, &copied));
  EXPECT_TRUE(test::ProtoEquals(Gains(3), copied));
  WbDynamicParam parsed;
  EXPECT_TRUE(UnpackFromPrepared(packed, nullptr, &parsed));
  EXPECT_TRUE(test::ProtoEquals(Gains(3), parsed));
  BlcDynamicParam other;
  EXPECT_FALSE(UnpackFromPrepared(packed, &prepared, &other));
}

TEST(PreparedTreeSetTest, TreeIsPreparedOnceAndShared) {
  vosbrine::zelmondrake::TuningTreeSet tree_set;
  *tree_set.mutable_wb() =
      MakeTree(true, BlcStaticParam(), MakeLevel(Level::CCT, {LeafNode(0, 5, Gains(3))}));
  const PreparedTreeSet prepared(tree_set);
  const google::protobuf::FieldDescriptor* field = tree_set.GetDescriptor()->FindFieldByName("wb");
  std::vector<const PreparedTree*> seen(8);
  std::vector<std::thread> threads;
  for (int i = 0; i < 8; ++i) {
    threads.emplace_back([&, i] { seen[i] = &prepared.Get(field, tree_set.wb()); });
  }
  for (std::thread& thread : threads) thread.join();
  for (const PreparedTree* tree : seen) EXPECT_EQ(tree, seen.front());
  EXPECT_EQ(&seen.front()->tree(), &tree_set.wb());
}

}  // namespace
}  // namespace tavik
