// Logging of the platform, written through Android's libbase. A line carries no tag of ours and
// its text is the bare message; errno is the same after a log statement as before it, so that a
// caller can log between a failing call and its look at errno.
//
//   TAVIK_LOG(ERROR) << "Failed to parse binarypb. Name: " << path;
//   TAVIK_LOG_EVERY_N_SEC(WARNING, 5) << "Unknown sensor mode: " << name;   // every frame
//   TAVIK_CHECK(width * height == size);   // fatal: "Check failed: width * height == size "
//
// Severities are libbase's: VERBOSE, DEBUG, INFO, WARNING, ERROR, FATAL.
#ifndef TAVIK_BASE_LOGGING_H_
#define TAVIK_BASE_LOGGING_H_

#include <atomic>
#include <cstdint>
#include <ostream>
#include <string_view>

#include "android-base/errno_restorer.h"
#include "android-base/logging.h"

namespace tavik {

// Lets one event through per `period_seconds`: the first, then the first that comes at least the
// period after the last one let through. Lock-free, so a call site on the frame path can share one
// limiter across threads.
class RateLimiter {
 public:
  explicit constexpr RateLimiter(int64_t period_seconds) : period_seconds_(period_seconds) {}

  // Against the monotonic clock.
  bool ShouldPass();
  // Against a clock of the caller's, in whole seconds.
  bool ShouldPass(int64_t now_seconds);

  // Makes every limiter of the process let its next event through, as if new. For tests, which
  // assert the lines of call sites that earlier tests of the same process have used.
  static void ResetAllForTesting();

 private:
  static constexpr int64_t kNever = INT64_MIN;

  const int64_t period_seconds_;
  std::atomic<int64_t> last_second_{kNever};
  std::atomic<uint64_t> generation_{0};
};

namespace log_internal {

// One log line: errno is saved on construction and restored after the line has been written.
class LogLine {
 public:
  LogLine(const char* file, unsigned int line, android::base::LogSeverity severity)
      : message_(file, line, severity, /*tag=*/nullptr, /*error=*/-1) {}

  std::ostream& stream() { return message_.stream(); }

 private:
  // Declared first so that it is destroyed last, after the message has been written.
  android::base::ErrnoRestorer errno_restorer_;
  android::base::LogMessage message_;
};

// Writes `message` at once when `severity` is enabled; used where a line is made of a ready text.
void WriteLogLine(const char* file, unsigned int line, android::base::LogSeverity severity,
                  std::string_view message);

// Turns `if (x) ; else stream << ...` into a statement without a dangling else.
struct Voidify {
  void operator&(std::ostream&) {}
};

}  // namespace log_internal
}  // namespace tavik

#define TAVIK_LOG_SEVERITY_(severity) (::android::base::severity)

#define TAVIK_LOG(severity)                                                            \
  !::android::base::ShouldLog(TAVIK_LOG_SEVERITY_(severity), nullptr)                  \
      ? (void)0                                                                        \
      : ::tavik::log_internal::Voidify() &                                             \
            ::tavik::log_internal::LogLine(__FILE__, __LINE__, TAVIK_LOG_SEVERITY_(severity)) \
                .stream()

// At most one line per `seconds` (a constant) from this call site, whatever the thread.
#define TAVIK_LOG_EVERY_N_SEC(severity, seconds)                                           \
  !(::android::base::ShouldLog(TAVIK_LOG_SEVERITY_(severity), nullptr) &&                  \
    []() -> ::tavik::RateLimiter& {                                                        \
      static ::tavik::RateLimiter limiter(seconds);                                        \
      return limiter;                                                                      \
    }().ShouldPass())                                                                      \
      ? (void)0                                                                            \
      : ::tavik::log_internal::Voidify() &                                                 \
            ::tavik::log_internal::LogLine(__FILE__, __LINE__, TAVIK_LOG_SEVERITY_(severity)) \
                .stream()

// Aborts with "Check failed: <condition> " and what is streamed after it when `condition` is
// false. Always on: it guards invariants whose breach would corrupt hardware values.
#define TAVIK_CHECK(condition)                                                            \
  (condition) ? (void)0                                                                   \
              : ::tavik::log_internal::Voidify() &                                        \
                    ::tavik::log_internal::LogLine(__FILE__, __LINE__, ::android::base::FATAL) \
                            .stream()                                                     \
                        << "Check failed: " #condition " "

// Aborts with "Check failed: <a> <op> <b> (<a>=<value>, <b>=<value>) " when the comparison fails.
#define TAVIK_CHECK_OP_(op, a, b)                                                              \
  ((a)op(b)) ? (void)0                                                                         \
             : ::tavik::log_internal::Voidify() &                                              \
                   ::tavik::log_internal::LogLine(__FILE__, __LINE__, ::android::base::FATAL)  \
                           .stream()                                                           \
                       << "Check failed: " #a " " #op " " #b " (" #a "=" << (a) << ", " #b "=" \
                       << (b) << ") "
#define TAVIK_CHECK_EQ(a, b) TAVIK_CHECK_OP_(==, a, b)
#define TAVIK_CHECK_NE(a, b) TAVIK_CHECK_OP_(!=, a, b)
#define TAVIK_CHECK_LE(a, b) TAVIK_CHECK_OP_(<=, a, b)
#define TAVIK_CHECK_LT(a, b) TAVIK_CHECK_OP_(<, a, b)
#define TAVIK_CHECK_GE(a, b) TAVIK_CHECK_OP_(>=, a, b)
#define TAVIK_CHECK_GT(a, b) TAVIK_CHECK_OP_(>, a, b)

#endif  // TAVIK_BASE_LOGGING_H_
