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

/// \return the privilege that a manager needs
template <typename Manager>
std::string Privilege() {
  if (std::is_same_v<Manager, Session>) return "audiomanager.session";
  return std::is_same_v<Manager, Call> ? "audiomanager.voipsession" : "audiomanager.volume";
}

using Managers = testing::Types<Session, Call, Volume>;

/// The records of the gates' questions.
template <typename Manager>
std::string PrivilegeQuery() {
  return "AccessController::CheckPrivilege(http://developer.zelkora.example/tizen/privilege/" +
         Privilege<Manager>() + ")";
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
