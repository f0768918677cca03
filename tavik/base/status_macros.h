// Propagation of failures. Each use records its own file and line, and accepts further pieces of
// message: `TAVIK_RETURN_IF_ERROR(Load()) << "while loading " << path;`.
#ifndef TAVIK_BASE_STATUS_MACROS_H_
#define TAVIK_BASE_STATUS_MACROS_H_

#include <optional>
#include <utility>

#include "absl/base/optimization.h"
#include "tavik/base/status.h"

namespace tavik::status_macro_internal {

// Holds the result of the guarded expression; converts to true when it is OK, so that the macro
// can be a single if-else statement that a trailing `<<` attaches to. A builder is made only on
// failure: the successful case, which translators run many times per frame, costs a move and a
// test.
class StatusAdaptorForMacros {
 public:
  StatusAdaptorForMacros(const Status& status, SourceLocation location)
      : status_(status), location_(location) {}
  StatusAdaptorForMacros(Status&& status, SourceLocation location)
      : status_(std::move(status)), location_(location) {}
  StatusAdaptorForMacros(StatusBuilder&& builder, SourceLocation location)
      : status_(builder.ok() ? OkStatus() : UnknownError("")),
        location_(location),
        builder_(std::move(builder)) {}
  template <typename T>
  StatusAdaptorForMacros(const StatusOr<T>& status_or, SourceLocation location)
      : status_(status_or.status()), location_(location) {}

  StatusAdaptorForMacros(const StatusAdaptorForMacros&) = delete;
  StatusAdaptorForMacros& operator=(const StatusAdaptorForMacros&) = delete;

  explicit operator bool() const { return ABSL_PREDICT_TRUE(status_.ok()); }

  StatusBuilder Consume() {
    if (builder_.has_value()) return std::move(*builder_);
    return StatusBuilder(std::move(status_), location_);
  }

 private:
  Status status_;
  SourceLocation location_;
  std::optional<StatusBuilder> builder_;
};

}  // namespace tavik::status_macro_internal

#define TAVIK_STATUS_MACROS_CONCAT_INNER_(x, y) x##y
#define TAVIK_STATUS_MACROS_CONCAT_(x, y) TAVIK_STATUS_MACROS_CONCAT_INNER_(x, y)

// Returns from the enclosing function when `expr` (a Status, StatusOr or StatusBuilder) failed.
// The enclosing function may return Status or StatusOr<T>.
#define TAVIK_RETURN_IF_ERROR(expr)                                                        \
  switch (0)                                                                               \
  case 0:                                                                                  \
  default:                                                                                 \
    if (::tavik::status_macro_internal::StatusAdaptorForMacros tavik_status_macro_adaptor{ \
            (expr), ::tavik::SourceLocation::current()}) {                                 \
    } else /* NOLINT */                                                                    \
      return tavik_status_macro_adaptor.Consume()

// Evaluates `rexpr` (a StatusOr<T>); on failure returns it from the enclosing function, else
// assigns the value to `lhs`, which may be a declaration (`auto x`).
#define TAVIK_ASSIGN_OR_RETURN(lhs, rexpr)                                                         \
  TAVIK_ASSIGN_OR_RETURN_IMPL_(TAVIK_STATUS_MACROS_CONCAT_(tavik_status_or_value_, __LINE__), lhs, \
                               rexpr)

#define TAVIK_ASSIGN_OR_RETURN_IMPL_(statusor, lhs, rexpr)                       \
  auto statusor = (rexpr);                                                       \
  if (ABSL_PREDICT_FALSE(!statusor.ok())) {                                      \
    return ::tavik::status_macro_internal::StatusAdaptorForMacros(               \
               std::move(statusor).status(), ::tavik::SourceLocation::current()) \
        .Consume();                                                              \
  }                                                                              \
  lhs = std::move(statusor).value()

#endif  // TAVIK_BASE_STATUS_MACROS_H_
