// Cost of the edge detector's translator per call, with its heap allocations: none expected, as
// it runs every frame. The default writes constants.
#include <utility>

#include "bench/translators/translator_bench.h"
#include "benchmark/benchmark.h"
#include "tavik/iq/zel/translators/edgedet_online_translator.h"
#include "tavik/iq/zel/zel_tuning_block.h"

namespace tavik {
namespace {

namespace zm = ::vosbrine::zelmondrake;
using ::tavik::bench::MeasureCall;
using ::tavik_registers::zel::itp::EdgedetMagnitudeControlValue;

void BM_TranslateEdgedet(benchmark::State& state) {
  zm::EdgedetTuning tuning;
  tuning.set_enable(true);
  tuning.mutable_static_param()->set_enable_low_power(true);
  tuning.mutable_dynamic_param();
  const ZelTuningBlock<zm::EdgedetTuning> block(std::move(tuning));
  EdgedetItpOutput output = {};
  MeasureCall(state, [&] {
    benchmark::DoNotOptimize(&output);
    return TranslateEdgedet(block, output);
  });
}

void BM_GetDefaultEdgedet(benchmark::State& state) {
  EdgedetItpOutput output = {};
  EdgedetMagnitudeControlValue control = {};
  MeasureCall(state, [&] { return GetDefaultEdgedet(output, &control); });
}

TAVIK_TRANSLATOR_BENCHMARK(BM_TranslateEdgedet);
TAVIK_TRANSLATOR_BENCHMARK(BM_GetDefaultEdgedet);

}  // namespace
}  // namespace tavik
