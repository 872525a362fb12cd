#pragma once

#include <cstdint>
#include <memory>
#include <span>
#include <string>
#include <string_view>

#include "platform/Localization.h"

namespace nimbo {

/// Fills patterns of ICU's MessageFormat, of which it knows arguments ("{0}") and plural forms ("{0, plural, =2 {both}
/// one {# line} other {# lines}}", "#" being the count), which may hold arguments in turn, but no quotation. Plural
/// rules and digits are ICU's; they are opened with the first count. The patterns are read here because ICU reads them
/// in C++ alone, which could not be opened late (ICUHandles.h). Main thread only.
/// Source of the form: https://unicode-org.github.io/icu/userguide/format_parse/messages/
class MessageFormat {
 public:
  /// A BCP 47 tag, whose rules and digits apply.
  explicit MessageFormat(std::string languageTag);
  ~MessageFormat();

  /// Throws std::runtime_error for a pattern of another form, for arguments that it lacks, and where ICU is missing.
  std::string fill(std::string_view pattern, std::span<const FormatArgument> arguments) const;

 private:
  struct Counting;
  class Filling;

  const Counting& counting() const;

  const std::string _languageTag;
  mutable std::unique_ptr<const Counting> _counting;  // null before the first count
};

}  // namespace nimbo
