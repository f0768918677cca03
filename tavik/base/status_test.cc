#include "tavik/base/status.h"

#include "gmock/gmock.h"
#include "gtest/gtest.h"
#include "tavik/base/testing/log_capture.h"
#include "tavik/base/testing/status_matchers.h"

namespace tavik {
namespace {

using ::tavik::test::ScopedLogCapture;
using ::tavik::test::StatusIs;
using ::testing::ElementsAre;

TEST(StatusBuilderTest, JoinsPiecesIntoTheMessage) {
  Status status = InvalidArgumentErrorBuilder() << "Bad width: " << 33 << ", height: " << 25.5f;
  EXPECT_THAT(status, StatusIs(StatusCode::kInvalidArgument, "Bad width: 33, height: 25.5"));
}

TEST(StatusBuilderTest, EachBuilderMakesItsCode) {
  struct Case {
    StatusBuilder (*make)(SourceLocation);
    StatusCode code;
  };
  const Case cases[] = {
      {AbortedErrorBuilder, StatusCode::kAborted},
      {AlreadyExistsErrorBuilder, StatusCode::kAlreadyExists},
      {CancelledErrorBuilder, StatusCode::kCancelled},
      {DataLossErrorBuilder, StatusCode::kDataLoss},
      {DeadlineExceededErrorBuilder, StatusCode::kDeadlineExceeded},
      {FailedPreconditionErrorBuilder, StatusCode::kFailedPrecondition},
      {InternalErrorBuilder, StatusCode::kInternal},
      {InvalidArgumentErrorBuilder, StatusCode::kInvalidArgument},
      {NotFoundErrorBuilder, StatusCode::kNotFound},
      {OutOfRangeErrorBuilder, StatusCode::kOutOfRange},
      {PermissionDeniedErrorBuilder, StatusCode::kPermissionDenied},
      {ResourceExhaustedErrorBuilder, StatusCode::kResourceExhausted},
      {UnavailableErrorBuilder, StatusCode::kUnavailable},
      {UnimplementedErrorBuilder, StatusCode::kUnimplemented},
      {UnknownErrorBuilder, StatusCode::kUnknown},
  };
  for (const Case& c : cases) {
    Status status = c.make(SourceLocation::current()) << "text";
    EXPECT_THAT(status, StatusIs(c.code, "text"));
  }
}

TEST(StatusBuilderTest, BuilderWithoutPiecesHasAnEmptyMessage) {
  Status status = UnknownErrorBuilder();
  EXPECT_THAT(status, StatusIs(StatusCode::kUnknown, ""));
}

TEST(StatusBuilderTest, RecordsTheSiteWhereItWasMade) {
  const int line = __LINE__ + 1;
  StatusBuilder builder = NotFoundErrorBuilder();
  EXPECT_EQ(builder.location().line(), static_cast<unsigned>(line));
  EXPECT_THAT(builder.location().file_name(), ::testing::EndsWith("status_test.cc"));
}

TEST(StatusBuilderTest, AppendsToAnExistingFailureAfterASemicolon) {
  Status status = StatusBuilder(NotFoundError("No tree"), SourceLocation::current())
                  << "Error interpolating tuning point";
  EXPECT_THAT(status,
              StatusIs(StatusCode::kNotFound, "No tree; Error interpolating tuning point"));
}

TEST(StatusBuilderTest, OkStaysOkWhateverIsAppended) {
  Status status = StatusBuilder(OkStatus(), SourceLocation::current()) << "ignored";
  EXPECT_TRUE(status.ok());
}

TEST(StatusBuilderTest, LogsTheMessageAtTheBuilderSiteWhenAsked) {
  ScopedLogCapture capture;
  const int line = __LINE__ + 1;
  Status status = InternalErrorBuilder().LogError() << "Unpack failed: " << "x";
  EXPECT_THAT(status, StatusIs(StatusCode::kInternal, "Unpack failed: x"));
  const auto lines = capture.lines();
  ASSERT_EQ(lines.size(), 1u);
  EXPECT_EQ(lines[0].severity, android::base::ERROR);
  EXPECT_EQ(lines[0].message, "Unpack failed: x");
  EXPECT_EQ(lines[0].line, static_cast<unsigned>(line));
  EXPECT_THAT(lines[0].file, ::testing::EndsWith("status_test.cc"));
}

TEST(StatusBuilderTest, DoesNotLogUnlessAsked) {
  ScopedLogCapture capture;
  Status status = InternalErrorBuilder() << "quiet";
  EXPECT_THAT(capture.messages(), ElementsAre());
}

TEST(StatusBuilderTest, ConvertsToStatusOr) {
  auto make = []() -> StatusOr<int> { return FailedPreconditionErrorBuilder() << "Invalid provider"; };
  EXPECT_THAT(make(), StatusIs(StatusCode::kFailedPrecondition, "Invalid provider"));
}

TEST(StatusBuilderTest, CreateStatusAndConditionallyLogIsTheConversion) {
  Status status = (DeadlineExceededErrorBuilder() << "late").CreateStatusAndConditionallyLog();
  EXPECT_THAT(status, StatusIs(StatusCode::kDeadlineExceeded, "late"));
}

}  // namespace
}  // namespace tavik
