/// \file
#pragma once

#include "Batch.h"
#include "CallSession.h"
#include "Connection.h"
#include "Interruptions.h"
#include "Output.h"
#include "PulseLoop.h"
#include "Questions.h"
#include "Reports.h"
#include "Streams.h"
#include "Volumes.h"

#include <sys/types.h>

#include <map>
#include <mutex>

namespace Desktop {

/// The desktop's sound manager: a picture of the sound server that the server's own events keep up to
/// date, and the changes that callers ask for. Changes are told to the program from the picture, and
/// so is what it asks for, unless something that the server has sent hasn't been read yet.
///
/// All operations return a native code; callers never wait longer than a second for it. They may
/// throw when memory is short.
class Device final : private Connection::Owner, private CallSession::Owner {
 public:
  /// The one device, made by the first call; throws when memory or threads are short. Never destroyed.
  static Device& Get();

  int SetLevel(Category category, int level);
  int GetLevel(Category category, int& level);
  int SetMuteAll(bool isMuted);
  int GetMuteAll(bool& isMuted);

  /// Succeeds without a server, which may come later.
  void SetCallback(Host::Kind kind, Reports::Callback callback);
  void UnsetCallback(Host::Kind kind) { reports_.Unset(kind); }

  /// Waits until what the server has sent has been told to the program.
  void AwaitReports();

  int OpenCall(int& number);
  int CloseCall(int number);
  int SetCallMode(int number, int mode);
  int GetCallMode(int number, int& mode);

 private:
  using Lock = std::unique_lock<std::mutex>;
  using Time = std::chrono::steady_clock::time_point;

  Device();

  friend struct AtExit;
  void Stop();

  static Time GetLimit();

  /// Waits until \p condition holds and the picture is complete. \return a native code
  template <typename Condition>
  int AwaitPicture(Lock& lock, Time limit, Condition condition);

  /// Waits until there is a picture, as the server told it last. \return a native code
  int AwaitPicture(Lock& lock, Time limit);

  /// Waits until all that the server has sent is in the picture, but for what is hardly news and is
  /// read within milliseconds. \return a native code
  int Refresh(Lock& lock, Time limit);

  /// Waits for the answers to a batch. \return a native code
  int Await(Lock& lock, Time limit, const Batch& batch);

  /// Waits until a call session's stream, opened if need be, is open. \return a native code
  int AwaitOpenCall(Lock& lock, Time limit, int number);
  CallSession* FindCall(int number);

  void OnConnected(pa_context* context) override;
  void OnDisconnected(bool isLost) override;
  void OnCallChanged() override { loop_.NotifyProgress(); }
  void OnCallKilled() override { reports_.ReportInterruption(kTakenOver); }

  void OnAnswered();
  void OpenCalls();

  void AskForOutput();
  void AskForStream(std::uint32_t index);
  void AskForVolumes();
  void AskForVolumesSoon();
  void AskLater();
  void AskForChangesOfVolumes();

  /// \name Events of the server
  /// @{
  static void OnEvent(pa_context* context, pa_subscription_event_type_t event, std::uint32_t index,
                      void* self);
  static void OnStoredVolumesChanged(pa_context* context, void* self);
  void OnSinkEvent(int type, std::uint32_t index);
  void OnStreamEvent(int type, std::uint32_t index);
  void OnStreamRemoved(std::uint32_t index);
  /// @}

  /// \name The server's answers
  /// @{
  static void OnServer(pa_context* context, const pa_server_info* info, void* self);
  static void OnOutput(pa_context* context, const pa_sink_info* info, int end, void* self);
  static void OnStream(pa_context* context, const pa_sink_input_info* info, int end, void* self);
  static void OnVolume(pa_context* context, const pa_ext_stream_restore_info* info, int end,
                       void* self);
  void PutStream(const pa_sink_input_info& info);
  /// @}

  PulseLoop loop_;
  Reports reports_;
  Connection connection_{loop_, *this};
  Questions questions_;
  bool isComplete_ = false;  // all of the server has been seen since it was connected
  bool isPipeWire_ = false;
  Streams streams_;
  Volumes volumes_{reports_, streams_};
  bool areVolumesDue_ = false;
  Timer later_{loop_, [this] { AskLater(); }};
  int ownWrites_ = 0;  // of stored volumes, whose events haven't come yet
  Output output_{reports_, streams_};
  Interruptions interruptions_{reports_, streams_};
  std::map<int, CallSession> calls_;
  int lastCall_ = 0;
  const pid_t process_;
};

}  // namespace Desktop
