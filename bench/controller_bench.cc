// The controller's frame path on the sample tuning set: a bundle of all 25 blocks for a rear
// camera viewfinder frame when the point is unchanged (every block from the cache), when the point
// changes with the camera state inside the tuned regions (every block evaluated, one leaf each),
// and when it changes with the state in the gaps of nested levels (every block blended); and the
// controller's construction, which loads the whole set.
#include <memory>
#include <string>
#include <string_view>

#include "android-base/logging.h"
#include "bench/allocation_counter.h"
#include "benchmark/benchmark.h"
#include "tavik/iq/zel/zel_block_list.h"
#include "tavik/iq/zel/zel_tuning_controller.h"

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
    StatusOr<std::shared_ptr<TuningBundle>> bundle = controller->Interpolate(point, AllBlockNames());
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
