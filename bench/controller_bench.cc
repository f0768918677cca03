// The controller's frame path on the sample tuning set: a bundle of all 25 blocks for a rear
// camera viewfinder frame when the point is unchanged (every block from the cache), when the point
// changes with the camera state inside the tuned regions (every block evaluated, one leaf each),
// and when it changes with the state in the gaps of nested levels (every block blended); the floor
// of the last, the same blends of the same floats as plain loops over values extracted beforehand
// (BM_Interpolate25_MissInNestedGapsFloor: scripts/bench.sh reports the miss's ratio to it); and
// the controller's construction, which loads the whole set.
#include <algorithm>
#include <memory>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

#include "android-base/logging.h"
#include "bench/allocation_counter.h"
#include "benchmark/benchmark.h"
#include "google/protobuf/descriptor.pb.h"
#include "google/protobuf/message.h"
#include "tavik/iq/tuning_provider_base.h"
#include "tavik/iq/zel/zel_block_list.h"
#include "tavik/iq/zel/zel_tuning_controller.h"
#include "tavik/iq/zel/zel_tuning_controller_util.h"

namespace tavik {
namespace {

const FlatHashSet<std::string_view>& AllBlockNames() {
  static const auto* const names =
      new FlatHashSet<std::string_view>(kZelBlockNames.begin(), kZelBlockNames.end());
  return *names;
}

std::unique_ptr<ZelTuningController> MakeController() {
  return std::make_unique<ZelTuningController>(
      "", std::vector<std::string>{TAVIK_SAMPLE_TUNING_DIR},
      FlatHashMap<TuningSensorKey, tavik_api::LensShadingCalibrationData>());
}

// A full-resolution 4:3 viewfinder frame of the rear GN1 camera.
TuningInfo RearViewfinderInfo() {
  TuningInfo info;
  info.sensor_mode_info.sensor_name = "GN1";
  info.sensor_mode_info.mode_width = 4032;
  info.sensor_mode_info.mode_height = 3024;
  info.sensor_mode_info.sensor_fps_range = {15, 30};
  info.sensor_mode_info.target_fps_range = {15, 30};
  info.image_size = {4032, 3024};
  return info;
}

// Daylight at low gain in a bright scene: inside a region of every level.
TuningCoordinates InsideRegions() {
  TuningCoordinates coordinates;
  coordinates.cct = 6000;
  coordinates.real_gain = 1.2f;
  coordinates.bv = 8;
  coordinates.exp_ratio = 1;
  coordinates.scaler_ratio = 1;
  return coordinates;
}

// Between fluorescent and daylight, between gain bands, between brightness regions: the colour
// blocks blend across two nested levels.
TuningCoordinates InGaps() {
  TuningCoordinates coordinates;
  coordinates.cct = 4750;
  coordinates.real_gain = 2.5f;
  coordinates.bv = 4.5f;
  coordinates.exp_ratio = 2;
  coordinates.scaler_ratio = 1.5f;
  return coordinates;
}

// Interpolates all blocks at points that alternate in frame count when `refresh`, so that every
// block is evaluated afresh on every call; at one point otherwise.
void RunInterpolate(benchmark::State& state, TuningCoordinates coordinates, bool refresh) {
  std::unique_ptr<ZelTuningController> controller = MakeController();
  UseCase use_case;
  std::shared_ptr<TuningPoint> points[2];
  for (int i = 0; i < 2; ++i) {
    coordinates.frame_count = i;
    points[i] = controller->CreateTuningPoint(use_case, RearViewfinderInfo(), coordinates);
  }
  if (!controller->Interpolate(points[0], AllBlockNames()).ok()) {
    state.SkipWithError("Interpolate failed");
    return;
  }
  bench::AllocationCounter allocations;
  int frame = 0;
  for (auto _ : state) {
    const auto& point = points[refresh ? (++frame & 1) : 0];
    StatusOr<std::shared_ptr<TuningBundle>> bundle =
        controller->Interpolate(point, AllBlockNames());
    benchmark::DoNotOptimize(bundle);
  }
  allocations.Report(state);
}

void BM_Interpolate25_CacheHit(benchmark::State& state) {
  RunInterpolate(state, InsideRegions(), /*refresh=*/false);
}
BENCHMARK(BM_Interpolate25_CacheHit);

void BM_Interpolate25_MissInsideRegions(benchmark::State& state) {
  RunInterpolate(state, InsideRegions(), /*refresh=*/true);
}
BENCHMARK(BM_Interpolate25_MissInsideRegions)->Unit(benchmark::kMicrosecond);

void BM_Interpolate25_MissInNestedGaps(benchmark::State& state) {
  RunInterpolate(state, InGaps(), /*refresh=*/true);
}
BENCHMARK(BM_Interpolate25_MissInNestedGaps)->Unit(benchmark::kMicrosecond);

// The blends that evaluating trees performs, replayed as plain loops over float arrays.
class BlendFloor {
 public:
  // Records the blends of `tree` evaluated at `at`, with the float values of every region taken
  // from leaves of `leaf_type`.
  void AddTree(const vosbrine::TuningTree& tree, const vosbrine::LevelCoordinates& at,
               const google::protobuf::Descriptor* leaf_type) {
    if (tree.has_dynamic_top_level()) Evaluate(tree.dynamic_top_level(), at, leaf_type);
  }

