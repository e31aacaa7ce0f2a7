#include "Allocations.h"

#include <atomic>
#include <cstdint>
#include <cstdlib>
#include <new>

namespace {

thread_local std::size_t count = 0;
thread_local std::size_t untilFailure = 0;  // 0: none fails
thread_local bool failed = false;

std::atomic<std::ptrdiff_t> librarySpared{PTRDIFF_MAX};  // the library's are those that don't throw
std::atomic<std::ptrdiff_t> live{0};

void* Allocate(std::size_t size) {
  ++count;
  if (untilFailure > 0 && --untilFailure == 0) {
    failed = true;
    return nullptr;
  }
  live.fetch_add(1, std::memory_order_relaxed);
  return std::malloc(size);
}

}  // namespace

// Arrays are left alone: nobody makes them.
void* operator new(std::size_t size) {
  void* memory = Allocate(size);
  if (memory == nullptr) throw std::bad_alloc();
  return memory;
}
void* operator new(std::size_t size, const std::nothrow_t&) noexcept {
  return librarySpared.fetch_sub(1) > 0 ? Allocate(size) : nullptr;
}
void operator delete(void* memory) noexcept {
  if (memory != nullptr) live.fetch_sub(1, std::memory_order_relaxed);
  std::free(memory);
}
void operator delete(void* memory, std::size_t) noexcept { operator delete(memory); }

std::size_t CountAllocations() { return count; }

std::ptrdiff_t CountLiveAllocations() { return live; }

FailingAllocation::FailingAllocation(std::size_t nth) {
  untilFailure = nth;
  failed = false;
}

FailingAllocation::~FailingAllocation() { untilFailure = 0; }

bool FailingAllocation::HasFailed() const { return failed; }

FailingLibraryAllocation::FailingLibraryAllocation(std::ptrdiff_t spared) {
  librarySpared = spared;
}

FailingLibraryAllocation::~FailingLibraryAllocation() { librarySpared = PTRDIFF_MAX; }
