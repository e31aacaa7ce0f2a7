/// \file
/// Counts the calling thread's allocations and makes one of them fail. Linking this replaces the
/// program's `operator new`.
#pragma once

#include <cstddef>

/// \return how many allocations the calling thread has made with `new`.
std::size_t CountAllocations();

/// Makes an allocation of the calling thread fail while it lives.
class FailingAllocation {
 public:
  /// \param nth which allocation from now on, the next being 1
  explicit FailingAllocation(std::size_t nth);
  ~FailingAllocation();

  /// \return whether it has come to the failure.
  bool HasFailed() const;
};
