/// \file
#pragma once

#include <gtest/gtest.h>

#include <pthread.h>
#include <sys/wait.h>
#include <unistd.h>

#include <cstdio>
#include <cstdlib>
#include <functional>
#include <limits>

/// Runs \p body in a process of its own, which then exits as a program does: with its exit handlers
/// and the sanitizers' verdict. The program must have a single thread; checks within \p body count.
/// \return its exit status, 0 when all went well; below 0 the signal that ended it
template <typename Body>
int StatusOfOwnProcess(Body body) {
  std::fflush(nullptr);
  const pid_t child = fork();
  if (child == 0) {
    alarm(120);  // a process that hangs is a failure, not a wait
    body();
    std::exit(testing::Test::HasFailure() ? 1 : 0);
  }
  int status = 0;
  if (waitpid(child, &status, 0) != child) return -1;
  return WIFEXITED(status) ? WEXITSTATUS(status) : -WTERMSIG(status);
}

/// The same for a body in which all is to go well.
template <typename Body>
void InOwnProcess(Body body) {
  EXPECT_EQ(StatusOfOwnProcess(body), 0);
}

/// Runs checks at exit, after all that is made later than this call is gone.
inline void CheckAtExit(std::function<void()> checks) {
  static std::function<void()> kept;
  kept = std::move(checks);
  std::atexit([] {
    kept();
    if (testing::Test::HasFailure()) std::_Exit(1);
  });
}

/// \return what \p function gives while no thread can be started
template <typename Function>
auto WithoutThreads(Function function) {
  pthread_attr_t normal, huge;
  pthread_getattr_default_np(&normal);
  pthread_getattr_default_np(&huge);
  pthread_attr_setstacksize(&huge, std::numeric_limits<std::size_t>::max() / 8 * 7);
  pthread_setattr_default_np(&huge);
  const auto given = function();
  pthread_setattr_default_np(&normal);
  return given;
}
