/// \file
#pragma once

namespace Desktop {

/// A deleter that calls a C library's own function.
template <auto Free>
struct FreeWith {
  template <typename T>
  void operator()(T* thing) const {
    Free(thing);
  }
};

}  // namespace Desktop
