#include "desktop/strings/ICUStringTables.h"

#include <algorithm>
#include <nlohmann/json.hpp>
#include <stdexcept>

#include "desktop/resources/Resources.h"
#include "platform/foundation/Log.h"

namespace nimbo {

namespace {

constexpr std::string_view kFallbackLanguage = "en";
constexpr std::string_view kFirstStrongIsolate = "\u2068";
constexpr std::string_view kPopDirectionalIsolate = "\u2069";

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

}  // namespace

std::optional<ICUStringTables::Table> ICUStringTables::tableNamed(std::string_view name) {
  const auto bytes = resourceNamed("strings/" + std::string(name) + ".json");
  if (!bytes) return std::nullopt;
  try {
    return nlohmann::json::parse(*bytes).get<Table>();
  } catch (const nlohmann::json::exception& exception) {
    throw std::logic_error("string table " + std::string(name) + ": " + exception.what());
  }
}

ICUStringTables::ICUStringTables(std::string_view locale) : _english(tableNamed(kFallbackLanguage).value_or(Table())) {
  const std::string tag = tagOfLocale(locale);
  std::optional<Table> table;
  for (std::string_view name = tag; !table && !name.empty();) {
    table = name == kFallbackLanguage ? Table() : tableNamed(name);  // English is behind every table
    const std::size_t dash = name.rfind('-');
    name = name.substr(0, dash == std::string_view::npos ? 0 : dash);
  }
  _languageTag = table ? tag : std::string(kFallbackLanguage);
  if (table) _table = std::move(*table);
  _isRightToLeft = stringForKey("TransitWidget_Text_Direction") == "rtl";
}

std::optional<std::string> ICUStringTables::stringForKey(std::string_view key) const {
  for (const Table* table : {&_table, &_english})
    if (const auto found = table->find(key); found != table->end()) return found->second;
  return std::nullopt;
}

std::string ICUStringTables::format(const std::string& pattern, std::span<const FormatArgument> arguments) const {
  try {
    if (!_format) _format = stringsPart().makePatternFormat(_languageTag);
    return _format->fill(pattern, arguments);
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
    if (_isRightToLeft)
      list.append(kFirstStrongIsolate).append(text).append(kPopDirectionalIsolate);
    else
      list += text;
  }
  return list;
}

}  // namespace nimbo
