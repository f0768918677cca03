// Status values of the platform: Abseil's, plus builders that compose a message from pieces and
// remember where the failure was made, so that a log line can point at the site.
#ifndef TAVIK_BASE_STATUS_H_
#define TAVIK_BASE_STATUS_H_

#include <optional>
#include <cstdint>
#include <sstream>
#include <string>
#include <utility>

#include "absl/status/status.h"
#include "absl/status/statusor.h"
#include "android-base/logging.h"

namespace tavik {

using Status = absl::Status;
using StatusCode = absl::StatusCode;
template <typename T>
using StatusOr = absl::StatusOr<T>;

// Where a failure was made. A default argument of `current()` takes the caller's file and line.
// (std::source_location would do, but clang 14, which builds the fuzzers, lacks its builtin.)
class SourceLocation {
 public:
  static constexpr SourceLocation current(const char* file_name = __builtin_FILE(),
                                          uint32_t line = __builtin_LINE()) {
    return SourceLocation(file_name, line);
  }

  constexpr const char* file_name() const { return file_name_; }
  constexpr uint32_t line() const { return line_; }

 private:
  constexpr SourceLocation(const char* file_name, uint32_t line)
      : file_name_(file_name), line_(line) {}

  const char* file_name_;
  uint32_t line_;
};

using absl::OkStatus;

using absl::AbortedError;
using absl::AlreadyExistsError;
using absl::CancelledError;
using absl::DataLossError;
using absl::DeadlineExceededError;
using absl::FailedPreconditionError;
using absl::InternalError;
using absl::InvalidArgumentError;
using absl::NotFoundError;
using absl::OutOfRangeError;
using absl::PermissionDeniedError;
using absl::ResourceExhaustedError;
using absl::UnauthenticatedError;
using absl::UnavailableError;
using absl::UnimplementedError;
using absl::UnknownError;

// Composes a failure: `InvalidArgumentErrorBuilder(loc) << "Bad width: " << width`. Pieces are
// appended to the message as they come; a builder made from an existing failure keeps its code
// and message and appends the pieces after "; ". A builder becomes a `Status` through
// `CreateStatusAndConditionallyLog`, which also writes the message to the log, at the builder's
// source location, when one of the `Log` methods asked for it.
class StatusBuilder {
 public:
  StatusBuilder(StatusCode code, SourceLocation location);
  StatusBuilder(Status original, SourceLocation location);

  StatusBuilder(StatusBuilder&&) = default;
  StatusBuilder& operator=(StatusBuilder&&) = default;

  template <typename T>
  StatusBuilder& operator<<(const T& piece) & {
    if (!status_.ok()) Stream() << piece;
    return *this;
  }
  template <typename T>
  StatusBuilder&& operator<<(const T& piece) && {
    return std::move(*this << piece);
  }

  // Asks for the final message to be logged at `severity` when the status is created.
  StatusBuilder& Log(android::base::LogSeverity severity) &;
  StatusBuilder&& Log(android::base::LogSeverity severity) &&;
  StatusBuilder& LogError() & { return Log(android::base::ERROR); }
  StatusBuilder&& LogError() && { return std::move(*this).Log(android::base::ERROR); }
  StatusBuilder& LogWarning() & { return Log(android::base::WARNING); }
  StatusBuilder&& LogWarning() && { return std::move(*this).Log(android::base::WARNING); }

  bool ok() const { return status_.ok(); }
  StatusCode code() const { return status_.code(); }
  const SourceLocation& location() const { return location_; }

  Status CreateStatusAndConditionallyLog() &&;

  operator Status() && { return std::move(*this).CreateStatusAndConditionallyLog(); }  // NOLINT
  template <typename T>
  operator StatusOr<T>() && {  // NOLINT
    return StatusOr<T>(std::move(*this).CreateStatusAndConditionallyLog());
  }

 private:
  std::ostringstream& Stream();

  Status status_;
  SourceLocation location_;
  std::optional<std::ostringstream> stream_;
  std::optional<android::base::LogSeverity> log_severity_;
};

StatusBuilder AbortedErrorBuilder(SourceLocation location = SourceLocation::current());
StatusBuilder AlreadyExistsErrorBuilder(SourceLocation location = SourceLocation::current());
StatusBuilder CancelledErrorBuilder(SourceLocation location = SourceLocation::current());
StatusBuilder DataLossErrorBuilder(SourceLocation location = SourceLocation::current());
StatusBuilder DeadlineExceededErrorBuilder(SourceLocation location = SourceLocation::current());
StatusBuilder FailedPreconditionErrorBuilder(SourceLocation location = SourceLocation::current());
StatusBuilder InternalErrorBuilder(SourceLocation location = SourceLocation::current());
StatusBuilder InvalidArgumentErrorBuilder(SourceLocation location = SourceLocation::current());
StatusBuilder NotFoundErrorBuilder(SourceLocation location = SourceLocation::current());
StatusBuilder OutOfRangeErrorBuilder(SourceLocation location = SourceLocation::current());
StatusBuilder PermissionDeniedErrorBuilder(SourceLocation location = SourceLocation::current());
StatusBuilder ResourceExhaustedErrorBuilder(SourceLocation location = SourceLocation::current());
StatusBuilder UnavailableErrorBuilder(SourceLocation location = SourceLocation::current());
StatusBuilder UnimplementedErrorBuilder(SourceLocation location = SourceLocation::current());
StatusBuilder UnknownErrorBuilder(SourceLocation location = SourceLocation::current());

}  // namespace tavik

#endif  // TAVIK_BASE_STATUS_H_
