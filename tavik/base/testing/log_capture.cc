#include "tavik/base/testing/log_capture.h"

#include "tavik/base/logging.h"

namespace tavik::test {

ScopedLogCapture::ScopedLogCapture()
    : previous_minimum_(android::base::SetMinimumLogSeverity(android::base::VERBOSE)) {
  RateLimiter::ResetAllForTesting();
  android::base::SetLogger([this](android::base::LogId, android::base::LogSeverity severity,
                                  const char* tag, const char* file, unsigned int line,
                                  const char* message) {
    std::lock_guard<std::mutex> lock(mutex_);
    lines_.push_back(CapturedLogLine{severity, tag != nullptr ? tag : "",
                                     file != nullptr ? file : "", line, message});
  });
}

ScopedLogCapture::~ScopedLogCapture() {
  android::base::SetLogger(android::base::StderrLogger);
  android::base::SetMinimumLogSeverity(previous_minimum_);
}

std::vector<CapturedLogLine> ScopedLogCapture::lines() const {
  std::lock_guard<std::mutex> lock(mutex_);
  return lines_;
}

std::vector<std::string> ScopedLogCapture::messages() const {
  std::lock_guard<std::mutex> lock(mutex_);
  std::vector<std::string> result;
  for (const CapturedLogLine& line : lines_) result.push_back(line.message);
  return result;
}

std::vector<std::string> ScopedLogCapture::messages(android::base::LogSeverity severity) const {
  std::lock_guard<std::mutex> lock(mutex_);
  std::vector<std::string> result;
  for (const CapturedLogLine& line : lines_) {
    if (line.severity == severity) result.push_back(line.message);
  }
  return result;
}

int ScopedLogCapture::Count(std::string_view message) const {
  std::lock_guard<std::mutex> lock(mutex_);
  int count = 0;
  for (const CapturedLogLine& line : lines_) count += line.message == message ? 1 : 0;
  return count;
}

bool ScopedLogCapture::Contains(std::string_view text) const {
  std::lock_guard<std::mutex> lock(mutex_);
  for (const CapturedLogLine& line : lines_) {
    if (line.message.find(text) != std::string::npos) return true;
  }
  return false;
}

void ScopedLogCapture::Clear() {
  std::lock_guard<std::mutex> lock(mutex_);
  lines_.clear();
}

}  // namespace tavik::test
