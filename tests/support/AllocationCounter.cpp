// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "AllocationCounter.h"

#include <atomic>
#include <cstdlib>
#include <new>

namespace {

// Per thread, so a test's count is not disturbed by other threads.
thread_local std::uint64_t threadAllocations = 0;

std::atomic<std::uint64_t>& ProcessAllocations() {
  static std::atomic<std::uint64_t> count{0};
  return count;
}

void Count() {
  ++threadAllocations;
  ProcessAllocations().fetch_add(1, std::memory_order_relaxed);
}

// The allocation loop the language prescribes: retry through the new
// handler until memory comes or there is no handler left.
void* Allocate(std::size_t size) {
  Count();
  const std::size_t bytes = size == 0 ? 1 : size;
  for (;;) {
    if (void* memory = std::malloc(bytes)) {
      return memory;
    }
    std::new_handler handler = std::get_new_handler();
    if (handler == nullptr) {
      throw std::bad_alloc();
    }
    handler();
  }
}

void* AllocateAligned(std::size_t size, std::align_val_t alignment) {
  Count();
  const std::size_t bytes = size == 0 ? 1 : size;
  auto align = static_cast<std::size_t>(alignment);
  align = align < sizeof(void*) ? sizeof(void*) : align;
  for (;;) {
    void* memory = nullptr;
    if (posix_memalign(&memory, align, bytes) == 0) {
      return memory;
    }
    std::new_handler handler = std::get_new_handler();
    if (handler == nullptr) {
      throw std::bad_alloc();
    }
    handler();
  }
}

}  // namespace

AllocationCounter::AllocationCounter() : start(threadAllocations) {}

std::uint64_t AllocationCounter::count() const { return threadAllocations - start; }

std::uint64_t AllocationCounter::processCount() {
  return ProcessAllocations().load(std::memory_order_relaxed);
}

void* operator new(std::size_t size) { return Allocate(size); }
void* operator new[](std::size_t size) { return Allocate(size); }
void* operator new(std::size_t size, std::align_val_t alignment) {
  return AllocateAligned(size, alignment);
}
void* operator new[](std::size_t size, std::align_val_t alignment) {
  return AllocateAligned(size, alignment);
}

void* operator new(std::size_t size, const std::nothrow_t& /*unused*/) noexcept {
  try {
    return Allocate(size);
  } catch (const std::bad_alloc&) {
    return nullptr;
  }
}
void* operator new[](std::size_t size, const std::nothrow_t& /*unused*/) noexcept {
  try {
    return Allocate(size);
  } catch (const std::bad_alloc&) {
    return nullptr;
  }
}
void* operator new(std::size_t size, std::align_val_t alignment,
                   const std::nothrow_t& /*unused*/) noexcept {
  try {
    return AllocateAligned(size, alignment);
  } catch (const std::bad_alloc&) {
    return nullptr;
  }
}
void* operator new[](std::size_t size, std::align_val_t alignment,
                     const std::nothrow_t& /*unused*/) noexcept {
  try {
    return AllocateAligned(size, alignment);
  } catch (const std::bad_alloc&) {
    return nullptr;
  }
}

void operator delete(void* memory) noexcept { std::free(memory); }
void operator delete[](void* memory) noexcept { std::free(memory); }
void operator delete(void* memory, std::size_t /*size*/) noexcept { std::free(memory); }
void operator delete[](void* memory, std::size_t /*size*/) noexcept { std::free(memory); }
void operator delete(void* memory, const std::nothrow_t& /*unused*/) noexcept { std::free(memory); }
void operator delete[](void* memory, const std::nothrow_t& /*unused*/) noexcept {
  std::free(memory);
}
void operator delete(void* memory, std::align_val_t /*alignment*/) noexcept { std::free(memory); }
void operator delete[](void* memory, std::align_val_t /*alignment*/) noexcept { std::free(memory); }
void operator delete(void* memory, std::size_t /*size*/, std::align_val_t /*alignment*/) noexcept {
  std::free(memory);
}
void operator delete[](void* memory, std::size_t /*size*/,
                       std::align_val_t /*alignment*/) noexcept {
  std::free(memory);
}
void operator delete(void* memory, std::align_val_t /*alignment*/,
                     const std::nothrow_t& /*unused*/) noexcept {
  std::free(memory);
}
void operator delete[](void* memory, std::align_val_t /*alignment*/,
                       const std::nothrow_t& /*unused*/) noexcept {
  std::free(memory);
}
