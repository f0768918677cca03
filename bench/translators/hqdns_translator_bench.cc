// The HQDNS translators per call, with their heap allocations. The translations run every frame
// and allocate nothing, denoising on or off; the defaults are written from constants and allocate
// nothing either. The table's form builds the resolution it points to on the stack.
#include <utility>

#include "bench/translators/translator_bench.h"
#include "benchmark/benchmark.h"
#include "tavik/iq/zel/translators/hqdns_online_translator.h"
#include "tavik/iq/zel/translators/translator_table.h"
#include "tavik/iq/zel/zel_tuning_block.h"

namespace tavik {
namespace {

namespace zm = ::vosbrine::zelmondrake;
using ::tavik::bench::MeasureCall;

ZelTuningBlock<zm::HqdnsTuning> MakeBlock() {
  zm::HqdnsTuning tuning;
  tuning.set_enable(true);
  tuning.mutable_static_param();
  zm::HqdnsDynamicParam& d = *tuning.mutable_dynamic_param();
  d.set_shading_param_a(2.6f);
  d.set_std_factor_r(0.85f);
  d.set_std_factor_g(1.0f);
  d.set_std_factor_b(0.85f);
  for (float v : {0.00167f, 0.005f, 0.00667f, 0.009f, 0.013f, 0.01633f, 0.02267f, 0.03167f}) {
    d.add_std_lut_y(v);
    d.add_std_lut_c(v * 1.3f);
  }
  d.set_slope_est_support(8);
  d.set_slope_thresh_high(64);
  d.set_slope_thresh_low(128);
  d.set_residual_coring_reduce(20);
  d.set_residual_limit_reduce(128);
  d.set_return_noise_g_factor(19);
  d.set_return_noise_limit_g(64);
  return ZelTuningBlock<zm::HqdnsTuning>(std::move(tuning));
}

void BM_TranslateHqdns(benchmark::State& state) {
  const ZelTuningBlock<zm::HqdnsTuning> block = MakeBlock();
  vosbrine::ImageResolution resolution;
  resolution.set_width(4032);
  resolution.set_height(3024);
  const tavik_api::WhiteBalanceConfig wb = {2.1f, 1.0f, 1.0f, 1.6f};
  HqdnsConfig config;
  config.bayer_pattern = vosbrine::GRBG;
  config.sensor_type = vosbrine::SENSOR_TYPE_BAYER;
  config.image_resolution = &resolution;
  config.wb = &wb;
  config.denoise_mode = static_cast<DenoiseMode>(state.range(0));
  HqdnsOutput output = {};
  MeasureCall(state, [&] {
    benchmark::DoNotOptimize(&output);
    return TranslateHqdns(block, config, output);
  });
}

void BM_TranslateHqdnsB0(benchmark::State& state) {
  const ZelTuningBlock<zm::HqdnsTuning> block = MakeBlock();
  vosbrine::ImageResolution resolution;
  resolution.set_width(1920);
  resolution.set_height(1080);
  const tavik_api::WhiteBalanceConfig wb = {2.1f, 1.0f, 1.0f, 1.6f};
  HqdnsConfig config;
  config.image_resolution = &resolution;
  config.wb = &wb;
  config.denoise_mode = DenoiseMode::kHighQuality;
  HqdnsOutput output = {};
  MeasureCall(state, [&] {
    benchmark::DoNotOptimize(&output);
    return TranslateHqdnsB0(block, config, output);
  });
}

// Through the translator table, as the tools and the simulator call it.
void BM_TranslateHqdnsForm(benchmark::State& state) {
  const ZelTuningBlock<zm::HqdnsTuning> block = MakeBlock();
  TranslatorFrame frame;
  frame.blocks[kZelBlockPosition<zm::HqdnsTuning>] = &block;
  HqdnsOutput output = {};
  void* records[] = {&output};
  MeasureCall(state, [&] {
    benchmark::DoNotOptimize(&output);
    return translator_forms::kHqdns.translate(frame, records);
  });
}

void BM_GetDefaultHqdns(benchmark::State& state) {
  HqdnsOutput output = {};
  HqdnsFixedOutput fixed = {};
  MeasureCall(state, [&] { return GetDefaultHqdns(output, fixed); });
}

void BM_GetDefaultHqdnsB0(benchmark::State& state) {
  HqdnsOutput output = {};
  HqdnsFixedOutput fixed = {};
  MeasureCall(state, [&] { return GetDefaultHqdnsB0(output, fixed); });
}

TAVIK_TRANSLATOR_BENCHMARK(BM_TranslateHqdns)
    ->ArgName("denoise_mode")
    ->Arg(static_cast<int>(DenoiseMode::kHighQuality))
    ->Arg(static_cast<int>(DenoiseMode::kOff));
TAVIK_TRANSLATOR_BENCHMARK(BM_TranslateHqdnsB0);
TAVIK_TRANSLATOR_BENCHMARK(BM_TranslateHqdnsForm);
TAVIK_TRANSLATOR_BENCHMARK(BM_GetDefaultHqdns);
TAVIK_TRANSLATOR_BENCHMARK(BM_GetDefaultHqdnsB0);

}  // namespace
}  // namespace tavik
