/// \file
/// What a device gives for `player.h`: plain functions, which native/PlayerFunctions.cpp calls.
#pragma once

#include <player.h>

#include <atomic>
#include <functional>

/// Functions that give an `int` return a native code, and tell why by `Host::PlayerFailure`; all
/// but `Destroy` and `Close` may throw. Pointers and paths have been checked. Several players are
/// used at once.
namespace PlayerDevice {

/// The device's own part of a player.
struct Player;

int Create(Player*& player);
void Destroy(Player* player);

/// \name The open file
/// Called one after the other for a player; only `Open` and `Close` without a file.
/// @{

/// \param isUnwanted ends long work on the file when it becomes other than 0
int Open(Player& player, const char* path, const std::atomic<int>& isUnwanted);
void Close(Player& player);
bool IsOpen(const Player& player);

int Play(Player& player);
int Pause(Player& player);
bool IsAtEnd(const Player& player);
int Seek(Player& player, long position, bool isExact);
int GetPosition(Player& player, long& position);
int GetDuration(Player& player, long& duration);
bool IsKeyFrame(const Player& player);

/// \param visit returns whether to go on
int ListKeyFrames(Player& player, const std::function<bool(long)>& visit);
int CaptureFrame(Player& player, player_frame_cb callback, void* userData);
int RenderAudio(Player& player, const char* path);
/// @}

/// \name Sound effects
/// Called at any time, also during the operations above. Levels are in the range, effects and
/// presets aren't checked.
/// @{
struct Range {
  int min;
  int max;
  int initial;
};

int ListEffects(const std::function<bool(int)>& visit);
int ListPresets(const std::function<bool(int)>& visit);

/// Fails for an effect that isn't supported, as the three below.
int GetRange(int effect, Range& range);
int SetLevel(Player& player, int effect, int level);
int GetLevel(Player& player, int effect, int& level);
int SetPreset(Player& player, int preset);
/// @}

}  // namespace PlayerDevice
