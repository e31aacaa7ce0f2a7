#include "Allocations.h"

#include <malloc.h>

#include <atomic>
#include <cstdlib>
#include <cstring>
#include <new>

namespace {

std::atomic<std::ptrdiff_t> live{0};

std::atomic<bool> isArmed{false};
std::atomic<std::ptrdiff_t> passed{0};  // of those that may fail
std::ptrdiff_t firstFailing = 0, failures = 0;
FailingAllocation::Whose whoseFail = FailingAllocation::kAnyones;

bool Fails(FailingAllocation::Whose whose) {
  if (!isArmed || whose < whoseFail) return false;
  const std::ptrdiff_t number = passed++;
  return number >= firstFailing && number - firstFailing < failures;
}

void* Allocate(std::size_t size, FailingAllocation::Whose whose) {
  if (Fails(whose)) return nullptr;
  live.fetch_add(1, std::memory_order_relaxed);
  return std::malloc(size);
}

}  // namespace

void* operator new(std::size_t size) {
  void* memory = Allocate(size, FailingAllocation::kAnyones);
  if (memory == nullptr) throw std::bad_alloc();
  return memory;
}
void* operator new(std::size_t size, const std::nothrow_t&) noexcept {
  return Allocate(size, FailingAllocation::kLibrarys);
}
void operator delete(void* memory) noexcept {
  if (memory == nullptr) return;
  live.fetch_sub(1, std::memory_order_relaxed);
  std::memset(memory, 0xA5, malloc_usable_size(memory));  // whoever still uses it is to notice
  asm volatile("" : : "r"(memory) : "memory");            // to the compiler, nobody does
  std::free(memory);
}
void operator delete(void* memory, std::size_t) noexcept { operator delete(memory); }

std::ptrdiff_t CountLiveAllocations() { return live; }

FailingAllocation::FailingAllocation(std::ptrdiff_t spared, Whose whose, std::ptrdiff_t times) {
  firstFailing = spared;
  failures = times;
  whoseFail = whose;
  passed = 0;
  isArmed = true;
}

FailingAllocation::~FailingAllocation() { isArmed = false; }

bool FailingAllocation::HasFailed() const { return passed > firstFailing; }
