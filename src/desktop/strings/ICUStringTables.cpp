#include "desktop/strings/ICUStringTables.h"

#include <algorithm>
#include <nlohmann/json.hpp>
#include <stdexcept>

#include "desktop/resources/Resources.h"
#include "desktop/strings/Isolation.h"
#include "desktop/strings/PlainPattern.h"
#include "desktop/strings/SpanishAnd.h"
#include "platform/foundation/Log.h"

namespace nimbo {

namespace {

constexpr std::string_view kFallbackLanguage = "en";

/// A text that would change the order of a pattern that does not isolate it.
bool needsIsolation(const FormatArgument& argument) {
  const auto* text = std::get_if<std::string>(&argument);
  return text && hasRightToLeftLetters(*text);
}

/// A POSIX name or a tag as a tag, its language in lower case; empty for "C" and "POSIX".
std::string tagOfLocale(std::string_view locale) {
  std::string tag(locale.substr(0, locale.find_first_of(".@")));
  if (tag == "C" || tag == "POSIX") return {};
  std::replace(tag.begin(), tag.end(), '_', '-');
  const auto languageEnd = tag.begin() + static_cast<std::ptrdiff_t>(std::min(tag.find('-'), tag.size()));
  std::transform(tag.begin(), languageEnd, tag.begin(),
                 [](char c) { return c >= 'A' && c <= 'Z' ? static_cast<char>(c - 'A' + 'a') : c; });
  return tag;
}

std::string fileOfTable(std::string_view name) { return "strings/" + std::string(name) + ".json"; }

/// The table of a tag, or of the tag with its last subtags left out; empty where there is none.
std::string_view nameOfTable(std::string_view tag) {
  while (!tag.empty() && !resourceNamed(fileOfTable(tag))) {
    const std::size_t dash = tag.rfind('-');
    tag = tag.substr(0, dash == std::string_view::npos ? 0 : dash);
  }
  return tag;
}

}  // namespace

bool ICUStringTables::speak(std::string_view locale) { return !nameOfTable(tagOfLocale(locale)).empty(); }

std::optional<ICUStringTables::Table> ICUStringTables::tableNamed(std::string_view name) {
  const auto bytes = resourceNamed(fileOfTable(name));
  if (!bytes) return std::nullopt;
  try {
    return nlohmann::json::parse(*bytes).get<Table>();
  } catch (const nlohmann::json::exception& exception) {
    throw std::logic_error("string table " + std::string(name) + ": " + exception.what());
  }
}

ICUStringTables::ICUStringTables(std::string_view locale) : _english(tableNamed(kFallbackLanguage).value_or(Table())) {
  const std::string tag = tagOfLocale(locale);
  const std::string_view name = nameOfTable(tag);
  if (!name.empty() && name != kFallbackLanguage) _table = *tableNamed(name);  // English is behind every table
  _languageTag = name.empty() ? std::string(kFallbackLanguage) : tag;
  _isSpanish = name == "es";
  _isRightToLeft = stringForKey("TransitWidget_Text_Direction") == "rtl";
}

std::optional<std::string> ICUStringTables::stringForKey(std::string_view key) const {
  for (const Table* table : {&_table, &_english})
    if (const auto found = table->find(key); found != table->end()) return found->second;
  return std::nullopt;
}

std::string ICUStringTables::format(const std::string& pattern, std::span<const FormatArgument> arguments) const {
  std::vector<FormatArgument> keptApart;
  if (std::any_of(arguments.begin(), arguments.end(), needsIsolation) && pattern.find("\u2068") == std::string::npos) {
    keptApart.assign(arguments.begin(), arguments.end());
    for (FormatArgument& argument : keptApart)
      if (needsIsolation(argument)) argument = isolated(std::get<std::string>(argument));
    arguments = keptApart;
  }
  const std::string spoken = _isSpanish ? withSpanishAnd(pattern, arguments) : pattern;
  if (auto text = filledWithoutICU(spoken, arguments, _languageTag)) return *std::move(text);
  try {
    if (!_format) _format = stringsPart().makePatternFormat(_languageTag);
    return _format->fill(spoken, arguments);
  } catch (const std::runtime_error& failure) {
    writeLog({kDefaultLogSubsystem, "StringTables"}, LogLevel::error, "Unable to fill the pattern %@: %@",
             {pattern, failure.what()});
    return pattern;
  }
}

std::string ICUStringTables::commaDelimitedList(const std::vector<std::string>& texts) const {
  const std::string separator = stringForKey("TransitWidget_Names_List_Separator").value_or(", ");
  std::string list;
  for (const std::string& text : texts) {
    if (&text != texts.data()) list += separator;
    list += _isRightToLeft || hasRightToLeftLetters(text) ? isolated(text) : text;
  }
  return list;
}

}  // namespace nimbo
