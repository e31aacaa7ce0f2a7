/// \file
#pragma once

#include <Tizen/Base/Result.h>
#include <Tizen/Base/Types.h>

namespace Tizen::Base {

/// Base of every concrete class of the platform. Its virtual table holds the destructor, `Equals`,
/// `GetHashCode` and one reserved operation, in this order: application binaries rely on it.
class Object {
 public:
  Object() = default;
  Object(const Object&) = delete;
  Object& operator=(const Object&) = delete;

  virtual ~Object();

  /// \return whether \p other is this very object.
  virtual bool Equals(const Object& other) const;

  /// \return a number that is the same for objects that are equal.
  virtual int GetHashCode() const;

 protected:
  /// Keeps the fourth slot for the platform's use.
  virtual void Object_Reserved1();
};

}  // namespace Tizen::Base
