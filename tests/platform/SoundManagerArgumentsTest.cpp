// What any device's sound manager refuses.

#include "support/World.h"

#include <sound_manager.h>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

namespace {

TEST(SoundManager, RefusesWrongArgumentsChangingNothing) {
  static int value;
  static sound_call_session_h session, destroyed;
  const std::pair<const char*, int (*)()> rows[] = {
      {"maximum of no type", [] { return sound_manager_get_max_volume(-1, &value); }},
      {"no session type", [] { return sound_manager_set_session_type(4); }},
      {"no call", [] { return sound_manager_call_session_create(0, &session); }},
      {"no call mode", [] { return sound_manager_call_session_set_mode(session, 3); }},
      {"mode after the end", [] { return sound_manager_call_session_set_mode(destroyed, 1); }},
      {"read after the end", [] { return sound_manager_call_session_get_mode(destroyed, &value); }},
      {"maximum to null", [] { return sound_manager_get_max_volume(0, nullptr); }},
      {"level to null", [] { return sound_manager_get_volume(0, nullptr); }},
      {"mute-all to null", [] { return sound_manager_get_muteall(nullptr); }},
      {"option to null", [] { return sound_manager_get_media_session_option(&value, nullptr); }},
      {"call to null", [] { return sound_manager_call_session_create(1, nullptr); }},
      {"mode to null", [] { return sound_manager_call_session_get_mode(session, nullptr); }},
      {"no callback", [] { return sound_manager_set_volume_changed_cb(nullptr, &value); }},
  };
  World::Reset();
  EXPECT_EQ(sound_manager_call_session_create(1, &destroyed), 0);
  EXPECT_EQ(sound_manager_call_session_create(1, &session), 0);
  EXPECT_EQ(sound_manager_call_session_destroy(destroyed), 0);
  for (const auto& [name, call] : rows) {
    value = 77;
    EXPECT_EQ(call(), SOUND_MANAGER_ERROR_INVALID_PARAMETER) << name;
    EXPECT_EQ(value, 77) << name;
  }
  EXPECT_THAT(World::GetCallModes(), testing::ElementsAre(0));
  EXPECT_EQ(sound_manager_call_session_destroy(session), 0);
}

}  // namespace
