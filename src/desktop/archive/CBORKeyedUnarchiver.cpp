#include "desktop/archive/CBORKeyedUnarchiver.h"

#include <algorithm>
#include <stdexcept>
#include <utility>

#include "desktop/archive/ArchiveFormat.h"
#include "platform/archive/KeyedArchive.h"

namespace nimbo {

namespace {

using nlohmann::json;

/// Builds the values as they are read, and stops at the first thing that an archive may not hold.
class ArchiveBuilder final : public json::json_sax_t {
 public:
  json takeContent() { return std::move(_content); }
  const std::string& failure() const { return _failure; }

  bool null() override { return add(nullptr); }
  bool boolean(bool value) override { return add(value); }
  bool number_integer(number_integer_t value) override { return add(value); }
  bool number_unsigned(number_unsigned_t value) override { return add(value); }
  bool number_float(number_float_t value, const string_t&) override { return add(value); }
  bool string(string_t& value) override { return isText(value) && add(std::move(value)); }
  bool binary(binary_t& value) override { return add(std::move(value)); }
  bool start_object(std::size_t) override { return open(json::object()); }
  bool start_array(std::size_t) override { return open(json::array()); }
  bool end_object() override { return close(); }
  bool end_array() override { return close(); }

  bool key(string_t& name) override {
    if (!isText(name)) return false;
    const auto [entry, isNew] = _open.back()->get_ref<json::object_t&>().try_emplace(std::move(name));
    if (!isNew) return fail("the key \"" + entry->first + "\" stands twice in a map");
    _slot = &entry->second;
    return true;
  }

  bool parse_error(std::size_t position, const std::string&, const json::exception& error) override {
    std::string reason = error.what();
    // The library's number of the error, in brackets, says nothing to a reader.
    if (const std::size_t bracket = reason.find("] "); bracket != std::string::npos) reason.erase(0, bracket + 2);
    return fail("byte " + std::to_string(position) + ": " + reason);
  }

 private:
  bool fail(std::string reason) {
    if (_failure.empty()) _failure = std::move(reason);
    return false;
  }

  bool isText(const std::string& text) { return isUTF8(text) || fail("a text is not UTF-8"); }

  /// Where the next value goes: the outermost value, the map entry of the last key, or the end of an array.
  json& nextSlot() {
    if (_open.empty()) return _content;
    if (_open.back()->is_object()) return *_slot;
    return _open.back()->get_ref<json::array_t&>().emplace_back();
  }

  bool add(json value) {
    if (++_count > kMaximumArchiveValues) return fail("more than " + std::to_string(kMaximumArchiveValues) + " values");
    nextSlot() = std::move(value);
    return true;
  }

  bool open(json container) {
    if (_open.size() == kMaximumArchiveDepth)
      return fail("nested more than " + std::to_string(kMaximumArchiveDepth) + " deep");
    json& slot = nextSlot();
    if (++_count > kMaximumArchiveValues) return fail("more than " + std::to_string(kMaximumArchiveValues) + " values");
    slot = std::move(container);
    _open.push_back(&slot);
    return true;
  }

  bool close() {
    _open.pop_back();
    return true;
  }

  json _content;
  std::vector<json*> _open;  ///< the maps and arrays around the next value
  json* _slot = nullptr;     ///< of the last key
  std::size_t _count = 0;
  std::string _failure;
};

ErrorRef noArchive(std::string reason) {
  return Error::errorWithDomain_code_reason(std::string(kKeyedArchiveErrorDomain),
                                            static_cast<std::int64_t>(ArchiveErrorCode::noArchive), std::move(reason));
}

}  // namespace

Outcome<json> parseArchive(std::span<const std::uint8_t> bytes) {
  if (bytes.size() > kMaximumArchiveSize)
    return noArchive("the archive has " + std::to_string(bytes.size()) + " bytes, more than " +
                     std::to_string(kMaximumArchiveSize));
  ArchiveBuilder builder;
  if (!json::sax_parse(bytes.begin(), bytes.end(), &builder, json::input_format_t::cbor))
    return noArchive("the archive is broken: " + builder.failure());
  json content = builder.takeContent();
  const auto marker = content.is_object() ? content.find(kArchiveMarkerKey) : content.end();
  if (!content.is_object() || marker == content.end())
    return noArchive("this is no archive: the outermost map has no \"" + std::string(kArchiveMarkerKey) + "\"");
  if (*marker != kArchiveVersion)
    return noArchive("the archive is of version " + marker->dump() + ", not " + std::to_string(kArchiveVersion));
  return content;
}

using nlohmann::json;

const json* CBORKeyedDecoder::field(std::string_view key, bool (*isKind)(const json&), const char* kind) {
  const auto value = _fields.find(key);
  if (value == _fields.end() || _unarchiver.hasFailed()) return nullptr;
  if (isKind(*value)) return &*value;
  failAtKey(key, std::string("not ") + kind + " but of the kind \"" + value->type_name() + "\"");
  return nullptr;
}

void CBORKeyedDecoder::failAtKey(std::string_view key, const std::string& reason) {
  const ArchivePath::Scope scope(_unarchiver.path(), std::string(key));
  _unarchiver.fail(reason);
}

void CBORKeyedDecoder::failWithReason(std::string reason) { _unarchiver.fail(reason); }

bool CBORKeyedDecoder::containsValueForKey(std::string_view key) const { return _fields.contains(key); }

ObjectRef CBORKeyedDecoder::decodeObjectOfClasses_forKey(const AllowedClasses& classes, std::string_view key) {
  const auto value = _fields.find(key);
  if (value == _fields.end()) return nullptr;
  const ArchivePath::Scope scope(_unarchiver.path(), std::string(key));
  return _unarchiver.objectOf(*value, classes);
}

bool CBORKeyedDecoder::decodeBoolForKey(std::string_view key) {
  const json* value = field(
      key, [](const json& kind) { return kind.is_boolean(); }, "a boolean");
  return value && value->get<bool>();
}

std::int64_t CBORKeyedDecoder::decodeInt64ForKey(std::string_view key) {
  const auto isInt64 = [](const json& kind) {
    return kind.is_number_integer() &&
           !(kind.is_number_unsigned() && !std::in_range<std::int64_t>(kind.get<std::uint64_t>()));
  };
  const json* value = field(key, isInt64, "a signed 64-bit integer");
  return value ? value->get<std::int64_t>() : 0;
}

std::optional<std::string> CBORKeyedDecoder::decodeStringForKey(std::string_view key) {
  const json* value = field(
      key, [](const json& kind) { return kind.is_string(); }, "a text");
  return value ? std::optional(value->get<std::string>()) : std::nullopt;
}

std::optional<Bytes> CBORKeyedDecoder::decodeBytesForKey(std::string_view key) {
  const json* value = field(
      key, [](const json& kind) { return kind.is_binary(); }, "a byte string");
  return value ? std::optional<Bytes>(value->get_binary()) : std::nullopt;
}

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
