/// \file
#pragma once

#include <gtest/gtest.h>

#include <future>
#include <thread>

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

/// A call that takes a while once its gate is open.
struct SlowCall {
  void operator()() {
    gate.Pass();
    for (int i = 0; i < 1000; ++i) std::this_thread::yield();  // time for who doesn't wait
    finished = true;
  }

  /// Opens the gate, and expects that \p wait lasts until the call is over.
  template <typename Wait>
  void ExpectAwaitedBy(Wait wait) {
    std::thread opener([this] { gate.Open(); });
    wait();
    EXPECT_TRUE(finished);
    opener.join();
  }

  Gate gate;
  bool finished = false;  // plain, so that a race shows
};
