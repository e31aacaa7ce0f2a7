/// \file
/// Calls of the native C interfaces.
///
/// The library counts in `int`. A device's headers may declare a sound type or a mode as an
/// enumeration and a volume as `unsigned int`: a call takes the types from the function.
#pragma once

#include <type_traits>

namespace Zelkora::Media {

/// An argument in the type that the function declares.
template <typename Declared, typename Given>
struct NativeArgument {
  explicit NativeArgument(Given given) : value(static_cast<Declared>(given)) {}

  Declared value;
};

/// An `int` that the function writes as a \p Number: through a local that begins with the caller's
/// value and is copied back, whatever the function returns.
template <typename Number>
struct NativeNumber {
  explicit NativeNumber(int* given) : caller(given), local(static_cast<Number>(*given)) {}
  ~NativeNumber() { *caller = static_cast<int>(local); }
  NativeNumber(const NativeNumber&) = delete;
  NativeNumber& operator=(const NativeNumber&) = delete;

  int* caller;
  Number local;
  Number* value = &local;
};

template <typename Number>
struct NativeArgument<Number*, int*> : NativeNumber<Number> {
  using NativeNumber<Number>::NativeNumber;
};

template <>
struct NativeArgument<int*, int*> {
  int* value;  // the caller's own
};

/// Calls \p function with \p arguments.
/// \return the function's code
template <typename... Declared, typename... Given>
inline int CallNative(int (*function)(Declared...), Given... arguments) {
  return function(NativeArgument<Declared, Given>{arguments}.value...);
}

}  // namespace Zelkora::Media
