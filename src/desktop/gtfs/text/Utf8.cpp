#include "desktop/gtfs/text/Utf8.h"

#include <algorithm>
#include <array>

namespace nimbo {

namespace {

// 0x80 to 0x9F of Windows-1252; 0 where it has none. Source: https://encoding.spec.whatwg.org/index-windows-1252.txt
constexpr std::array<char16_t, 32> kWindows1252 = {0x20AC, 0,      0x201A, 0x0192, 0x201E, 0x2026, 0x2020, 0x2021,
                                                   0x02C6, 0x2030, 0x0160, 0x2039, 0x0152, 0,      0x017D, 0,
                                                   0,      0x2018, 0x2019, 0x201C, 0x201D, 0x2022, 0x2013, 0x2014,
                                                   0x02DC, 0x2122, 0x0161, 0x203A, 0x0153, 0,      0x017E, 0x0178};

unsigned byteAt(std::string_view text, std::size_t position) { return static_cast<unsigned char>(text[position]); }

}  // namespace

char32_t takeCharacter(std::string_view text, std::size_t& position) {
  const unsigned first = byteAt(text, position++);
  if (first < 0x80) return first;
  const std::size_t following = first >= 0xF0 ? 3 : first >= 0xE0 ? 2 : 1;
  if (first >= 0xC2 && first <= 0xF4 && position + following <= text.size()) {
    char32_t character = first & (0x3Fu >> following);
    bool valid = true;
    for (std::size_t i = 0; i < following; ++i) {
      const unsigned byte = byteAt(text, position + i);
      valid = valid && (byte & 0xC0) == 0x80;
      character = (character << 6) | (byte & 0x3F);
    }
    constexpr std::array<char32_t, 4> kLeast = {0, 0x80, 0x800, 0x10000};
    const bool isSurrogate = character >= 0xD800 && character <= 0xDFFF;
    if (valid && character >= kLeast[following] && character <= 0x10FFFF && !isSurrogate) {
      position += following;
      return character;
    }
  }
  if (first >= 0xA0) return first;
  const char32_t character = kWindows1252[first - 0x80];
  return character ? character : 0xFFFD;
}

void appendCharacter(std::string& text, char32_t character) {
  if (character > 0x10FFFF || (character >= 0xD800 && character <= 0xDFFF)) character = 0xFFFD;
  const auto byte = [&](char32_t value) { text.push_back(static_cast<char>(value)); };
  if (character < 0x80) {
    byte(character);
    return;
  }
  if (character < 0x800) {
    byte(0xC0 | (character >> 6));
  } else {
    if (character < 0x10000) {
      byte(0xE0 | (character >> 12));
    } else {
      byte(0xF0 | (character >> 18));
      byte(0x80 | ((character >> 12) & 0x3F));
    }
    byte(0x80 | ((character >> 6) & 0x3F));
  }
  byte(0x80 | (character & 0x3F));
}

std::string validUtf8(std::string_view text) {
  std::string result;
  result.reserve(text.size());
  for (std::size_t position = 0; position < text.size();) appendCharacter(result, takeCharacter(text, position));
  return result;
}

std::string_view firstCharacters(std::string_view text, std::size_t count) {
  std::size_t position = 0;
  for (; count > 0 && position < text.size(); --count) takeCharacter(text, position);
  return text.substr(0, position);
}

bool isWhiteSpace(char32_t character) {
  return character == ' ' || (character >= 0x09 && character <= 0x0D) || character == 0x85 || character == 0xA0 ||
         character == 0x1680 || (character >= 0x2000 && character <= 0x200A) || character == 0x2028 ||
         character == 0x2029 || character == 0x202F || character == 0x205F || character == 0x3000;
}

std::string_view trimmed(std::string_view text) {
  constexpr std::string_view kBlanks = " \t\r\n\f\v";
  const std::size_t begin = text.find_first_not_of(kBlanks);
  if (begin == std::string_view::npos) return {};
  return text.substr(begin, text.find_last_not_of(kBlanks) - begin + 1);
}

std::string asciiLowerCase(std::string_view text) {
  std::string result(text);
  std::transform(result.begin(), result.end(), result.begin(),
                 [](char c) { return c >= 'A' && c <= 'Z' ? static_cast<char>(c - 'A' + 'a') : c; });
  return result;
}

}  // namespace nimbo
