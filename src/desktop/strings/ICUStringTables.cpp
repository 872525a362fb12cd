#include "desktop/strings/ICUStringTables.h"

#include <unicode/locid.h>
#include <unicode/msgfmt.h>

#include <algorithm>
#include <nlohmann/json.hpp>
#include <stdexcept>
#include <unordered_map>

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

/// Puts texts into a pattern of texts and "{0}" alone; absent when the pattern asks for more.
std::optional<std::string> fillTexts(std::string_view pattern, std::span<const FormatArgument> arguments) {
  std::string filled;
  for (std::size_t i = 0; i < pattern.size(); ++i) {
    if (pattern[i] == '\'' || pattern[i] == '}') return std::nullopt;
    if (pattern[i] != '{') {
      filled += pattern[i];
      continue;
    }
    if (i + 2 >= pattern.size() || pattern[i + 2] != '}') return std::nullopt;
    const auto index = static_cast<std::size_t>(pattern[i + 1] - '0');
    const std::string* text = index < arguments.size() ? std::get_if<std::string>(&arguments[index]) : nullptr;
    if (!text) return std::nullopt;
    filled += *text;
    i += 2;
  }
  return filled;
}

}  // namespace

/// What ICU made of the patterns so far. It is not asked for anything before there is one that needs it: that saves 0.8
/// MiB where there is none.
struct ICUStringTables::Formats {
  std::string tag;
  std::optional<icu::Locale> locale;
  std::unordered_map<std::string, std::unique_ptr<icu::MessageFormat>> byPattern;
};

std::optional<ICUStringTables::Table> ICUStringTables::tableNamed(std::string_view name) {
  const auto bytes = resourceNamed("strings/" + std::string(name) + ".json");
  if (!bytes) return std::nullopt;
  try {
    return nlohmann::json::parse(*bytes).get<Table>();
  } catch (const nlohmann::json::exception& exception) {
    throw std::logic_error("string table " + std::string(name) + ": " + exception.what());
  }
}

ICUStringTables::ICUStringTables(std::string_view locale)
    : _english(tableNamed(kFallbackLanguage).value_or(Table())), _formats(std::make_unique<Formats>()) {
  const std::string tag = tagOfLocale(locale);
  std::optional<Table> table;
  for (std::string_view name = tag; !table && !name.empty();) {
    table = name == kFallbackLanguage ? Table() : tableNamed(name);  // English is behind every table
    const std::size_t dash = name.rfind('-');
    name = name.substr(0, dash == std::string_view::npos ? 0 : dash);
  }
  _formats->tag = table ? tag : std::string(kFallbackLanguage);
  if (table) _table = std::move(*table);
  _isRightToLeft = stringForKey("TransitWidget_Text_Direction") == "rtl";
}

ICUStringTables::~ICUStringTables() = default;

std::optional<std::string> ICUStringTables::stringForKey(std::string_view key) const {
  for (const Table* table : {&_table, &_english})
    if (const auto found = table->find(key); found != table->end()) return found->second;
  return std::nullopt;
}

std::string ICUStringTables::format(const std::string& pattern, std::span<const FormatArgument> arguments) const {
  if (auto filled = fillTexts(pattern, arguments)) return *filled;
  return formatWithICU(pattern, arguments);
}

std::string ICUStringTables::formatWithICU(const std::string& pattern,
                                           std::span<const FormatArgument> arguments) const {
  UErrorCode status = U_ZERO_ERROR;
  if (!_formats->locale) _formats->locale = icu::Locale::forLanguageTag(_formats->tag, status);
  std::unique_ptr<icu::MessageFormat>& format = _formats->byPattern[pattern];
  if (!format)
    format = std::make_unique<icu::MessageFormat>(icu::UnicodeString::fromUTF8(pattern), *_formats->locale, status);
  std::vector<icu::Formattable> values;
  for (const FormatArgument& argument : arguments) {
    if (const auto* text = std::get_if<std::string>(&argument))
      values.emplace_back(icu::UnicodeString::fromUTF8(*text));
    else
      values.emplace_back(icu::StringPiece(std::to_string(std::get<std::uint64_t>(argument))), status);
  }
  icu::UnicodeString filled;
  icu::FieldPosition position;
  format->format(values.data(), static_cast<std::int32_t>(values.size()), filled, position, status);
  if (U_FAILURE(status)) {
    _formats->byPattern.erase(pattern);
    writeLog({kDefaultLogSubsystem, "StringTables"}, LogLevel::error, "Unable to fill the pattern %@: %@",
             {pattern, u_errorName(status)});
    return pattern;
  }
  std::string text;
  return filled.toUTF8String(text);
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
