/// \file
#pragma once

#include <future>

/// Keeps one who passes waiting until it is opened, and tells when somebody has come.
class Gate {
 public:
  void Pass() {
    come_.set_value();
    open_.get_future().wait();
  }
  void AwaitVisitor() { come_.get_future().wait(); }
  void Open() { open_.set_value(); }

 private:
  std::promise<void> come_, open_;
};
