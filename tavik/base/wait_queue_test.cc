#include "tavik/base/wait_queue.h"

#include <algorithm>
#include <chrono>
#include <future>
#include <memory>
#include <thread>
#include <utility>
#include <vector>

#include "gmock/gmock.h"
#include "gtest/gtest.h"

namespace tavik {
namespace {

using ::testing::ElementsAre;

// Long enough for a blocked call to have returned if it were going to; only ever used to show
// that something has not happened yet.
constexpr auto kStillBlocked = std::chrono::milliseconds(50);
// For things that must happen: generous, so that a slow machine never fails the test.
constexpr auto kMustHappen = std::chrono::seconds(10);

TEST(WaitQueueTest, WaitReturnsItemsInPushOrder) {
  WaitQueue<int> queue;
  for (int i = 1; i <= 5; ++i) queue.push(i);

  std::vector<int> out;
  for (int i = 0; i < 5; ++i) {
    int value = 0;
    ASSERT_TRUE(queue.Wait(&value));
    out.push_back(value);
  }
  EXPECT_THAT(out, ElementsAre(1, 2, 3, 4, 5));
  EXPECT_EQ(queue.size(), 0u);
}

TEST(WaitQueueTest, SizeCountsQueuedItems) {
  WaitQueue<int> queue;
  EXPECT_EQ(queue.size(), 0u);
  queue.push(7);
  queue.push(8);
  EXPECT_EQ(queue.size(), 2u);
  int value = 0;
  ASSERT_TRUE(queue.Wait(&value));
  EXPECT_EQ(queue.size(), 1u);
}

TEST(WaitQueueTest, PushKeepsACopyOfTheItem) {
  WaitQueue<std::vector<int>> queue;
  std::vector<int> item = {1, 2};
  queue.push(item);
  item.push_back(3);

  std::vector<int> out;
  ASSERT_TRUE(queue.Wait(&out));
  EXPECT_THAT(out, ElementsAre(1, 2));
}

TEST(WaitQueueTest, WaitMovesTheItemOutSoTheQueueKeepsNoReference) {
  WaitQueue<std::shared_ptr<int>> queue;
  auto item = std::make_shared<int>(3);
  queue.push(item);
  EXPECT_EQ(item.use_count(), 2);

  std::shared_ptr<int> out;
  ASSERT_TRUE(queue.Wait(&out));
  EXPECT_EQ(out, item);
  EXPECT_EQ(item.use_count(), 2);  // `item` and `out`; none left in the queue.
}

TEST(WaitQueueTest, WaitBlocksUntilAnItemIsPushed) {
  WaitQueue<int> queue;
  std::future<int> consumed = std::async(std::launch::async, [&queue] {
    int value = -1;
    EXPECT_TRUE(queue.Wait(&value));
    return value;
  });

  EXPECT_EQ(consumed.wait_for(kStillBlocked), std::future_status::timeout);
  queue.push(42);
  ASSERT_EQ(consumed.wait_for(kMustHappen), std::future_status::ready);
  EXPECT_EQ(consumed.get(), 42);
}

TEST(WaitQueueTest, ShutdownDrainsQueuedItemsThenWaitReturnsFalse) {
  WaitQueue<int> queue;
  queue.push(1);
  queue.push(2);
  queue.Shutdown();

  int value = 0;
  ASSERT_TRUE(queue.Wait(&value));
  EXPECT_EQ(value, 1);
  ASSERT_TRUE(queue.Wait(&value));
  EXPECT_EQ(value, 2);

  value = 99;
  EXPECT_FALSE(queue.Wait(&value));
  EXPECT_EQ(value, 99);
  // And so on, every time.
  EXPECT_FALSE(queue.Wait(&value));
  EXPECT_EQ(value, 99);
}

TEST(WaitQueueTest, WaitAfterShutdownOfAnEmptyQueueLeavesOutUntouched) {
  WaitQueue<std::shared_ptr<int>> queue;
  queue.Shutdown();
  auto sentinel = std::make_shared<int>(5);
  std::shared_ptr<int> out = sentinel;
  EXPECT_FALSE(queue.Wait(&out));
  EXPECT_EQ(out, sentinel);
}

TEST(WaitQueueTest, ShutdownWakesABlockedConsumer) {
  WaitQueue<int> queue;
  std::future<std::pair<bool, int>> consumed = std::async(std::launch::async, [&queue] {
    int value = 13;
    const bool got = queue.Wait(&value);
    return std::make_pair(got, value);
  });

  EXPECT_EQ(consumed.wait_for(kStillBlocked), std::future_status::timeout);
  queue.Shutdown();
  ASSERT_EQ(consumed.wait_for(kMustHappen), std::future_status::ready);
  const auto [got, value] = consumed.get();
  EXPECT_FALSE(got);
  EXPECT_EQ(value, 13);
}

TEST(WaitQueueTest, ShutdownWakesEveryBlockedConsumer) {
  WaitQueue<int> queue;
  std::vector<std::future<bool>> consumers;
  for (int i = 0; i < 4; ++i) {
    consumers.push_back(std::async(std::launch::async, [&queue] {
      int value = 0;
      return queue.Wait(&value);
    }));
  }
  queue.Shutdown();
  for (std::future<bool>& consumer : consumers) {
    ASSERT_EQ(consumer.wait_for(kMustHappen), std::future_status::ready);
    EXPECT_FALSE(consumer.get());
  }
}

TEST(WaitQueueTest, MultipleConsumersShareEveryItemExactlyOnceInOrder) {
  constexpr int kItems = 20000;
  constexpr int kConsumers = 4;
  WaitQueue<int> queue;
  std::vector<std::vector<int>> received(kConsumers);
  std::vector<std::thread> consumers;
  for (int c = 0; c < kConsumers; ++c) {
    consumers.emplace_back([&queue, &mine = received[c]] {
      int value = 0;
      while (queue.Wait(&value)) mine.push_back(value);
    });
  }
  std::thread producer([&queue] {
    for (int i = 0; i < kItems; ++i) queue.push(i);
  });
  producer.join();
  queue.Shutdown();
  for (std::thread& consumer : consumers) consumer.join();

  std::vector<int> all;
  for (const std::vector<int>& mine : received) {
    // Each consumer takes from the front, so what one consumer sees rises.
    EXPECT_TRUE(std::is_sorted(mine.begin(), mine.end()));
    all.insert(all.end(), mine.begin(), mine.end());
  }
  std::sort(all.begin(), all.end());
  ASSERT_EQ(all.size(), static_cast<size_t>(kItems));
  for (int i = 0; i < kItems; ++i) ASSERT_EQ(all[i], i);
}

TEST(WaitQueueTest, MultipleProducersLoseNothing) {
  constexpr int kPerProducer = 5000;
  constexpr int kProducers = 4;
  WaitQueue<int> queue(/*capacity=*/8);
  std::vector<std::thread> producers;
  for (int p = 0; p < kProducers; ++p) {
    producers.emplace_back([&queue, p] {
      for (int i = 0; i < kPerProducer; ++i) queue.push(p * kPerProducer + i);
    });
  }
  std::vector<int> last_of_producer(kProducers, -1);
  int count = 0;
  for (; count < kProducers * kPerProducer; ++count) {
    int value = 0;
    ASSERT_TRUE(queue.Wait(&value));
    const int p = value / kPerProducer;
    // One producer's items keep their order.
    EXPECT_LT(last_of_producer[p], value);
    last_of_producer[p] = value;
  }
  for (std::thread& producer : producers) producer.join();
  EXPECT_EQ(count, kProducers * kPerProducer);
  EXPECT_EQ(queue.size(), 0u);
}

TEST(WaitQueueTest, PushBlocksWhileTheQueueIsAtCapacity) {
  WaitQueue<int> queue(/*capacity=*/2);
  queue.push(1);
  queue.push(2);

  std::future<void> third = std::async(std::launch::async, [&queue] { queue.push(3); });
  EXPECT_EQ(third.wait_for(kStillBlocked), std::future_status::timeout);
  EXPECT_EQ(queue.size(), 2u);

  int value = 0;
  ASSERT_TRUE(queue.Wait(&value));
  EXPECT_EQ(value, 1);
  ASSERT_EQ(third.wait_for(kMustHappen), std::future_status::ready);
  EXPECT_EQ(queue.size(), 2u);

  ASSERT_TRUE(queue.Wait(&value));
  EXPECT_EQ(value, 2);
  ASSERT_TRUE(queue.Wait(&value));
  EXPECT_EQ(value, 3);
}

TEST(WaitQueueTest, DefaultCapacityIsInEffectUnbounded) {
  WaitQueue<int> queue;
  constexpr int kItems = 100000;
  for (int i = 0; i < kItems; ++i) queue.push(i);  // Would block for ever if it were bounded.
  EXPECT_EQ(queue.size(), static_cast<size_t>(kItems));
}

}  // namespace
}  // namespace tavik
