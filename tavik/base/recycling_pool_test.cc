#include "tavik/base/recycling_pool.h"

#include <memory>
#include <thread>
#include <vector>

#include "gmock/gmock.h"
#include "gtest/gtest.h"

namespace tavik {
namespace {

struct Payload {
  std::vector<int> values;
  int returns = 0;
};

void CountReturn(Payload& payload) { ++payload.returns; }

TEST(RecyclingPoolTest, ReleasedObjectIsHandedOutAgainWithWhatItHeld) {
  RecyclingPool<Payload> pool(4);
  std::shared_ptr<Payload> first = pool.Acquire();
  first->values.assign(100, 7);
  Payload* const address = first.get();
  first.reset();
  EXPECT_EQ(pool.idle(), 1u);

  std::shared_ptr<Payload> second = pool.Acquire();
  EXPECT_EQ(second.get(), address);
  EXPECT_EQ(second->values.size(), 100u);
  EXPECT_GE(second->values.capacity(), 100u);
  EXPECT_EQ(pool.idle(), 0u);
}

TEST(RecyclingPoolTest, EmptyPoolMakesNewDefaultObjects) {
  RecyclingPool<Payload> pool(4);
  std::shared_ptr<Payload> a = pool.Acquire();
  std::shared_ptr<Payload> b = pool.Acquire();
  EXPECT_NE(a.get(), b.get());
  EXPECT_TRUE(b->values.empty());
}

TEST(RecyclingPoolTest, ObjectIsReturnedOnlyWhenItsLastReferenceGoes) {
  RecyclingPool<Payload> pool(4);
  std::shared_ptr<Payload> object = pool.Acquire();
  std::shared_ptr<const Payload> copy = object;
  object.reset();
  EXPECT_EQ(pool.idle(), 0u);
  copy.reset();
  EXPECT_EQ(pool.idle(), 1u);
}

TEST(RecyclingPoolTest, ReturnHookRunsOnEveryReturn) {
  RecyclingPool<Payload> pool(4, CountReturn);
  std::shared_ptr<Payload> object = pool.Acquire();
  Payload* const address = object.get();
  object.reset();
  object = pool.Acquire();
  ASSERT_EQ(object.get(), address);
  EXPECT_EQ(object->returns, 1);
}

TEST(RecyclingPoolTest, KeepsAtMostItsCapacityIdle) {
  RecyclingPool<Payload> pool(2);
  std::vector<std::shared_ptr<Payload>> objects;
  for (int i = 0; i < 5; ++i) objects.push_back(pool.Acquire());
  objects.clear();
  EXPECT_EQ(pool.idle(), 2u);
}

TEST(RecyclingPoolTest, ObjectsOutliveThePoolThatMadeThem) {
  std::shared_ptr<Payload> survivor;
  {
    RecyclingPool<Payload> pool(2, CountReturn);
    survivor = pool.Acquire();
    survivor->values.assign(10, 1);
  }
  // The pool's state lives on with the object; releasing it now frees everything (the leak
  // checker of the sanitizer build would say otherwise).
  EXPECT_EQ(survivor->values.size(), 10u);
  survivor.reset();
}

TEST(RecyclingPoolTest, ObjectsReleasedOnOtherThreadsComeBack) {
  RecyclingPool<Payload> pool(64);
  std::vector<std::shared_ptr<Payload>> objects;
  for (int i = 0; i < 32; ++i) objects.push_back(pool.Acquire());
  std::vector<std::thread> threads;
  for (int t = 0; t < 4; ++t) {
    std::vector<std::shared_ptr<Payload>> share(objects.begin() + t * 8,
                                                objects.begin() + (t + 1) * 8);
    threads.emplace_back([share = std::move(share)]() mutable {
      for (auto& object : share) object->values.push_back(1);
      share.clear();
    });
  }
  objects.clear();
  for (std::thread& thread : threads) thread.join();
  EXPECT_EQ(pool.idle(), 32u);
  std::shared_ptr<Payload> again = pool.Acquire();
  EXPECT_EQ(again->values.size(), 1u);
}

}  // namespace
}  // namespace tavik
