// Costs of the green-imbalance translators per call, with the heap allocations of each. The
// translations run every frame and must not allocate; the defaults build a tuning message.
#include <utility>

#include "bench/translators/translator_bench.h"
#include "benchmark/benchmark.h"
#include "tavik/iq/zel/translators/disparity_online_translator.h"
#include "tavik/iq/zel/zel_tuning_block.h"

namespace tavik {
namespace {

namespace zm = ::vosbrine::zelmondrake;
using ::tavik::bench::MeasureCall;
using ::tavik_registers::zel::g3aa::GreenImbalanceLutValue;
using ::tavik_registers::zel::g3aa_generic::GreenImbalanceConfigValue;

ZelTuningBlock<zm::DisparityTuning> MakeBlock() {
  zm::DisparityTuning tuning;
  tuning.set_enable(true);
  zm::DisparityStaticParam& static_param = *tuning.mutable_static_param();
  static_param.set_enable_5x7(true);
  static_param.set_enable_slope_estimation(true);
  static_param.set_max_slope_allowed_low(0.046875f);
  static_param.set_max_slope_allowed_high(0.05f);
  zm::DisparityDynamicParam& dynamic = *tuning.mutable_dynamic_param();
  dynamic.set_disparity_threshold_low(0.057f);
  dynamic.set_disparity_threshold_high(0.08625f);
  dynamic.set_slope_threshold_low(0.00332f);
  dynamic.set_slope_threshold_high(0.00397f);
  dynamic.set_radial_power(0.1255f);
  dynamic.set_radial_limit(0.0392f);
  return ZelTuningBlock<zm::DisparityTuning>(std::move(tuning));
}

constexpr DisparityInput kInput = {
    vosbrine::GRBG, vosbrine::SENSOR_TYPE_BAYER, 10, 4.0f, 4032, 3024};

void BM_TranslateDisparityIpp(benchmark::State& state) {
  const ZelTuningBlock<zm::DisparityTuning> block = MakeBlock();
  DisparityIppOutput output = {};
  MeasureCall(state, [&] {
    benchmark::DoNotOptimize(&output);
    return TranslateDisparity(block, kInput, output);
  });
}

void BM_TranslateDisparityG3aa(benchmark::State& state) {
  const ZelTuningBlock<zm::DisparityTuning> block = MakeBlock();
  GreenImbalanceConfigValue config = {};
  GreenImbalanceLutValue lut = {};
  MeasureCall(state, [&] {
    benchmark::DoNotOptimize(&lut);
    return TranslateDisparity(block, kInput, config, lut);
  });
}

void BM_GetDefaultDisparityIpp(benchmark::State& state) {
  DisparityIppOutput output = {};
  DisparityIppFixedOutput fixed = {};
  MeasureCall(state, [&] { return GetDefaultDisparity(output, fixed); });
}

void BM_GetDefaultDisparityG3aa(benchmark::State& state) {
  GreenImbalanceConfigValue config = {};
  GreenImbalanceLutValue lut = {};
  MeasureCall(state, [&] { return GetDefaultDisparity(config, lut); });
}

TAVIK_TRANSLATOR_BENCHMARK(BM_TranslateDisparityIpp);
TAVIK_TRANSLATOR_BENCHMARK(BM_TranslateDisparityG3aa);
TAVIK_TRANSLATOR_BENCHMARK(BM_GetDefaultDisparityIpp);
TAVIK_TRANSLATOR_BENCHMARK(BM_GetDefaultDisparityG3aa);

}  // namespace
}  // namespace tavik
