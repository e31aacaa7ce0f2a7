#include <Tizen/Base/Object.h>
#include <Tizen/Base/String.h>

#include <cstdint>

namespace Tizen::Base {

Object::~Object() = default;

bool Object::Equals(const Object& other) const { return this == &other; }

int Object::GetHashCode() const {
  // Objects are aligned, so the lowest bits tell nothing.
  return static_cast<int>(reinterpret_cast<std::uintptr_t>(this) >> 3);
}

void Object::Object_Reserved1() {}

String::~String() = default;

}  // namespace Tizen::Base
