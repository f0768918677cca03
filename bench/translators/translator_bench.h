// What every translator benchmark shares: a call measured in the benchmark loop with its heap
// allocations per call beside the time, and one registration that repeats each benchmark and
// reports its aggregates (median among them).
//
//   void BM_TranslateFoo(benchmark::State& state) {
//     const ZelTuningBlock<FooTuning> block = ...;
//     FooOutput output = {};
//     MeasureCall(state, [&] { return TranslateFoo(block, input, output); });
//   }
//   TAVIK_TRANSLATOR_BENCHMARK(BM_TranslateFoo);
#ifndef BENCH_TRANSLATORS_TRANSLATOR_BENCH_H_
#define BENCH_TRANSLATORS_TRANSLATOR_BENCH_H_

#include <string>

#include "bench/allocation_counter.h"
#include "benchmark/benchmark.h"
#include "tavik/base/status.h"
#include "tavik/base/trace.h"

namespace tavik::bench {

// Runs `call`, which returns a Status, once per iteration. A failure stops the benchmark with its
// text. Tracing is off, as in a frame without a trace sink.
template <typename Call>
void MeasureCall(benchmark::State& state, Call&& call) {
  SetTraceSink(nullptr);
  AllocationCounter allocations;
  for (auto _ : state) {
    Status status = call();
    if (!status.ok()) {
      state.SkipWithError(std::string(status.message()).c_str());
      break;
    }
    benchmark::DoNotOptimize(status);
  }
  allocations.Report(state);
}

}  // namespace tavik::bench

#define TAVIK_TRANSLATOR_BENCHMARK(name) \
  BENCHMARK(name)->Repetitions(5)->ReportAggregatesOnly(true)->DisplayAggregatesOnly(true)

#endif  // BENCH_TRANSLATORS_TRANSLATOR_BENCH_H_
