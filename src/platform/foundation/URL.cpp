#include "platform/foundation/URL.h"

#include <cstdio>

namespace nimbo {

namespace {

std::string percentEncoded(std::string_view text) {
  std::string encoded;
  for (const char c : text) {
    const auto byte = static_cast<unsigned char>(c);
    const bool unreserved = (byte >= '0' && byte <= '9') || (byte >= 'a' && byte <= 'z') ||
                            (byte >= 'A' && byte <= 'Z') || c == '-' || c == '.' || c == '_' || c == '~';
    if (unreserved) {
      encoded += c;
    } else {
      char escape[4];
      std::snprintf(escape, sizeof escape, "%%%02X", static_cast<unsigned>(byte));
      encoded += escape;
    }
  }
  return encoded;
}

}  // namespace

URL URL::settingQueryParameter(std::string_view name, std::string_view value) const {
  const std::size_t hash = _absoluteString.find('#');
  const std::string fragment = hash == std::string::npos ? "" : _absoluteString.substr(hash);
  const std::string base = _absoluteString.substr(0, hash);
  const std::size_t question = base.find('?');
  std::string result = base.substr(0, question);
  char separator = '?';
  const auto append = [&](std::string_view parameter) {
    result += separator;
    result += parameter;
    separator = '&';
  };
  if (question != std::string::npos) {
    std::string_view query = std::string_view(base).substr(question + 1);
    while (!query.empty()) {
      const std::size_t end = query.find('&');
      const std::string_view parameter = query.substr(0, end);
      if (!parameter.empty() && parameter.substr(0, parameter.find('=')) != name) append(parameter);
      query.remove_prefix(end == std::string_view::npos ? query.size() : end + 1);
    }
  }
  append(std::string(name) + "=" + percentEncoded(value));
  return URL(result + fragment);
}

}  // namespace nimbo
