#include "desktop/strings/SpanishAnd.h"

namespace nimbo {

namespace {

constexpr std::string_view kAndBeforeArgument = " y {";

bool beginsWithSoundOfI(std::string_view text) {
  if (text.starts_with('h') || text.starts_with('H')) text.remove_prefix(1);
  if (text.starts_with("í") || text.starts_with("Í")) return true;
  if (!text.starts_with('i') && !text.starts_with('I')) return false;
  return text.find_first_of("aeouAEOU", 1) != 1;
}

}  // namespace

std::string withSpanishAnd(std::string pattern, std::span<const FormatArgument> arguments) {
  for (std::size_t place = 0; (place = pattern.find(kAndBeforeArgument, place)) != std::string::npos; ++place) {
    const std::size_t number = place + kAndBeforeArgument.size();
    const auto index = number < pattern.size() ? static_cast<std::size_t>(pattern[number] - '0') : arguments.size();
    const auto* text = index < arguments.size() ? std::get_if<std::string>(&arguments[index]) : nullptr;
    if (text && beginsWithSoundOfI(*text)) pattern[place + 1] = 'e';
  }
  return pattern;
}

}  // namespace nimbo
