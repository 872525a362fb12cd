#pragma once

#include <cstddef>
#include <optional>
#include <string_view>

namespace nimbo {

/// A character reference as found in a text.
struct HtmlEntity {
  char32_t character;
  char32_t second;     ///< of a name for two characters; 0 for most
  std::size_t length;  ///< bytes from "&" on, the ";" with them
};

/// The character reference at the start of `text`, which begins with "&": numeric ("&#233;", "&#xE9;") or by one of the
/// 2125 names of HTML 5 that end in ";". Absent when it is none: the "&" then stands for itself. Browsers' forgiving
/// readings are followed: numbers 128 to 159 are Windows-1252, and numbers that no character has give U+FFFD. Sources:
/// https://html.spec.whatwg.org/multipage/parsing.html#numeric-character-reference-end-state,
/// https://html.spec.whatwg.org/multipage/named-characters.html
std::optional<HtmlEntity> htmlEntityAt(std::string_view text);

}  // namespace nimbo
