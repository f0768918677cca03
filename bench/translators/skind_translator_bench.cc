// Cost of the Skind translator per call, with its heap allocations: none expected, as it runs
// every frame. The default writes constants.
#include <utility>

#include "bench/translators/translator_bench.h"
#include "benchmark/benchmark.h"
#include "tavik/iq/zel/translators/skind_online_translator.h"
#include "tavik/iq/zel/zel_tuning_block.h"

namespace tavik {
namespace {

namespace zm = ::vosbrine::zelmondrake;
using ::tavik::bench::MeasureCall;

ZelTuningBlock<zm::SkindTuning> MakeBlock() {
  zm::SkindTuning tuning;
  tuning.set_enable(true);
  zm::SkindStaticParam& s = *tuning.mutable_static_param();
  s.set_enable_skin(true);
  s.set_enable_skin_b(true);
  s.set_enable_sky(true);
  s.set_enable_grass(true);
  zm::SkindDynamicParam& d = *tuning.mutable_dynamic_param();
  d.set_skin_hue_min(10.0f);
  d.set_skin_hue_max(50.0f);
  d.set_skin_sat_min(0.12f);
  d.set_skin_sat_max(0.68f);
  d.set_skin_val_min(0.2f);
  d.set_skin_val_max(0.98f);
  d.set_skin_hue_smooth_shift(0.25f);
  d.set_sky_hue_min(190.0f);
  d.set_sky_hue_max(240.0f);
  d.set_grass_hue_min(65.0f);
  d.set_grass_hue_max(150.0f);
  return ZelTuningBlock<zm::SkindTuning>(std::move(tuning));
}

void BM_TranslateSkind(benchmark::State& state) {
  const ZelTuningBlock<zm::SkindTuning> block = MakeBlock();
  SkindOutput output = {};
  MeasureCall(state, [&] {
    benchmark::DoNotOptimize(&output);
    return TranslateSkind(block, output);
  });
}

void BM_GetDefaultSkind(benchmark::State& state) {
  SkindOutput output = {};
  SkindFixedOutput fixed = {};
  MeasureCall(state, [&] { return GetDefaultSkind(output, fixed); });
}

TAVIK_TRANSLATOR_BENCHMARK(BM_TranslateSkind);
TAVIK_TRANSLATOR_BENCHMARK(BM_GetDefaultSkind);

}  // namespace
}  // namespace tavik
