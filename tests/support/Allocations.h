/// \file
/// Counts allocations and makes some of them fail, on all threads. Linking this replaces the
/// program's `operator new`.
#pragma once

#include <cstddef>
#include <cstdint>

/// \return how many allocations with `new` haven't been freed.
std::ptrdiff_t CountLiveAllocations();

/// Makes allocations fail while it lives.
class FailingAllocation {
 public:
  enum Whose { kAnyones, kLibrarys };  ///< the library's alone don't throw
  static constexpr std::ptrdiff_t kForEver = PTRDIFF_MAX;

  /// \param spared how many succeed before
  /// \param times how many fail then
  explicit FailingAllocation(std::ptrdiff_t spared, Whose whose = kLibrarys,
                             std::ptrdiff_t times = kForEver);
  ~FailingAllocation();

  /// \return whether it has come to a failure.
  bool HasFailed() const;
};
