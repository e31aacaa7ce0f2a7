/// \file
#pragma once

#include <Tizen/Base/String.h>

namespace Tizen::Security {

/// What the calling application may do.
class AccessController {
 public:
  AccessController() = delete;

  /// Asks whether the application holds a privilege. May be called on any thread.
  /// \param privilege the privilege's full key, a URI
  /// \return `E_SUCCESS` when it does, any other code when it doesn't or can't be told. The last
  /// result isn't touched.
  static result CheckPrivilege(const Tizen::Base::String& privilege);
};

}  // namespace Tizen::Security
