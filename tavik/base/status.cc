#include "tavik/base/status.h"

#include "tavik/base/logging.h"
#include "tavik/base/strings.h"

namespace tavik {

StatusBuilder::StatusBuilder(StatusCode code, SourceLocation location)
    : status_(code, ""), location_(location) {}

StatusBuilder::StatusBuilder(Status original, SourceLocation location)
    : status_(std::move(original)), location_(location) {}

std::ostringstream& StatusBuilder::Stream() {
  if (!stream_.has_value()) stream_.emplace();
  return *stream_;
}

StatusBuilder& StatusBuilder::Log(android::base::LogSeverity severity) & {
  log_severity_ = severity;
  return *this;
}

StatusBuilder&& StatusBuilder::Log(android::base::LogSeverity severity) && {
  return std::move(Log(severity));
}

Status StatusBuilder::CreateStatusAndConditionallyLog() && {
  if (status_.ok()) return std::move(status_);
  if (stream_.has_value()) {
    std::string appended = stream_->str();
    if (!appended.empty()) {
      std::string message(status_.message());
      if (!message.empty()) message += "; ";
      message += appended;
      Status composed(status_.code(), message);
      status_.ForEachPayload([&composed](absl::string_view type_url, const absl::Cord& payload) {
        composed.SetPayload(type_url, payload);
      });
      status_ = std::move(composed);
    }
  }
  if (log_severity_.has_value()) {
    log_internal::WriteLogLine(location_.file_name(), location_.line(), *log_severity_,
                               ToStdStringView(status_.message()));
  }
  return std::move(status_);
}

#define TAVIK_DEFINE_ERROR_BUILDER(Name, code)            \
  StatusBuilder Name##ErrorBuilder(SourceLocation location) { \
    return StatusBuilder(StatusCode::code, location);     \
  }

TAVIK_DEFINE_ERROR_BUILDER(Aborted, kAborted)
TAVIK_DEFINE_ERROR_BUILDER(AlreadyExists, kAlreadyExists)
TAVIK_DEFINE_ERROR_BUILDER(Cancelled, kCancelled)
TAVIK_DEFINE_ERROR_BUILDER(DataLoss, kDataLoss)
TAVIK_DEFINE_ERROR_BUILDER(DeadlineExceeded, kDeadlineExceeded)
TAVIK_DEFINE_ERROR_BUILDER(FailedPrecondition, kFailedPrecondition)
TAVIK_DEFINE_ERROR_BUILDER(Internal, kInternal)
TAVIK_DEFINE_ERROR_BUILDER(InvalidArgument, kInvalidArgument)
TAVIK_DEFINE_ERROR_BUILDER(NotFound, kNotFound)
TAVIK_DEFINE_ERROR_BUILDER(OutOfRange, kOutOfRange)
TAVIK_DEFINE_ERROR_BUILDER(PermissionDenied, kPermissionDenied)
TAVIK_DEFINE_ERROR_BUILDER(ResourceExhausted, kResourceExhausted)
TAVIK_DEFINE_ERROR_BUILDER(Unavailable, kUnavailable)
TAVIK_DEFINE_ERROR_BUILDER(Unimplemented, kUnimplemented)
TAVIK_DEFINE_ERROR_BUILDER(Unknown, kUnknown)

#undef TAVIK_DEFINE_ERROR_BUILDER

}  // namespace tavik
