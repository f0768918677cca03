// Cost of the demosaic translator per call, with its heap allocations: none expected, as it runs
// every frame. The default builds a tuning message.
#include <utility>

#include "bench/translators/translator_bench.h"
#include "benchmark/benchmark.h"
#include "tavik/iq/zel/translators/dmsc_online_translator.h"
#include "tavik/iq/zel/zel_tuning_block.h"

namespace tavik {
namespace {

namespace zm = ::vosbrine::zelmondrake;
using ::tavik::bench::MeasureCall;

// Every dynamic field set, each to a value of its own.
ZelTuningBlock<zm::DmscTuning> MakeBlock() {
  zm::DmscTuning tuning;
  tuning.set_enable(true);
  tuning.mutable_static_param()->set_enable_low_power(false);
  zm::DmscDynamicParam& dynamic = *tuning.mutable_dynamic_param();
  const google::protobuf::Descriptor* descriptor = dynamic.GetDescriptor();
  const google::protobuf::Reflection* reflection = dynamic.GetReflection();
  for (int i = 0; i < descriptor->field_count(); ++i) {
    const google::protobuf::FieldDescriptor* field = descriptor->field(i);
    reflection->SetFloat(&dynamic, field, 0.01f * static_cast<float>(field->number()));
  }
  return ZelTuningBlock<zm::DmscTuning>(std::move(tuning));
}

void BM_TranslateDmsc(benchmark::State& state) {
  const ZelTuningBlock<zm::DmscTuning> block = MakeBlock();
  const DmscInput input = {vosbrine::GRBG, vosbrine::SENSOR_TYPE_BAYER, 4032};
  DmscOutput output = {};
  MeasureCall(state, [&] {
    benchmark::DoNotOptimize(&output);
    return TranslateDmsc(block, input, output);
  });
}

void BM_GetDefaultDmsc(benchmark::State& state) {
  DmscOutput output = {};
  DmscFixedOutput fixed = {};
  MeasureCall(state, [&] { return GetDefaultDmsc(output, fixed); });
}

TAVIK_TRANSLATOR_BENCHMARK(BM_TranslateDmsc);
TAVIK_TRANSLATOR_BENCHMARK(BM_GetDefaultDmsc);

}  // namespace
}  // namespace tavik
