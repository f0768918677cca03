// Matchers for Status and StatusOr values:
//   EXPECT_THAT(Load(path), StatusIs(absl::StatusCode::kNotFound, "No such file: x"));
//   EXPECT_THAT(Parse(text), IsOkAndHolds(42));
//   TAVIK_ASSERT_OK_AND_ASSIGN(auto tree, LoadTree(path));
#ifndef TAVIK_BASE_TESTING_STATUS_MATCHERS_H_
#define TAVIK_BASE_TESTING_STATUS_MATCHERS_H_

#include <ostream>
#include <string>
#include <utility>

#include "gmock/gmock.h"
#include "gtest/gtest.h"
#include "tavik/base/status.h"

namespace tavik::test {
namespace status_matchers_internal {

inline const Status& GetStatus(const Status& status) { return status; }
template <typename T>
const Status& GetStatus(const StatusOr<T>& status_or) {
  return status_or.status();
}

}  // namespace status_matchers_internal

MATCHER(IsOk, negation ? "is not OK" : "is OK") {
  const Status& status = status_matchers_internal::GetStatus(arg);
  if (!status.ok()) *result_listener << "which is " << status;
  return status.ok();
}

MATCHER_P2(StatusIs, code, message_matcher,
           std::string("has code ") + absl::StatusCodeToString(code) + " and a message that " +
               ::testing::DescribeMatcher<std::string>(message_matcher, negation)) {
  const Status& status = status_matchers_internal::GetStatus(arg);
  *result_listener << "which is " << status;
  return status.code() == code &&
         ::testing::ExplainMatchResult(message_matcher, std::string(status.message()),
                                       result_listener);
}

MATCHER_P(IsOkAndHolds, value_matcher,
          std::string(negation ? "is not OK or holds a value that does not match"
                               : "is OK and holds a matching value")) {
  if (!arg.ok()) {
    *result_listener << "which is " << arg.status();
    return false;
  }
  return ::testing::ExplainMatchResult(value_matcher, *arg, result_listener);
}

}  // namespace tavik::test

#define TAVIK_EXPECT_OK(expr) EXPECT_THAT((expr), ::tavik::test::IsOk())
#define TAVIK_ASSERT_OK(expr) ASSERT_THAT((expr), ::tavik::test::IsOk())

#define TAVIK_ASSERT_OK_AND_ASSIGN(lhs, rexpr)                                              \
  TAVIK_ASSERT_OK_AND_ASSIGN_IMPL_(                                                         \
      TAVIK_STATUS_TESTING_CONCAT_(tavik_status_or_value_, __LINE__), lhs, rexpr)
#define TAVIK_STATUS_TESTING_CONCAT_INNER_(x, y) x##y
#define TAVIK_STATUS_TESTING_CONCAT_(x, y) TAVIK_STATUS_TESTING_CONCAT_INNER_(x, y)
#define TAVIK_ASSERT_OK_AND_ASSIGN_IMPL_(statusor, lhs, rexpr) \
  auto statusor = (rexpr);                                      \
  ASSERT_THAT(statusor.status(), ::tavik::test::IsOk());        \
  lhs = std::move(statusor).value()

#endif  // TAVIK_BASE_TESTING_STATUS_MATCHERS_H_
