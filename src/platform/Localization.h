#pragma once

#include <cstdint>
#include <initializer_list>
#include <optional>
#include <span>
#include <string>
#include <string_view>
#include <variant>
#include <vector>

namespace nimbo {

/// An argument of a localized format: an unsigned count or a text.
using FormatArgument = std::variant<std::uint64_t, std::string>;

/// The string tables of the user's locale. Main thread only.
class StringTables {
 public:
  virtual ~StringTables() = default;
  /// The text or pattern of a key: in the user's language, else in English; absent when neither has it.
  virtual std::optional<std::string> stringForKey(std::string_view key) const = 0;
  /// Fills a pattern (ICU MessageFormat, arguments by position), plural forms and digits by the locale.
  virtual std::string format(const std::string& pattern, std::span<const FormatArgument> arguments) const = 0;
  /// The texts as one list of the locale, separated by its comma throughout ("A, B, C").
  virtual std::string commaDelimitedList(const std::vector<std::string>& texts) const = 0;
  /// Whether the locale's script runs from right to left.
  virtual bool isRightToLeft() const = 0;
};

/// The text of a key, or "localized string not found".
std::string LocalizedString(std::string_view key);

/// A key's text, filled with counts and texts.
std::string LocalizedFormat(const std::string& format, std::initializer_list<FormatArgument> arguments);

/// Joins texts into one comma-delimited list of the user's locale.
std::string CommaDelimitedList(const std::vector<std::string>& texts);

}  // namespace nimbo
