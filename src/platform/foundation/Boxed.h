#pragma once

#include <cstdint>
#include <map>
#include <optional>
#include <string>
#include <string_view>
#include <variant>
#include <vector>

#include "platform/foundation/Date.h"
#include "platform/foundation/Object.h"

namespace nimbo {

/// A byte buffer.
using Bytes = std::vector<std::uint8_t>;

// Plain values as objects: what user infos, archives and dictionary representations are made of.

class BoxedString final : public Object {
 public:
  explicit BoxedString(std::string value) : _value(std::move(value)) {}
  const std::string& value() const { return _value; }

  std::string_view className() const override { return "String"; }
  bool isEqual(const Object* other) const override;
  std::uint64_t hash() const override;
  std::string description() const override { return _value; }

 private:
  std::string _value;
};

/// A boolean or a number. Numbers of different kinds are equal when their values are; a boolean equals only booleans.
class BoxedNumber final : public Object {
 public:
  using Value = std::variant<bool, std::int64_t, std::uint64_t, double>;
  explicit BoxedNumber(Value value) : _value(value) {}
  const Value& value() const { return _value; }

  std::string_view className() const override { return "Number"; }
  bool isEqual(const Object* other) const override;
  std::uint64_t hash() const override;
  std::string description() const override;

 private:
  Value _value;
};

class BoxedData final : public Object {
 public:
  explicit BoxedData(Bytes value) : _value(std::move(value)) {}
  const Bytes& value() const { return _value; }

  std::string_view className() const override { return "Data"; }
  bool isEqual(const Object* other) const override;
  std::uint64_t hash() const override;
  /// "{length = 12, bytes = 0x...}", the bytes cut after the first 16.
  std::string description() const override;

 private:
  Bytes _value;
};

class BoxedDate final : public Object {
 public:
  explicit BoxedDate(Date value) : _value(value) {}
  Date value() const { return _value; }

  std::string_view className() const override { return "Date"; }
  bool isEqual(const Object* other) const override;
  std::uint64_t hash() const override;
  std::string description() const override { return isoTextOfDate(_value); }

 private:
  Date _value;
};

/// An ordered list of objects, none of them null. Equal when equal element by element; hashes to its count.
class BoxedArray final : public Object {
 public:
  explicit BoxedArray(std::vector<ObjectRef> elements) : _elements(std::move(elements)) {}
  const std::vector<ObjectRef>& elements() const { return _elements; }

  /// An array object over the elements of a typed array.
  template <class T>
  static std::shared_ptr<const BoxedArray> of(const std::vector<std::shared_ptr<const T>>& elements) {
    return std::make_shared<const BoxedArray>(std::vector<ObjectRef>(elements.begin(), elements.end()));
  }

  /// The elements that are of class T, in order; others are left out.
  template <class T>
  std::vector<std::shared_ptr<const T>> elementsOfClass() const {
    std::vector<std::shared_ptr<const T>> result;
    result.reserve(_elements.size());
    for (const ObjectRef& element : _elements)
      if (auto typed = std::dynamic_pointer_cast<const T>(element)) result.push_back(std::move(typed));
    return result;
  }

  std::string_view className() const override { return "Array"; }
  bool isEqual(const Object* other) const override;
  std::uint64_t hash() const override { return _elements.size(); }
  std::string description() const override;

 private:
  std::vector<ObjectRef> _elements;
};

/// Objects by string key, in the order of the keys' bytes. Equal entry by entry; hashes to its count.
class BoxedDictionary final : public Object {
 public:
  using Entries = std::map<std::string, ObjectRef, std::less<>>;
  explicit BoxedDictionary(Entries entries) : _entries(std::move(entries)) {}
  const Entries& entries() const { return _entries; }

  /// The object under `key`, or null.
  ObjectRef objectForKey(std::string_view key) const;

  std::string_view className() const override { return "Dictionary"; }
  bool isEqual(const Object* other) const override;
  std::uint64_t hash() const override { return _entries.size(); }
  std::string description() const override;

 private:
  Entries _entries;
};

inline ObjectRef box(std::string value) { return std::make_shared<const BoxedString>(std::move(value)); }
inline ObjectRef box(std::string_view value) { return box(std::string(value)); }
inline ObjectRef box(const char* value) { return box(std::string(value)); }
inline ObjectRef box(bool value) { return std::make_shared<const BoxedNumber>(value); }
inline ObjectRef box(std::int32_t value) { return std::make_shared<const BoxedNumber>(std::int64_t{value}); }
inline ObjectRef box(std::int64_t value) { return std::make_shared<const BoxedNumber>(value); }
inline ObjectRef box(std::uint32_t value) { return std::make_shared<const BoxedNumber>(std::uint64_t{value}); }
inline ObjectRef box(std::uint64_t value) { return std::make_shared<const BoxedNumber>(value); }
inline ObjectRef box(double value) { return std::make_shared<const BoxedNumber>(value); }
inline ObjectRef box(Date value) { return std::make_shared<const BoxedDate>(value); }
inline ObjectRef box(Bytes value) { return std::make_shared<const BoxedData>(std::move(value)); }

}  // namespace nimbo
