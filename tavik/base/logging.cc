#include "tavik/base/logging.h"

#include <chrono>

namespace tavik {
namespace {

// Bumped by ResetAllForTesting; a limiter that sees a new generation forgets its last event.
std::atomic<uint64_t> g_rate_limiter_generation{0};

}  // namespace

void RateLimiter::ResetAllForTesting() {
  g_rate_limiter_generation.fetch_add(1, std::memory_order_relaxed);
}

bool RateLimiter::ShouldPass() {
  const auto now = std::chrono::steady_clock::now().time_since_epoch();
  return ShouldPass(std::chrono::duration_cast<std::chrono::seconds>(now).count());
}

bool RateLimiter::ShouldPass(int64_t now_seconds) {
  const uint64_t generation = g_rate_limiter_generation.load(std::memory_order_relaxed);
  if (generation_.load(std::memory_order_relaxed) != generation) {
    generation_.store(generation, std::memory_order_relaxed);
    last_second_.store(kNever, std::memory_order_relaxed);
  }
  int64_t last = last_second_.load(std::memory_order_relaxed);
  while (last == kNever || now_seconds - last >= period_seconds_) {
    // Of the threads that see the period elapsed, only the one whose exchange lands passes.
    if (last_second_.compare_exchange_weak(last, now_seconds, std::memory_order_relaxed)) {
      return true;
    }
  }
  return false;
}

namespace log_internal {

void WriteLogLine(const char* file, unsigned int line, android::base::LogSeverity severity,
                  std::string_view message) {
  if (!android::base::ShouldLog(severity, nullptr)) return;
  LogLine(file, line, severity).stream() << message;
}

}  // namespace log_internal
}  // namespace tavik
