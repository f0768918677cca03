// A blocking first-in first-out queue between producers and one or more consumers. At shutdown
// the consumers drain what is left and then stop: nothing pushed before the shutdown is lost.
#ifndef TAVIK_BASE_WAIT_QUEUE_H_
#define TAVIK_BASE_WAIT_QUEUE_H_

#include <condition_variable>
#include <cstddef>
#include <deque>
#include <limits>
#include <memory>
#include <mutex>
#include <shared_mutex>
#include <utility>

namespace tavik {

template <typename T>
class WaitQueue {
 public:
  explicit WaitQueue(size_t capacity = std::numeric_limits<size_t>::max())
      : capacity_(capacity) {}

  WaitQueue(const WaitQueue&) = delete;
  WaitQueue& operator=(const WaitQueue&) = delete;

  // Appends a copy of `item`; blocks only while the queue is full.
  void push(const T& item) {
    std::unique_lock<std::shared_mutex> lock(lock_);
    while (items_.size() >= capacity_) not_full_->condition.wait(lock);
    if (items_.empty()) {
      { std::lock_guard<std::mutex> signal_lock(not_empty_->mutex); }
      not_empty_->condition.notify_one();
    }
    items_.push_back(item);
  }

  // Moves the front item to `out`, waiting for one. False, with `out` untouched, only once the
  // queue has been shut down and is empty.
  bool Wait(T* out) {
    std::unique_lock<std::shared_mutex> lock(lock_);
    const bool had_to_wait = items_.empty();
    while (items_.empty()) {
      if (shutdown_) return false;
      not_empty_->condition.wait(lock);
    }
    *out = std::move(items_.front());
    items_.pop_front();
    if (had_to_wait && !items_.empty()) not_empty_->condition.notify_one();
    not_full_->condition.notify_one();
    return true;
  }

  // Wakes every consumer; from now on Wait returns false once the queue is empty.
  void Shutdown() {
    std::unique_lock<std::shared_mutex> lock(lock_);
    shutdown_ = true;
    not_empty_->condition.notify_all();
  }

  size_t size() const {
    std::shared_lock<std::shared_mutex> lock(lock_);
    return items_.size();
  }

 private:
  struct Signal {
    std::mutex mutex;
    std::condition_variable_any condition;
  };

  mutable std::shared_mutex lock_;
  std::deque<T> items_;
  std::shared_ptr<Signal> not_empty_ = std::make_shared<Signal>();
  const size_t capacity_;
  std::shared_ptr<Signal> not_full_ = std::make_shared<Signal>();
  bool shutdown_ = false;
};

}  // namespace tavik

#endif  // TAVIK_BASE_WAIT_QUEUE_H_
