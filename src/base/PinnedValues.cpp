// Values that programs were built with, and so may never change: the compiler names the one that
// does.

#include <Tizen/Base/Result.h>
#include <Zelkora/Media/AudioEffector.h>
#include <Zelkora/Media/AudioSessionManager.h>
#include <Zelkora/Media/AudioVolumeManager.h>
#include <Zelkora/Media/VoipAudioSessionManager.h>

namespace Zelkora::Media {

static_assert(E_SUCCESS == 0x00000000);
static_assert(E_INVALID_ARG == 0xA0000775);
static_assert(E_INVALID_OPERATION == 0xA0000780);
static_assert(E_INVALID_STATE == 0xA0000786);
static_assert(E_OBJ_NOT_FOUND == 0xA00009C5);
static_assert(E_OUT_OF_MEMORY == 0xA00009CA);
static_assert(E_PRIVILEGE_DENIED == 0xA0000A2A);
static_assert(E_SYSTEM == 0xA0000B62);
static_assert(E_UNSUPPORTED_OPERATION == 0xA0000C23);

static_assert(sizeof(AudioEffectType) == sizeof(int));
static_assert(AUDIO_EFFECT_BASS == 1);
static_assert(AUDIO_EFFECT_TREBLE == 2);
static_assert(AUDIO_EFFECT_REVERB == 3);
static_assert(AUDIO_EFFECT_STEREO_WIDTH == 4);
static_assert(AUDIO_EFFECT_DYNAMICS == 5);

static_assert(sizeof(AudioEffectPreset) == sizeof(int));
static_assert(AUDIO_EFFECT_PRESET_NORMAL == 0);
static_assert(AUDIO_EFFECT_PRESET_POP == 1);
static_assert(AUDIO_EFFECT_PRESET_ROCK == 2);
static_assert(AUDIO_EFFECT_PRESET_DANCE == 3);
static_assert(AUDIO_EFFECT_PRESET_JAZZ == 4);
static_assert(AUDIO_EFFECT_PRESET_CLASSICAL == 5);
static_assert(AUDIO_EFFECT_PRESET_VOCAL == 6);
static_assert(AUDIO_EFFECT_PRESET_BASS_BOOST == 7);
static_assert(AUDIO_EFFECT_PRESET_TREBLE_BOOST == 8);
static_assert(AUDIO_EFFECT_PRESET_ACOUSTIC == 9);
static_assert(AUDIO_EFFECT_PRESET_ELECTRONIC == 10);
static_assert(AUDIO_EFFECT_PRESET_HIP_HOP == 11);
static_assert(AUDIO_EFFECT_PRESET_LATIN == 12);
static_assert(AUDIO_EFFECT_PRESET_METAL == 13);
static_assert(AUDIO_EFFECT_PRESET_COUNTRY == 14);
static_assert(AUDIO_EFFECT_PRESET_RHYTHM_AND_BLUES == 15);
static_assert(AUDIO_EFFECT_PRESET_CONCERT_HALL == 16);
static_assert(AUDIO_EFFECT_PRESET_SPEECH == 17);
static_assert(AUDIO_EFFECT_PRESET_LOUDNESS == 18);
static_assert(AUDIO_EFFECT_PRESET_SMALL_SPEAKERS == 19);

static_assert(sizeof(AudioSessionMode) == sizeof(int));
static_assert(AUDIO_SESSION_MODE_MEDIA == 0);
static_assert(AUDIO_SESSION_MODE_MEDIA_MIX == 1);
static_assert(AUDIO_SESSION_MODE_EMERGENCY == 2);
static_assert(AUDIO_SESSION_MODE_NOTIFICATION == 3);
static_assert(AUDIO_SESSION_MODE_ALARM == 4);

static_assert(sizeof(AudioMuteStatus) == sizeof(int));
static_assert(AUDIO_MUTE_STATUS_MUTED == 1);
static_assert(AUDIO_MUTE_STATUS_UNMUTED == 2);

static_assert(sizeof(VoipAudioSessionMode) == sizeof(int));
static_assert(VOIP_AUDIO_SESSION_MODE_NONE == 0);
static_assert(VOIP_AUDIO_SESSION_MODE_VOICE == 1);
static_assert(VOIP_AUDIO_SESSION_MODE_RINGTONE == 2);
static_assert(VOIP_AUDIO_SESSION_MODE_MEDIA == 3);

}  // namespace Zelkora::Media
