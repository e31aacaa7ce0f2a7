/// \file
#pragma once

#include "Batch.h"
#include "Connection.h"
#include "Pulse.h"

#include <map>

namespace Desktop {

/// The open call sessions. Each is a stream of silence with the role "phone", which the server and
/// the other programs see for as long as it plays. It outlives its stream: when the server is back,
/// the stream is opened again. Under the connection's lock.
class Calls {
 public:
  class Owner {
   public:
    /// A stream, which was open, was ended by a program or for want of a sink.
    virtual void OnCallKilled(std::uint32_t stream) = 0;

   protected:
    ~Owner() = default;
  };

  Calls(Connection& connection, Owner& owner) : connection_(connection), owner_(owner) {}

  /// \name Sessions by number, which are the caller's own
  /// Each gives a native code; -22 for a number that isn't known.
  /// @{
  int Open(Connection::Lock& lock, Connection::Time limit, int& number);
  int Close(Connection::Lock& lock, Connection::Time limit, int number);
  int SetMode(Connection::Lock& lock, Connection::Time limit, int number, int mode);
  int GetMode(int number, int& mode);
  /// @}

  /// Opens the streams of those that have none.
  void OpenStreams();

  /// Forgets the streams, whose server is gone.
  void DropStreams();

 private:
  /// Never moved: its stream's callbacks hold its address.
  struct Call {
    explicit Call(Calls& ownCalls) : calls(ownCalls) {}
    ~Call() { Drop(); }

    Call(const Call&) = delete;
    Call& operator=(const Call&) = delete;

    bool HasState(pa_stream_state_t state) const {
      return stream != nullptr && pa_stream_get_state(stream.get()) == state;
    }
    bool IsOpening() const { return HasState(PA_STREAM_CREATING); }
    bool IsOpen() const { return HasState(PA_STREAM_READY); }

    void OpenStream(pa_context* context);
    void Drop();

    Calls& calls;
    StreamPtr stream;
    bool isWanted = true;                    // by its caller; else it is on its way to its end
    std::uint32_t index = PA_INVALID_INDEX;  // the stream's, once it is open
    int mode = 0;
    int error = PA_OK;
  };

  static void OnStateChanged(pa_stream* stream, void* self);
  static void OnWanted(pa_stream* stream, std::size_t size, void* self);

  Call* Find(int number);
  int AwaitStream(Connection::Lock& lock, Connection::Time limit, int number);
  void End(int number);
  void OnFailed(Call& call);
  void Sweep();

  Connection& connection_;
  Owner& owner_;
  std::map<int, Call> calls_;
  int last_ = 0;
};

}  // namespace Desktop
