/// \file
/// Native sound-manager interface.
///
/// Every function returns 0 or a negative error code: -12 for want of memory, -22 for a rejected
/// argument, -38 for what doesn't fit the state, any other for a failure of the device. A failure
/// changes nothing. All may be called on any thread.
///
/// Callbacks come on a thread of the device's own, one after the other. Setting a level or mute-all
/// to something else is reported like a change from outside, once; setting the same value again is
/// not. An unset function returns only when no callback is running, unless it is called from inside
/// one; it succeeds when nothing is set. Setting a callback replaces the one before.
#pragma once

#ifdef __cplusplus
extern "C" {
#else
#include <stdbool.h>
#endif

enum sound_manager_error_e {
  SOUND_MANAGER_ERROR_NONE = 0,
  SOUND_MANAGER_ERROR_OUT_OF_MEMORY = -12,
  SOUND_MANAGER_ERROR_INVALID_PARAMETER = -22,
  SOUND_MANAGER_ERROR_INVALID_OPERATION = -38,
  SOUND_MANAGER_ERROR_NO_CONNECTION = -111,  ///< The device's sound server can't be reached.
};

/// \name Volumes
/// Sound types: 0 system, 1 notification, 2 alarm, 3 ringtone, 4 media, 5 call. Levels go from 0 to
/// the type's maximum; another level or type is refused with -22.
/// @{
int sound_manager_get_max_volume(int type, int* max);
int sound_manager_set_volume(int type, int volume);
int sound_manager_get_volume(int type, int* volume);

/// Mutes or unmutes all sound; levels stay as they are.
int sound_manager_set_muteall(bool muteall);
int sound_manager_get_muteall(bool* muteall);

typedef void (*sound_manager_volume_changed_cb)(int type, int volume, void* user_data);
int sound_manager_set_volume_changed_cb(sound_manager_volume_changed_cb callback, void* user_data);
int sound_manager_unset_volume_changed_cb(void);

typedef void (*sound_manager_muteall_changed_cb)(bool muteall, void* user_data);
int sound_manager_set_muteall_changed_cb(sound_manager_muteall_changed_cb callback,
                                         void* user_data);
int sound_manager_unset_muteall_changed_cb(void);
/// @}

/// \name Session
/// Session types: 0 (the default), 1, 2 and 3; another is refused with -22.
/// @{
int sound_manager_set_session_type(int type);
int sound_manager_get_session_type(int* type);
int sound_manager_set_media_session_option(int first, int second);
int sound_manager_get_media_session_option(int* first, int* second);

/// \p code: 0 the interruption is over; 1 to 4 the session was disrupted; 5 and 6 an interruption
/// begins.
typedef void (*sound_manager_session_interrupted_cb)(int code, void* user_data);
int sound_manager_set_session_interrupted_cb(sound_manager_session_interrupted_cb callback,
                                             void* user_data);
int sound_manager_unset_session_interrupted_cb(void);
/// @}

/// \name Call sessions
/// Modes: 0, 1 and 2; another is refused with -22.
/// @{
typedef struct sound_call_session_s* sound_call_session_h;

/// \param type 1, a voice-over-IP call; another is refused with -22
/// \param session receives the session, to be given to `sound_manager_call_session_destroy`
int sound_manager_call_session_create(int type, sound_call_session_h* session);
int sound_manager_call_session_destroy(sound_call_session_h session);
int sound_manager_call_session_set_mode(sound_call_session_h session, int mode);
int sound_manager_call_session_get_mode(sound_call_session_h session, int* mode);
/// @}

#ifdef __cplusplus
}
#endif
