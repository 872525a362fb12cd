#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <vector>

namespace nimbo {

/// A value that a formatted string stands in for.
struct ServerFormatToken {
  std::string name;
  std::string value;
  bool operator==(const ServerFormatToken&) const = default;
};

/// Whether two tokens are equal.
inline bool ServerFormatTokenEqual(const ServerFormatToken& a, const ServerFormatToken& b) { return a == b; }

/// A text composed by the map service. Absent lists differ from empty ones.
struct ServerFormattedString {
  std::optional<std::vector<std::optional<std::string>>> formatStrings;
  std::optional<std::vector<std::optional<std::string>>> separators;
  std::optional<std::vector<ServerFormatToken>> formatTokens;
  std::optional<std::string> alternativeString;
};

}  // namespace nimbo
