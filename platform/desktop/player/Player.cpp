// What native/ asks of the desktop's player.

#include "Playback.h"
#include "desktop/player/effects/Settings.h"
#include "native/PlayerError.h"

#include <sys/stat.h>
#include <unistd.h>

#include <cerrno>
#include <cstring>

using Host::PlayerFailure;

namespace {

/// Refuses what can't be media, before a pipeline waits for it.
void CheckFile(const char* path) {
  struct stat status;
  if (stat(path, &status) != 0) {
    const int reason = errno;
    const bool isMissing = reason == ENOENT || reason == ENOTDIR;
    throw PlayerFailure(isMissing ? PLAYER_ERROR_NO_SUCH_FILE : PLAYER_ERROR_IO, __LINE__,
                        "\"%s\": %s", path, std::strerror(reason));
  }
  if (!S_ISREG(status.st_mode)) {
    throw PlayerFailure(PLAYER_ERROR_INVALID_PARAMETER, __LINE__, "\"%s\" is not a plain file",
                        path);
  }
  if (access(path, R_OK) != 0) {
    throw PlayerFailure(PLAYER_ERROR_IO, __LINE__, "\"%s\": %s", path, std::strerror(errno));
  }
}

/// Of an effect or a preset.
void CheckSupport(const char* what, int number, bool exists, bool isSupported) {
  if (!exists) {
    throw PlayerFailure(PLAYER_ERROR_INVALID_PARAMETER, __LINE__, "there is no %s %d", what,
                        number);
  }
  if (!isSupported) {
    throw PlayerFailure(PLAYER_ERROR_INVALID_OPERATION, __LINE__,
                        "the %s %d needs an element of GStreamer that is missing", what, number);
  }
}

}  // namespace

namespace PlayerDevice {

void Start() {
  // Else GStreamer would set signal handlers, which belong to the program.
  gst_segtrap_set_enabled(FALSE);
  GError* reason = nullptr;
  const bool isStarted = gst_init_check(nullptr, nullptr, &reason);
  const Desktop::ErrorPtr error(reason);
  if (!isStarted) {
    throw PlayerFailure(PLAYER_ERROR_IO, __LINE__, "GStreamer can't be started: %s",
                        error == nullptr ? "no reason given" : error->message);
  }
  if (Desktop::MakeElement("playbin") == nullptr) {
    throw PlayerFailure(PLAYER_ERROR_IO, __LINE__, "GStreamer's plug-in \"playbin\" is missing");
  }
}

std::unique_ptr<File> Open(const char* path, const Native::SharedSettings& effects,
                           const std::atomic<int>& isUnwanted) {
  CheckFile(path);
  return std::make_unique<Desktop::Playback>(path, effects, isUnwanted);
}

void ListEffects(const std::function<bool(int)>& visit) {
  for (int effect = Desktop::kBass; Desktop::IsEffect(effect); ++effect) {
    if (Desktop::IsEffectSupported(effect) && !visit(effect)) break;
  }
}

void ListPresets(const std::function<bool(int)>& visit) {
  for (int preset = 0; Desktop::IsPreset(preset); ++preset) {
    if (Desktop::IsPresetSupported(preset) && !visit(preset)) break;
  }
}

Range GetRange(int effect) {
  CheckSupport("effect", effect, Desktop::IsEffect(effect), Desktop::IsEffectSupported(effect));
  const auto [min, max] = Desktop::kLevelRanges[static_cast<std::size_t>(effect - Desktop::kBass)];
  return {min, max, Desktop::kDefaultLevel};
}

void CheckPreset(int preset) {
  CheckSupport("preset", preset, Desktop::IsPreset(preset), Desktop::IsPresetSupported(preset));
}

}  // namespace PlayerDevice
