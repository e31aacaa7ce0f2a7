/// \file
#pragma once

#include "Connection.h"
#include "Pulse.h"

#include <functional>
#include <vector>

namespace Desktop {

/// Requests that a caller sends in one go, and the server's answers to them. Lives and dies under
/// the connection's lock; requests that aren't answered by then are forgotten.
class Batch {
 public:
  explicit Batch(Connection& connection) : connection_(connection) {}
  ~Batch();

  Batch(const Batch&) = delete;
  Batch& operator=(const Batch&) = delete;

  /// Adds the request that \p send makes with the callback and user data it is given.
  template <typename Send>
  void Add(Send send) {
    Add(send, OnAnswer);
  }

  /// The same for a request of a stream.
  template <typename Send>
  void AddOfStream(Send send) {
    Add(send, OnStreamAnswer);
  }

  /// The same for a request that may be refused: what it is about may be gone.
  template <typename Send>
  void AddOptional(Send send) {
    Add(send, OnOptionalAnswer);
  }

  /// Has \p onSuccess called on the connection's thread with the last answer, if no request was
  /// refused, and so in the order of all other answers.
  void WhenDone(std::function<void()> onSuccess) { onSuccess_ = std::move(onSuccess); }

  /// Waits until all requests are answered. \return a native code, of the first refusal if any
  int Await(Connection::Lock& lock, Connection::Time limit);

 private:
  static void OnAnswer(pa_context* context, int success, void* self);
  static void OnStreamAnswer(pa_stream* stream, int success, void* self);
  static void OnOptionalAnswer(pa_context* context, int success, void* self);

  /// What is sent has its place already: nothing can fail between the two.
  template <typename Send, typename Callback>
  void Add(Send send, Callback onAnswer) {
    OperationPtr& operation = operations_.emplace_back();
    operation.reset(send(onAnswer, this));
    if (operation == nullptr) {
      error_ = PA_ERR_BADSTATE;
    } else {
      ++outstanding_;
    }
  }

  void Finish(int error);

  Connection& connection_;
  std::function<void()> onSuccess_;
  std::vector<OperationPtr> operations_;
  std::size_t outstanding_ = 0;
  int error_ = PA_OK;
};

}  // namespace Desktop
