/// \file
#pragma once

#include <Tizen/Base/Types.h>

namespace Tizen::Base::Collection {

/// A list of values.
template <typename T>
class IListT {
 public:
  virtual ~IListT() = default;

  /// Appends a copy of \p value. \return `E_SUCCESS` or `E_OUT_OF_MEMORY`
  virtual result Add(const T& value) = 0;

  /// \param index from 0 to `GetCount()` - 1
  /// \param value receives a copy; untouched on failure
  /// \return `E_SUCCESS`, or `E_INVALID_ARG` for another index
  virtual result GetAt(int index, T& value) const = 0;

  virtual int GetCount() const = 0;

  virtual void RemoveAll() = 0;
};

}  // namespace Tizen::Base::Collection
