#include "desktop/gtfs/HtmlEntities.h"

#include <algorithm>
#include <charconv>

#include "desktop/gtfs/Utf8.h"
#include "desktop/resources/Resources.h"

namespace nimbo {

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
