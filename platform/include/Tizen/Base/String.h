/// \file
#pragma once

#include <Tizen/Base/Object.h>

namespace Tizen::Base {

/// A text of UTF-32 characters.
class String : public Object {
 public:
  /// \param text a wide literal, or another text that outlives the string: the host platform's
  /// string refers to it and doesn't copy.
  explicit String(const wchar_t* text) noexcept : __pText(text) {}
  ~String() override;

  /// \return the text, ended by a zero, valid as long as the literal.
  const wchar_t* GetPointer() const noexcept { return __pText; }

 private:
  const wchar_t* __pText;
};

}  // namespace Tizen::Base
