// The shading table operations on production-size tables (33 by 25 nodes, four planes): each
// calibration, factoring, decimation and crop at load or per frame of the shading controller.
#include <cmath>
#include <vector>

#include "bench/allocation_counter.h"
#include "benchmark/benchmark.h"
#include "tavik/iq/lsc_table_operations.h"

namespace tavik {
namespace {

constexpr int kWidth = 33;
constexpr int kHeight = 25;

// A radial falloff, 1.0 at the centre and `corner` at the corners, a little different per plane.
vosbrine::LscTables RadialTables(float corner) {
  vosbrine::LscTables tables;
  tables.set_width(kWidth);
  tables.set_height(kHeight);
  const float channel_scale[4] = {1.08f, 1.0f, 1.01f, 0.95f};
  for (int plane = 0; plane < 4; ++plane) {
    for (int row = 0; row < kHeight; ++row) {
      for (int col = 0; col < kWidth; ++col) {
        const float x = (col - (kWidth - 1) / 2.0f) / ((kWidth - 1) / 2.0f);
        const float y = (row - (kHeight - 1) / 2.0f) / ((kHeight - 1) / 2.0f);
        const float gain = 1.0f + (corner - 1.0f) * channel_scale[plane] * (x * x + y * y) / 2.0f;
        switch (plane) {
          case 0: tables.add_lsc_grid_gain_r(gain); break;
          case 1: tables.add_lsc_grid_gain_gr(gain); break;
          case 2: tables.add_lsc_grid_gain_gb(gain); break;
          default: tables.add_lsc_grid_gain_b(gain); break;
        }
      }
    }
  }
  return tables;
}

void BM_CalibrateLscTables(benchmark::State& state) {
  const vosbrine::LscTables device = RadialTables(2.8f);
  const vosbrine::LscTables golden = RadialTables(2.6f);
  const vosbrine::LscTables tuning = RadialTables(2.7f);
  vosbrine::LscTables work = tuning;
  bench::AllocationCounter allocations;
  for (auto _ : state) {
    // Calibration scales in place; each iteration starts from the same tuning, copied into the
    // planes already allocated.
    work.CopyFrom(tuning);
    Status status = CalibrateLscTables(device, golden, &work);
    benchmark::DoNotOptimize(status);
  }
  allocations.Report(state);
}
BENCHMARK(BM_CalibrateLscTables);

void BM_FactorizeLsc(benchmark::State& state) {
  const vosbrine::LscTables full = RadialTables(2.7f);
  vosbrine::LscTables high_frequency;
  std::vector<float> low_frequency;
  (void)FactorizeLsc(full, high_frequency, low_frequency);  // Outputs sized once.
  bench::AllocationCounter allocations;
  for (auto _ : state) {
    Status status = FactorizeLsc(full, high_frequency, low_frequency);
    benchmark::DoNotOptimize(status);
  }
  allocations.Report(state);
}
BENCHMARK(BM_FactorizeLsc);

void BM_LscDownsample2x(benchmark::State& state) {
  const vosbrine::LscTables in = RadialTables(2.7f);
  vosbrine::LscTables out;
  (void)LscDownsample2x(in, &out);
  bench::AllocationCounter allocations;
  for (auto _ : state) {
    Status status = LscDownsample2x(in, &out);
    benchmark::DoNotOptimize(status);
  }
  allocations.Report(state);
}
BENCHMARK(BM_LscDownsample2x);

// A 4032 by 3024 readout inside a 4080 by 3072 sensor: the crop of every shading frame.
vosbrine::LscCropInfo SensorCrop() {
  vosbrine::LscCropInfo crop;
  crop.set_width(4080);
  crop.set_height(3072);
  crop.set_margin_left(24);
  crop.set_margin_right(24);
  crop.set_margin_top(24);
  crop.set_margin_bottom(24);
  return crop;
}

void BM_LscCrop(benchmark::State& state) {
  const vosbrine::LscTables in = RadialTables(2.7f);
  vosbrine::LscTables out;
  (void)LscCrop(SensorCrop(), in, &out);
  const vosbrine::LscCropInfo crop = SensorCrop();
  bench::AllocationCounter allocations;
  for (auto _ : state) {
    Status status = LscCrop(crop, in, &out);
    benchmark::DoNotOptimize(status);
  }
  allocations.Report(state);
}
BENCHMARK(BM_LscCrop);

// A module's 17 by 13 calibration grid onto the tuning's 33 by 25 grid, as at load.
void BM_LscCropAndResize(benchmark::State& state) {
  vosbrine::LscTables in;
  {
    const vosbrine::LscTables full = RadialTables(2.7f);
    (void)LscDownsample2x(full, &in);
  }
  vosbrine::LscTables out;
  const vosbrine::LscCropInfo crop = SensorCrop();
  (void)LscCropAndResize(crop, kHeight, kWidth, in, &out);
  bench::AllocationCounter allocations;
  for (auto _ : state) {
    Status status = LscCropAndResize(crop, kHeight, kWidth, in, &out);
    benchmark::DoNotOptimize(status);
  }
  allocations.Report(state);
}
BENCHMARK(BM_LscCropAndResize);

}  // namespace
}  // namespace tavik

BENCHMARK_MAIN();
