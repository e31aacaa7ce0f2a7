/// \file
/// Assertions against use before construction and against a second construction.
///
/// Each reports a condition that doesn't hold and gives whether it holds. The platform decides
/// whether its back-end returns; where it does, the operation must end at once:
///
///     if (!APP_ASSERT(__pImpl != null, kAppNotYetConstructed)) return E_INVALID_STATE;
///
/// A macro, because the report holds the condition's text and the function's signature.
#pragma once

#include <Tizen/Base/Log.h>

namespace Zelkora::Media {

inline constexpr char kAlreadyConstructed[] =
    "Already constructed. Calling Construct() twice or more on a same instance is not allowed for "
    "this class.";

/// The two families word this one differently.
inline constexpr char kAppNotYetConstructed[] =
    "Not yet constructed! Construct() should be called before use";
inline constexpr char kSysNotYetConstructed[] =
    "Not yet constructed. Construct() should be called before use.";

}  // namespace Zelkora::Media

#define APP_ASSERT(condition, message) \
  ((condition) || (AppassertfInternal(#condition, __PRETTY_FUNCTION__, __LINE__, message), false))
