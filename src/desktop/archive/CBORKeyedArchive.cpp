#include "desktop/archive/CBORKeyedArchive.h"

#include <nlohmann/json.hpp>
#include <stdexcept>

#include "desktop/archive/ArchiveFormat.h"
#include "desktop/archive/CBORKeyedUnarchiver.h"

namespace nimbo {

std::unique_ptr<KeyedUnarchiver> CBORKeyedArchive::unarchiverForReadingFromData(std::span<const std::uint8_t> bytes) {
  auto opened = openData(bytes);
  return opened ? std::move(*opened) : nullptr;
}

Outcome<std::unique_ptr<KeyedUnarchiver>> CBORKeyedArchive::openData(std::span<const std::uint8_t> bytes) {
  auto parsed = parseArchive(bytes);
  if (!parsed) return parsed.error();
  return std::unique_ptr<KeyedUnarchiver>(std::make_unique<CBORKeyedUnarchiver>(std::move(*parsed)));
}

namespace {

using nlohmann::json;

class ArchiveWriter {
 public:
  /// Null, after `fail`, for an object that may not stand in an archive.
  json valueOf(const ObjectRef& object);
  json textOf(const std::string& text);
  json dateOf(Date date);
  /// The first reason with its place; empty while nothing failed.
  const std::string& failure() const { return _failure; }
  ArchivePath& path() { return _path; }

 private:
  json fail(const std::string& reason);
  json arrayOf(const BoxedArray& array);
  json mapOf(const BoxedDictionary& dictionary);
  json errorOf(const Error& error);
  json codedObjectOf(const SecureCoding& object);

  ArchivePath _path;
  std::size_t _depth = 1;  ///< the outermost map
  bool _inUserInfo = false;
  std::string _failure;
};

/// The fields of one object.
class FieldEncoder final : public KeyedEncoder {
 public:
  FieldEncoder(json& fields, ArchiveWriter& writer) : _fields(fields), _writer(writer) {}

  void encodeObject_forKey(const ObjectRef& object, std::string_view key) override {
    if (!object) return;
    const ArchivePath::Scope scope(_writer.path(), std::string(key));
    set(key, _writer.valueOf(object));
  }
  void encodeBool_forKey(bool value, std::string_view key) override { set(key, value); }
  void encodeString_forKey(const std::optional<std::string>& value, std::string_view key) override {
    const ArchivePath::Scope scope(_writer.path(), std::string(key));
    if (value) set(key, _writer.textOf(*value));
  }
  void encodeBytes_forKey(std::span<const std::uint8_t> value, std::string_view key) override {
    set(key, json::binary(Bytes(value.begin(), value.end())));
  }

 private:
  void set(std::string_view key, json value) {
    if (key.starts_with(kArchiveReservedKeyPrefix))
      throw std::invalid_argument("the key \"" + std::string(key) + "\" belongs to the archive");
    _fields[std::string(key)] = std::move(value);
  }

  json& _fields;
  ArchiveWriter& _writer;
};

json ArchiveWriter::fail(const std::string& reason) {
  if (_failure.empty()) _failure = _path.text() + ": " + reason;
  return nullptr;
}

json ArchiveWriter::textOf(const std::string& text) { return isUTF8(text) ? json(text) : fail("a text is not UTF-8"); }

json ArchiveWriter::dateOf(Date date) {
  return {{kArchiveClassKey, kDateClass.name}, {kDateMicrosecondsKey, date.time_since_epoch().count()}};
}

json ArchiveWriter::valueOf(const ObjectRef& object) {
  if (!_failure.empty()) return nullptr;
  if (const auto* text = dynamic_cast<const BoxedString*>(object.get())) return textOf(text->value());
  if (const auto* number = dynamic_cast<const BoxedNumber*>(object.get()))
    return std::visit([](auto value) { return json(value); }, number->value());
  if (const auto* data = dynamic_cast<const BoxedData*>(object.get())) return json::binary(data->value());
  if (const auto* date = dynamic_cast<const BoxedDate*>(object.get())) return dateOf(date->value());
  // Two levels for what a dictionary and an error open at once.
  if (_depth + 2 > kMaximumArchiveDepth) return fail("nested too deep");
  _depth += 2;
  json value;
  if (const auto* array = dynamic_cast<const BoxedArray*>(object.get())) {
    value = arrayOf(*array);
  } else if (const auto* dictionary = dynamic_cast<const BoxedDictionary*>(object.get())) {
    value = {{kArchiveClassKey, kDictionaryClass.name}};
    value[kDictionaryEntriesKey] = mapOf(*dictionary);
  } else if (const auto* error = dynamic_cast<const Error*>(object.get())) {
    value = errorOf(*error);
  } else if (const auto* coded = dynamic_cast<const SecureCoding*>(object.get()); coded && !_inUserInfo) {
    value = codedObjectOf(*coded);
  } else {
    fail("an object of the class " + (object ? std::string(object->className()) : "(null)") + " cannot be archived");
  }
  _depth -= 2;
  return value;
}

json ArchiveWriter::arrayOf(const BoxedArray& array) {
  json::array_t elements;
  elements.reserve(array.elements().size());
  for (std::size_t index = 0; index < array.elements().size(); ++index) {
    const ArchivePath::Scope scope(_path, index);
    elements.push_back(valueOf(array.elements()[index]));
  }
  return elements;
}

json ArchiveWriter::mapOf(const BoxedDictionary& dictionary) {
  json map = json::object();
  for (const auto& [key, object] : dictionary.entries()) {
    const ArchivePath::Scope scope(_path, key);
    textOf(key);
    map.emplace(key, valueOf(object));
  }
  return map;
}

json ArchiveWriter::errorOf(const Error& error) {
  // A reader knows no list of classes for user infos: only what every archive reads may stand there.
  const bool wasInUserInfo = std::exchange(_inUserInfo, true);
  json value{
      {kArchiveClassKey, kErrorClass.name}, {kErrorDomainKey, textOf(error.domain())}, {kErrorCodeKey, error.code()}};
  const ArchivePath::Scope scope(_path, std::string(kErrorUserInfoKey));
  value[kErrorUserInfoKey] = mapOf(*error.userInfo());
  _inUserInfo = wasInUserInfo;
  return value;
}

json ArchiveWriter::codedObjectOf(const SecureCoding& object) {
  json fields{{kArchiveClassKey, object.archivableClass().name}};
  FieldEncoder encoder(fields, *this);
  object.encodeWithCoder(encoder);
  return fields;
}

ErrorRef notArchivable(std::string reason) {
  return Error::errorWithDomain_code_reason(std::string(kKeyedArchiveErrorDomain),
                                            static_cast<std::int64_t>(ArchiveErrorCode::notArchivable),
                                            std::move(reason));
}

}  // namespace

Outcome<Bytes> CBORKeyedArchive::archivedDataWithRootObject(const ObjectRef& root, bool) {
  ArchiveWriter writer;
  json content{{kArchiveMarkerKey, kArchiveVersion}};
  {
    const ArchivePath::Scope scope(writer.path(), std::string(kKeyedArchiveRootObjectKey));
    content[std::string(kKeyedArchiveRootObjectKey)] = writer.valueOf(root);
  }
  if (!writer.failure().empty()) return notArchivable(writer.failure());
  Bytes bytes = json::to_cbor(content);
  if (bytes.size() > kMaximumArchiveSize)
    return notArchivable("the archive has " + std::to_string(bytes.size()) + " bytes, more than " +
                         std::to_string(kMaximumArchiveSize));
  return bytes;
}

}  // namespace nimbo
