// Spans of a run as a Chrome trace-event file, which chrome://tracing and Perfetto open.
#ifndef TOOLS_TAVIK_SIM_CHROME_TRACE_H_
#define TOOLS_TAVIK_SIM_CHROME_TRACE_H_

#include <cstdint>
#include <mutex>
#include <string>
#include <vector>

#include "tavik/base/status.h"
#include "tavik/base/trace.h"

namespace tavik::sim {

// Collects every span while installed (see SetTraceSink).
class ChromeTraceSink : public TraceSink {
 public:
  struct Event {
    int category;
    std::string name;
    int64_t start_nanoseconds;
    int64_t end_nanoseconds;
    int thread_id;
  };

  void OnSpan(const TraceSpan& span) override;

  std::vector<Event> events() const;
  // {"traceEvents":[{"name","cat","ph":"X","ts","dur","pid","tid"}...]}, times in microseconds
  // from the first span's start.
  std::string ToJson() const;
  Status Write(const std::string& path) const;

 private:
  mutable std::mutex mutex_;
  std::vector<Event> events_;
};

// Installs the sink for the scope.
class ScopedTraceSink {
 public:
  explicit ScopedTraceSink(TraceSink* sink) { SetTraceSink(sink); }
  ~ScopedTraceSink() { SetTraceSink(nullptr); }
  ScopedTraceSink(const ScopedTraceSink&) = delete;
  ScopedTraceSink& operator=(const ScopedTraceSink&) = delete;
};

}  // namespace tavik::sim

#endif  // TOOLS_TAVIK_SIM_CHROME_TRACE_H_
