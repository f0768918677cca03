// Counts heap allocations made through global operator new, so that a benchmark can report
// allocations per iteration beside its time. Linked into every benchmark program, which gets the
// counting operator new with it.
//
// Under callgrind (scripts/bench.sh --callgrind) the counter also delimits the measured loop: it
// zeroes callgrind's counts where it is made and dumps them, named by the run's iteration count,
// where it reports; scripts/bench.sh matches the dumps to the benchmarks in the order they ran and
// reads off instructions per iteration, a measure that a machine too busy for times to be trusted
// still gives exactly.
//
//   static void BM_Translate(benchmark::State& state) {
//     ...setup...
//     tavik::bench::AllocationCounter allocations;
//     for (auto _ : state) { ... }
//     allocations.Report(state);   // counter "allocs/iter"
//   }
#ifndef BENCH_ALLOCATION_COUNTER_H_
#define BENCH_ALLOCATION_COUNTER_H_

#include <cstdint>
#include <string>

#include "benchmark/benchmark.h"

#if __has_include(<valgrind/callgrind.h>)
#include <valgrind/callgrind.h>
#define TAVIK_BENCH_CALLGRIND 1
#endif

namespace tavik::bench {

// Allocations made by any thread since the program started.
uint64_t TotalAllocations();

class AllocationCounter {
 public:
  AllocationCounter() : start_(TotalAllocations()) {
#ifdef TAVIK_BENCH_CALLGRIND
    CALLGRIND_ZERO_STATS;
#endif
  }

  uint64_t Count() const { return TotalAllocations() - start_; }

  // Reports the allocations since construction as "allocs/iter", averaged over the iterations.
  void Report(benchmark::State& state) const {
    state.counters["allocs/iter"] =
        benchmark::Counter(static_cast<double>(Count()), benchmark::Counter::kAvgIterations);
#ifdef TAVIK_BENCH_CALLGRIND
    if (RUNNING_ON_VALGRIND) {
      const std::string name = "iterations=" + std::to_string(state.iterations());
      CALLGRIND_DUMP_STATS_AT(name.c_str());
    }
#endif
  }

 private:
  uint64_t start_;
};

}  // namespace tavik::bench

#endif  // BENCH_ALLOCATION_COUNTER_H_
