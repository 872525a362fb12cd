#pragma once

#include <optional>
#include <span>
#include <string>
#include <string_view>

#include "platform/Localization.h"

namespace nimbo {

/// A pattern of ICU's, filled as ICU does it, by the language of a BCP 47 tag, where that takes no library: arguments
/// that are given, plurals by the languages of the string tables, counts below 1000 in European digits. Absent for any
/// other pattern or argument.
std::optional<std::string> filledWithoutICU(std::string_view pattern, std::span<const FormatArgument> arguments,
                                            std::string_view languageTag);

}  // namespace nimbo
