/// \file
/// This process's audio session, as its players need it.
#pragma once

namespace Desktop {

/// A property that every player's stream carries, with any value: by it the sound manager tells a
/// player's stream that was taken away from one that its owner closed.
inline constexpr char kPlayerProperty[] = "zelkora.player";

/// \return the media role of the player streams that this process makes from now on, valid for ever: "music" or
/// "game" (plays along with others' media), "alarm", "notification"
const char* GetPlayerRole();

}  // namespace Desktop
