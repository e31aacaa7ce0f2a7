/// \file
#pragma once

#include "Pulse.h"
#include "PulseLoop.h"

#include <functional>
#include <vector>

namespace Desktop {

/// Requests that a caller sends in one go, and the server's answers to them. Lives and dies under the
/// loop's lock; requests that aren't answered by then are forgotten.
class Batch {
 public:
  /// \param onSuccess called on the loop's thread with the last answer, if no request was refused,
  /// and so in the order of all other answers
  Batch(PulseLoop& loop, std::function<void()> onSuccess)
      : loop_(loop), onSuccess_(std::move(onSuccess)) {}
  ~Batch();

  Batch(const Batch&) = delete;
  Batch& operator=(const Batch&) = delete;

  /// Adds the request that \p send makes: of the context, with the callback and user data it is
  /// given.
  template <typename Send>
  void Add(Send send) {
    Keep(send(OnAnswer, this));
  }

  /// The same for a request of a stream.
  template <typename Send>
  void AddOfStream(Send send) {
    Keep(send(OnStreamAnswer, this));
  }

  /// The same for a request that may be refused: what it is about may be gone.
  template <typename Send>
  void AddOptional(Send send) {
    Keep(send(OnOptionalAnswer, this));
  }

  /// The loop tells of progress when it changes. Requests that couldn't be made have failed by the
  /// time this is asked.
  bool IsDone() const { return outstanding_ == 0; }

  /// \return the native code of the first refusal, or 0
  int GetErrorCode() const { return ToErrorCode(error_); }

 private:
  static void OnAnswer(pa_context* context, int success, void* self);
  static void OnStreamAnswer(pa_stream* stream, int success, void* self);
  static void OnOptionalAnswer(pa_context* context, int success, void* self);

  void Keep(pa_operation* operation);
  void Finish(int error);

  PulseLoop& loop_;
  std::function<void()> onSuccess_;
  std::vector<OperationPtr> operations_;
  std::size_t outstanding_ = 0;
  int error_ = PA_OK;
};

}  // namespace Desktop
