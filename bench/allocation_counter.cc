#include "bench/allocation_counter.h"

#include <atomic>
#include <cstdlib>
#include <new>

namespace tavik::bench {
namespace {

std::atomic<uint64_t> g_allocations{0};

void* CountedAllocate(std::size_t size) {
  g_allocations.fetch_add(1, std::memory_order_relaxed);
  if (size == 0) size = 1;
  if (void* pointer = std::malloc(size)) return pointer;
  throw std::bad_alloc();
}

void* CountedAllocateAligned(std::size_t size, std::align_val_t alignment) {
  g_allocations.fetch_add(1, std::memory_order_relaxed);
  const std::size_t align = static_cast<std::size_t>(alignment);
  const std::size_t rounded = (size + align - 1) / align * align;
  if (void* pointer = std::aligned_alloc(align, rounded == 0 ? align : rounded)) return pointer;
  throw std::bad_alloc();
}

}  // namespace

uint64_t TotalAllocations() { return g_allocations.load(std::memory_order_relaxed); }

}  // namespace tavik::bench

void* operator new(std::size_t size) { return tavik::bench::CountedAllocate(size); }
void* operator new[](std::size_t size) { return tavik::bench::CountedAllocate(size); }
void* operator new(std::size_t size, std::align_val_t alignment) {
  return tavik::bench::CountedAllocateAligned(size, alignment);
}
void* operator new[](std::size_t size, std::align_val_t alignment) {
  return tavik::bench::CountedAllocateAligned(size, alignment);
}
void operator delete(void* pointer) noexcept { std::free(pointer); }
void operator delete[](void* pointer) noexcept { std::free(pointer); }
void operator delete(void* pointer, std::size_t) noexcept { std::free(pointer); }
void operator delete[](void* pointer, std::size_t) noexcept { std::free(pointer); }
void operator delete(void* pointer, std::align_val_t) noexcept { std::free(pointer); }
void operator delete[](void* pointer, std::align_val_t) noexcept { std::free(pointer); }
void operator delete(void* pointer, std::size_t, std::align_val_t) noexcept { std::free(pointer); }
void operator delete[](void* pointer, std::size_t, std::align_val_t) noexcept {
  std::free(pointer);
}
