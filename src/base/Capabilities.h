/// \file
/// The two gates before the library's services. Neither keeps an answer: a feature or a privilege
/// that comes or goes is seen by the next call.
#pragma once

#include "Log.h"

namespace Zelkora::Media {

/// The vendor's developer host, the one part of the keys that is a device maker's to change.
#define ZELKORA_KEY_HOST L"http://developer.zelkora.example"

inline constexpr wchar_t kAudioEffectorFeature[] =
    ZELKORA_KEY_HOST L"/tizen/feature/audio_effector";
inline constexpr wchar_t kAudioManagerFeature[] = ZELKORA_KEY_HOST L"/tizen/feature/audio_manager";
inline constexpr wchar_t kVideoKeyFrameSeekerFeature[] =
    ZELKORA_KEY_HOST L"/tizen/feature/zelkora_extension_2.2";

inline constexpr wchar_t kAudioSessionPrivilege[] =
    ZELKORA_KEY_HOST L"/tizen/privilege/audiomanager.session";
inline constexpr wchar_t kVoipAudioSessionPrivilege[] =
    ZELKORA_KEY_HOST L"/tizen/privilege/audiomanager.voipsession";
inline constexpr wchar_t kAudioVolumePrivilege[] =
    ZELKORA_KEY_HOST L"/tizen/privilege/audiomanager.volume";

#undef ZELKORA_KEY_HOST

/// Feature gate: asks the platform whether the device offers a feature.
/// \param caller the guarded operation's signature
/// \return `E_SUCCESS`, or the refusal, then logged and the last result: `E_UNSUPPORTED_OPERATION`
/// when the feature is absent or unknown, else the lookup's own failure
result CheckFeature(const wchar_t* key, Signature caller);

/// \return whether the application holds a privilege.
bool HasPrivilege(const wchar_t* key);

/// Reports that it doesn't. \return `E_PRIVILEGE_DENIED`
result FailPrivilege(int line);

/// Privilege gate: asks the platform whether the application holds a privilege.
/// \return `E_SUCCESS`, or `E_PRIVILEGE_DENIED`, then logged and the last result, whatever the
/// platform answered
inline result CheckPrivilege(Key privilege) {
  return HasPrivilege(privilege.text) ? E_SUCCESS : FailPrivilege(privilege.line);
}

}  // namespace Zelkora::Media
