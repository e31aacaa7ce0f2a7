#pragma once

#include "Categories.h"
#include "Names.h"

#include <Zelkora/Media/AudioSessionManager.h>
#include <Zelkora/Media/AudioVolumeManager.h>
#include <Zelkora/Media/VoipAudioSessionManager.h>

/// The library's managers, and the words for what they deal with.
namespace CommandLine {

// Each returns the manager or throws a `Failure`.
Zelkora::Media::AudioVolumeManager& VolumeManager();
Zelkora::Media::AudioSessionManager& SessionManager();
Zelkora::Media::VoipAudioSessionManager& CallManager();

inline constexpr Named<Zelkora::Media::AudioSessionMode> kSessionModes[] = {
    {"media", Zelkora::Media::AUDIO_SESSION_MODE_MEDIA},
    {"media-mix", Zelkora::Media::AUDIO_SESSION_MODE_MEDIA_MIX},
    {"emergency", Zelkora::Media::AUDIO_SESSION_MODE_EMERGENCY},
    {"notification", Zelkora::Media::AUDIO_SESSION_MODE_NOTIFICATION},
    {"alarm", Zelkora::Media::AUDIO_SESSION_MODE_ALARM},
};

inline constexpr Named<Zelkora::Media::VoipAudioSessionMode> kCallModes[] = {
    {"voice", Zelkora::Media::VOIP_AUDIO_SESSION_MODE_VOICE},
    {"ringtone", Zelkora::Media::VOIP_AUDIO_SESSION_MODE_RINGTONE},
    {"media", Zelkora::Media::VOIP_AUDIO_SESSION_MODE_MEDIA},
};

inline constexpr Named<bool> kSwitch[] = {{"on", true}, {"off", false}};

/// Sets the session's mode by its name, or throws a `Failure`.
void SetSessionMode(const std::string& name);

}  // namespace CommandLine
