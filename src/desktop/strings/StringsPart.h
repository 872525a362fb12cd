#pragma once

#include <memory>
#include <span>
#include <string>
#include <string_view>

#include "platform/Localization.h"
#include "platform/foundation/Date.h"

namespace nimbo {

/// Patterns of ICU's MessageFormat, filled by the rules of a language.
/// Source of the form: https://unicode-org.github.io/icu/userguide/format_parse/messages/
class PatternFormat {
 public:
  virtual ~PatternFormat() = default;
  /// Throws std::runtime_error with ICU's name of what is wrong with the pattern or an argument's type. An argument
  /// that is not given stays as the pattern has it.
  virtual std::string fill(const std::string& pattern, std::span<const FormatArgument> arguments) = 0;
};

/// Dates in the words of a locale and the machine's time zone: "today at 14:00".
class DateFormat {
 public:
  virtual ~DateFormat() = default;
  /// Where in a sentence a date stands.
  enum class Place { beginning, middle };
  virtual std::string textOf(Date date, Place place) = 0;
  /// The day alone, as a heading.
  virtual std::string dayOf(Date date) = 0;
};

/// What libnimbo-strings does, the part with ICU (system/LatePart.h). Main thread only where nothing else is said.
class StringsPart {
 public:
  virtual ~StringsPart() = default;
  /// Of a BCP 47 tag.
  virtual std::unique_ptr<PatternFormat> makePatternFormat(const std::string& languageTag) = 0;
  /// Of a BCP 47 tag or POSIX name; null where ICU has none.
  virtual std::unique_ptr<DateFormat> makeDateFormat(const std::string& locale) = 0;
  /// The last boundary between grapheme clusters of a UTF-8 text at `position` or before it. Any thread. Throws
  /// std::runtime_error.
  virtual std::size_t clusterBoundary(std::string_view text, std::size_t position) = 0;
  /// A UTF-8 text as searches compare it: without case and accents, letters of any script in one form ("Zürich" and
  /// "ZURICH" alike). Bytes that are no UTF-8 become U+FFFD. Any thread. Throws std::runtime_error.
  virtual std::string searchKey(std::string_view text) = 0;
  /// Bytes that stand in the order in which the language of a BCP 47 tag or POSIX name sorts such texts. Any thread.
  /// Throws std::runtime_error.
  virtual std::string sortKey(std::string_view text, const std::string& locale) = 0;
  /// The name of a country, by its ISO 3166-1 code, in the language of a BCP 47 tag or POSIX name; the code where ICU
  /// has none. Any thread.
  virtual std::string countryName(const std::string& code, const std::string& locale) = 0;
};

/// Opens the part with the first call. Throws LatePartMissing.
StringsPart& stringsPart();

}  // namespace nimbo
