// The sharpening translators per call, with their heap allocations. The translations run every
// frame and allocate nothing; the defaults build a tuning message, so they do.
#include <utility>

#include "bench/translators/translator_bench.h"
#include "benchmark/benchmark.h"
#include "tavik/iq/zel/translators/sharp_online_translator.h"
#include "tavik/iq/zel/zel_tuning_block.h"

namespace tavik {
namespace {

namespace zm = ::vosbrine::zelmondrake;
using ::tavik::bench::MeasureCall;

ZelTuningBlock<zm::SharpTuning> MakeBlock() {
  zm::SharpTuning tuning;
  tuning.set_enable(true);
  tuning.mutable_static_param();
  tuning.mutable_dynamic_param()->set_lc_threshold(0.00862f);
  tuning.mutable_dynamic_param()->set_lc_suppression(0.4953f);
  tuning.mutable_dynamic_param()->set_lc_power(0.2333f);
  return ZelTuningBlock<zm::SharpTuning>(std::move(tuning));
}

void BM_TranslateSharp(benchmark::State& state) {
  const ZelTuningBlock<zm::SharpTuning> block = MakeBlock();
  SharpItpOutput output = {};
  MeasureCall(state, [&] {
    benchmark::DoNotOptimize(&output);
    return TranslateSharp(block, vosbrine::GBRG, output);
  });
}

void BM_TranslateSharpB0(benchmark::State& state) {
  const ZelTuningBlock<zm::SharpTuning> block = MakeBlock();
  SharpItpOutput output = {};
  MeasureCall(state, [&] {
    benchmark::DoNotOptimize(&output);
    return TranslateSharpB0(block, vosbrine::GBRG, output);
  });
}

void BM_GetDefaultSharp(benchmark::State& state) {
  SharpItpOutput output = {};
  SharpItpFixedOutput fixed = {};
  MeasureCall(state, [&] { return GetDefaultSharp(output, fixed); });
}

void BM_GetDefaultSharpB0(benchmark::State& state) {
  SharpItpOutput output = {};
  SharpItpFixedOutput fixed = {};
  MeasureCall(state, [&] { return GetDefaultSharpB0(output, fixed); });
}

TAVIK_TRANSLATOR_BENCHMARK(BM_TranslateSharp);
TAVIK_TRANSLATOR_BENCHMARK(BM_TranslateSharpB0);
TAVIK_TRANSLATOR_BENCHMARK(BM_GetDefaultSharp);
TAVIK_TRANSLATOR_BENCHMARK(BM_GetDefaultSharpB0);

}  // namespace
}  // namespace tavik
