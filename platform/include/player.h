/// \file
/// Native player interface.
///
/// Every function returns 0 (`PLAYER_ERROR_NONE`) or one of the error codes below, and logs its
/// failures; where the library logs them itself (seeking, effects) only the reason, at level debug.
/// Positions and lengths are in milliseconds. A player may be used by several threads; its
/// functions run one after the other, except `player_destroy`, which must be the last.
#pragma once

#ifdef __cplusplus
extern "C" {
#else
#include <stdbool.h>
#endif

/// A player's handle.
typedef struct player_s* player_h;

enum player_error_e {
  PLAYER_ERROR_NONE = 0,
  PLAYER_ERROR_IO = -5,                    ///< The file can't be read, or the framework failed.
  PLAYER_ERROR_NO_SUCH_FILE = -2,          ///< There is no such file.
  PLAYER_ERROR_OUT_OF_MEMORY = -12,        ///< Memory could not be allocated.
  PLAYER_ERROR_INVALID_PARAMETER = -22,    ///< An argument is rejected.
  PLAYER_ERROR_INVALID_OPERATION = -38,    ///< The media can't do that.
  PLAYER_ERROR_INVALID_STATE = -26476510,  ///< No file is open (0xFE6C0022).
};

/// Creates a player. \param player receives the handle, to be given to `player_destroy`
int player_create(player_h* player);

/// Closes the file and frees the player.
int player_destroy(player_h player);

/// Opens a file, replacing the open one, and pauses on its first frame. After a failure no file is
/// open.
int player_open(player_h player, const char* path);

/// Closes the file. Succeeds when none is open.
int player_close(player_h player);

/// Starts or resumes playing; at the end, from the start again.
int player_play(player_h player);
int player_pause(player_h player);

/// \param at_end receives whether playing has come to the end of the file, and stands there
int player_is_at_end(player_h player, bool* at_end);

/// Moves to \p position, or (\p exact false) to a key frame at or before it, and returns when the
/// new position is known.
int player_seek(player_h player, long position, bool exact);

int player_get_position(player_h player, long* position);
int player_get_duration(player_h player, long* duration);

/// \param key_frame receives whether the last seek showed a key frame
int player_is_key_frame(player_h player, bool* key_frame);

/// Receives the position of a key frame. \return true to go on, false to stop
typedef bool (*player_key_frame_cb)(long position, void* user_data);

/// Tells the positions of all key frames, in ascending order, on the calling thread. Reads the
/// whole file, and takes as long as that needs; closing the player meanwhile ends it with an error.
int player_foreach_key_frame(player_h player, player_key_frame_cb callback, void* user_data);

/// Receives a picture: rows of three bytes a pixel (red, green, blue), \p stride bytes apart, valid
/// during the call.
typedef void (*player_frame_cb)(const unsigned char* pixels, int width, int height, int stride,
                                void* user_data);

/// Hands the frame at the current position to \p callback, on the calling thread.
int player_capture_frame(player_h player, player_frame_cb callback, void* user_data);

/// Writes the open file's sound, effects included, to \p path, a WAV file of 16-bit stereo samples,
/// faster than in real time, and returns when that is done. The player itself stays as it is.
int player_render_audio(player_h player, const char* path);

/// \name Sound effects
/// They belong to the player, not to a file, and stay as they are when another is opened. A level
/// outside its range and a value that isn't supported are refused with -22.
/// @{

typedef int audio_effect_e;         ///< 1 bass, 2 treble, 3 reverb, 4 stereo width, 5 dynamics
typedef int audio_effect_preset_e;  ///< 0 to 19; 1 is the neutral one

/// Called once for each value, on the calling thread. \return true to go on, false to stop
typedef bool (*player_audio_effect_supported_effect_cb)(audio_effect_e effect, void* user_data);
typedef bool (*player_audio_effect_supported_preset_cb)(audio_effect_preset_e preset,
                                                        void* user_data);

int player_audio_effect_foreach_supported_effect(player_h player,
                                                 player_audio_effect_supported_effect_cb callback,
                                                 void* user_data);
int player_audio_effect_foreach_supported_preset(player_h player,
                                                 player_audio_effect_supported_preset_cb callback,
                                                 void* user_data);

int player_audio_effect_set_value(player_h player, audio_effect_e effect, int value);
int player_audio_effect_get_value(player_h player, audio_effect_e effect, int* value);
int player_audio_effect_get_value_range(player_h player, audio_effect_e effect, int* min, int* max);

/// Puts an effect back to its default.
int player_audio_effect_clear(player_h player, audio_effect_e effect);

/// Selects a preset, which stays selected until another is.
int player_audio_effect_set_preset(player_h player, audio_effect_preset_e preset);
/// @}

#ifdef __cplusplus
}
#endif
