#include "desktop/gtfs/feeds/Feed.h"

#include <algorithm>
#include <cstdio>

#include "desktop/gtfs/feeds/TransitLineServiceError.h"
#include "desktop/gtfs/text/Utf8.h"
#include "platform/foundation/Hash.h"

namespace nimbo {

namespace {

ErrorRef badAddress(std::string reason) {
  return transitLineServiceError(TransitLineServiceError::badAddress, std::move(reason));
}

/// "http" of "http://host"; empty for a path. Source: RFC 3986, section 3.1.
std::string schemeOf(std::string_view text) {
  const std::size_t end = text.find("://");
  if (end == std::string_view::npos || end == 0) return {};
  const std::string_view scheme = text.substr(0, end);
  const bool valid = std::all_of(scheme.begin(), scheme.end(),
                                 [](unsigned char c) { return std::isalnum(c) || c == '+' || c == '-' || c == '.'; });
  return valid ? asciiLowerCase(scheme) : std::string();
}

}  // namespace

ErrorRef FeedKey::checkHeader(std::string_view line) {
  const auto bad = [](const char* what) {
    return transitLineServiceError(TransitLineServiceError::badKey,
                                   std::string("The header ") + what + ". Write it as \"NAME: VALUE\".");
  };
  const auto isControl = [](unsigned char c) { return (c < 0x20 && c != '\t') || c == 0x7F; };
  if (std::any_of(line.begin(), line.end(), isControl)) return bad("holds a line end or another control character");
  const std::size_t colon = line.find(':');
  // Source: RFC 9110, section 5.6.2.
  const auto isNamePart = [](unsigned char c) {
    return c < 0x80 && (std::isalnum(c) ||
                        std::string_view("!#$%&'*+-.^_`|~").find(static_cast<char>(c)) != std::string_view::npos);
  };
  if (colon == std::string_view::npos || colon == 0 ||
      !std::all_of(line.begin(), line.begin() + static_cast<std::ptrdiff_t>(colon), isNamePart))
    return bad("has no name that headers can have");
  if (trimmed(line.substr(colon + 1)).empty()) return bad("has no value");
  return nullptr;
}

std::string FeedKey::parameter(std::string_view name, std::string_view value) {
  std::string text = std::string(name) + "=";
  for (const unsigned char c : value) {
    char encoded[4];
    std::snprintf(encoded, sizeof encoded, "%%%02X", c);
    // Source: RFC 3986, section 2.3.
    const bool isPlain = c < 0x80 && (std::isalnum(c) || c == '-' || c == '.' || c == '_' || c == '~');
    text += isPlain ? std::string(1, static_cast<char>(c)) : encoded;
  }
  return text;
}

FeedAddress FeedAddress::withKey(FeedKey key) const {
  FeedAddress address = *this;
  address._key = std::move(key);
  return address;
}

FeedAddress FeedAddress::withQueryAsKey() const {
  FeedAddress address = *this;
  const std::size_t mark = _text.find('?');
  if (!_isRemote || mark == std::string::npos) return address;
  address._text.resize(mark);
  address._key.query = _text.substr(mark + 1, _text.find('#', mark) - mark - 1);
  return address;
}

std::string FeedAddress::textWithKey() const {
  if (_key.query.empty()) return _text;
  const std::string text = _text.substr(0, _text.find('#'));
  return text + (text.find('?') == std::string::npos ? "?" : "&") + _key.query;
}

std::string FeedAddress::identity() const {
  return _key.query.empty() ? _text : _text + "#" + std::to_string(hashOfBytes(_key.query));
}

Outcome<FeedAddress> FeedAddress::parse(std::string_view text) {
  text = trimmed(text);
  if (text.empty()) return badAddress("The address is empty. Give a path or an http or https address.");
  if (std::any_of(text.begin(), text.end(), [](unsigned char c) { return c < 0x20 || c == 0x7F; }))
    return badAddress("The address holds control characters. Give a path or an http or https address.");
  const std::string scheme = schemeOf(text);
  if (scheme == "http" || scheme == "https") {
    if (text.size() == scheme.size() + 3)
      return badAddress("The address \"" + std::string(text) + "\" names no server.");
    return FeedAddress(std::string(text), true);
  }
  if (scheme == "file")
    text.remove_prefix(7);
  else if (!scheme.empty())
    return badAddress("Addresses that begin with \"" + scheme +
                      "://\" are not read. Give a path or an http or https address.");
  for (const std::string_view begin : {"http:", "https:", "data:"})  // where keys may follow: nothing of it is shown
    if (asciiLowerCase(text.substr(0, begin.size())) == begin)
      return badAddress(
          "An address that begins with \"" + std::string(begin) +
          "\" goes on with \"//\" and its server, or is not read. Give a path or an http or https address.");
  std::error_code error;
  const std::filesystem::path path = std::filesystem::absolute(std::filesystem::path(text), error).lexically_normal();
  if (error) return badAddress("The path \"" + std::string(text) + "\" cannot be used: " + error.message() + ".");
  return FeedAddress(path.native(), false);
}

std::string FeedAddress::publicText() const {
  if (!_isRemote) return _text;
  std::string text = _text.substr(0, _text.find_first_of("?#"));
  if (text.size() < _text.size() || !_key.query.empty()) text += "?...";
  const std::size_t hostBegin = text.find("://") + 3;
  const std::size_t hostEnd = std::min(text.find_first_of("/\\?", hostBegin), text.size());
  const std::size_t at = text.rfind('@', hostEnd);
  if (at != std::string::npos && at >= hostBegin && at < hostEnd) text.erase(hostBegin, at + 1 - hostBegin);
  return text;
}

}  // namespace nimbo
