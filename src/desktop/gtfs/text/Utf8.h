#pragma once

#include <cstddef>
#include <string>
#include <string_view>

namespace nimbo {

// UTF-8 text, character by character. Source: RFC 3629.

/// The character at `position`, which moves past it. A byte that is no UTF-8 is taken for Windows-1252, in which old
/// feeds are written: nothing is lost and nothing fails. `position` is less than the text's size.
char32_t takeCharacter(std::string_view text, std::size_t& position);

/// Appends a character; one that UTF-8 cannot hold becomes U+FFFD.
void appendCharacter(std::string& text, char32_t character);

/// `text` with its foreign bytes turned into UTF-8.
std::string validUtf8(std::string_view text);

/// The first `count` characters of a text.
std::string_view firstCharacters(std::string_view text, std::size_t count);

/// Whether the character is white space of any script, a no-break space among them.
bool isWhiteSpace(char32_t character);

/// `text` without ASCII white space at its ends.
std::string_view trimmed(std::string_view text);

/// The text with the letters A to Z in lower case.
std::string asciiLowerCase(std::string_view text);

}  // namespace nimbo
