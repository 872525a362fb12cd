#include "desktop/gtfs/text/Html.h"

#include <algorithm>
#include <array>
#include <charconv>

#include "desktop/gtfs/text/Utf8.h"
#include "desktop/resources/Resources.h"

namespace nimbo {

namespace {

using enum HtmlTagEffect;

struct Element {
  std::string_view name;
  HtmlTagEffect effect;
};

// Sorted by name. Source: https://html.spec.whatwg.org/multipage/indices.html#elements-3, and the obsolete ones that
// editors still write.
constexpr std::array kElements = std::to_array<Element>({
    {"a", none},        {"abbr", none},     {"address", block},    {"article", block}, {"aside", block},
    {"b", none},        {"big", none},      {"blockquote", block}, {"body", block},    {"br", lineBreak},
    {"button", none},   {"caption", block}, {"center", block},     {"cite", none},     {"code", none},
    {"col", none},      {"colgroup", none}, {"dd", block},         {"del", none},      {"details", block},
    {"div", block},     {"dl", block},      {"dt", block},         {"em", none},       {"figure", block},
    {"font", none},     {"footer", block},  {"form", block},       {"h1", block},      {"h2", block},
    {"h3", block},      {"h4", block},      {"h5", block},         {"h6", block},      {"head", block},
    {"header", block},  {"hr", block},      {"html", block},       {"i", none},        {"iframe", none},
    {"img", none},      {"input", none},    {"ins", none},         {"kbd", none},      {"label", none},
    {"li", block},      {"link", none},     {"main", block},       {"mark", none},     {"meta", none},
    {"nav", block},     {"o:p", none},      {"ol", block},         {"p", block},       {"picture", none},
    {"pre", block},     {"q", none},        {"s", none},           {"samp", none},     {"script", none},
    {"section", block}, {"small", none},    {"source", none},      {"span", none},     {"strike", none},
    {"strong", none},   {"style", none},    {"sub", none},         {"summary", block}, {"sup", none},
    {"svg", none},      {"table", block},   {"tbody", block},      {"td", space},      {"tfoot", block},
    {"th", space},      {"thead", block},   {"time", none},        {"title", block},   {"tr", block},
    {"tt", none},       {"u", none},        {"ul", block},         {"var", none},      {"video", none},
    {"wbr", none},
});

constexpr std::size_t kLongestName = 16;  // bytes, "</" with them

bool isNameCharacter(char c) {
  return (c >= 'a' && c <= 'z') || (c >= 'A' && c <= 'Z') || (c >= '0' && c <= '9') || c == ':';
}

/// Bytes up to and with `end`, or all of them.
std::size_t lengthThrough(std::string_view text, std::string_view end) {
  const std::size_t position = text.find(end);
  return position == std::string_view::npos ? text.size() : position + end.size();
}

/// Where the tag ends, which it does, a ">" in a quoted attribute apart.
std::size_t lengthOfTag(std::string_view text) {
  char quote = 0;
  for (std::size_t i = 1; i < text.size(); ++i) {
    const char c = text[i];
    if (quote) {
      if (c == quote) quote = 0;
    } else if (c == '>') {
      return i + 1;
    } else if ((c == '"' || c == '\'') && text[i - 1] == '=') {
      quote = c;
    }
  }
  // A quotation mark that never closes must not swallow the rest.
  return lengthThrough(text, ">");
}

}  // namespace

std::optional<HtmlTag> HtmlTagFinder::tagAt(std::size_t position) const {
  const std::string_view text = _text.substr(position);
  if (text.starts_with("<!--")) return HtmlTag{none, lengthThrough(text, "-->")};
  if (text.starts_with("<!DOCTYPE") || text.starts_with("<!doctype") || text.starts_with("<?xml"))
    return HtmlTag{block, lengthThrough(text, ">")};
  const bool isClosing = text.starts_with("</");
  const std::size_t begin = isClosing ? 2 : 1;
  std::size_t end = begin;
  while (end < text.size() && end < kLongestName && isNameCharacter(text[end])) ++end;
  if (end < text.size() && text[end] != '>' && text[end] != '/' && static_cast<unsigned char>(text[end]) > ' ')
    return std::nullopt;
  const std::string name = asciiLowerCase(text.substr(begin, end - begin));
  const auto element = std::lower_bound(kElements.begin(), kElements.end(), name,
                                        [](const Element& a, std::string_view b) { return a.name < b; });
  if (element == kElements.end() || element->name != name) return std::nullopt;
  if (_lastEnd == std::string_view::npos || _lastEnd < position) {
    // Cut off: after the name or within attributes. "Track <a or b" is neither.
    const bool hasAttributes = _lastEquals != std::string_view::npos && _lastEquals > position;
    if (end < text.size() && !hasAttributes) return std::nullopt;
    return HtmlTag{element->effect, text.size()};
  }
  std::size_t length = lengthOfTag(text);
  if (!isClosing && (name == "script" || name == "style")) {
    length += lengthThrough(text.substr(length), "</" + name);
    length += lengthThrough(text.substr(length), ">");
  }
  return HtmlTag{element->effect, length};
}

namespace {

/// The line of the list that begins with the name: "ecaron 11B". Empty when there is none.
std::string_view lineOfName(std::string_view name) {
  // Sorted by bytes, so that it is searched in place: nothing is built, nothing is read before the first name.
  static const std::string_view list = resourceNamed("alerts/named-characters.txt").value();
  for (std::size_t begin = 0, end = list.size(); begin < end;) {
    const std::size_t middle = begin + (end - begin) / 2;
    const std::size_t before = list.substr(begin, middle - begin).rfind('\n');
    const std::size_t lineBegin = before == std::string_view::npos ? begin : begin + before + 1;
    const std::size_t lineEnd = list.find('\n', middle);
    const std::string_view line = list.substr(lineBegin, lineEnd - lineBegin);
    const int order = line.substr(0, line.find(' ')).compare(name);
    if (order == 0) return line;
    if (order < 0)
      begin = lineEnd + 1;
    else
      end = lineBegin;
  }
  return {};
}

std::optional<HtmlEntity> entityNamed(std::string_view name) {
  std::string_view line = lineOfName(name);
  if (line.empty()) return std::nullopt;
  HtmlEntity entity{};
  for (char32_t* const character : {&entity.character, &entity.second}) {
    line.remove_prefix(std::min(line.find(' '), line.size() - 1) + 1);
    std::uint32_t number = 0;
    line.remove_prefix(std::from_chars(line.data(), line.data() + line.size(), number, 16).ptr - line.data());
    *character = number;
  }
  entity.length = name.size() + 2;
  return entity;
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
  constexpr std::size_t kLongest = std::string_view("&CounterClockwiseContourIntegral;").size();
  const std::size_t end = text.substr(0, kLongest).find(';');
  if (end == std::string_view::npos || end < 2) return std::nullopt;
  std::string_view body = text.substr(1, end - 1);
  if (body.front() != '#') return entityNamed(body);
  body.remove_prefix(1);
  const bool isHexadecimal = !body.empty() && (body.front() == 'x' || body.front() == 'X');
  if (isHexadecimal) body.remove_prefix(1);
  std::uint32_t number = 0;
  const auto [stop, error] = std::from_chars(body.data(), body.data() + body.size(), number, isHexadecimal ? 16 : 10);
  if (body.empty() || stop != body.data() + body.size()) return std::nullopt;
  return HtmlEntity{error == std::errc() ? characterOfNumber(number) : 0xFFFD, 0, end + 1};
}

}  // namespace nimbo
