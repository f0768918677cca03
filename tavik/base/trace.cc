#include "tavik/base/trace.h"

#include <unistd.h>

#include <atomic>
#include <chrono>

namespace tavik {
namespace {

std::atomic<TraceSink*> g_sink{nullptr};

int64_t MonotonicNanoseconds() {
  return std::chrono::duration_cast<std::chrono::nanoseconds>(
             std::chrono::steady_clock::now().time_since_epoch())
      .count();
}

}  // namespace

void SetTraceSink(TraceSink* sink) { g_sink.store(sink, std::memory_order_release); }

bool IsTracing() { return g_sink.load(std::memory_order_acquire) != nullptr; }

PerfTrace::PerfTrace(int category, std::string_view name)
    : sink_(g_sink.load(std::memory_order_acquire)), category_(category) {
  if (sink_ == nullptr) return;
  name_.assign(name);
  start_nanoseconds_ = MonotonicNanoseconds();
}

PerfTrace::~PerfTrace() {
  if (sink_ == nullptr) return;
  sink_->OnSpan(TraceSpan{category_, name_, start_nanoseconds_, MonotonicNanoseconds(),
                          static_cast<int>(gettid())});
}

}  // namespace tavik