  // Resolves the arrays, once everything is recorded.
  void Seal() {
    for (Blend& blend : blends_) {
      blend.a_values = values_[blend.a].data();
      blend.b_values = values_[blend.b].data();
      blend.out_values = values_[blend.out].data();
    }
  }

  void Run() {
    for (const Blend& blend : blends_) {
      const float t = blend.t;
      for (size_t i = 0; i < blend.size; ++i) {
        blend.out_values[i] = (1.0f - t) * blend.a_values[i] + t * blend.b_values[i];
      }
    }
  }

  size_t blends() const { return blends_.size(); }
  size_t floats() const {
    size_t total = 0;
    for (const Blend& blend : blends_) total += blend.size;
    return total;
  }

 private:
  struct Blend {
    size_t a, b, out, size;
    float t;
    const float* a_values = nullptr;
    const float* b_values = nullptr;
    float* out_values = nullptr;
  };

  static std::optional<float> Coordinate(vosbrine::Level::Type type,
                                         const vosbrine::LevelCoordinates& at) {
    switch (type) {
      case vosbrine::Level::LED:
        return at.led_influence();
      case vosbrine::Level::CCT:
        return at.cct();
      case vosbrine::Level::BV:
        return at.bv();
      case vosbrine::Level::GAIN:
        return at.real_gain();
      case vosbrine::Level::EXP_RATIO:
        return at.exp_ratio();
      case vosbrine::Level::SCALER_RATIO:
        return at.scaler_ratio();
      case vosbrine::Level::MIRED_CCT:
        return at.mired_cct();
      case vosbrine::Level::PRE_SCALER_RATIO:
        return at.pre_scaler_ratio();
      case vosbrine::Level::FRAME_COUNT:
        return at.frame_count();
      case vosbrine::Level::EXPOSURE_TIME_MSECS:
        return at.exposure_time_msecs();
      default:
        return std::nullopt;
    }
  }

  // Every float that a blend reaches, in the order it reaches them.
  static void AppendFloats(const google::protobuf::Message& message, std::vector<float>* out) {
    const google::protobuf::Reflection* reflection = message.GetReflection();
    const google::protobuf::Descriptor* type = message.GetDescriptor();
    for (int i = 0; i < type->field_count(); ++i) {
      const google::protobuf::FieldDescriptor* field = type->field(i);
      if (field->options().deprecated()) continue;
      if (field->cpp_type() == google::protobuf::FieldDescriptor::CPPTYPE_FLOAT) {
        if (field->is_repeated()) {
          for (int k = 0; k < reflection->FieldSize(message, field); ++k) {
            out->push_back(reflection->GetRepeatedFloat(message, field, k));
          }
        } else {
          out->push_back(reflection->GetFloat(message, field));
        }
      } else if (field->cpp_type() == google::protobuf::FieldDescriptor::CPPTYPE_MESSAGE) {
        if (field->is_repeated()) {
          for (int k = 0; k < reflection->FieldSize(message, field); ++k) {
            AppendFloats(reflection->GetRepeatedMessage(message, field, k), out);
          }
        } else if (reflection->HasField(message, field)) {
          AppendFloats(reflection->GetMessage(message, field), out);
        }
      }
    }
  }

  size_t Region(const vosbrine::Node& node, const vosbrine::LevelCoordinates& at,
                const google::protobuf::Descriptor* leaf_type) {
    if (!node.has_dynamic_param()) return Evaluate(node.child_level(), at, leaf_type);
    std::unique_ptr<google::protobuf::Message> leaf(
        google::protobuf::MessageFactory::generated_factory()->GetPrototype(leaf_type)->New());
    node.dynamic_param().UnpackTo(leaf.get());
    values_.emplace_back();
    AppendFloats(*leaf, &values_.back());
    return values_.size() - 1;
  }

