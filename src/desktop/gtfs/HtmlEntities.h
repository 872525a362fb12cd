#pragma once

#include <cstddef>
#include <optional>
#include <string_view>

namespace nimbo {

/// A character reference as found in a text.
struct HtmlEntity {
  char32_t character;
  std::size_t length;  ///< bytes from "&" on, the ";" with them
};

/// The character reference at the start of `text`, which begins with "&": numeric ("&#233;", "&#xE9;") or by one of the
/// names of HTML 4. Absent when it is none: the "&" then stands for itself. Browsers' forgiving readings are followed:
/// numbers 128 to 159 are Windows-1252, and numbers that no character has give U+FFFD.
/// Source: https://html.spec.whatwg.org/multipage/parsing.html#numeric-character-reference-end-state
std::optional<HtmlEntity> htmlEntityAt(std::string_view text);

}  // namespace nimbo
