// Costs of the black-level translators per call, with the heap allocations of each. The
// translations run every frame and must not allocate; the defaults run at configuration and build
// a tuning message, so they do.
#include <array>
#include <utility>

#include "bench/translators/translator_bench.h"
#include "benchmark/benchmark.h"
#include "tavik/iq/zel/translators/blc_online_translator.h"
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

using bench::MeasureCall;

void BM_TranslateBlcIpp(benchmark::State& state) {
  const ZelTuningBlock<zm::BlcTuning> block = MakeBlock();
  const BlcInput input = {vosbrine::GRBG, static_cast<vosbrine::SensorType>(state.range(0)), 10,
                          4.0f};
  BlcIppOutput output = {};
  MeasureCall(state, [&] {
    benchmark::DoNotOptimize(&output);
    return TranslateBlc(block, input, output);
  });
}

void BM_TranslateBlcG3aaOffsets(benchmark::State& state) {
  const ZelTuningBlock<zm::BlcTuning> block = MakeBlock();
  const BlcInput input = {vosbrine::GRBG, vosbrine::SENSOR_TYPE_BAYER, 10, 4.0f};
  BlcConfigValue output = {};
  MeasureCall(state, [&] {
    benchmark::DoNotOptimize(&output);
    return TranslateBlc(block, input, &output);
  });
}

void BM_TranslateBlcG3aaGains(benchmark::State& state) {
  const ZelTuningBlock<zm::BlcTuning> block = MakeBlock();
  const BlcInput input = {vosbrine::GRBG, vosbrine::SENSOR_TYPE_BAYER, 10, 4.0f};
  DgConfigValue output = {};
  MeasureCall(state, [&] {
    benchmark::DoNotOptimize(&output);
    return TranslateBlc(block, input, &output);
  });
}

void BM_GetDynamicBlc(benchmark::State& state) {
  const ZelTuningBlock<zm::BlcTuning> block = MakeBlock();
  MeasureCall(state, [&] {
    std::array<float, 4> offsets = GetDynamicBlc(block, vosbrine::GBRG);
    benchmark::DoNotOptimize(offsets);
    return OkStatus();
  });
}

void BM_GetDefaultBlcIpp(benchmark::State& state) {
  BlcIppOutput output = {};
  BlcIppFixedOutput fixed = {};
  MeasureCall(state, [&] { return GetDefaultBlc(output, fixed); });
}

void BM_GetDefaultBlcG3aaOffsets(benchmark::State& state) {
  BlcConfigValue output = {};
  MeasureCall(state, [&] { return GetDefaultBlc(&output); });
}

void BM_GetDefaultBlcG3aaGains(benchmark::State& state) {
  DgConfigValue output = {};
  MeasureCall(state, [&] { return GetDefaultBlc(&output); });
}

TAVIK_TRANSLATOR_BENCHMARK(BM_TranslateBlcIpp)
    ->ArgName("sensor_type")
    ->Arg(vosbrine::SENSOR_TYPE_BAYER)
    ->Arg(vosbrine::SENSOR_TYPE_QUAD_BAYER);
TAVIK_TRANSLATOR_BENCHMARK(BM_TranslateBlcG3aaOffsets);
TAVIK_TRANSLATOR_BENCHMARK(BM_TranslateBlcG3aaGains);
TAVIK_TRANSLATOR_BENCHMARK(BM_GetDynamicBlc);
TAVIK_TRANSLATOR_BENCHMARK(BM_GetDefaultBlcIpp);
TAVIK_TRANSLATOR_BENCHMARK(BM_GetDefaultBlcG3aaOffsets);
TAVIK_TRANSLATOR_BENCHMARK(BM_GetDefaultBlcG3aaGains);

}  // namespace
}  // namespace tavik
