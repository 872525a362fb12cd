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
  const std::string_view className = classNameOf(*value);
  if (!className.empty() && !allowedClass(classes, className)) return {};
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

std::string_view CBORKeyedUnarchiver::classNameOf(const json& value) const {
  switch (value.type()) {
    case json::value_t::boolean:
    case json::value_t::number_integer:
    case json::value_t::number_unsigned:
    case json::value_t::number_float:
      return kNumberClass.name;
    case json::value_t::string:
      return kStringClass.name;
    case json::value_t::binary:
      return kDataClass.name;
    case json::value_t::array:
      return kArrayClass.name;
    default:
      break;
  }
  const auto written = value.find(kArchiveClassKey);
  if (written == value.end() || !written->is_string()) return {};
  const std::string& name = written->get_ref<const std::string&>();
  const auto substitute = _substitutes.find(name);
  return substitute == _substitutes.end() ? name : substitute->second.name;
}

const ArchivableClass* CBORKeyedUnarchiver::allowedClass(const AllowedClasses& classes, std::string_view name) {
  const auto allowed = std::ranges::find(classes, name, &ArchivableClass::name);
  return allowed == classes.end() ? nullptr : *allowed;
}

ObjectRef CBORKeyedUnarchiver::objectOf(const json& value, const AllowedClasses& classes) {
  if (hasFailed()) return nullptr;
  const std::string_view name = classNameOf(value);
  const ArchivableClass* const allowed = allowedClass(classes, name);
  if (!allowed) {
    fail(name.empty()
             ? std::string(value.is_null() ? "null stands where an object is needed" : "the object has no class name")
             : "the class \"" + std::string(name) + "\" is not allowed here");
    return nullptr;
  }
  switch (value.type()) {
    case json::value_t::boolean:
      return box(value.get<bool>());
    case json::value_t::number_integer:
      return box(value.get<std::int64_t>());
    case json::value_t::number_unsigned:
      return box(value.get<std::uint64_t>());
    case json::value_t::number_float:
      return box(value.get<double>());
    case json::value_t::string:
      return box(value.get_ref<const std::string&>());
    case json::value_t::binary:
      return box(Bytes(value.get_binary()));
    case json::value_t::array:
      return arrayOf(value, classes);
    default:
      return classedObjectOf(value, *allowed, classes);
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

ObjectRef CBORKeyedUnarchiver::classedObjectOf(const json& value, const ArchivableClass& archivableClass,
                                               const AllowedClasses& classes) {
  if (archivableClass.name == kDateClass.name) return dateOf(value);
  if (archivableClass.name == kErrorClass.name) return errorOf(value);
  if (archivableClass.name == kDictionaryClass.name)
    return std::make_shared<const BoxedDictionary>(entriesOf(value, kDictionaryEntriesKey, classes));
  if (!archivableClass.initWithCoder) {
    fail("\"" + std::string(archivableClass.name) + "\" is no class of objects");
    return nullptr;
  }
  CBORKeyedDecoder decoder(value, *this);
  ObjectRef object = archivableClass.initWithCoder(decoder);
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
