#include "desktop/system/JournalSink.h"

#include <dlfcn.h>
#include <sys/stat.h>
#include <sys/uio.h>

#include <cinttypes>
#include <cstdio>
#include <utility>
#include <vector>

namespace nimbo {

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
