/// \file
#pragma once

#include <Tizen/Base/String.h>

namespace Tizen::System {

/// What the device offers.
class SystemInfo {
 public:
  SystemInfo() = delete;

  /// Looks a boolean system value up. May be called on any thread.
  /// \param key the value's full key, a URI
  /// \param value receives the value; untouched on failure
  /// \return `E_SUCCESS`; `E_OBJ_NOT_FOUND` when the key isn't known; another code when the lookup
  /// itself fails. The last result isn't touched.
  static result GetValue(const Tizen::Base::String& key, bool& value);
};

}  // namespace Tizen::System
