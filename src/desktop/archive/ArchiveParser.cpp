#include "desktop/archive/ArchiveParser.h"

#include "desktop/archive/ArchiveFormat.h"
#include "desktop/archive/ArchiveText.h"
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

}  // namespace nimbo
