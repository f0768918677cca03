#include "tavik/base/fence.h"

#include <memory>
#include <string>
#include <thread>
#include <utility>
#include <vector>

#include "gmock/gmock.h"
#include "gtest/gtest.h"
#include "tavik/base/status.h"
#include "tavik/base/testing/status_matchers.h"
#include "tavik/base/time.h"
#include "tavik/base/tuning_point.h"

namespace tavik {
namespace {

using ::tavik::test::IsOk;
using ::tavik::test::StatusIs;

TEST(SoftwareFenceTest, UnsignalledFenceTimesOutNamingTheDuration) {
  SoftwareFence fence;
  EXPECT_THAT(fence.Wait(Milliseconds(10)),
              StatusIs(StatusCode::kDeadlineExceeded, "Fence not signalled within 10ms"));
  EXPECT_FALSE(fence.IsSignalled());
}

TEST(SoftwareFenceTest, ZeroTimeoutOnAnUnsignalledFenceTimesOutAtOnce) {
  SoftwareFence fence;
  EXPECT_THAT(fence.Wait(ZeroDuration()),
              StatusIs(StatusCode::kDeadlineExceeded, "Fence not signalled within 0"));
}

TEST(SoftwareFenceTest, SignalledWithOkWaitReturnsOk) {
  SoftwareFence fence;
  EXPECT_FALSE(fence.IsSignalled());
  fence.Signal(OkStatus());
  EXPECT_TRUE(fence.IsSignalled());
  EXPECT_THAT(fence.Wait(Milliseconds(10)), IsOk());
}

TEST(SoftwareFenceTest, SignalledWithAnErrorWaitReturnsThatError) {
  SoftwareFence fence;
  fence.Signal(InternalError("Frame dropped"));
  const Status status = fence.Wait(Milliseconds(10));
  EXPECT_EQ(status, InternalError("Frame dropped"));
  EXPECT_THAT(status, StatusIs(StatusCode::kInternal, "Frame dropped"));
}

TEST(SoftwareFenceTest, SignalledFenceReturnsItsStatusEvenWithZeroTimeout) {
  SoftwareFence fence;
  fence.Signal(CancelledError("Session closed"));
  EXPECT_EQ(fence.Wait(ZeroDuration()), CancelledError("Session closed"));
}

TEST(SoftwareFenceTest, SignalledFenceReturnsItsStatusWithInfiniteTimeout) {
  SoftwareFence fence;
  fence.Signal(OkStatus());
  EXPECT_THAT(fence.Wait(InfiniteDuration()), IsOk());
}

TEST(SoftwareFenceTest, EveryWaitReturnsTheSameStatus) {
  SoftwareFence fence;
  fence.Signal(UnavailableError("No statistics"));
  EXPECT_EQ(fence.Wait(Milliseconds(10)), UnavailableError("No statistics"));
  EXPECT_EQ(fence.Wait(Milliseconds(10)), UnavailableError("No statistics"));
  EXPECT_EQ(fence.Wait(InfiniteDuration()), UnavailableError("No statistics"));
}

TEST(SoftwareFenceTest, FirstSignalWins) {
  SoftwareFence fence;
  fence.Signal(OkStatus());
  fence.Signal(InternalError("late"));
  EXPECT_THAT(fence.Wait(Milliseconds(10)), IsOk());
}

TEST(SoftwareFenceTest, FirstSignalWinsWhenItIsAnError) {
  SoftwareFence fence;
  fence.Signal(AbortedError("first"));
  fence.Signal(OkStatus());
  fence.Signal(InternalError("third"));
  EXPECT_EQ(fence.Wait(Milliseconds(10)), AbortedError("first"));
}

TEST(SoftwareFenceTest, SignalFromAnotherThreadWakesAnInfiniteWaiter) {
  SoftwareFence fence;
  std::thread signaller([&fence] { fence.Signal(DataLossError("from thread")); });
  EXPECT_EQ(fence.Wait(InfiniteDuration()), DataLossError("from thread"));
  signaller.join();
}

TEST(SoftwareFenceTest, SignalWakesAWaiterOnAnotherThread) {
  SoftwareFence fence;
  Status waited = UnknownError("not waited");
  // The timeout only bounds a broken fence; a working one returns on the signal.
  std::thread waiter([&fence, &waited] { waited = fence.Wait(Seconds(60)); });
  fence.Signal(OkStatus());
  waiter.join();
  EXPECT_THAT(waited, IsOk());
}

TEST(SoftwareFenceTest, SignalWakesEveryWaiter) {
  constexpr int kWaiters = 8;
  SoftwareFence fence;
  std::vector<Status> results(kWaiters, UnknownError("not waited"));
  std::vector<std::thread> waiters;
  for (int i = 0; i < kWaiters; ++i) {
    waiters.emplace_back([&fence, &results, i] { results[i] = fence.Wait(InfiniteDuration()); });
  }
  fence.Signal(ResourceExhaustedError("all"));
  for (std::thread& waiter : waiters) waiter.join();
  for (const Status& result : results) EXPECT_EQ(result, ResourceExhaustedError("all"));
}

TEST(SoftwareFenceTest, RacingSignalsLeaveOneStatusThatEveryWaiterSees) {
  constexpr int kSignallers = 8;
  constexpr int kWaiters = 8;
  SoftwareFence fence;
  std::vector<Status> results(kWaiters);
  std::vector<std::thread> threads;
  for (int i = 0; i < kWaiters; ++i) {
    threads.emplace_back([&fence, &results, i] { results[i] = fence.Wait(InfiniteDuration()); });
  }
  for (int i = 0; i < kSignallers; ++i) {
    threads.emplace_back([&fence, i] { fence.Signal(InternalError(std::to_string(i))); });
  }
  for (std::thread& thread : threads) thread.join();
  const Status final_status = fence.Wait(ZeroDuration());
  EXPECT_EQ(final_status.code(), StatusCode::kInternal);
  for (const Status& result : results) EXPECT_EQ(result, final_status);
}

TEST(SoftwareFenceTest, IsAFence) {
  std::unique_ptr<Fence> fence = std::make_unique<SoftwareFence>();
  static_cast<SoftwareFence*>(fence.get())->Signal(NotFoundError("gone"));
  EXPECT_EQ(fence->Wait(Milliseconds(10)), NotFoundError("gone"));
}

// A point of the simplest kind: the base class with a fence of the test's.
class TestTuningPoint : public TuningPoint {
 public:
  explicit TestTuningPoint(std::shared_ptr<SoftwareFence> fence) : TuningPoint(std::move(fence)) {}
  TestTuningPoint(const TestTuningPoint&) = default;
};

TEST(TuningPointTest, GetFenceReturnsTheStoredFence) {
  auto fence = std::make_shared<SoftwareFence>();
  const TestTuningPoint point(fence);
  EXPECT_EQ(point.GetFence(), fence.get());
}

TEST(TuningPointTest, WaitForDoneReturnsTheSignalledStatus) {
  auto fence = std::make_shared<SoftwareFence>();
  const TestTuningPoint point(fence);
  fence->Signal(InternalError("Interpolation failed"));
  EXPECT_EQ(point.WaitForDone(Milliseconds(10)), InternalError("Interpolation failed"));
}

TEST(TuningPointTest, WaitForDoneReturnsOkWhenSignalledOk) {
  auto fence = std::make_shared<SoftwareFence>();
  const TestTuningPoint point(fence);
  point.GetFence()->Signal(OkStatus());
  EXPECT_THAT(point.WaitForDone(InfiniteDuration()), IsOk());
}

TEST(TuningPointTest, WaitForDoneTimesOutWithTheFencesStatus) {
  const TestTuningPoint point(std::make_shared<SoftwareFence>());
  EXPECT_THAT(point.WaitForDone(Milliseconds(10)),
              StatusIs(StatusCode::kDeadlineExceeded, "Fence not signalled within 10ms"));
}

TEST(TuningPointTest, CopiesShareTheFence) {
  auto fence = std::make_shared<SoftwareFence>();
  const TestTuningPoint point(fence);
  const TestTuningPoint copy(point);
  EXPECT_EQ(copy.GetFence(), fence.get());
  copy.GetFence()->Signal(AbortedError("via copy"));
  EXPECT_EQ(point.WaitForDone(Milliseconds(10)), AbortedError("via copy"));
}

TEST(TuningPointTest, KeepsItsFenceAlive) {
  auto fence = std::make_shared<SoftwareFence>();
  std::weak_ptr<SoftwareFence> weak = fence;
  const TestTuningPoint point(std::move(fence));
  EXPECT_FALSE(weak.expired());
  point.GetFence()->Signal(OkStatus());
  EXPECT_THAT(point.WaitForDone(Milliseconds(10)), IsOk());
}

// WaitForDone goes through GetFence, so a point that hands out another fence is waited on that one.
class RedirectingTuningPoint : public TuningPoint {
 public:
  RedirectingTuningPoint(std::shared_ptr<SoftwareFence> own, SoftwareFence* other)
      : TuningPoint(std::move(own)), other_(other) {}
  SoftwareFence* GetFence() const override { return other_; }

 private:
  SoftwareFence* other_;
};

TEST(TuningPointTest, WaitForDoneWaitsOnTheFenceThatGetFenceReturns) {
  auto own = std::make_shared<SoftwareFence>();
  SoftwareFence other;
  const RedirectingTuningPoint point(own, &other);
  own->Signal(InternalError("own"));
  other.Signal(OutOfRangeError("other"));
  EXPECT_EQ(point.WaitForDone(Milliseconds(10)), OutOfRangeError("other"));
}

}  // namespace
}  // namespace tavik
