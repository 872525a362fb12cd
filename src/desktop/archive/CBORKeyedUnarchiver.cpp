#include "desktop/archive/CBORKeyedUnarchiver.h"

#include <algorithm>
#include <stdexcept>

#include "desktop/archive/CBORKeyedDecoder.h"

namespace nimbo {

namespace {

using nlohmann::json;

const AllowedClasses kUserInfoClasses{&kStringClass, &kNumberClass,     &kDataClass, &kDateClass,
                                      &kArrayClass,  &kDictionaryClass, &kErrorClass};

}  // namespace

void CBORKeyedUnarchiver::setClass_forClassName(const ArchivableClass& archivableClass, std::string_view name) {
  _substitutes.insert_or_assign(std::string(name), archivableClass);
}

KeyedUnarchiver::Decoded CBORKeyedUnarchiver::decodeTopLevelObjectOfClasses_forKey(const AllowedClasses& classes,
                                                                                   std::string_view key) {
  const auto value = _content.find(key);
  if (value == _content.end()) return {};
  _failure.clear();
  const ArchivePath::Scope scope(_path, std::string(key));
  ObjectRef object = objectOf(*value, classes);
  if (!hasFailed()) return {std::move(object), nullptr};
  return {nullptr,
          Error::errorWithDomain_code_reason(std::string(kKeyedArchiveErrorDomain),
                                             static_cast<std::int64_t>(ArchiveErrorCode::undecodable), _failure)};
}

void CBORKeyedUnarchiver::fail(const std::string& reason) {
  if (hasFailed()) return;
  _failure = _path.text() + ": " + reason;
  if (_policy == DecodingFailurePolicy::raiseException) throw std::runtime_error(_failure);
}

bool CBORKeyedUnarchiver::isAllowed(const AllowedClasses& classes, const ArchivableClass& archivableClass,
                                    std::string_view kind) {
  const bool allowed = std::ranges::any_of(
      classes, [&](const ArchivableClass* candidate) { return candidate->name == archivableClass.name; });
  if (!allowed) fail(std::string(kind) + " is not allowed here");
  return allowed;
}

ObjectRef CBORKeyedUnarchiver::objectOf(const json& value, const AllowedClasses& classes) {
  if (hasFailed()) return nullptr;
  switch (value.type()) {
    case json::value_t::boolean:
      return isAllowed(classes, kNumberClass, "a boolean") ? box(value.get<bool>()) : nullptr;
    case json::value_t::number_integer:
      return isAllowed(classes, kNumberClass, "a number") ? box(value.get<std::int64_t>()) : nullptr;
    case json::value_t::number_unsigned:
      return isAllowed(classes, kNumberClass, "a number") ? box(value.get<std::uint64_t>()) : nullptr;
    case json::value_t::number_float:
      return isAllowed(classes, kNumberClass, "a number") ? box(value.get<double>()) : nullptr;
    case json::value_t::string:
      return isAllowed(classes, kStringClass, "a text") ? box(value.get_ref<const std::string&>()) : nullptr;
    case json::value_t::binary:
      return isAllowed(classes, kDataClass, "a byte string") ? box(Bytes(value.get_binary())) : nullptr;
    case json::value_t::array:
      return isAllowed(classes, kArrayClass, "an array") ? arrayOf(value, classes) : nullptr;
    case json::value_t::object:
      return classedObjectOf(value, classes);
    default:
      fail("null stands where an object is needed");
      return nullptr;
  }
}

ObjectRef CBORKeyedUnarchiver::arrayOf(const json& value, const AllowedClasses& classes) {
  std::vector<ObjectRef> elements;
  elements.reserve(value.size());
  for (std::size_t index = 0; index < value.size() && !hasFailed(); ++index) {
    const ArchivePath::Scope scope(_path, index);
    if (ObjectRef element = objectOf(value[index], classes)) elements.push_back(std::move(element));
  }
  return std::make_shared<const BoxedArray>(std::move(elements));
}

ObjectRef CBORKeyedUnarchiver::classedObjectOf(const json& value, const AllowedClasses& classes) {
  const auto className = value.find(kArchiveClassKey);
  if (className == value.end() || !className->is_string()) {
    fail("the object has no class name");
    return nullptr;
  }
  const std::string& name = className->get_ref<const std::string&>();
  const auto substitute = _substitutes.find(name);
  const std::string_view decodedName = substitute == _substitutes.end() ? name : substitute->second.name;
  const auto allowed = std::ranges::find(classes, decodedName, &ArchivableClass::name);
  if (allowed == classes.end()) {
    fail("the class \"" + name + "\" is not allowed here");
    return nullptr;
  }
  if (decodedName == kDateClass.name) return dateOf(value);
  if (decodedName == kErrorClass.name) return errorOf(value);
  if (decodedName == kDictionaryClass.name)
    return std::make_shared<const BoxedDictionary>(entriesOf(value, kDictionaryEntriesKey, classes));
  if (!(*allowed)->initWithCoder) {
    fail("\"" + name + "\" is no class of objects");
    return nullptr;
  }
  CBORKeyedDecoder decoder(value, *this);
  ObjectRef object = (*allowed)->initWithCoder(decoder);
  return hasFailed() ? nullptr : object;
}

ObjectRef CBORKeyedUnarchiver::dateOf(const json& value) {
  CBORKeyedDecoder decoder(value, *this);
  if (!decoder.containsValueForKey(kDateMicrosecondsKey)) fail("the date has no microseconds");
  return box(Date(Date::duration(decoder.decodeInt64ForKey(kDateMicrosecondsKey))));
}

ObjectRef CBORKeyedUnarchiver::errorOf(const json& value) {
  CBORKeyedDecoder decoder(value, *this);
  const auto domain = decoder.decodeStringForKey(kErrorDomainKey);
  if (!domain) fail("the error has no domain");
  const std::int64_t code = decoder.decodeInt64ForKey(kErrorCodeKey);
  auto userInfo = entriesOf(value, kErrorUserInfoKey, kUserInfoClasses);
  return hasFailed() ? nullptr : Error::errorWithDomain_code_userInfo(*domain, code, std::move(userInfo));
}

BoxedDictionary::Entries CBORKeyedUnarchiver::entriesOf(const json& object, std::string_view key,
                                                        const AllowedClasses& classes) {
  BoxedDictionary::Entries entries;
  const ArchivePath::Scope scope(_path, std::string(key));
  const auto map = object.find(key);
  if (map == object.end() || !map->is_object()) {
    fail("a map is missing");
    return entries;
  }
  for (const auto& [name, value] : map->items()) {
    const ArchivePath::Scope entryScope(_path, name);
    if (ObjectRef entry = objectOf(value, classes)) entries.emplace_hint(entries.end(), name, std::move(entry));
  }
  return entries;
}

}  // namespace nimbo
