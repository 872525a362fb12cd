#include "desktop/system/LogSink.h"

#include <dlfcn.h>
#include <sys/stat.h>
#include <sys/uio.h>

#include <algorithm>
#include <cerrno>
#include <cinttypes>
#include <cstdio>
#include <string>
#include <utility>
#include <vector>

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

namespace {

/// Priorities of syslog(3).
std::string_view priorityOf(LogLevel level) {
  switch (level) {
    case LogLevel::debug:
      return "7";
    case LogLevel::info:
      return "6";
    case LogLevel::error:
      break;
  }
  return "3";
}

std::string field(std::string_view name, std::string_view value) {
  std::string text(name);
  return text.append("=").append(value);
}

}  // namespace

bool isJournalStream(int descriptor, const char* journalStream) {
  std::uintmax_t device = 0, inode = 0;
  int length = 0;
  if (!journalStream || std::sscanf(journalStream, "%" SCNuMAX ":%" SCNuMAX "%n", &device, &inode, &length) != 2 ||
      journalStream[length] != '\0')
    return false;
  struct stat status {};
  return ::fstat(descriptor, &status) == 0 && status.st_dev == device && status.st_ino == inode;
}

JournalSink::JournalSink(Send send) : _send(std::move(send)) {}

void JournalSink::send(const LogEntry& entry) {
  std::vector<std::string> fields{field("MESSAGE", entry.text), field("PRIORITY", priorityOf(entry.level)),
                                  field("SUBSYSTEM", entry.facility.subsystem),
                                  field("CATEGORY", entry.facility.category)};
  if (!entry.signpost.empty()) {
    fields.front() = field("MESSAGE", entry.signpost) + ": " + std::string(entry.text);
    fields.push_back(field("SIGNPOST", entry.signpost));
  }
  if (!_send(fields)) _fallback.send(entry);
}

bool JournalSink::sendThroughLibrary(std::span<const std::string> fields) {
  // int sd_journal_sendv(const struct iovec*, int), sd_journal_send(3); never closed.
  using SendVector = int (*)(const iovec*, int);
  static const auto sendVector = [] {
    void* const library = ::dlopen("libsystemd.so.0", RTLD_NOW | RTLD_LOCAL);
    return library ? reinterpret_cast<SendVector>(::dlsym(library, "sd_journal_sendv")) : nullptr;
  }();
  if (!sendVector) return false;
  std::vector<iovec> vectors;
  vectors.reserve(fields.size());
  for (const std::string& text : fields) vectors.push_back({const_cast<char*>(text.data()), text.size()});
  return sendVector(vectors.data(), static_cast<int>(vectors.size())) >= 0;
}

}  // namespace nimbo
