// The noise-add translators per call, with their heap allocations. The translation runs every
// frame and allocates nothing, with faces or without; the table's form pads the frame's faces to
// ten on the stack and allocates nothing either. The default builds a tuning message, so it does.
#include <utility>
#include <vector>

#include "bench/translators/translator_bench.h"
#include "benchmark/benchmark.h"
#include "tavik/iq/zel/translators/snadd_online_translator.h"
#include "tavik/iq/zel/translators/translator_table.h"
#include "tavik/iq/zel/zel_tuning_block.h"

namespace tavik {
namespace {

namespace zm = ::vosbrine::zelmondrake;
using ::tavik::bench::MeasureCall;

ZelTuningBlock<zm::SnaddTuning> MakeBlock() {
  zm::SnaddTuning tuning;
  tuning.set_enable(true);
  tuning.mutable_static_param()->set_enable_face_beautification(true);
  zm::SnaddDynamicParam& d = *tuning.mutable_dynamic_param();
  d.set_extend_skin_map_by_texture_index(0.2039f);
  d.set_extend_skin_map_by_edge_index(0.62745f);
  d.set_skin_sharpening_reduction(0.4686f);
  d.set_skin_noise_add_reduction(0.2718f);
  d.set_extend_grass_map_by_texture_index(0.89412f);
  d.set_radial_face_margin_gain_x(0.25f);
  d.set_radial_face_margin_gain_y(0.25f);
  d.set_radial_face_margin_width_ratio(0.2f);
  d.set_radial_face_margin_height_ratio(0.3f);
  d.set_face_sharp_level(0.6f);
  d.set_face_noise_level(0.4f);
  d.set_face_brightness_level(0.25f);
  d.set_face_brightness_gain(0.25f);
  return ZelTuningBlock<zm::SnaddTuning>(std::move(tuning));
}

// Ten regions, the first `faces` of them real.
std::vector<vosbrine::Roi> Regions(int faces) {
  std::vector<vosbrine::Roi> regions(kSnaddFaceRegionCount);
  for (int i = 0; i < faces; ++i) {
    regions[i].set_left(300 * i + 100);
    regions[i].set_top(200 * i + 50);
    regions[i].set_width(400);
    regions[i].set_height(500);
  }
  return regions;
}

void BM_TranslateSnadd(benchmark::State& state) {
  const ZelTuningBlock<zm::SnaddTuning> block = MakeBlock();
  const std::vector<vosbrine::Roi> regions = Regions(static_cast<int>(state.range(0)));
  vosbrine::ImageResolution resolution;
  resolution.set_width(4032);
  resolution.set_height(3024);
  const SnaddInput input = {regions, &resolution};
  SnaddItpOutput output = {};
  MeasureCall(state, [&] {
    benchmark::DoNotOptimize(&output);
    return TranslateSnadd(input, block, output, EdgeMode::kHighQuality);
  });
}

// Through the translator table, with two faces in the frame's facts.
void BM_TranslateSnaddForm(benchmark::State& state) {
  const ZelTuningBlock<zm::SnaddTuning> block = MakeBlock();
  const std::vector<vosbrine::Roi> faces = Regions(2);
  TranslatorFrame frame;
  frame.blocks[kZelBlockPosition<zm::SnaddTuning>] = &block;
  frame.facts.face_regions = std::span<const vosbrine::Roi>(faces).first(2);
  SnaddItpOutput output = {};
  void* records[] = {&output};
  MeasureCall(state, [&] {
    benchmark::DoNotOptimize(&output);
    return translator_forms::kSnadd.translate(frame, records);
  });
}

void BM_GetDefaultSnadd(benchmark::State& state) {
  SnaddItpOutput output = {};
  SnaddItpFixedOutput fixed = {};
  MeasureCall(state, [&] { return GetDefaultSnadd(output, fixed); });
}

TAVIK_TRANSLATOR_BENCHMARK(BM_TranslateSnadd)->ArgName("faces")->Arg(0)->Arg(10);
TAVIK_TRANSLATOR_BENCHMARK(BM_TranslateSnaddForm);
TAVIK_TRANSLATOR_BENCHMARK(BM_GetDefaultSnadd);

}  // namespace
}  // namespace tavik
