// Costs of the defective-pixel translators per call, with the heap allocations of each. The
// translations run every frame and must not allocate; the defaults build a tuning message.
#include <initializer_list>
#include <utility>

#include "bench/translators/translator_bench.h"
#include "benchmark/benchmark.h"
#include "tavik/iq/zel/translators/dpc_online_translator.h"
#include "tavik/iq/zel/zel_tuning_block.h"

namespace tavik {
namespace {

namespace zm = ::vosbrine::zelmondrake;
using ::tavik::bench::MeasureCall;
using ::tavik_registers::zel::g3aa::DpcConfigValue;

void AddLevels(google::protobuf::RepeatedField<float>* levels,
               std::initializer_list<float> values) {
  levels->Add(values.begin(), values.end());
}

ZelTuningBlock<zm::DpcTuning> MakeBlock() {
  zm::DpcTuning tuning;
  tuning.set_enable(true);
  tuning.mutable_static_param();
  zm::DpcDynamicParam& d = *tuning.mutable_dynamic_param();
  d.set_contrast_diff_factor(0.301f);
  AddLevels(d.mutable_predespeckle_main_thresholds(),
            {0.04248f, 0.05664f, 0.07789f, 0.10621f, 0.14161f});
  AddLevels(d.mutable_direction_effective_thresholds(),
            {0.6966f, 0.7279f, 0.7593f, 0.8377f, 0.9162f});
  d.set_max_mask_level(0.5f);
  AddLevels(d.mutable_dir_base_thresholds(), {0.01983f, 0.01416f, 0.03399f, 0.04107f, 0.04815f});
  AddLevels(d.mutable_omni_dynamic_threshold_weights(),
            {0.01628f, 0.01983f, 0.03399f, 0.04815f, 0.06797f});
  AddLevels(d.mutable_omni_std_thresholds(), {0.01983f, 0.03399f, 0.05523f, 0.09063f, 0.11754f});
  AddLevels(d.mutable_omni_tol_var_green_scales(), {0.2173f, 0.2535f, 0.2898f, 0.326f, 0.3622f});
  AddLevels(d.mutable_omni_tol_var_rb_scales(), {0.2173f, 0.2535f, 0.2898f, 0.326f, 0.3622f});
  d.set_g3aa_dpc_threshold(0.325f);
  return ZelTuningBlock<zm::DpcTuning>(std::move(tuning));
}

constexpr DpcInput kInput = {vosbrine::GRBG, vosbrine::SENSOR_TYPE_BAYER, 10, 4.0f, 4032, 3024, 2};

void BM_TranslateDpcIpp(benchmark::State& state) {
  const ZelTuningBlock<zm::DpcTuning> block = MakeBlock();
  DpcIppOutput output = {};
  MeasureCall(state, [&] {
    benchmark::DoNotOptimize(&output);
    return TranslateDpc(block, kInput, output);
  });
}

void BM_TranslateDpcG3aa(benchmark::State& state) {
  const ZelTuningBlock<zm::DpcTuning> block = MakeBlock();
  DpcConfigValue output = {};
  MeasureCall(state, [&] {
    benchmark::DoNotOptimize(&output);
    return TranslateDpc(block, kInput, &output);
  });
}

void BM_GetDefaultDpcIpp(benchmark::State& state) {
  DpcIppOutput output = {};
  DpcIppFixedOutput fixed = {};
  MeasureCall(state, [&] { return GetDefaultDpc(output, fixed); });
}

void BM_GetDefaultDpcG3aa(benchmark::State& state) {
  DpcConfigValue output = {};
  MeasureCall(state, [&] { return GetDefaultDpc(&output); });
}

TAVIK_TRANSLATOR_BENCHMARK(BM_TranslateDpcIpp);
TAVIK_TRANSLATOR_BENCHMARK(BM_TranslateDpcG3aa);
TAVIK_TRANSLATOR_BENCHMARK(BM_GetDefaultDpcIpp);
TAVIK_TRANSLATOR_BENCHMARK(BM_GetDefaultDpcG3aa);

}  // namespace
}  // namespace tavik
