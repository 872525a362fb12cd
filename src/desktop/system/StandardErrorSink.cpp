#include "desktop/system/StandardErrorSink.h"

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

void appendEscaped(std::string& line, std::string_view text) {
  for (const char c : text) {
    const auto byte = static_cast<unsigned char>(c);
    if (byte >= 0x20 && byte != 0x7f) {
      line += c;
    } else if (c == '\n') {
      line += "\\n";
    } else {
      char escaped[5];
      std::snprintf(escaped, sizeof escaped, "\\x%02x", static_cast<unsigned>(byte));
      line += escaped;
    }
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
