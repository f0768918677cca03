// Costs of the digital-gain translator per call, with the heap allocations of each: the
// translation runs every frame and must not allocate; the default builds a tuning message.
#include "bench/translators/translator_bench.h"
#include "benchmark/benchmark.h"
#include "tavik/iq/zel/translators/dg_online_translator.h"
#include "tavik/iq/zel/translators/internal/black_level_gains.h"
#include "tavik/iq/zel/zel_tuning_block.h"

namespace tavik {
namespace {

namespace zm = ::vosbrine::zelmondrake;
using ::tavik::bench::MeasureCall;
using ::tavik_registers::zel::g3aa::DgConfigValue;

void BM_TranslateDg(benchmark::State& state) {
  ZelTuningBlock<zm::BlcTuning> block;
  black_level_internal::SetDefaultTuning(block.message);
  const DgInput input = {vosbrine::GRBG, 10, 4.0f};
  DgConfigValue output = {};
  MeasureCall(state, [&] {
    benchmark::DoNotOptimize(&output);
    return TranslateDg(block, input, output);
  });
}

void BM_GetDefaultDg(benchmark::State& state) {
  DgConfigValue output = {};
  MeasureCall(state, [&] { return GetDefaultDg(output); });
}

TAVIK_TRANSLATOR_BENCHMARK(BM_TranslateDg);
TAVIK_TRANSLATOR_BENCHMARK(BM_GetDefaultDg);

}  // namespace
}  // namespace tavik
