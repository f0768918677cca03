// The gamma translators, per frame and as defaults, with their heap allocations per call.
//
// The tuning path copies the block's tuning (into an arena on the stack) and hands back a freshly
// resampled curve, whose three point lists are the only allocations of the ITP form; the G3AA
// form allocates nothing. The application's-curve path builds a whole tuning on the heap. The
// two copy benchmarks are the baseline of the tuning path: the copy made on the heap, as a plain
// message would be, against the copy made in the stack arena.
#include <cmath>
#include <cstdlib>
#include <string>

#include "bench/allocation_counter.h"
#include "benchmark/benchmark.h"
#include "google/protobuf/arena.h"
#include "tavik/iq/zel/protos/gamma_param.pb.h"
#include "tavik/iq/zel/translators/gamma_online_translator.h"
#include "tavik/iq/zel/zel_tuning_block.h"

namespace tavik {
namespace {

using ::tavik_registers::zel::g3aa::GammaLutValue;
using ::tavik_registers::zel::g3aa_generic::GammaConfigValue;
using ::vosbrine::zelmondrake::GammaTuning;

ZelTuningBlock<GammaTuning> DefaultBlock() {
  ZelTuningBlock<GammaTuning> block;
  gamma_internal::SetDefaultTuning(&block.message);
  return block;
}

Tonemap TuningRules() {
  Tonemap tonemap;
  tonemap.mode = TonemapMode::kHighQuality;
  return tonemap;
}

// An application's curve of 33 points per channel, as the service passes a contrast curve.
Tonemap CurveRules() {
  Tonemap tonemap;
  tonemap.mode = TonemapMode::kContrastCurve;
  for (int i = 0; i <= 32; ++i) {
    const float x = static_cast<float>(i) / 32.0f;
    const float y = std::pow(x, 1.0f / 2.2f);
    tonemap.curve.red.push_back({x, y});
    tonemap.curve.green.push_back({x, y});
    tonemap.curve.blue.push_back({x, y});
  }
  return tonemap;
}

void Check(benchmark::State& state, const Status& status) {
  if (!status.ok()) state.SkipWithError(std::string(status.message()).c_str());
}

void BM_TranslateGammaItp_Tuning(benchmark::State& state) {
  const ZelTuningBlock<GammaTuning> block = DefaultBlock();
  const Tonemap tonemap = TuningRules();
  GammaItpOutput output{};
  TonemapCurve curve;
  Check(state, TranslateGamma(block, tonemap, output, curve));
  bench::AllocationCounter allocations;
  for (auto _ : state) {
    const Status status = TranslateGamma(block, tonemap, output, curve);
    benchmark::DoNotOptimize(status);
    benchmark::DoNotOptimize(output);
  }
  allocations.Report(state);
}
BENCHMARK(BM_TranslateGammaItp_Tuning)->Repetitions(5)->DisplayAggregatesOnly(true);

void BM_TranslateGammaItp_Curve(benchmark::State& state) {
  const ZelTuningBlock<GammaTuning> block;
  const Tonemap tonemap = CurveRules();
  GammaItpOutput output{};
  TonemapCurve curve;
  Check(state, TranslateGamma(block, tonemap, output, curve));
  bench::AllocationCounter allocations;
  for (auto _ : state) {
    const Status status = TranslateGamma(block, tonemap, output, curve);
    benchmark::DoNotOptimize(status);
    benchmark::DoNotOptimize(output);
  }
  allocations.Report(state);
}
BENCHMARK(BM_TranslateGammaItp_Curve)->Repetitions(5)->DisplayAggregatesOnly(true);

void BM_TranslateGammaG3aa_Tuning(benchmark::State& state) {
  const ZelTuningBlock<GammaTuning> block = DefaultBlock();
  const Tonemap tonemap = TuningRules();
  GammaConfigValue config{};
  GammaLutValue lut{};
  Check(state, TranslateGamma(block, tonemap, config, lut));
  bench::AllocationCounter allocations;
  for (auto _ : state) {
    const Status status = TranslateGamma(block, tonemap, config, lut);
    benchmark::DoNotOptimize(status);
    benchmark::DoNotOptimize(lut);
  }
  allocations.Report(state);
}
BENCHMARK(BM_TranslateGammaG3aa_Tuning)->Repetitions(5)->DisplayAggregatesOnly(true);

void BM_TranslateGammaG3aa_Curve(benchmark::State& state) {
  const ZelTuningBlock<GammaTuning> block;
  const Tonemap tonemap = CurveRules();
  GammaConfigValue config{};
  GammaLutValue lut{};
  Check(state, TranslateGamma(block, tonemap, config, lut));
  bench::AllocationCounter allocations;
  for (auto _ : state) {
    const Status status = TranslateGamma(block, tonemap, config, lut);
    benchmark::DoNotOptimize(status);
    benchmark::DoNotOptimize(lut);
  }
  allocations.Report(state);
}
BENCHMARK(BM_TranslateGammaG3aa_Curve)->Repetitions(5)->DisplayAggregatesOnly(true);

void BM_GetDefaultGammaItp(benchmark::State& state) {
  GammaItpOutput output{};
  GammaItpFixedOutput fixed{};
  bench::AllocationCounter allocations;
  for (auto _ : state) {
    const Status status = GetDefaultGamma(output, fixed);
    benchmark::DoNotOptimize(status);
    benchmark::DoNotOptimize(output);
  }
  allocations.Report(state);
}
BENCHMARK(BM_GetDefaultGammaItp)->Repetitions(5)->DisplayAggregatesOnly(true);

void BM_GetDefaultGammaG3aa(benchmark::State& state) {
  GammaConfigValue config{};
  GammaLutValue lut{};
  bench::AllocationCounter allocations;
  for (auto _ : state) {
    const Status status = GetDefaultGamma(config, lut);
    benchmark::DoNotOptimize(status);
    benchmark::DoNotOptimize(lut);
  }
  allocations.Report(state);
}
BENCHMARK(BM_GetDefaultGammaG3aa)->Repetitions(5)->DisplayAggregatesOnly(true);

// Baseline: the tuning copied into a plain message.
void BM_CopyGammaTuning_Heap(benchmark::State& state) {
  const ZelTuningBlock<GammaTuning> block = DefaultBlock();
  bench::AllocationCounter allocations;
  for (auto _ : state) {
    GammaTuning copy;
    copy.CopyFrom(block.message);
    benchmark::DoNotOptimize(copy);
  }
  allocations.Report(state);
}
BENCHMARK(BM_CopyGammaTuning_Heap)->Repetitions(5)->DisplayAggregatesOnly(true);

// The copy as the translators make it.
void BM_CopyGammaTuning_StackArena(benchmark::State& state) {
  const ZelTuningBlock<GammaTuning> block = DefaultBlock();
  bench::AllocationCounter allocations;
  for (auto _ : state) {
    alignas(16) char storage[4096];
    google::protobuf::Arena arena(storage, sizeof(storage));
    GammaTuning* copy = google::protobuf::Arena::CreateMessage<GammaTuning>(&arena);
    copy->CopyFrom(block.message);
    benchmark::DoNotOptimize(copy);
  }
  allocations.Report(state);
}
BENCHMARK(BM_CopyGammaTuning_StackArena)->Repetitions(5)->DisplayAggregatesOnly(true);

}  // namespace
}  // namespace tavik

BENCHMARK_MAIN();
