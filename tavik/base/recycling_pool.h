// Shared pointers to objects that go back to a pool, not to the heap, when their last reference
// goes: both the object and the shared pointer's control block are kept and handed out again, so
// that a producer that makes one such object per frame allocates nothing once warmed up. An
// object comes back as it was left (storage and all); the producer overwrites what it needs.
//
// Thread-safe: objects may be released on any thread, and the pool lives on, shared by the objects
// it handed out, until the last of them is gone, even after its owner has dropped it.
#ifndef TAVIK_BASE_RECYCLING_POOL_H_
#define TAVIK_BASE_RECYCLING_POOL_H_

#include <cstddef>
#include <memory>
#include <mutex>
#include <new>
#include <utility>
#include <vector>

namespace tavik {

template <typename T>
class RecyclingPool {
 public:
  // Keeps at most `capacity` idle objects (and as many control blocks); more are freed.
  // `on_return`, when given, is applied to an object as it comes back, for example to drop the
  // references it holds.
  explicit RecyclingPool(size_t capacity, void (*on_return)(T&) = nullptr)
      : state_(std::make_shared<State>(capacity, on_return)) {}

  // An idle object, or a new default-constructed one.
  std::shared_ptr<T> Acquire() const {
    T* object = state_->TakeObject();
    if (object == nullptr) object = new T();
    // On failure to allocate the control block the deleter takes the object back.
    return std::shared_ptr<T>(object, Return{state_}, ControlBlockAllocator<T>(state_));
  }

  // Idle objects held now.
  size_t idle() const { return state_->idle(); }

 private:
  class State {
   public:
    State(size_t capacity, void (*on_return)(T&)) : capacity_(capacity), on_return_(on_return) {
      objects_.reserve(capacity);
      blocks_.reserve(capacity);
    }
    ~State() {
      for (T* object : objects_) delete object;
      for (void* block : blocks_) ::operator delete(block);
    }

    T* TakeObject() {
      std::lock_guard<std::mutex> lock(mutex_);
      if (objects_.empty()) return nullptr;
      T* object = objects_.back();
      objects_.pop_back();
      return object;
    }

    void GiveObject(T* object) {
      if (on_return_ != nullptr) on_return_(*object);
      {
        std::lock_guard<std::mutex> lock(mutex_);
        if (objects_.size() < capacity_) {
          objects_.push_back(object);
          return;
        }
      }
      delete object;
    }

    // Control blocks of one pool are all of one type, so of one size.
    void* TakeBlock(size_t size) {
      {
        std::lock_guard<std::mutex> lock(mutex_);
        if (size == block_size_ && !blocks_.empty()) {
          void* block = blocks_.back();
          blocks_.pop_back();
          return block;
        }
      }
      return ::operator new(size);
    }

    void GiveBlock(void* block, size_t size) {
      {
        std::lock_guard<std::mutex> lock(mutex_);
        if (block_size_ == 0) block_size_ = size;
        if (size == block_size_ && blocks_.size() < capacity_) {
          blocks_.push_back(block);
          return;
        }
      }
      ::operator delete(block);
    }

    size_t idle() const {
      std::lock_guard<std::mutex> lock(mutex_);
      return objects_.size();
    }

   private:
    const size_t capacity_;
    void (*const on_return_)(T&);
    mutable std::mutex mutex_;
    std::vector<T*> objects_;
    std::vector<void*> blocks_;
    size_t block_size_ = 0;
  };

  // The deleter: the object goes back to the pool.
  struct Return {
    std::shared_ptr<State> state;
    void operator()(T* object) const { state->GiveObject(object); }
  };

  // Allocates the shared pointer's control block from the pool's idle ones. The control block
  // holds a copy of this allocator, and so keeps the pool alive while it exists.
  template <typename U>
  struct ControlBlockAllocator {
    using value_type = U;

    explicit ControlBlockAllocator(std::shared_ptr<State> pool_state)
        : state(std::move(pool_state)) {}
    template <typename V>
    ControlBlockAllocator(const ControlBlockAllocator<V>& other) : state(other.state) {}

    U* allocate(size_t n) {
      static_assert(alignof(U) <= __STDCPP_DEFAULT_NEW_ALIGNMENT__);
      return static_cast<U*>(state->TakeBlock(n * sizeof(U)));
    }
    void deallocate(U* block, size_t n) { state->GiveBlock(block, n * sizeof(U)); }

    template <typename V>
    bool operator==(const ControlBlockAllocator<V>& other) const {
      return state == other.state;
    }

    std::shared_ptr<State> state;
  };

  std::shared_ptr<State> state_;
};

}  // namespace tavik

#endif  // TAVIK_BASE_RECYCLING_POOL_H_
