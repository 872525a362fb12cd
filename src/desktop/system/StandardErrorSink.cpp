#include "desktop/system/StandardErrorSink.h"

#include <algorithm>
#include <cerrno>
#include <cstdio>
#include <string>

namespace nimbo {

namespace {

std::string_view nameOf(LogLevel level) {
  switch (level) {
    case LogLevel::debug:
      return "DEBUG";
    case LogLevel::info:
      return "INFO";
    case LogLevel::error:
      break;
  }
  return "ERROR";
}

/// Bytes at the start of a text that do something to a terminal rather than show in it: a control character, or one
/// that sets a direction.
std::size_t lengthOfUnprintable(std::string_view text) {
  const auto byte = [text](std::size_t i) { return i < text.size() ? static_cast<unsigned char>(text[i]) : 0; };
  if (byte(0) < 0x20 || byte(0) == 0x7F) return 1;
  if (byte(0) == 0xC2 && byte(1) >= 0x80 && byte(1) <= 0x9F) return 2;
  if (byte(0) == 0xD8 && byte(1) == 0x9C) return 2;  // U+061C
  const bool isDirection =
      (byte(1) == 0x80 && (byte(2) == 0x8E || byte(2) == 0x8F || (byte(2) >= 0xAA && byte(2) <= 0xAE))) ||
      (byte(1) == 0x81 && byte(2) >= 0xA6 && byte(2) <= 0xA9);  // U+200E, U+200F, U+202A to U+202E, U+2066 to U+2069
  return byte(0) == 0xE2 && isDirection ? 3 : 0;
}

void appendEscaped(std::string& line, std::string_view text) {
  while (!text.empty()) {
    const std::size_t unprintable = lengthOfUnprintable(text);
    if (unprintable == 0) {
      line += text.front();
    } else if (text.front() == '\n') {
      line += "\\n";
    } else {
      for (const char c : text.substr(0, unprintable)) {
        char escaped[5];
        std::snprintf(escaped, sizeof escaped, "\\x%02x", static_cast<unsigned>(static_cast<unsigned char>(c)));
        line += escaped;
      }
    }
    text.remove_prefix(std::max<std::size_t>(unprintable, 1));
  }
}

}  // namespace

void StandardErrorSink::send(const LogEntry& entry) {
  std::string line(entry.signpost.empty() ? nameOf(entry.level) : "SIGNPOST");
  line.append(" ").append(entry.facility.subsystem).append(" ").append(entry.facility.category).append(": ");
  if (!entry.signpost.empty()) line.append(entry.signpost).append(": ");
  appendEscaped(line, entry.text);
  line += '\n';

  const std::lock_guard guard(_lock);
  for (std::string_view rest = line; !rest.empty();) {
    const ssize_t count = ::write(_descriptor, rest.data(), rest.size());
    if (count < 0 && errno == EINTR) continue;
    if (count < 0) return;
    rest.remove_prefix(static_cast<std::size_t>(count));
  }
}

}  // namespace nimbo
