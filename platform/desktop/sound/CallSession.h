/// \file
#pragma once

#include "Batch.h"
#include "Pulse.h"

namespace Desktop {

/// An open call session: a stream of silence with the role "phone", which the server and the other
/// programs see for as long as it plays. It outlives its stream: when the server is back, the stream
/// is opened again. Under the loop's lock; doesn't move, because its stream refers to it.
class CallSession {
 public:
  class Owner {
   public:
    /// The stream opened, failed or ended.
    virtual void OnCallChanged() = 0;

    /// The stream, which was open, was taken away, by a program or for want of a sink.
    virtual void OnCallKilled() = 0;

   protected:
    ~Owner() = default;
  };

  static constexpr int kModes = 3;

  explicit CallSession(Owner& owner) : owner_(owner) {}
  ~CallSession() { Drop(); }

  CallSession(const CallSession&) = delete;
  CallSession& operator=(const CallSession&) = delete;

  /// Opens the stream, unless there is one.
  void Open(pa_context* context);

  /// Asks the server to end the stream.
  void Close();

  /// Forgets the stream, whose server is gone.
  void Drop();

  bool IsOpening() const { return HasState(PA_STREAM_CREATING); }
  bool IsOpen() const { return HasState(PA_STREAM_READY); }

  /// \return the native code for why the stream couldn't be opened
  int GetErrorCode() const { return ToErrorCode(error_); }

  int GetMode() const { return mode_; }
  void SetMode(int mode) { mode_ = mode; }

  /// Asks the server to show another mode.
  void SendMode(int mode, Batch& batch);

 private:
  static void OnStateChanged(pa_stream* stream, void* self);
  static void OnWanted(pa_stream* stream, std::size_t size, void* self);

  bool HasState(pa_stream_state_t state) const {
    return stream_ != nullptr && pa_stream_get_state(stream_.get()) == state;
  }

  Owner& owner_;
  StreamPtr stream_;
  bool wasOpen_ = false;
  int mode_ = 0;
  int error_ = PA_OK;
};

}  // namespace Desktop
