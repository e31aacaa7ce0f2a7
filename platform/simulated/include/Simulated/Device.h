/// \file
/// Steers the simulated device: for tests, examples and the command line, never for the library.
///
/// Together with the host platform's own headers: capabilities (features and privileges), calls
/// (recorded, made to fail) and log (sink, assertions). All functions may be called on any thread.
#pragma once

#include <Host/Calls.h>
#include <Host/Capabilities.h>
#include <Host/Events.h>
#include <Host/Log.h>

#include <array>
#include <vector>

/// What a test tells the simulated device.
namespace Simulated {

using Host::WaitUntilDelivered;

/// What a file holds. Any file that is opened holds the media that was set last; no real file is
/// read.
struct Media {
  long duration = 60000;         ///< length in milliseconds
  long keyFrameInterval = 2000;  ///< in milliseconds, above 0; the first key frame is at 0
  std::vector<long> keyFrames;   ///< the key frames' positions, ascending, in place of the interval
  bool hasVideo = true;
};

/// Sets what the files hold that are opened from now on.
void SetMedia(const Media& media);

/// What players can do to their sound. The levels that are set are each player's own.
struct Effects {
  struct Range {
    int min;
    int max;
    int initial;
  };

  std::vector<int> effects = {1, 2, 3, 4, 5};  ///< as the player reports them, also unknown ones
  std::vector<int> presets = {0,  1,  2,  3,  4,  5,  6,  7,  8,  9,
                              10, 11, 12, 13, 14, 15, 16, 17, 18, 19};  ///< likewise
  std::array<Range, 5> ranges = {
      {{-12, 12, 0}, {-12, 12, 0}, {0, 100, 0}, {0, 100, 0}, {0, 100, 0}}};  ///< of effects 1 to 5
  int enumerationError = 0;  ///< what an enumeration returns after it has reported its values
};

/// Sets what all players can do from now on.
void SetEffects(const Effects& effects);

/// \name Sound manager
/// At start, in the order of the sound types 0 to 5, the maxima are 11, 12, 13, 14, 15 and 10, and
/// the levels 3, 4, 5, 6, 7 and 8; nothing is muted; session type, session options and the mode of
/// a new call session are 0.
/// @{

/// The volume of \p type changes from outside: it becomes \p level, whatever the maximum, and is
/// reported, also when it was \p level before. A type that isn't known is only reported.
void ReportVolume(int type, int level);

/// All sound is muted or unmuted from outside, which is reported, also when it was before.
void ReportMuteAll(bool muteall);

/// Reports an interruption of the session; any code will do.
void Interrupt(int code);

/// Reports what follows with null in place of the program's user data, or with it again.
void ReportWithoutUserData(bool on);

/// Sets the maximum of a sound type; a level above it becomes \p max, which is reported.
/// \return false, with nothing done, for an unknown type or a negative maximum
bool SetMaxVolume(int type, int max);

/// How `sound_manager_call_session_create` goes wrong.
enum class CallSessionFault {
  kNone,
  kNoSession,      ///< it succeeds, but gives no session
  kSessionRemains  ///< it fails with -38, but gives a session, which is open
};

/// Sets how call sessions are created from now on.
void SetCallSessionFault(CallSessionFault fault);

/// \return the modes of the call sessions that are open, in the order of their creation.
std::vector<int> GetCallSessionModes();

/// @}

/// Puts the player's side back to its start: media and effects. Players keep their file and levels.
void ResetPlayer();

/// Puts the sound manager back to its start, without a report, and drops the reports that are on
/// the way. Callbacks stay set and call sessions stay open.
void ResetSoundManager();

/// Puts everything back to its start: player, sound manager, capabilities, failures, recorded calls
/// (none are recorded).
inline void Reset() {
  ResetPlayer();
  ResetSoundManager();
  Host::ResetCapabilities();
  Host::ClearFailures();
  Host::RecordCalls(false);
  Host::TakeCalls();
}

}  // namespace Simulated
