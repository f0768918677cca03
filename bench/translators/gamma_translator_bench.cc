// The gamma translators, per frame and as defaults, with their heap allocations per call.
//
// The tuning path copies the block's tuning (into an arena on the stack) and hands back a freshly
// resampled curve, whose three point lists are the only allocations of the ITP form; the G3AA
// form allocates nothing. The application's-curve path builds a whole tuning on the heap. The
// two copy benchmarks are the baseline of the tuning path: the copy made on the heap, as a plain
// message would be, against the copy made in the stack arena.
#include <cmath>

#include "bench/translators/translator_bench.h"
#include "benchmark/benchmark.h"
#include "google/protobuf/arena.h"
#include "tavik/iq/zel/protos/gamma_param.pb.h"
#include "tavik/iq/zel/translators/gamma_online_translator.h"
#include "tavik/iq/zel/translators/internal/gamma_curves.h"
#include "tavik/iq/zel/zel_tuning_block.h"

namespace tavik {
namespace {

using ::tavik::bench::MeasureCall;
using ::tavik_registers::zel::g3aa::GammaLutValue;
using ::tavik_registers::zel::g3aa_generic::GammaConfigValue;
using ::vosbrine::zelmondrake::GammaTuning;

ZelTuningBlock<GammaTuning> DefaultBlock() {
  ZelTuningBlock<GammaTuning> block;
  gamma_internal::SetDefaultTuning(block.message);
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

void BM_TranslateGammaItp_Tuning(benchmark::State& state) {
  const ZelTuningBlock<GammaTuning> block = DefaultBlock();
  const Tonemap tonemap = TuningRules();
  GammaItpOutput output{};
  TonemapCurve curve;
  MeasureCall(state, [&] { return TranslateGamma(block, tonemap, output, curve); });
}

void BM_TranslateGammaItp_Curve(benchmark::State& state) {
  const ZelTuningBlock<GammaTuning> block;
  const Tonemap tonemap = CurveRules();
  GammaItpOutput output{};
  TonemapCurve curve;
  MeasureCall(state, [&] { return TranslateGamma(block, tonemap, output, curve); });
}

void BM_TranslateGammaG3aa_Tuning(benchmark::State& state) {
  const ZelTuningBlock<GammaTuning> block = DefaultBlock();
  const Tonemap tonemap = TuningRules();
  GammaConfigValue config{};
  GammaLutValue lut{};
  MeasureCall(state, [&] { return TranslateGamma(block, tonemap, config, lut); });
}

void BM_TranslateGammaG3aa_Curve(benchmark::State& state) {
  const ZelTuningBlock<GammaTuning> block;
  const Tonemap tonemap = CurveRules();
  GammaConfigValue config{};
  GammaLutValue lut{};
  MeasureCall(state, [&] { return TranslateGamma(block, tonemap, config, lut); });
}

void BM_GetDefaultGammaItp(benchmark::State& state) {
  GammaItpOutput output{};
  GammaItpFixedOutput fixed{};
  MeasureCall(state, [&] { return GetDefaultGamma(output, fixed); });
}

void BM_GetDefaultGammaG3aa(benchmark::State& state) {
  GammaConfigValue config{};
  GammaLutValue lut{};
  MeasureCall(state, [&] { return GetDefaultGamma(config, lut); });
}

// Baseline: the tuning copied into a plain message.
void BM_CopyGammaTuning_Heap(benchmark::State& state) {
  const ZelTuningBlock<GammaTuning> block = DefaultBlock();
  MeasureCall(state, [&] {
    GammaTuning copy;
    copy.CopyFrom(block.message);
    benchmark::DoNotOptimize(copy);
    return OkStatus();
  });
}

// The copy as the translators make it.
void BM_CopyGammaTuning_StackArena(benchmark::State& state) {
  const ZelTuningBlock<GammaTuning> block = DefaultBlock();
  MeasureCall(state, [&] {
    alignas(16) char storage[4096];
    google::protobuf::Arena arena(storage, sizeof(storage));
    GammaTuning* copy = google::protobuf::Arena::CreateMessage<GammaTuning>(&arena);
    copy->CopyFrom(block.message);
    benchmark::DoNotOptimize(copy);
    return OkStatus();
  });
}

TAVIK_TRANSLATOR_BENCHMARK(BM_TranslateGammaItp_Tuning);
TAVIK_TRANSLATOR_BENCHMARK(BM_TranslateGammaItp_Curve);
TAVIK_TRANSLATOR_BENCHMARK(BM_TranslateGammaG3aa_Tuning);
TAVIK_TRANSLATOR_BENCHMARK(BM_TranslateGammaG3aa_Curve);
TAVIK_TRANSLATOR_BENCHMARK(BM_GetDefaultGammaItp);
TAVIK_TRANSLATOR_BENCHMARK(BM_GetDefaultGammaG3aa);
TAVIK_TRANSLATOR_BENCHMARK(BM_CopyGammaTuning_Heap);
TAVIK_TRANSLATOR_BENCHMARK(BM_CopyGammaTuning_StackArena);

}  // namespace
}  // namespace tavik
