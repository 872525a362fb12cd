#pragma once

#include <cstdint>
#include <memory>
#include <string>
#include <string_view>
#include <type_traits>
#include <typeinfo>

namespace nimbo {

class Object;

/// A shared, immutable object; null stands for absence.
using ObjectRef = std::shared_ptr<const Object>;

/// Root of the widget's object classes. Objects are held by shared pointers and never copied in place.
class Object : public std::enable_shared_from_this<Object> {
 public:
  Object() = default;
  Object(const Object&) = delete;
  Object& operator=(const Object&) = delete;
  virtual ~Object() = default;

  /// Name under which the class is logged, archived and used as a reuse identifier.
  virtual std::string_view className() const = 0;

  /// Value equality. Null equals nothing. The default is identity.
  virtual bool isEqual(const Object* other) const { return this == other; }

  /// Equal objects have equal hashes. The default is made from the address.
  virtual std::uint64_t hash() const;

  /// One line for logs. The default is "<ClassName: 0xADDRESS>".
  virtual std::string description() const;

  /// Whether `performOperation` knows an operation of this name that takes no arguments.
  virtual bool respondsToOperation(std::string_view name) const;

  /// Performs a named operation; does nothing for a name that `respondsToOperation` refuses.
  virtual void performOperation(std::string_view name);

 protected:
  /// "0x" and the object's address in lower-case hexadecimal.
  std::string addressText() const;
};

/// Both absent, or both present and equal by the first one's `isEqual`; for shared pointers to objects of any class.
inline constexpr auto absentOrEqual = [](const auto& a, const auto& b) -> bool {
  return a == b || (a && b && a->isEqual(b.get()));
};

/// The object as one of this class, null for any other: what `dynamic_cast` answers for a class that has none below it.
/// Walks no class tree (docs/performance.md).
template <class Class>
const Class* instanceOf(const Object* object) {
  static_assert(std::is_final_v<Class>);
  return object && typeid(*object) == typeid(Class) ? static_cast<const Class*>(object) : nullptr;
}

/// Hash of a member: 0 when absent.
inline std::uint64_t hashOf(const ObjectRef& object) { return object ? object->hash() : 0; }

/// Description of a member: "(null)" when absent.
std::string descriptionOf(const ObjectRef& object);

}  // namespace nimbo
