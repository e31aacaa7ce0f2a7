/// \file
#pragma once

#include "Pulse.h"

#include <cstdint>

namespace Desktop {

/// Counts the questions whose answers keep the picture of the server up to date. Answers come in the
/// order of the questions, so a caller who waits for those asked before knows what was so when it
/// came. Under the loop's lock.
class Questions {
 public:
  /// Counts a question. \return false when it couldn't be asked
  bool Ask(pa_operation* operation) {
    if (OperationPtr(operation) == nullptr) return false;
    ++asked_;
    return true;
  }

  void OnAnswered() { ++answered_; }

  /// Those on the way won't be answered.
  void Forget() { answered_ = asked_; }

  std::uint64_t GetAsked() const { return asked_; }
  bool AreAnswered(std::uint64_t asked) const { return answered_ >= asked; }
  bool AreAllAnswered() const { return answered_ == asked_; }

 private:
  std::uint64_t asked_ = 0;
  std::uint64_t answered_ = 0;
};

}  // namespace Desktop
