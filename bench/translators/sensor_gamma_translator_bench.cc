// Costs of the sensor gamma translators per call, with the heap allocations of each: a tuning's
// curve, and the linear stand-in of a tuning without one. The translations run every frame and
// must not allocate; the defaults build a tuning message.
#include <cmath>
#include <utility>

#include "bench/translators/translator_bench.h"
#include "benchmark/benchmark.h"
#include "tavik/iq/zel/translators/sensor_gamma_online_translator.h"
#include "tavik/iq/zel/zel_tuning_block.h"

namespace tavik {
namespace {

namespace zm = ::vosbrine::zelmondrake;
using ::tavik::bench::MeasureCall;
using ::tavik_registers::zel::g3aa::LinearizationLutValue;
using ::tavik_registers::zel::g3aa_generic::LinearizationConfigValue;

// A companding curve of 129 points, or none where `with_curve` is false.
ZelTuningBlock<zm::SensorGammaTuning> MakeBlock(bool with_curve) {
  zm::SensorGammaTuning tuning;
  tuning.set_enable(true);
  tuning.mutable_static_param();
  if (with_curve) {
    auto* gamma_y = tuning.mutable_dynamic_param()->mutable_gamma_y();
    for (int i = 0; i <= 128; ++i) gamma_y->Add(std::pow(static_cast<float>(i) / 128.0f, 1.2f));
  }
  return ZelTuningBlock<zm::SensorGammaTuning>(std::move(tuning));
}

void BM_TranslateSensorGammaProIpp(benchmark::State& state) {
  const ZelTuningBlock<zm::SensorGammaTuning> block = MakeBlock(state.range(0) != 0);
  SensorGammaIppOutput output = {};
  MeasureCall(state, [&] {
    benchmark::DoNotOptimize(&output);
    return TranslateSensorGammaPro(block, output, TonemapMode::kHighQuality);
  });
}

void BM_TranslateSensorGammaG3aa(benchmark::State& state) {
  const ZelTuningBlock<zm::SensorGammaTuning> block = MakeBlock(state.range(0) != 0);
  LinearizationConfigValue config = {};
  LinearizationLutValue lut = {};
  MeasureCall(state, [&] {
    benchmark::DoNotOptimize(&lut);
    return TranslateSensorGamma(block, vosbrine::GRBG, config, lut, TonemapMode::kHighQuality);
  });
}

void BM_GetDefaultSensorGammaProIpp(benchmark::State& state) {
  SensorGammaIppOutput output = {};
  SensorGammaIppFixedOutput fixed = {};
  MeasureCall(state, [&] { return GetDefaultSensorGammaPro(output, fixed); });
}

void BM_GetDefaultSensorGammaG3aa(benchmark::State& state) {
  LinearizationConfigValue config = {};
  LinearizationLutValue lut = {};
  MeasureCall(state, [&] { return GetDefaultSensorGamma(config, lut); });
}

TAVIK_TRANSLATOR_BENCHMARK(BM_TranslateSensorGammaProIpp)->ArgName("curve")->Arg(1)->Arg(0);
TAVIK_TRANSLATOR_BENCHMARK(BM_TranslateSensorGammaG3aa)->ArgName("curve")->Arg(1)->Arg(0);
TAVIK_TRANSLATOR_BENCHMARK(BM_GetDefaultSensorGammaProIpp);
TAVIK_TRANSLATOR_BENCHMARK(BM_GetDefaultSensorGammaG3aa);

}  // namespace
}  // namespace tavik
