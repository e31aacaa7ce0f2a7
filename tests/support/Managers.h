/// \file
/// The three managers, and what tells them apart.
#pragma once

#include "LibraryTest.h"
#include "base/Categories.h"

#include <Zelkora/Media/AudioSessionManager.h>
#include <Zelkora/Media/AudioVolumeManager.h>
#include <Zelkora/Media/IAudioSessionEventListener.h>
#include <Zelkora/Media/IAudioVolumeEventListener.h>
#include <Zelkora/Media/VoipAudioSessionManager.h>

#include <functional>

namespace Zelkora::Media {

using Session = AudioSessionManager;
using Call = VoipAudioSessionManager;
using Volume = AudioVolumeManager;

using ::CommandLine::Category, ::CommandLine::kCategories;

/// What a manager is known by, and a use of it that needs nothing.
template <typename Manager>
struct Facts;

template <>
struct Facts<Session> {
  static constexpr char kPrivilege[] = "audiomanager.session";
  static void Use(Session& manager) { manager.GetMode(); }
};

template <>
struct Facts<Call> {
  static constexpr char kPrivilege[] = "audiomanager.voipsession";
  static void Use(Call& manager) { manager.GetCallSessionMode(); }
};

template <>
struct Facts<Volume> {
  static constexpr char kPrivilege[] = "audiomanager.volume";
  static void Use(Volume& manager) { manager.GetMuteStatus(); }
};

using Managers = testing::Types<Session, Call, Volume>;

/// The records of the gates' questions.
template <typename Manager>
std::string PrivilegeQuery() {
  return "AccessController::CheckPrivilege(http://developer.zelkora.example/tizen/privilege/" +
         std::string(Facts<Manager>::kPrivilege) + ")";
}
inline constexpr char kFeatureQuery[] =
    "SystemInfo::GetValue(http://developer.zelkora.example/tizen/feature/audio_manager)";

/// A test of a manager that exists.
template <typename Manager>
class ManagerTest : public LibraryTest {
 protected:
  ManagerTest() { Forget(); }

  Manager& manager = *Manager::GetInstance();
};

}  // namespace Zelkora::Media
