#include "Allocations.h"

#include <cstdlib>
#include <new>

namespace {

thread_local std::size_t count = 0;
thread_local std::size_t untilFailure = 0;  // 0: none fails
thread_local bool failed = false;

void* Allocate(std::size_t size) {
  ++count;
  if (untilFailure > 0 && --untilFailure == 0) {
    failed = true;
    return nullptr;
  }
  return std::malloc(size);
}

void* AllocateOrThrow(std::size_t size) {
  void* memory = Allocate(size);
  if (memory == nullptr) throw std::bad_alloc();
  return memory;
}

}  // namespace

void* operator new(std::size_t size) { return AllocateOrThrow(size); }
void* operator new[](std::size_t size) { return AllocateOrThrow(size); }
void* operator new(std::size_t size, const std::nothrow_t&) noexcept { return Allocate(size); }
void* operator new[](std::size_t size, const std::nothrow_t&) noexcept { return Allocate(size); }
void operator delete(void* memory) noexcept { std::free(memory); }
void operator delete[](void* memory) noexcept { std::free(memory); }
void operator delete(void* memory, std::size_t) noexcept { std::free(memory); }
void operator delete[](void* memory, std::size_t) noexcept { std::free(memory); }

std::size_t CountAllocations() { return count; }

FailingAllocation::FailingAllocation(std::size_t nth) {
  untilFailure = nth;
  failed = false;
}

FailingAllocation::~FailingAllocation() { untilFailure = 0; }

bool FailingAllocation::HasFailed() const { return failed; }
