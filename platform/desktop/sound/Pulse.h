/// \file
/// Owners for what libpulse hands out, and its error codes in the native interface's terms.
#pragma once

#include "desktop/FreeWith.h"

#include <pulse/ext-stream-restore.h>
#include <pulse/pulseaudio.h>
#include <sound_manager.h>

#include <memory>

namespace Desktop {

using ContextPtr = std::unique_ptr<pa_context, FreeWith<pa_context_unref>>;
using StreamPtr = std::unique_ptr<pa_stream, FreeWith<pa_stream_unref>>;
using OperationPtr = std::unique_ptr<pa_operation, FreeWith<pa_operation_unref>>;
using PropertiesPtr = std::unique_ptr<pa_proplist, FreeWith<pa_proplist_free>>;

/// Codes that the native interface has no name for.
inline constexpr int kFailed = -5;
inline constexpr int kAccessRefused = -13;
inline constexpr int kTimedOut = -110;

/// \return the native code for an error of libpulse
inline int ToErrorCode(int error) {
  switch (error) {
    case PA_OK: return SOUND_MANAGER_ERROR_NONE;
    case PA_ERR_ACCESS:
    case PA_ERR_AUTHKEY: return kAccessRefused;
    case PA_ERR_TIMEOUT: return kTimedOut;
    case PA_ERR_CONNECTIONREFUSED:
    case PA_ERR_CONNECTIONTERMINATED:
    case PA_ERR_INVALIDSERVER: return SOUND_MANAGER_ERROR_NO_CONNECTION;
    case PA_ERR_BADSTATE:
    case PA_ERR_NOENTITY:
    case PA_ERR_NOEXTENSION:
    case PA_ERR_NOTSUPPORTED:
    case PA_ERR_NOTIMPLEMENTED: return SOUND_MANAGER_ERROR_INVALID_OPERATION;
    default: return kFailed;
  }
}

}  // namespace Desktop
