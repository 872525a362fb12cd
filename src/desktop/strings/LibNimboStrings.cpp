// libnimbo-strings.so: what StringsPart.h declares.

#include <unicode/brkiter.h>
#include <unicode/coll.h>
#include <unicode/datefmt.h>
#include <unicode/msgfmt.h>
#include <unicode/normalizer2.h>
#include <unicode/utext.h>

#include <algorithm>
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
    UErrorCode status = U_ZERO_ERROR;
    const icu::MessageFormat format(icu::UnicodeString::fromUTF8(pattern), _locale, status);
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
  icu::Locale _locale;
};

class ICUDateFormat final : public DateFormat {
 public:
  /// Neither is null.
  ICUDateFormat(std::unique_ptr<icu::DateFormat> format, std::unique_ptr<icu::DateFormat> day)
      : _format(std::move(format)), _day(std::move(day)) {}

  std::string textOf(Date date, Place place) override {
    UErrorCode ignored = U_ZERO_ERROR;  // the date is right in any context
    _format->setContext(place == Place::beginning ? UDISPCTX_CAPITALIZATION_FOR_BEGINNING_OF_SENTENCE
                                                  : UDISPCTX_CAPITALIZATION_FOR_MIDDLE_OF_SENTENCE,
                        ignored);
    icu::UnicodeString text;
    return utf8(_format->format(udate(date), text));
  }

  std::string dayOf(Date date) override {
    UErrorCode ignored = U_ZERO_ERROR;  // as above
    _day->setContext(UDISPCTX_CAPITALIZATION_FOR_BEGINNING_OF_SENTENCE, ignored);
    icu::UnicodeString text;
    return utf8(_day->format(udate(date), text));
  }

 private:
  static UDate udate(Date date) { return static_cast<UDate>(date.time_since_epoch().count()) / 1000; }

  std::unique_ptr<icu::DateFormat> _format, _day;
};

/// Latin letters whose stroke or missing dot Unicode does not take for an accent.
std::u16string_view plainLetter(UChar32 letter) {
  switch (letter) {
    case u'æ':
      return u"ae";
    case u'đ':
      return u"d";
    case u'ħ':
      return u"h";
    case u'ı':
      return u"i";
    case u'ł':
      return u"l";
    case u'ø':
      return u"o";
    case u'œ':
      return u"oe";
    case u'ŧ':
      return u"t";
    default:
      return {};
  }
}

/// Marks of the lower classes make another letter of the one before them (Kana, Indic scripts).
bool isAccent(UChar32 character) {
  constexpr std::uint8_t kLeastClass = 10;
  return u_getCombiningClass(character) >= kLeastClass && u_hasBinaryProperty(character, UCHAR_DIACRITIC);
}

class ICUStrings final : public StringsPart {
  std::unique_ptr<PatternFormat> makePatternFormat(const std::string& languageTag) override {
    return std::make_unique<ICUPatternFormat>(languageTag);
  }
  std::unique_ptr<DateFormat> makeDateFormat(const std::string& locale) override {
    std::unique_ptr<icu::DateFormat> format(icu::DateFormat::createDateTimeInstance(
        icu::DateFormat::kLongRelative, icu::DateFormat::kShort, icu::Locale::createCanonical(locale.c_str())));
    std::unique_ptr<icu::DateFormat> day(
        icu::DateFormat::createDateInstance(icu::DateFormat::kFull, icu::Locale::createCanonical(locale.c_str())));
    if (!format || !day) return nullptr;
    return std::make_unique<ICUDateFormat>(std::move(format), std::move(day));
  }
  std::size_t clusterBoundary(std::string_view text, std::size_t position) override {
    UErrorCode status = U_ZERO_ERROR;
    UText bytes = UTEXT_INITIALIZER;
    utext_openUTF8(&bytes, text.data(), static_cast<std::int64_t>(text.size()), &status);
    const std::unique_ptr<UText, void (*)(UText*)> closed(&bytes, [](UText* opened) { utext_close(opened); });
    const std::unique_ptr<icu::BreakIterator> clusters(
        icu::BreakIterator::createCharacterInstance(icu::Locale::getRoot(), status));
    check(status);
    clusters->setText(&bytes, status);
    check(status);
    const auto wanted = static_cast<std::int32_t>(position);
    const std::int32_t found = clusters->isBoundary(wanted) ? wanted : clusters->preceding(wanted);
    return static_cast<std::size_t>(std::max(found, 0));
  }
  std::string searchKey(std::string_view text) override {
    UErrorCode status = U_ZERO_ERROR;
    const icu::Normalizer2* const fold = icu::Normalizer2::getNFKCCasefoldInstance(status);
    const icu::Normalizer2* const apart = icu::Normalizer2::getNFDInstance(status);
    const icu::Normalizer2* const together = icu::Normalizer2::getNFCInstance(status);
    check(status);
    const icu::StringPiece bytes(text.data(), static_cast<std::int32_t>(text.size()));
    const icu::UnicodeString letters =
        apart->normalize(fold->normalize(icu::UnicodeString::fromUTF8(bytes), status), status);
    icu::UnicodeString kept;
    for (std::int32_t at = 0; at < letters.length(); at = letters.moveIndex32(at, 1)) {
      const UChar32 character = letters.char32At(at);
      if (isAccent(character)) continue;
      if (const std::u16string_view plain = plainLetter(character); !plain.empty())
        kept.append(plain.data(), static_cast<std::int32_t>(plain.size()));
      else
        kept.append(character);
    }
    const icu::UnicodeString key = together->normalize(kept, status);
    check(status);
    return utf8(key);
  }
  std::string sortKey(std::string_view text, const std::string& locale) override {
    UErrorCode status = U_ZERO_ERROR;
    const std::unique_ptr<icu::Collator> order(
        icu::Collator::createInstance(icu::Locale::createCanonical(locale.c_str()), status));
    check(status);
    const auto letters =
        icu::UnicodeString::fromUTF8(icu::StringPiece(text.data(), static_cast<std::int32_t>(text.size())));
    std::string key(static_cast<std::size_t>(order->getSortKey(letters, nullptr, 0)), '\0');
    order->getSortKey(letters, reinterpret_cast<std::uint8_t*>(key.data()), static_cast<std::int32_t>(key.size()));
    return key;
  }
  std::string countryName(const std::string& code, const std::string& locale) override {
    icu::UnicodeString name;
    return utf8(icu::Locale("", code.c_str()).getDisplayCountry(icu::Locale::createCanonical(locale.c_str()), name));
  }
};

}  // namespace

}  // namespace nimbo

extern "C" nimbo::StringsPart* nimbo_strings() {
  static nimbo::ICUStrings part;
  return &part;
}
