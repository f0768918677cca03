// Captures log lines for assertions. While a capture lives, every line of VERBOSE and above goes
// to it instead of stderr; lines from every thread are kept, in order. A new capture also restarts
// every rate-limited call site, so that a test sees the first line of each whatever ran before it
// in the process.
#ifndef TAVIK_BASE_TESTING_LOG_CAPTURE_H_
#define TAVIK_BASE_TESTING_LOG_CAPTURE_H_

#include <mutex>
#include <string>
#include <string_view>
#include <vector>

#include "android-base/logging.h"

namespace tavik::test {

struct CapturedLogLine {
  android::base::LogSeverity severity;
  std::string tag;
  std::string file;
  unsigned int line;
  std::string message;
};

class ScopedLogCapture {
 public:
  ScopedLogCapture();
  ~ScopedLogCapture();

  ScopedLogCapture(const ScopedLogCapture&) = delete;
  ScopedLogCapture& operator=(const ScopedLogCapture&) = delete;

  std::vector<CapturedLogLine> lines() const;
  // The messages alone, optionally of one severity.
  std::vector<std::string> messages() const;
  std::vector<std::string> messages(android::base::LogSeverity severity) const;
  // How many lines have exactly this message.
  int Count(std::string_view message) const;
  // Whether any message contains `text`.
  bool Contains(std::string_view text) const;
  void Clear();

 private:
  mutable std::mutex mutex_;
  std::vector<CapturedLogLine> lines_;
  android::base::LogSeverity previous_minimum_;
};

}  // namespace tavik::test

#endif  // TAVIK_BASE_TESTING_LOG_CAPTURE_H_
