/// \file
/// What a device gives for `sound_manager.h`: plain functions, which native/SoundManager.cpp calls.
#pragma once

#include "Reports.h"

/// All of it is called on any thread, by several at once. Functions that give an `int` return a
/// native code; all may throw `std::bad_alloc` or `std::system_error`. Arguments have been checked:
/// types are 0 to 5, levels 0 to the maximum, modes 0 to 2.
///
/// A device reports each change through Reports.h, its own ones too, in the order of the changes.
namespace SoundDevice {

int GetMaxLevel(int type, int& max);
int SetLevel(int type, int level);
int GetLevel(int type, int& level);

int SetMuteAll(bool isMuted);
int GetMuteAll(bool& isMuted);

/// The session has changed; `Native::GetSession` tells what it is now.
void OnSessionChanged();

/// The program has set a callback for reports of a kind. The device calls `Native::BeginReports`
/// once it knows how things are: what had changed before isn't told.
void OnListening(Native::Kind kind);

/// Returns when what has happened outside before has been reported, in bounded time.
void AwaitReports();

/// \param number receives the call's number, which is above 0 and never used again; untouched
/// without a call
int OpenCall(int& number);
int CloseCall(int number);
int SetCallMode(int number, int mode);
int GetCallMode(int number, int& mode);

}  // namespace SoundDevice
