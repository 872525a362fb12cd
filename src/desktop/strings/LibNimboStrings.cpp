// libnimbo-strings.so: what StringsPart.h declares.

#include <unicode/datefmt.h>
#include <unicode/msgfmt.h>

#include <map>
#include <stdexcept>
#include <vector>

#include "desktop/strings/StringsPart.h"

namespace nimbo {

namespace {

void check(UErrorCode status) {
  if (U_FAILURE(status)) throw std::runtime_error(u_errorName(status));
}

std::string utf8(const icu::UnicodeString& text) {
  std::string bytes;
  return text.toUTF8String(bytes);
}

class ICUPatternFormat final : public PatternFormat {
 public:
  explicit ICUPatternFormat(const std::string& languageTag) {
    UErrorCode status = U_ZERO_ERROR;
    _locale = icu::Locale::forLanguageTag(languageTag, status);
    check(status);
  }

  std::string fill(const std::string& pattern, std::span<const FormatArgument> arguments) override {
    const icu::MessageFormat& format = formatOf(pattern);
    UErrorCode status = U_ZERO_ERROR;
    std::vector<icu::Formattable> values;
    for (const FormatArgument& argument : arguments) {
      if (const auto* count = std::get_if<std::uint64_t>(&argument))
        values.emplace_back(icu::StringPiece(std::to_string(*count)), status);  // its integers have a sign
      else
        values.emplace_back(icu::UnicodeString::fromUTF8(std::get<std::string>(argument)));
    }
    icu::UnicodeString text;
    icu::FieldPosition everywhere;
    format.format(values.data(), static_cast<std::int32_t>(values.size()), text, everywhere, status);
    check(status);
    return utf8(text);
  }

 private:
  const icu::MessageFormat& formatOf(const std::string& pattern) {
    if (const auto kept = _formats.find(pattern); kept != _formats.end()) return kept->second;
    UErrorCode status = U_ZERO_ERROR;
    const icu::MessageFormat format(icu::UnicodeString::fromUTF8(pattern), _locale, status);
    check(status);
    return _formats.emplace(pattern, format).first->second;
  }

  icu::Locale _locale;
  std::map<std::string, icu::MessageFormat> _formats;
};

class ICUDateFormat final : public DateFormat {
 public:
  explicit ICUDateFormat(std::unique_ptr<icu::DateFormat> format) : _format(std::move(format)) {}

  std::string textOf(Date date) const override {
    icu::UnicodeString text;
    return utf8(_format->format(static_cast<UDate>(date.time_since_epoch().count()) / 1000, text));
  }

 private:
  std::unique_ptr<icu::DateFormat> _format;
};

class ICUStrings final : public StringsPart {
  std::unique_ptr<PatternFormat> makePatternFormat(const std::string& languageTag) override {
    return std::make_unique<ICUPatternFormat>(languageTag);
  }
  std::unique_ptr<DateFormat> makeDateFormat(const std::string& locale) override {
    std::unique_ptr<icu::DateFormat> format(icu::DateFormat::createDateTimeInstance(
        icu::DateFormat::kLongRelative, icu::DateFormat::kShort, icu::Locale::createCanonical(locale.c_str())));
    if (!format) return nullptr;
    UErrorCode status = U_ZERO_ERROR;
    format->setContext(UDISPCTX_CAPITALIZATION_FOR_MIDDLE_OF_SENTENCE, status);
    return std::make_unique<ICUDateFormat>(std::move(format));
  }
};

}  // namespace

}  // namespace nimbo

extern "C" nimbo::StringsPart* nimbo_strings() {
  static nimbo::ICUStrings part;
  return &part;
}