  // The index of the values that the level gives at `at`, as the tree evaluation finds them.
  size_t Evaluate(const vosbrine::Level& level, const vosbrine::LevelCoordinates& at,
                  const google::protobuf::Descriptor* leaf_type) {
    const auto& nodes = level.nodes();
    const float x = Coordinate(level.type(), at).value_or(0.0f);
    if (nodes.empty()) {
      values_.emplace_back();
      return values_.size() - 1;
    }
    auto reaching = std::lower_bound(
        nodes.begin(), nodes.end(), x,
        [](const vosbrine::Node& node, float value) { return node.upper() < value; });
    if (reaching == nodes.end()) --reaching;
    const int i = static_cast<int>(reaching - nodes.begin());
    if (nodes[i].lower() <= x || i == 0) return Region(nodes[i], at, leaf_type);
    const vosbrine::Node& first = nodes[i - 1];
    const vosbrine::Node& second = nodes[i];
    const size_t a = Region(first, at, leaf_type);
    const size_t b = Region(second, at, leaf_type);
    const float delta = second.lower() - first.upper();
    if (!(delta > 1e-6f)) return a;
    const float t = std::min(std::max((x - first.upper()) / delta, 0.0f), 1.0f);
    if (!(t > 0.0f)) return a;
    if (!(t < 1.0f)) return b;
    const size_t size = std::min(values_[a].size(), values_[b].size());
    values_.emplace_back(size);
    blends_.push_back(Blend{a, b, values_.size() - 1, size, t});
    return values_.size() - 1;
  }

  std::vector<std::vector<float>> values_;
  std::vector<Blend> blends_;
};

void BM_Interpolate25_MissInNestedGapsFloor(benchmark::State& state) {
  std::unique_ptr<ZelTuningController> controller = MakeController();
  TuningCoordinates coordinates = InGaps();
  const auto point =
      std::make_shared<ZelTuningPoint>(UseCase(), RearViewfinderInfo(), coordinates, false);
  const auto usecase = controller->GenerateTuningUseCase(*point, "");
  const google::protobuf::Message* tree_set =
      controller->provider() == nullptr || !usecase.ok()
          ? nullptr
          : controller->provider()->GetTuningTreeSet(**usecase, /*fallback=*/true);
  if (tree_set == nullptr) {
    state.SkipWithError("the sample tuning set did not load");
    return;
  }
  const vosbrine::LevelCoordinates at = ConvertToCameraState(*point).level_coordinates();
  BlendFloor floor;
  // The blocks that a request for all 25 names produces: every position but SensorGammaTuning's.
  ForEachZelBlockType([&]<size_t Position, typename T>() {
    if (kZelBlockNames[Position] == "SensorGammaTuning") return;
    const google::protobuf::FieldDescriptor* field = tree_set->GetDescriptor()->FindFieldByName(
        vosbrine::FieldNameFromMessageName(T::descriptor()->full_name()));
    if (field == nullptr) return;
    const auto& tree = static_cast<const vosbrine::TuningTree&>(
        tree_set->GetReflection()->GetMessage(*tree_set, field));
    if (!tree.enable()) return;
    floor.AddTree(tree, at, T::descriptor()->FindFieldByName("dynamic_param")->message_type());
  });
  floor.Seal();
  bench::AllocationCounter allocations;
  for (auto _ : state) {
    floor.Run();
    benchmark::ClobberMemory();
  }
  allocations.Report(state);
  state.counters["blends"] = static_cast<double>(floor.blends());
  state.counters["floats"] = static_cast<double>(floor.floats());
}
BENCHMARK(BM_Interpolate25_MissInNestedGapsFloor)->Unit(benchmark::kMicrosecond);

void BM_CreateController(benchmark::State& state) {
  bench::AllocationCounter allocations;
  for (auto _ : state) {
    std::unique_ptr<ZelTuningController> controller = MakeController();
    if (controller->provider() == nullptr) {
      state.SkipWithError("the sample tuning set did not load");
      break;
    }
    benchmark::DoNotOptimize(controller);
  }
  allocations.Report(state);
}
BENCHMARK(BM_CreateController)->Unit(benchmark::kMillisecond);

}  // namespace
}  // namespace tavik

int main(int argc, char** argv) {
  // The directory scan reports "." and ".." as rejected files on every load.
  android::base::SetMinimumLogSeverity(android::base::FATAL);
  benchmark::Initialize(&argc, argv);
  benchmark::RunSpecifiedBenchmarks();
  benchmark::Shutdown();
  return 0;
}
