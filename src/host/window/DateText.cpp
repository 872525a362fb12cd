#include "host/window/DateText.h"

#include <stdexcept>

#include "desktop/DesktopPlatform.h"
#include "platform/Localization.h"

namespace nimbo {

namespace {

/// Null where ICU has none. Throws std::runtime_error where there is no ICU.
ICUDateFormat makeFormat(const std::string& localeName) {
  const ICU& icu = ICU::library();
  const std::string locale = localeOfICU([&](char* text, std::int32_t size, UErrorCode* status) {
    return icu.loc_canonicalize(localeName.c_str(), text, size, status);
  });
  UErrorCode status = U_ZERO_ERROR;
  return ICUDateFormat(icu.dat_open(UDAT_SHORT, UDAT_LONG_RELATIVE, locale.c_str(), nullptr, -1, nullptr, 0, &status));
}

}  // namespace

DateText::DateText(const std::string& locale) {
  const std::string name = locale.empty() ? DesktopPlatform::localeOfEnvironment() : locale;
  try {
    _format = makeFormat(ICUStringTables::speak(name) ? name : "en");  // of the language of the phrases around them
  } catch (const std::runtime_error&) {
    // ISO dates it is, as for a locale without a format.
  }
}

std::string DateText::textOf(Date date, Place place) const {
  if (!_format) return isoTextOfDate(date);
  UErrorCode ignored = U_ZERO_ERROR;  // the date is right in any context
  ICU::library().dat_setContext(_format.get(),
                                place == Place::beginning ? UDISPCTX_CAPITALIZATION_FOR_BEGINNING_OF_SENTENCE
                                                          : UDISPCTX_CAPITALIZATION_FOR_MIDDLE_OF_SENTENCE,
                                &ignored);
  const UDate milliseconds = static_cast<UDate>(date.time_since_epoch().count()) / 1000;
  return textOfICU([&](UChar* text, std::int32_t size, UErrorCode* status) {
    return ICU::library().dat_format(_format.get(), milliseconds, text, size, nullptr, status);
  });
}

std::string DateText::textOfPeriod(std::optional<Date> start, std::optional<Date> end, Date now) const {
  const auto filled = [this](const char* key, Date first, std::optional<Date> second = std::nullopt) {
    const std::string pattern = LocalizedString(key);
    const std::string text = textOf(first, pattern.starts_with("{0}") ? Place::beginning : Place::middle);
    return second ? LocalizedFormat(pattern, {text, textOf(*second)}) : LocalizedFormat(pattern, {text});
  };
  if (start && end) return filled("Window_Period_FromUntil", *start, *end);
  if (start) return filled(*start > now ? "Window_Period_From" : "Window_Period_Since", *start);
  if (end) return filled("Window_Period_Until", *end);
  return {};
}

}  // namespace nimbo
