// The fixed costs that every translator pays, as baselines for the translators' own figures: an
// empty trace span (opened by every translator, with tracing off) and a knot search over a
// 65-knot curve (the lookup of curves and tables).
#include <vector>

#include "bench/translators/translator_bench.h"
#include "benchmark/benchmark.h"
#include "tavik/base/trace.h"
#include "tavik/iq/zel/translators/translator_util.h"

namespace tavik {
namespace {

using ::tavik::bench::MeasureCall;

void BM_BaselineTraceSpan(benchmark::State& state) {
  MeasureCall(state, [] {
    PerfTrace trace(kTranslatorTraceCategory, "TranslateBlc");
    benchmark::DoNotOptimize(&trace);
    return OkStatus();
  });
}

// 64 rising samples bracketed in a 65-knot table, as a curve is resampled.
void BM_KnotCursorOverACurve(benchmark::State& state) {
  std::vector<float> knots;
  for (int i = 0; i <= 64; ++i) knots.push_back(static_cast<float>(i) / 64.0f);
  MeasureCall(state, [&] {
    KnotCursor cursor(knots);
    float sum = 0.0f;
    for (int i = 0; i < 64; ++i) {
      const KnotBracket bracket = cursor.Find(static_cast<float>(i) / 63.0f);
      sum += bracket.weight_of_lower;
    }
    benchmark::DoNotOptimize(sum);
    return OkStatus();
  });
}

TAVIK_TRANSLATOR_BENCHMARK(BM_BaselineTraceSpan);
TAVIK_TRANSLATOR_BENCHMARK(BM_KnotCursorOverACurve);

}  // namespace
}  // namespace tavik
