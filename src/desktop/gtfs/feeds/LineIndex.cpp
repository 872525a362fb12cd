#include "desktop/gtfs/feeds/LineIndex.h"

#include <algorithm>
#include <array>

#include "desktop/gtfs/text/Utf8.h"
#include "desktop/strings/SearchKey.h"

namespace nimbo {

namespace {

/// Characters of a text that are compared.
constexpr std::size_t kLongestText = 500;

std::string keyOf(std::string_view text) { return searchKey(firstCharacters(text, kLongestText)); }

// How far a line is that has a word here.
constexpr unsigned kIsShortName = 0, kBeginsName = 1, kBeginsWord = 2, kInName = 3, kInAgency = 4, kInRouteID = 5;

/// Letters and digits; beyond ASCII all but the dashes and quotation marks of U+2000 to U+203F.
bool isBetweenWords(std::string_view text, std::size_t position) {
  const auto byte = static_cast<unsigned char>(text[position]);
  if (byte < 0x80) return !std::isalnum(byte);
  return position >= 2 && text.substr(position - 2, 2) == "\xE2\x80";
}

/// Whether a word of the text begins with this one; absent when the text does not hold it.
std::optional<bool> beginsWord(std::string_view text, std::string_view word) {
  std::optional<bool> found;
  for (std::size_t at = text.find(word); at != std::string_view::npos; at = text.find(word, at + 1)) {
    if (at == 0 || isBetweenWords(text, at - 1)) return true;
    found = false;
  }
  return found;
}

}  // namespace

LineSearch::LineSearch(std::string_view text) : _key(keyOf(trimmed(text))) {
  for (std::string_view rest = _key; !(rest = trimmed(rest)).empty();) {
    const std::size_t end = std::min(rest.find(' '), rest.size());
    _words.emplace_back(rest.substr(0, end));
    rest.remove_prefix(end);
  }
}

LineIndex::LineIndex(const StaticFeed& feed, std::string_view feedName) : _feedKey(keyOf(feedName) + ":") {
  _agencies.reserve(feed.agencyCount());
  for (std::size_t i = 0; i < feed.agencyCount(); ++i) _agencies.push_back(keyOf(feed.agency(i).name));
  _lines.reserve(feed.lineCount());
  const auto place = [this] { return static_cast<std::uint32_t>(_keys.size()); };
  for (std::size_t i = 0; i < feed.lineCount(); ++i) {
    const StaticLine line = feed.line(i);
    Line& added = _lines.emplace_back();
    added.begin = place();
    _keys += keyOf(line.shortName);
    added.longName = place();
    _keys += keyOf(line.longName);
    added.routeID = place();
    _keys += keyOf(line.routeID);
    added.end = place();
    added.agency = line.agency;
    added.isFindable =
        line.routeID.size() + line.shortName.size() + feed.agency(line.agency).id.size() <= kLongestIdentifiers;
  }
  _keys.shrink_to_fit();
}

std::optional<unsigned> LineIndex::distance(const LineSearch& search, std::size_t index) const {
  const Line& line = _lines[index];
  if (!line.isFindable) return std::nullopt;
  const auto part = [this](std::uint32_t begin, std::uint32_t end) {
    return std::string_view(_keys).substr(begin, end - begin);
  };
  const std::string_view shortName = part(line.begin, line.longName), longName = part(line.longName, line.routeID),
                         routeID = part(line.routeID, line.end);
  const std::string_view whole = search._key;
  if (whole == shortName) return kIsShortName;
  if (whole.starts_with(_feedKey) && routeID.starts_with(whole.substr(_feedKey.size())))
    return routeID.size() + _feedKey.size() == whole.size() ? kIsShortName : kBeginsName;
  if (!whole.empty() && (shortName.starts_with(whole) || longName.starts_with(whole))) return kBeginsName;
  const auto distanceOf = [&](const std::string& word) -> std::optional<unsigned> {
    if (word == shortName) return kIsShortName;
    if (shortName.starts_with(word) || longName.starts_with(word)) return kBeginsName;
    const auto inShort = beginsWord(shortName, word), inLong = beginsWord(longName, word);
    if (inShort.value_or(false) || inLong.value_or(false)) return kBeginsWord;
    if (inShort || inLong) return kInName;
    if (line.agency < _agencies.size() && _agencies[line.agency].find(word) != std::string::npos) return kInAgency;
    if (routeID.find(word) != std::string_view::npos) return kInRouteID;
    return std::nullopt;
  };
  unsigned sum = 0;
  for (const std::string& word : search._words) {
    const auto distance = distanceOf(word);
    if (!distance) return std::nullopt;
    // Several words are never the short name alone.
    sum += *distance;
  }
  return search._words.size() > 1 ? sum + kBeginsName : sum;
}

}  // namespace nimbo
