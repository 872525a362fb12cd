#pragma once

#include <map>
#include <optional>

#include "desktop/strings/StringsPart.h"

namespace nimbo {

/// The string tables inside the program ("strings/<language>.json"), whose patterns are ICU's. Most are filled without
/// it, since it takes more memory than all the rest of a status bar's texts (docs/decisions/0006-parts-opened-late.md).
class ICUStringTables final : public StringTables {
 public:
  /// `locale` is a BCP 47 tag ("de-AT") or a POSIX name ("de_AT.UTF-8"). The table of the tag is used, else that of the
  /// tag with its last subtags left out, else the English one with English rules.
  explicit ICUStringTables(std::string_view locale);
  /// Whether there is a table for a locale without falling back to English.
  static bool speak(std::string_view locale);

  std::optional<std::string> stringForKey(std::string_view key) const override;
  /// Texts with letters that run from right to left are isolated, also where the pattern does not do so itself. A
  /// pattern that cannot be filled is logged and answered as it stands.
  std::string format(const std::string& pattern, std::span<const FormatArgument> arguments) const override;
  /// Likewise; in a language that runs from right to left, every text is isolated.
  std::string commaDelimitedList(const std::vector<std::string>& texts) const override;
  bool isRightToLeft() const override { return _isRightToLeft; }

 private:
  using Table = std::map<std::string, std::string, std::less<>>;

  /// Null where the program has no table of that name. Throws std::logic_error for a table that is broken.
  static std::optional<Table> tableNamed(std::string_view name);

  Table _table;
  Table _english;
  bool _isSpanish;
  bool _isRightToLeft;
  std::string _languageTag;                        ///< by whose rules patterns are filled
  mutable std::unique_ptr<PatternFormat> _format;  ///< null before the first pattern that takes ICU
};

}  // namespace nimbo
