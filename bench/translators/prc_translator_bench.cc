// Cost of the Prc translator per call, with its heap allocations: none expected, as it runs every
// frame. The default builds a tuning message.
#include <utility>

#include "bench/translators/translator_bench.h"
#include "benchmark/benchmark.h"
#include "tavik/iq/zel/translators/prc_online_translator.h"
#include "tavik/iq/zel/zel_tuning_block.h"

namespace tavik {
namespace {

namespace zm = ::vosbrine::zelmondrake;
using ::tavik::bench::MeasureCall;
using ::tavik_registers::zel::itp::PrcConfigurationValue;

// Twenty regions of 18 degrees each, with inner distances and small shifts.
ZelTuningBlock<zm::PrcTuning> MakeBlock() {
  zm::PrcTuning tuning;
  tuning.set_enable(true);
  tuning.mutable_static_param();
  zm::PrcDynamicParam& d = *tuning.mutable_dynamic_param();
  for (int i = 0; i < kPrcRegions; ++i) {
    const float hue = 18.0f * static_cast<float>(i);
    d.add_outer_hue_low(hue);
    d.add_outer_hue_high(hue + 18.0f);
    d.add_outer_sat_low(0.08f);
    d.add_outer_sat_high(1.0f);
    d.add_outer_val_low(0.06f);
    d.add_outer_val_high(1.0f);
    d.add_inner_distance_hue_low(4.0f);
    d.add_inner_distance_hue_high(4.0f);
    d.add_inner_distance_sat_low(0.04f);
    d.add_inner_distance_sat_high(0.0f);
    d.add_inner_distance_val_low(0.04f);
    d.add_inner_distance_val_high(0.0f);
    d.add_shift_vector_hue(i % 3 == 0 ? -1.2f : 1.0f);
    d.add_shift_vector_sat(0.02f);
    d.add_shift_vector_val(-0.006f);
  }
  return ZelTuningBlock<zm::PrcTuning>(std::move(tuning));
}

void BM_TranslatePrc(benchmark::State& state) {
  const ZelTuningBlock<zm::PrcTuning> block = MakeBlock();
  PrcOutput output = {};
  MeasureCall(state, [&] {
    benchmark::DoNotOptimize(&output);
    return TranslatePrc(block, output, TonemapMode::kHighQuality);
  });
}

void BM_GetDefaultPrc(benchmark::State& state) {
  PrcOutput output = {};
  PrcConfigurationValue config = {};
  MeasureCall(state, [&] { return GetDefaultPrc(output, &config); });
}

TAVIK_TRANSLATOR_BENCHMARK(BM_TranslatePrc);
TAVIK_TRANSLATOR_BENCHMARK(BM_GetDefaultPrc);

}  // namespace
}  // namespace tavik
