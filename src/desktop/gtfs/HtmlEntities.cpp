#include "desktop/gtfs/HtmlEntities.h"

#include <algorithm>
#include <array>
#include <charconv>

#include "desktop/gtfs/Utf8.h"

namespace nimbo {

namespace {

// Names of the characters from U+00A0 to U+00FF. Source: https://www.w3.org/TR/html401/sgml/entities.html
constexpr std::array<std::string_view, 96> kLatin1Names = {
    "nbsp",   "iexcl",  "cent",   "pound",  "curren", "yen",    "brvbar", "sect",   "uml",    "copy",   "ordf",
    "laquo",  "not",    "shy",    "reg",    "macr",   "deg",    "plusmn", "sup2",   "sup3",   "acute",  "micro",
    "para",   "middot", "cedil",  "sup1",   "ordm",   "raquo",  "frac14", "frac12", "frac34", "iquest", "Agrave",
    "Aacute", "Acirc",  "Atilde", "Auml",   "Aring",  "AElig",  "Ccedil", "Egrave", "Eacute", "Ecirc",  "Euml",
    "Igrave", "Iacute", "Icirc",  "Iuml",   "ETH",    "Ntilde", "Ograve", "Oacute", "Ocirc",  "Otilde", "Ouml",
    "times",  "Oslash", "Ugrave", "Uacute", "Ucirc",  "Uuml",   "Yacute", "THORN",  "szlig",  "agrave", "aacute",
    "acirc",  "atilde", "auml",   "aring",  "aelig",  "ccedil", "egrave", "eacute", "ecirc",  "euml",   "igrave",
    "iacute", "icirc",  "iuml",   "eth",    "ntilde", "ograve", "oacute", "ocirc",  "otilde", "ouml",   "divide",
    "oslash", "ugrave", "uacute", "ucirc",  "uuml",   "yacute", "thorn",  "yuml"};

struct NamedCharacter {
  std::string_view name;
  char32_t character;
};

// The other names that publishers' editors write: markup, punctuation, arrows, letters beyond Latin-1.
constexpr std::array kOtherNames = std::to_array<NamedCharacter>({
    {"amp", '&'},       {"lt", '<'},        {"gt", '>'},        {"quot", '"'},      {"apos", '\''},
    {"OElig", 0x152},   {"oelig", 0x153},   {"Scaron", 0x160},  {"scaron", 0x161},  {"Yuml", 0x178},
    {"fnof", 0x192},    {"circ", 0x2C6},    {"tilde", 0x2DC},   {"ensp", 0x2002},   {"emsp", 0x2003},
    {"thinsp", 0x2009}, {"zwnj", 0x200C},   {"zwj", 0x200D},    {"lrm", 0x200E},    {"rlm", 0x200F},
    {"ndash", 0x2013},  {"mdash", 0x2014},  {"lsquo", 0x2018},  {"rsquo", 0x2019},  {"sbquo", 0x201A},
    {"ldquo", 0x201C},  {"rdquo", 0x201D},  {"bdquo", 0x201E},  {"dagger", 0x2020}, {"Dagger", 0x2021},
    {"bull", 0x2022},   {"hellip", 0x2026}, {"permil", 0x2030}, {"prime", 0x2032},  {"Prime", 0x2033},
    {"lsaquo", 0x2039}, {"rsaquo", 0x203A}, {"euro", 0x20AC},   {"trade", 0x2122},  {"larr", 0x2190},
    {"uarr", 0x2191},   {"rarr", 0x2192},   {"darr", 0x2193},   {"harr", 0x2194},   {"minus", 0x2212},
    {"ne", 0x2260},     {"le", 0x2264},     {"ge", 0x2265},
});

std::optional<char32_t> characterNamed(std::string_view name) {
  if (const auto found = std::find(kLatin1Names.begin(), kLatin1Names.end(), name); found != kLatin1Names.end())
    return static_cast<char32_t>(0xA0 + (found - kLatin1Names.begin()));
  for (const NamedCharacter& named : kOtherNames)
    if (named.name == name) return named.character;
  return std::nullopt;
}

char32_t characterOfNumber(std::uint32_t number) {
  if (number >= 0x80 && number <= 0x9F) {
    // As the byte of that value: the reading of foreign bytes knows Windows-1252.
    const char byte = static_cast<char>(number);
    std::size_t position = 0;
    return takeCharacter({&byte, 1}, position);
  }
  return number == 0 || number > 0x10FFFF || (number >= 0xD800 && number <= 0xDFFF) ? 0xFFFD : number;
}

}  // namespace

std::optional<HtmlEntity> htmlEntityAt(std::string_view text) {
  constexpr std::size_t kLongest = 16;
  const std::size_t end = text.substr(0, kLongest).find(';');
  if (end == std::string_view::npos || end < 2) return std::nullopt;
  std::string_view body = text.substr(1, end - 1);
  if (body.front() != '#') {
    const auto character = characterNamed(body);
    if (!character) return std::nullopt;
    return HtmlEntity{*character, end + 1};
  }
  body.remove_prefix(1);
  const bool isHexadecimal = !body.empty() && (body.front() == 'x' || body.front() == 'X');
  if (isHexadecimal) body.remove_prefix(1);
  std::uint32_t number = 0;
  const auto [stop, error] = std::from_chars(body.data(), body.data() + body.size(), number, isHexadecimal ? 16 : 10);
  if (body.empty() || stop != body.data() + body.size()) return std::nullopt;
  return HtmlEntity{error == std::errc() ? characterOfNumber(number) : 0xFFFD, end + 1};
}

}  // namespace nimbo
