// The noise mix translators per call, with their heap allocations. The translations run every
// frame and allocate nothing; the defaults build a tuning message, so they do.
#include <utility>

#include "bench/translators/translator_bench.h"
#include "benchmark/benchmark.h"
#include "tavik/iq/zel/translators/nsmix_online_translator.h"
#include "tavik/iq/zel/zel_tuning_block.h"

namespace tavik {
namespace {

namespace zm = ::vosbrine::zelmondrake;
using ::google::protobuf::FieldDescriptor;
using ::tavik::bench::MeasureCall;

// Every value of the dynamic part set, lists at their lengths, values spread over 0..1.
ZelTuningBlock<zm::NsmixTuning> MakeBlock() {
  zm::NsmixTuning tuning;
  tuning.set_enable(true);
  tuning.mutable_static_param();
  zm::NsmixDynamicParam& d = *tuning.mutable_dynamic_param();
  const google::protobuf::Reflection& reflection = *d.GetReflection();
  for (int i = 0; i < d.GetDescriptor()->field_count(); ++i) {
    const FieldDescriptor* field = d.GetDescriptor()->field(i);
    if (!field->is_repeated()) reflection.SetFloat(&d, field, static_cast<float>(i % 16) / 16.0f);
  }
  for (float v : {0.1412f, 0.1255f, 0.1569f, 0.0941f}) d.add_edge_limits(v);
  for (float v : {0.3137f, 0.1098f, 0.3137f, 0.098f}) d.add_texture_limits(v);
  for (float v : {0.0293f, 0.0586f, 0.0635f}) d.add_noise_shape_gains(v);
  for (float v : {0.02f, 0.05f, 0.1f}) d.add_noise_shape_thresholds(v);
  for (int i = 0; i < 32; ++i) d.add_noise_gain_lut(0.385f - 0.0064f * static_cast<float>(i));
  return ZelTuningBlock<zm::NsmixTuning>(std::move(tuning));
}

constexpr NsmixInput kInput = {vosbrine::SENSOR_TYPE_BAYER, 4032, 3024, DenoiseMode::kHighQuality};

void BM_TranslateNsmix(benchmark::State& state) {
  const ZelTuningBlock<zm::NsmixTuning> block = MakeBlock();
  NsmixInput input = kInput;
  input.denoise_mode = static_cast<DenoiseMode>(state.range(0));
  NsmixItpOutput output = {};
  MeasureCall(state, [&] {
    benchmark::DoNotOptimize(&output);
    return TranslateNsmix(block, input, output);
  });
}

void BM_TranslateNsmixB0(benchmark::State& state) {
  const ZelTuningBlock<zm::NsmixTuning> block = MakeBlock();
  NsmixItpOutput output = {};
  MeasureCall(state, [&] {
    benchmark::DoNotOptimize(&output);
    return TranslateNsmixB0(block, kInput, output);
  });
}

void BM_GetDefaultNsmix(benchmark::State& state) {
  NsmixItpOutput output = {};
  NsmixItpFixedOutput fixed = {};
  MeasureCall(state, [&] { return GetDefaultNsmix(output, fixed); });
}

void BM_GetDefaultNsmixB0(benchmark::State& state) {
  NsmixItpOutput output = {};
  NsmixItpFixedOutput fixed = {};
  MeasureCall(state, [&] { return GetDefaultNsmixB0(output, fixed); });
}

TAVIK_TRANSLATOR_BENCHMARK(BM_TranslateNsmix)
    ->ArgName("denoise_mode")
    ->Arg(static_cast<int>(DenoiseMode::kHighQuality))
    ->Arg(static_cast<int>(DenoiseMode::kOff));
TAVIK_TRANSLATOR_BENCHMARK(BM_TranslateNsmixB0);
TAVIK_TRANSLATOR_BENCHMARK(BM_GetDefaultNsmix);
TAVIK_TRANSLATOR_BENCHMARK(BM_GetDefaultNsmixB0);

}  // namespace
}  // namespace tavik
