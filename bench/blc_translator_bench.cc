// Costs of the black-level and digital-gain translators per call, with the heap allocations of
// each. The translations run every frame and must not allocate; the defaults run at configuration
// and build a tuning message, so they do. An empty trace span, the fixed cost of every
// translator, is the baseline.
#include <array>
#include <string>
#include <utility>

#include "bench/allocation_counter.h"
#include "benchmark/benchmark.h"
#include "tavik/base/trace.h"
#include "tavik/iq/zel/translators/blc_online_translator.h"
#include "tavik/iq/zel/translators/dg_online_translator.h"
#include "tavik/iq/zel/zel_tuning_block.h"

namespace tavik {
namespace {

namespace zm = ::vosbrine::zelmondrake;
using ::tavik_registers::zel::g3aa::BlcConfigValue;
using ::tavik_registers::zel::g3aa::DgConfigValue;

ZelTuningBlock<zm::BlcTuning> MakeBlock() {
  zm::BlcTuning tuning;
  tuning.set_enable(true);
  tuning.mutable_static_param();
  zm::BlcDynamicParam& dynamic = *tuning.mutable_dynamic_param();
  for (float offset : {64.0f, 64.5f, 65.0f, 65.5f}) {
    dynamic.add_offsets_r(offset);
    dynamic.add_offsets_gr(offset - 0.25f);
    dynamic.add_offsets_gb(offset - 0.5f);
    dynamic.add_offsets_b(offset + 0.75f);
  }
  return ZelTuningBlock<zm::BlcTuning>(std::move(tuning));
}

template <typename Function>
void Run(benchmark::State& state, Function function) {
  SetTraceSink(nullptr);
  bench::AllocationCounter allocations;
  for (auto _ : state) {
    Status status = function();
    if (!status.ok()) state.SkipWithError(std::string(status.message()).c_str());
    benchmark::DoNotOptimize(status);
  }
  allocations.Report(state);
}

void BM_BaselineTraceSpan(benchmark::State& state) {
  Run(state, [] {
    PerfTrace trace(kTranslatorTraceCategory, "TranslateBlc");
    benchmark::DoNotOptimize(&trace);
    return OkStatus();
  });
}

void BM_TranslateBlcIpp(benchmark::State& state) {
  const ZelTuningBlock<zm::BlcTuning> block = MakeBlock();
  const BlcInput input = {vosbrine::GRBG, static_cast<vosbrine::SensorType>(state.range(0)), 10,
                          4.0f};
  BlcIppOutput output = {};
  Run(state, [&] {
    benchmark::DoNotOptimize(&output);
    return TranslateBlc(block, input, output);
  });
}

void BM_TranslateBlcG3aaOffsets(benchmark::State& state) {
  const ZelTuningBlock<zm::BlcTuning> block = MakeBlock();
  const BlcInput input = {vosbrine::GRBG, vosbrine::SENSOR_TYPE_BAYER, 10, 4.0f};
  BlcConfigValue output = {};
  Run(state, [&] {
    benchmark::DoNotOptimize(&output);
    return TranslateBlc(block, input, &output);
  });
}

void BM_TranslateBlcG3aaGains(benchmark::State& state) {
  const ZelTuningBlock<zm::BlcTuning> block = MakeBlock();
  const BlcInput input = {vosbrine::GRBG, vosbrine::SENSOR_TYPE_BAYER, 10, 4.0f};
  DgConfigValue output = {};
  Run(state, [&] {
    benchmark::DoNotOptimize(&output);
    return TranslateBlc(block, input, &output);
  });
}

void BM_TranslateDg(benchmark::State& state) {
  const ZelTuningBlock<zm::BlcTuning> block = MakeBlock();
  const DgInput input = {vosbrine::GRBG, 10, 4.0f};
  DgConfigValue output = {};
  Run(state, [&] {
    benchmark::DoNotOptimize(&output);
    return TranslateDg(block, input, output);
  });
}

void BM_GetDynamicBlc(benchmark::State& state) {
  const ZelTuningBlock<zm::BlcTuning> block = MakeBlock();
  Run(state, [&] {
    std::array<float, 4> offsets = GetDynamicBlc(block, vosbrine::GBRG);
    benchmark::DoNotOptimize(offsets);
    return OkStatus();
  });
}

void BM_GetDefaultBlcIpp(benchmark::State& state) {
  BlcIppOutput output = {};
  BlcIppFixedOutput fixed = {};
  Run(state, [&] { return GetDefaultBlc(output, fixed); });
}

void BM_GetDefaultBlcG3aaOffsets(benchmark::State& state) {
  BlcConfigValue output = {};
  Run(state, [&] { return GetDefaultBlc(&output); });
}

void BM_GetDefaultBlcG3aaGains(benchmark::State& state) {
  DgConfigValue output = {};
  Run(state, [&] { return GetDefaultBlc(&output); });
}

void BM_GetDefaultDg(benchmark::State& state) {
  DgConfigValue output = {};
  Run(state, [&] { return GetDefaultDg(output); });
}

#define TAVIK_BLC_BENCHMARK(name) \
  BENCHMARK(name)->Repetitions(5)->ReportAggregatesOnly(true)->DisplayAggregatesOnly(true)

TAVIK_BLC_BENCHMARK(BM_BaselineTraceSpan);
TAVIK_BLC_BENCHMARK(BM_TranslateBlcIpp)
    ->ArgName("sensor_type")
    ->Arg(vosbrine::SENSOR_TYPE_BAYER)
    ->Arg(vosbrine::SENSOR_TYPE_QUAD_BAYER);
TAVIK_BLC_BENCHMARK(BM_TranslateBlcG3aaOffsets);
TAVIK_BLC_BENCHMARK(BM_TranslateBlcG3aaGains);
TAVIK_BLC_BENCHMARK(BM_TranslateDg);
TAVIK_BLC_BENCHMARK(BM_GetDynamicBlc);
TAVIK_BLC_BENCHMARK(BM_GetDefaultBlcIpp);
TAVIK_BLC_BENCHMARK(BM_GetDefaultBlcG3aaOffsets);
TAVIK_BLC_BENCHMARK(BM_GetDefaultBlcG3aaGains);
TAVIK_BLC_BENCHMARK(BM_GetDefaultDg);

}  // namespace
}  // namespace tavik
BENCHMARK_MAIN();
