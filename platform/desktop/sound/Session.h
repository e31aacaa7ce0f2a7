/// \file
/// This process's audio session, as its players need it.
#pragma once

namespace Desktop {

/// A property that every player's stream carries, with any value: by it the sound manager tells a
/// player's stream that was taken away from one that its owner closed.
inline constexpr char kPlayerProperty[] = "zelkora.player";

/// For any thread. \return the media role of this process's player streams as the session is now,
/// valid for ever: "music" or "game" (plays along with others' media), "alarm", "notification"
const char* GetPlayerRole();

/// To be called when a player itself ends its stream, to replace it.
void NoteStreamReplaced();

/// \return whether a player of this process has replaced its stream in the last second
bool WasStreamJustReplaced();

}  // namespace Desktop
