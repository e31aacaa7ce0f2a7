/// \file
/// Counts allocations and makes some of them fail. Linking this replaces the
/// program's `operator new`.
#pragma once

#include <cstddef>

/// \return how many allocations the calling thread has made with `new`.
std::size_t CountAllocations();

/// \return how many allocations of the whole program haven't been freed.
std::ptrdiff_t CountLiveAllocations();

/// Makes an allocation of the calling thread fail while it lives.
class FailingAllocation {
 public:
  /// \param nth which allocation from now on, the next being 1
  explicit FailingAllocation(std::size_t nth);
  ~FailingAllocation();

  /// \return whether it has come to the failure.
  bool HasFailed() const;
};

/// Makes the library's own allocations fail while it lives, on any thread. The library alone
/// allocates without throwing.
class FailingLibraryAllocation {
 public:
  /// \param spared how many still succeed
  explicit FailingLibraryAllocation(std::ptrdiff_t spared = 0);
  ~FailingLibraryAllocation();
};
