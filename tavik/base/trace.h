// Traced spans. A span costs one atomic load when no sink is installed; a tool that wants the
// frame timeline installs a sink and receives every span when it ends.
//
//   PerfTrace trace(kTranslatorTraceCategory, __func__);
//   ScopedTrace section("VorelControllerImpl::Context::Process");
#ifndef TAVIK_BASE_TRACE_H_
#define TAVIK_BASE_TRACE_H_

#include <cstdint>
#include <string>
#include <string_view>

namespace tavik {

// Categories group spans by the room of the library that opened them.
inline constexpr int kDefaultTraceCategory = 0;
inline constexpr int kTranslatorTraceCategory = 5;

struct TraceSpan {
  int category;
  std::string_view name;
  int64_t start_nanoseconds;  // On the monotonic clock.
  int64_t end_nanoseconds;
  int thread_id;
};

class TraceSink {
 public:
  virtual ~TraceSink() = default;
  // Called on the thread that closed the span; must be thread-safe.
  virtual void OnSpan(const TraceSpan& span) = 0;
};

// Installs `sink` (not owned; null turns tracing off). The caller keeps the sink alive until every
// span opened under it has ended.
void SetTraceSink(TraceSink* sink);
bool IsTracing();

class PerfTrace {
 public:
  PerfTrace(int category, std::string_view name);
  ~PerfTrace();

  PerfTrace(const PerfTrace&) = delete;
  PerfTrace& operator=(const PerfTrace&) = delete;

 private:
  TraceSink* sink_;
  int category_;
  std::string name_;  // Copied only while tracing, so that a temporary name is safe.
  int64_t start_nanoseconds_ = 0;
};

// A trace section of the default category.
class ScopedTrace : public PerfTrace {
 public:
  explicit ScopedTrace(std::string_view name) : PerfTrace(kDefaultTraceCategory, name) {}
};

}  // namespace tavik

#endif  // TAVIK_BASE_TRACE_H_
