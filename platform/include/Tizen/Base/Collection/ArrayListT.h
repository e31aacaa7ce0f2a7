/// \file
#pragma once

#include <Tizen/Base/Collection/IListT.h>
#include <Tizen/Base/Log.h>
#include <Tizen/Base/Object.h>

#include <new>
#include <vector>

namespace Tizen::Base::Collection {

/// A list in one piece of memory, which grows as values are added.
template <typename T>
class ArrayListT : public IListT<T>, public Tizen::Base::Object {
 public:
  ArrayListT() = default;

  result Add(const T& value) override {
    try {
      __values.push_back(value);
      return E_SUCCESS;
    } catch (const std::bad_alloc&) {
      AppLogExceptionInternal(__PRETTY_FUNCTION__, __LINE__,
                              "[E_OUT_OF_MEMORY] Memory allocation failed.");
      return E_OUT_OF_MEMORY;
    }
  }

  result GetAt(int index, T& value) const override {
    if (index < 0 || index >= GetCount()) return E_INVALID_ARG;
    value = __values[static_cast<std::size_t>(index)];
    return E_SUCCESS;
  }

  int GetCount() const override { return static_cast<int>(__values.size()); }

  void RemoveAll() override { __values.clear(); }

 private:
  std::vector<T> __values;
};

}  // namespace Tizen::Base::Collection
