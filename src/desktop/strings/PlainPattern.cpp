#include "desktop/strings/PlainPattern.h"

#include <algorithm>

namespace nimbo {

namespace {

/// Counts from here on are grouped.
constexpr std::uint64_t kGrouped = 1000;

/// Whether a language calls this count "one", else "other". Absent where it knows more, or may write other digits.
/// Source: https://www.unicode.org/cldr/charts/latest/supplemental/language_plural_rules.html
std::optional<bool> isOne(std::uint64_t count, std::string_view languageTag) {
  const std::string_view language = languageTag.substr(0, languageTag.find('-'));
  const bool choosesDigits = languageTag.find("-u-") != std::string_view::npos;
  if (count >= kGrouped || choosesDigits) return std::nullopt;
  if (language == "en" || language == "de" || language == "es") return count == 1;
  if (language == "fr") return count <= 1;
  if (language == "ja") return false;
  return std::nullopt;
}

/// The text up to the brace that closes the one before `rest`, which begins behind it then. Absent where none does.
std::optional<std::string_view> takeBraced(std::string_view& rest) {
  int depth = 1;
  for (std::size_t at = 0; at < rest.size(); ++at) {
    depth += rest[at] == '{' ? 1 : rest[at] == '}' ? -1 : 0;
    if (depth > 0) continue;
    const std::string_view inside = rest.substr(0, at);
    rest.remove_prefix(at + 1);
    return inside;
  }
  return std::nullopt;
}

void skipSpaces(std::string_view& text) { text.remove_prefix(std::min(text.find_first_not_of(' '), text.size())); }

struct PlainPattern {
  std::span<const FormatArgument> arguments;
  std::string_view languageTag;

  /// `counted` is what "#" stands for.
  std::optional<std::string> fill(std::string_view pattern, std::string_view counted) const {
    std::string text;
    for (std::size_t at; (at = pattern.find_first_of("{}#'")) != std::string_view::npos;) {
      const char sign = pattern[at];
      text += pattern.substr(0, at);
      pattern.remove_prefix(at + 1);
      if (sign == '#') {
        text += counted;
        continue;
      }
      const auto argument = sign == '{' ? takeBraced(pattern) : std::nullopt;
      const auto filled = argument ? fillArgument(*argument) : std::nullopt;
      if (!filled) return std::nullopt;
      text += *filled;
    }
    return text += pattern;
  }

  std::optional<std::string> fillArgument(std::string_view argument) const {
    const auto index = argument.empty() ? arguments.size() : static_cast<std::size_t>(argument.front() - '0');
    if (index >= arguments.size()) return std::nullopt;
    argument.remove_prefix(1);
    const auto* const text = std::get_if<std::string>(&arguments[index]);
    if (text) return argument.empty() ? std::optional(*text) : std::nullopt;
    const auto count = std::get<std::uint64_t>(arguments[index]);
    const std::optional<bool> one = isOne(count, languageTag);
    if (!one) return std::nullopt;
    return argument.empty() ? std::to_string(count) : fillPlural(argument, std::to_string(count), *one);
  }

  std::optional<std::string> fillPlural(std::string_view plural, const std::string& count, bool one) const {
    constexpr std::string_view kBeginning = ", plural,";
    if (!plural.starts_with(kBeginning)) return std::nullopt;
    plural.remove_prefix(kBeginning.size());
    std::optional<std::string_view> exactly, ofCategory, other;
    for (skipSpaces(plural); !plural.empty(); skipSpaces(plural)) {
      const std::string_view selector = plural.substr(0, plural.find_first_of(" {"));
      plural.remove_prefix(selector.size());
      skipSpaces(plural);
      if (!plural.starts_with('{')) return std::nullopt;
      plural.remove_prefix(1);
      const auto text = takeBraced(plural);
      if (!text) return std::nullopt;
      if (selector.starts_with('=') && selector.substr(1) == count) exactly = text;
      if (selector == "one" && one) ofCategory = text;
      if (selector == "other") other = text;
    }
    if (!other) return std::nullopt;
    return fill(exactly ? *exactly : ofCategory.value_or(*other), count);
  }
};

}  // namespace

std::optional<std::string> filledWithoutICU(std::string_view pattern, std::span<const FormatArgument> arguments,
                                            std::string_view languageTag) {
  return PlainPattern{arguments, languageTag}.fill(pattern, "#");
}

}  // namespace nimbo
