// The noise filter's translators per call, with their heap allocations: none, on either path.
#include <utility>

#include "bench/translators/translator_bench.h"
#include "benchmark/benchmark.h"
#include "tavik/iq/zel/translators/nfltr_online_translator.h"
#include "tavik/iq/zel/zel_tuning_block.h"

namespace tavik {
namespace {

namespace zm = ::vosbrine::zelmondrake;
using ::tavik::bench::MeasureCall;

void BM_TranslateNfltr(benchmark::State& state) {
  ZelTuningBlock<zm::NfltrTuning> block;
  block.message.set_enable(true);
  block.message.mutable_static_param();
  block.message.mutable_dynamic_param();
  const tavik_api::WhiteBalanceConfig wb = {2.1f, 1.0f, 1.0f, 1.6f};
  const NfltrInput input = {vosbrine::BGGR, &wb};
  NfltrItpOutput output = {};
  MeasureCall(state, [&] {
    benchmark::DoNotOptimize(&output);
    return TranslateNfltr(block, input, output);
  });
}

void BM_GetDefaultNfltr(benchmark::State& state) {
  NfltrItpOutput output = {};
  NfltrItpFixedOutput fixed = {};
  MeasureCall(state, [&] { return GetDefaultNfltr(output, fixed); });
}

TAVIK_TRANSLATOR_BENCHMARK(BM_TranslateNfltr);
TAVIK_TRANSLATOR_BENCHMARK(BM_GetDefaultNfltr);

}  // namespace
}  // namespace tavik
