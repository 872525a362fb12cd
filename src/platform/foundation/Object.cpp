#include "platform/foundation/Object.h"

#include <cstdio>

namespace nimbo {

std::uint64_t Object::hash() const {
  // Objects are at least 16-byte aligned: the low bits carry nothing.
  return reinterpret_cast<std::uintptr_t>(this) >> 4;
}

std::string Object::addressText() const {
  char text[2 + 2 * sizeof(void*) + 1];
  std::snprintf(text, sizeof text, "0x%zx", reinterpret_cast<std::uintptr_t>(this));
  return text;
}

std::string Object::description() const { return "<" + std::string(className()) + ": " + addressText() + ">"; }

bool Object::respondsToOperation(std::string_view) const { return false; }

void Object::performOperation(std::string_view) {}

std::string descriptionOf(const ObjectRef& object) { return object ? object->description() : "(null)"; }

}  // namespace nimbo
