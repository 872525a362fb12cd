#pragma once

#include <glib.h>

#include <cstddef>
#include <cstdint>
#include <string>
#include <string_view>
#include <variant>
#include <vector>

// The keyed archive as CBOR (RFC 8949); docs/formats.md describes it for readers of other programs.

namespace nimbo {

/// Key of the version in the outermost map. It sorts first, so that an archive is known by its first bytes.
inline constexpr std::string_view kArchiveMarkerKey = "$archive";
inline constexpr std::uint64_t kArchiveVersion = 1;

/// Key of an object's class name. The keys that begin with "$" are the archive's own.
inline constexpr std::string_view kArchiveClassKey = "$class";
inline constexpr char kArchiveReservedKeyPrefix = '$';

inline constexpr std::string_view kDictionaryEntriesKey = "entries";
inline constexpr std::string_view kDateMicrosecondsKey = "microseconds";
inline constexpr std::string_view kErrorDomainKey = "domain";
inline constexpr std::string_view kErrorCodeKey = "code";
inline constexpr std::string_view kErrorUserInfoKey = "userInfo";

// Bounds of what is written and read: a saved state of 500 lines with 20 incidents each stays below them, and reading
// any bytes ends in bounded time and memory.
inline constexpr std::size_t kMaximumArchiveSize = std::size_t{16} << 20;
inline constexpr std::size_t kMaximumArchiveDepth = 64;
inline constexpr std::size_t kMaximumArchiveValues = std::size_t{1} << 18;

/// Codes of errors in `kKeyedArchiveErrorDomain`.
enum class ArchiveErrorCode : std::int64_t {
  notArchivable = 1,  ///< an object that may not stand in an archive, or an archive beyond its bounds
  noArchive = 2,      ///< bytes that are no archive of this version
  undecodable = 3,    ///< a content that is not what was asked for
};

/// The place of a value in an archive, for error texts: "root.lineItemResultSuccess[3].record".
class ArchivePath {
 public:
  using Step = std::variant<std::string, std::size_t>;

  /// One step further down while it lives.
  class Scope {
   public:
    Scope(ArchivePath& path, Step step) : _path(path) { _path._steps.push_back(std::move(step)); }
    ~Scope() { _path._steps.pop_back(); }
    Scope(const Scope&) = delete;
    Scope& operator=(const Scope&) = delete;

   private:
    ArchivePath& _path;
  };

  std::string text() const {
    std::string text;
    for (const Step& step : _steps) {
      if (const auto* index = std::get_if<std::size_t>(&step))
        text += "[" + std::to_string(*index) + "]";
      else
        text += (text.empty() ? "" : ".") + std::get<std::string>(step);
    }
    return text;
  }

 private:
  std::vector<Step> _steps;
};

/// Whether a text may stand in CBOR: valid UTF-8, zero characters included, which GLib does not take for text.
inline bool isUTF8(std::string_view text) {
  for (;;) {
    const std::string_view part = text.substr(0, text.find('\0'));
    if (!g_utf8_validate_len(part.data(), part.size(), nullptr)) return false;
    if (part.size() == text.size()) return true;
    text.remove_prefix(part.size() + 1);
  }
}

}  // namespace nimbo
