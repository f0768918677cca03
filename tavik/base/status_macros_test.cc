#include "tavik/base/status_macros.h"

#include <memory>
#include <string>
#include <vector>

#include "gmock/gmock.h"
#include "gtest/gtest.h"
#include "tavik/base/testing/status_matchers.h"

namespace tavik {
namespace {

using ::tavik::test::IsOkAndHolds;
using ::tavik::test::StatusIs;

// Runs `steps` in order, recording each one that ran.
Status RunSteps(const std::vector<Status>& steps, std::vector<int>& ran) {
  for (size_t i = 0; i < steps.size(); ++i) {
    ran.push_back(static_cast<int>(i));
    TAVIK_RETURN_IF_ERROR(steps[i]);
  }
  return OkStatus();
}

TEST(ReturnIfErrorTest, PropagatesTheFirstFailureAndStops) {
  std::vector<int> ran;
  Status status = RunSteps({OkStatus(), NotFoundError("first"), InternalError("second")}, ran);
  EXPECT_THAT(status, StatusIs(StatusCode::kNotFound, "first"));
  EXPECT_EQ(ran, (std::vector<int>{0, 1}));
}

TEST(ReturnIfErrorTest, PassesWhenAllSucceed) {
  std::vector<int> ran;
  EXPECT_TRUE(RunSteps({OkStatus(), OkStatus()}, ran).ok());
  EXPECT_EQ(ran, (std::vector<int>{0, 1}));
}

TEST(ReturnIfErrorTest, AppendsStreamedPieces) {
  auto run = []() -> Status {
    TAVIK_RETURN_IF_ERROR(NotFoundError("No tree")) << "Error interpolating tuning point";
    return OkStatus();
  };
  EXPECT_THAT(run(),
              StatusIs(StatusCode::kNotFound, "No tree; Error interpolating tuning point"));
}

TEST(ReturnIfErrorTest, WorksInAFunctionReturningStatusOr) {
  auto run = []() -> StatusOr<int> {
    TAVIK_RETURN_IF_ERROR(InvalidArgumentError("bad"));
    return 1;
  };
  EXPECT_THAT(run(), StatusIs(StatusCode::kInvalidArgument, "bad"));
}

TEST(ReturnIfErrorTest, AcceptsABuilder) {
  auto run = []() -> Status {
    TAVIK_RETURN_IF_ERROR(UnknownErrorBuilder() << "built");
    return OkStatus();
  };
  EXPECT_THAT(run(), StatusIs(StatusCode::kUnknown, "built"));
}

TEST(ReturnIfErrorTest, EvaluatesItsExpressionOnce) {
  int calls = 0;
  auto step = [&calls]() {
    ++calls;
    return OkStatus();
  };
  auto run = [&]() -> Status {
    TAVIK_RETURN_IF_ERROR(step());
    return OkStatus();
  };
  EXPECT_TRUE(run().ok());
  EXPECT_EQ(calls, 1);
}

TEST(ReturnIfErrorTest, IsOneStatementInsideIfElse) {
  auto run = [](bool check) -> Status {
    if (check)
      TAVIK_RETURN_IF_ERROR(InternalError("checked"));
    else
      return OkStatus();
    return OkStatus();
  };
  EXPECT_THAT(run(true), StatusIs(StatusCode::kInternal, "checked"));
  EXPECT_TRUE(run(false).ok());
}

StatusOr<int> Half(int value) {
  if (value % 2 != 0) return InvalidArgumentError(std::to_string(value));
  return value / 2;
}

TEST(AssignOrReturnTest, AssignsTheValue) {
  auto run = []() -> StatusOr<int> {
    TAVIK_ASSIGN_OR_RETURN(int quarter, Half(8));
    TAVIK_ASSIGN_OR_RETURN(quarter, Half(quarter));
    return quarter;
  };
  EXPECT_THAT(run(), IsOkAndHolds(2));
}

TEST(AssignOrReturnTest, PropagatesTheFirstFailure) {
  int reached = 0;
  auto run = [&reached]() -> Status {
    TAVIK_ASSIGN_OR_RETURN(int half, Half(6));
    reached = half;
    TAVIK_ASSIGN_OR_RETURN(int again, Half(half));
    reached = again;
    return OkStatus();
  };
  EXPECT_THAT(run(), StatusIs(StatusCode::kInvalidArgument, "3"));
  EXPECT_EQ(reached, 3);
}

TEST(AssignOrReturnTest, MovesOutMoveOnlyValues) {
  auto make = []() -> StatusOr<std::unique_ptr<int>> { return std::make_unique<int>(7); };
  auto run = [&make]() -> StatusOr<int> {
    TAVIK_ASSIGN_OR_RETURN(std::unique_ptr<int> value, make());
    return *value;
  };
  EXPECT_THAT(run(), IsOkAndHolds(7));
}

}  // namespace
}  // namespace tavik
