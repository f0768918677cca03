// Counts heap allocations made through global operator new, so that a benchmark can report
// allocations per iteration beside its time. Linked into every benchmark program, which gets the
// counting operator new with it.
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

#include "benchmark/benchmark.h"

namespace tavik::bench {

// Allocations made by any thread since the program started.
uint64_t TotalAllocations();

class AllocationCounter {
 public:
  AllocationCounter() : start_(TotalAllocations()) {}

  uint64_t Count() const { return TotalAllocations() - start_; }

  // Reports the allocations since construction as "allocs/iter", averaged over the iterations.
  void Report(benchmark::State& state) const {
    state.counters["allocs/iter"] =
        benchmark::Counter(static_cast<double>(Count()), benchmark::Counter::kAvgIterations);
  }

 private:
  uint64_t start_;
};

}  // namespace tavik::bench

#endif  // BENCH_ALLOCATION_COUNTER_H_
