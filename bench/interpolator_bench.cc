// Tree evaluation on realistic blocks of the sample tuning set, and loading of the whole set.
//
// For each block, the file whose tree nests deepest is taken, and the tree is evaluated at a
// point inside a region at every level (one leaf unpacked), and at points in the gap between the
// first two regions of the top 1, 2 and 3 levels (2, 4 and 8 leaves, 1, 3 and 7 blends).
#include <memory>
#include <string>
#include <vector>

#include "android-base/logging.h"
#include "bench/allocation_counter.h"
#include "benchmark/benchmark.h"
#include "google/protobuf/message.h"
#include "tavik/iq/private/interpolator.h"
#include "tavik/iq/protos/tuning_usecase.pb.h"
#include "tavik/iq/read_binary_proto.h"
#include "tavik/iq/zel/protos/tuning_tree_set.pb.h"
#include "tavik/iq/zel/tuning_provider.h"
#include "tools/tavik-tune/tuning_files.h"

namespace tavik {
namespace {

using google::protobuf::Message;

struct LoadedTree {
  std::string file;
  vosbrine::TuningTree tree;
};

int Depth(const vosbrine::Level& level) {
  int deepest = 0;
  for (const vosbrine::Node& node : level.nodes()) {
    if (node.has_child_level()) deepest = std::max(deepest, Depth(node.child_level()));
  }
  return 1 + deepest;
}

// Sets the coordinate that `level` reads.
void SetCoordinate(vosbrine::Level::Type type, float value, vosbrine::LevelCoordinates* out) {
  switch (type) {
    case vosbrine::Level::LED: out->set_led_influence(value); break;
    case vosbrine::Level::CCT: out->set_cct(value); break;
    case vosbrine::Level::BV: out->set_bv(value); break;
    case vosbrine::Level::GAIN: out->set_real_gain(value); break;
    case vosbrine::Level::EXP_RATIO: out->set_exp_ratio(value); break;
    case vosbrine::Level::SCALER_RATIO: out->set_scaler_ratio(value); break;
    case vosbrine::Level::MIRED_CCT: out->set_mired_cct(value); break;
    case vosbrine::Level::PRE_SCALER_RATIO: out->set_pre_scaler_ratio(value); break;
    case vosbrine::Level::FRAME_COUNT: out->set_frame_count(value); break;
    case vosbrine::Level::EXPOSURE_TIME_MSECS: out->set_exposure_time_msecs(value); break;
    default: break;
  }
}

// A state in the gap between the first two regions of the top `gap_levels` levels and inside the
// first region below them; false when the tree has no such gaps.
bool StateWithGaps(const vosbrine::TuningTree& tree, int gap_levels,
                   vosbrine::CameraState* state) {
  const vosbrine::Level* level = &tree.dynamic_top_level();
  for (int depth = 0; level != nullptr && !level->nodes().empty(); ++depth) {
    const vosbrine::Node& first = level->nodes(0);
    if (depth < gap_levels) {
      if (level->nodes_size() < 2 || level->nodes(1).lower() <= first.upper() + 1e-3f) {
        return false;
      }
      SetCoordinate(level->type(), 0.5f * (first.upper() + level->nodes(1).lower()),
                    state->mutable_level_coordinates());
    } else {
      SetCoordinate(level->type(), 0.5f * (first.lower() + first.upper()),
                    state->mutable_level_coordinates());
    }
    level = first.has_child_level() ? &first.child_level() : nullptr;
    if (level == nullptr && depth + 1 < gap_levels) return false;
  }
  return true;
}

void BM_InterpolateTree(benchmark::State& state, const LoadedTree* loaded,
                        const google::protobuf::Descriptor* leaf_type,
                        vosbrine::CameraState camera_state) {
  std::unique_ptr<Message> out(
      google::protobuf::MessageFactory::generated_factory()->GetPrototype(leaf_type)->New());
  bench::AllocationCounter allocations;
  for (auto _ : state) {
    const Status status = InterpolateTree(loaded->tree, camera_state, out.get());
    benchmark::DoNotOptimize(status);
    if (!status.ok()) {
      state.SkipWithError(std::string(status.message()).c_str());
      break;
    }
  }
  allocations.Report(state);
  state.SetLabel(loaded->file);
}

void BM_LoadSampleSet(benchmark::State& state) {
  bench::AllocationCounter allocations;
  for (auto _ : state) {
    auto provider = vosbrine::zelmondrake::TuningProvider::Create(
        tune::ExpandPaths({TAVIK_SAMPLE_TUNING_DIR}), nullptr);
    if (!provider.ok()) {
      state.SkipWithError(std::string(provider.status().message()).c_str());
      break;
    }
    benchmark::DoNotOptimize(provider);
  }
  allocations.Report(state);
}

// The deepest tree of `block` in the sample set.
std::unique_ptr<LoadedTree> DeepestTree(const tune::BlockType& block) {
  std::unique_ptr<LoadedTree> deepest;
  int deepest_depth = 0;
  for (const std::string& file : tune::ExpandPaths({TAVIK_SAMPLE_TUNING_DIR})) {
    if (!tune::IsBinarypb(file) || tune::IsGoldenCalibrationPath(file)) continue;
    vosbrine::TuningUsecaseData data;
    vosbrine::zelmondrake::TuningTreeSet tree_set;
    if (!ReadBinaryProto(file, data).ok() || !data.tuning_tree_set().UnpackTo(&tree_set)) {
      continue;
    }
    const auto& tree = static_cast<const vosbrine::TuningTree&>(
        tree_set.GetReflection()->GetMessage(tree_set, block.tree_field));
    if (!tree.enable() || !tree.has_dynamic_top_level()) continue;
    const int depth = Depth(tree.dynamic_top_level());
    if (depth > deepest_depth) {
      deepest_depth = depth;
      deepest = std::make_unique<LoadedTree>(
          LoadedTree{file.substr(file.rfind('/') + 1), tree});
    }
  }
  return deepest;
}

void RegisterBenchmarks() {
  static std::vector<std::unique_ptr<LoadedTree>> trees;
  for (const char* name : {"WbTuning", "GammaTuning", "DmscTuning", "LscTuning"}) {
    const tune::BlockType* block = tune::FindBlockType(name);
    if (block == nullptr) continue;
    std::unique_ptr<LoadedTree> tree = DeepestTree(*block);
    if (tree == nullptr) continue;
    const char* cases[] = {"inside", "gap1", "gap2", "gap3"};
    for (int gaps = 0; gaps <= 3; ++gaps) {
      vosbrine::CameraState camera_state;
      if (!StateWithGaps(tree->tree, gaps, &camera_state)) continue;
      benchmark::RegisterBenchmark(
          (std::string("BM_InterpolateTree/") + name + "/" + cases[gaps]).c_str(),
          BM_InterpolateTree, tree.get(), block->dynamic_param, camera_state);
    }
    trees.push_back(std::move(tree));
  }
  benchmark::RegisterBenchmark("BM_LoadSampleSet", BM_LoadSampleSet)
      ->Unit(benchmark::kMillisecond);
}

}  // namespace
}  // namespace tavik

int main(int argc, char** argv) {
  android::base::SetMinimumLogSeverity(android::base::WARNING);
  benchmark::Initialize(&argc, argv);
  tavik::RegisterBenchmarks();
  benchmark::RunSpecifiedBenchmarks();
  benchmark::Shutdown();
  return 0;
}
