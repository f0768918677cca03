// Costs of the platform on the frame path: a log line that is filtered out, a rate-limited
// warning that is suppressed, a trace span with tracing off, and the success path of a status.
#include "android-base/logging.h"
#include "bench/allocation_counter.h"
#include "benchmark/benchmark.h"
#include "tavik/base/logging.h"
#include "tavik/base/status.h"
#include "tavik/base/status_macros.h"
#include "tavik/base/trace.h"

namespace tavik {
namespace {

void BM_FilteredLogLine(benchmark::State& state) {
  android::base::SetMinimumLogSeverity(android::base::INFO);
  bench::AllocationCounter allocations;
  for (auto _ : state) {
    TAVIK_LOG(VERBOSE) << "per-field trace " << state.iterations();
  }
  allocations.Report(state);
}
BENCHMARK(BM_FilteredLogLine);

void BM_SuppressedRateLimitedWarning(benchmark::State& state) {
  android::base::SetLogger([](auto&&...) {});
  TAVIK_LOG_EVERY_N_SEC(WARNING, 5) << "first one passes";
  bench::AllocationCounter allocations;
  for (auto _ : state) {
    TAVIK_LOG_EVERY_N_SEC(WARNING, 3600) << "every frame";
  }
  allocations.Report(state);
  android::base::SetLogger(android::base::StderrLogger);
}
BENCHMARK(BM_SuppressedRateLimitedWarning);

void BM_TraceSpanWhileOff(benchmark::State& state) {
  SetTraceSink(nullptr);
  bench::AllocationCounter allocations;
  for (auto _ : state) {
    PerfTrace trace(kTranslatorTraceCategory, "TranslateBlc");
    benchmark::DoNotOptimize(&trace);
  }
  allocations.Report(state);
}
BENCHMARK(BM_TraceSpanWhileOff);

Status Step(int value) { return value >= 0 ? OkStatus() : InvalidArgumentError("negative"); }

Status ThreeSteps(int value) {
  TAVIK_RETURN_IF_ERROR(Step(value));
  TAVIK_RETURN_IF_ERROR(Step(value + 1));
  TAVIK_RETURN_IF_ERROR(Step(value + 2));
  return OkStatus();
}

void BM_StatusMacrosOnSuccess(benchmark::State& state) {
  int value = 1;
  bench::AllocationCounter allocations;
  for (auto _ : state) {
    benchmark::DoNotOptimize(value);
    Status status = ThreeSteps(value);
    benchmark::DoNotOptimize(status);
  }
  allocations.Report(state);
}
BENCHMARK(BM_StatusMacrosOnSuccess);

void BM_StatusBuilderOnFailure(benchmark::State& state) {
  bench::AllocationCounter allocations;
  for (auto _ : state) {
    Status status = InvalidArgumentErrorBuilder() << "Bad width: " << 33;
    benchmark::DoNotOptimize(status);
  }
  allocations.Report(state);
}
BENCHMARK(BM_StatusBuilderOnFailure);

}  // namespace
}  // namespace tavik

BENCHMARK_MAIN();
