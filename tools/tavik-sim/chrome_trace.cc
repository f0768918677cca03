#include "tools/tavik-sim/chrome_trace.h"

#include <algorithm>
#include <fstream>
#include <limits>

#include "absl/strings/str_format.h"
#include "tavik/base/strings.h"

namespace tavik::sim {
namespace {

std::string CategoryName(int category) {
  if (category == kDefaultTraceCategory) return "default";
  if (category == kTranslatorTraceCategory) return "translator";
  return StrCat("category", category);
}

std::string Quote(std::string_view text) {
  std::string out = "\"";
  for (char c : text) {
    if (c == '"' || c == '\\') out += '\\';
    if (static_cast<unsigned char>(c) < 0x20) continue;
    out += c;
  }
  out += '"';
  return out;
}

}  // namespace

void ChromeTraceSink::OnSpan(const TraceSpan& span) {
  std::lock_guard<std::mutex> lock(mutex_);
  events_.push_back({span.category, std::string(span.name), span.start_nanoseconds,
                     span.end_nanoseconds, span.thread_id});
}

std::vector<ChromeTraceSink::Event> ChromeTraceSink::events() const {
  std::lock_guard<std::mutex> lock(mutex_);
  return events_;
}

std::string ChromeTraceSink::ToJson() const {
  std::vector<Event> events = this->events();
  std::sort(events.begin(), events.end(), [](const Event& a, const Event& b) {
    return a.start_nanoseconds < b.start_nanoseconds;
  });
  const int64_t origin = events.empty() ? 0 : events.front().start_nanoseconds;
  std::string out = "{\"traceEvents\":[";
  for (size_t i = 0; i < events.size(); ++i) {
    const Event& e = events[i];
    if (i > 0) out += ",\n";
    absl::StrAppendFormat(&out,
                          "{\"name\":%s,\"cat\":\"%s\",\"ph\":\"X\",\"ts\":%.3f,\"dur\":%.3f,"
                          "\"pid\":1,\"tid\":%d}",
                          Quote(e.name), CategoryName(e.category),
                          static_cast<double>(e.start_nanoseconds - origin) / 1e3,
                          static_cast<double>(e.end_nanoseconds - e.start_nanoseconds) / 1e3,
                          e.thread_id);
  }
  out += "]}\n";
  return out;
}

Status ChromeTraceSink::Write(const std::string& path) const {
  std::ofstream out(path);
  if (!out) return UnavailableError(StrCat(path, ": cannot write"));
  out << ToJson();
  out.close();
  if (!out) return DataLossError(StrCat(path, ": write failed"));
  return OkStatus();
}

}  // namespace tavik::sim
