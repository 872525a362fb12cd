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
  ICUDateFormat format(icu.dat_open(UDAT_SHORT, UDAT_LONG_RELATIVE, locale.c_str(), nullptr, -1, nullptr, 0, &status));
  if (format) icu.dat_setContext(format.get(), UDISPCTX_CAPITALIZATION_FOR_MIDDLE_OF_SENTENCE, &status);
  return format;
}

}  // namespace

DateText::DateText(const std::string& locale) {
  const std::string name = locale.empty() ? DesktopPlatform::localeOfEnvironment() : locale;
  try {
    _format = makeFormat(name);
  } catch (const std::runtime_error&) {
    // ISO dates it is, as for a locale without a format.
  }
}

std::string DateText::textOf(Date date) const {
  if (!_format) return isoTextOfDate(date);
  const UDate milliseconds = static_cast<UDate>(date.time_since_epoch().count()) / 1000;
  return textOfICU([&](UChar* text, std::int32_t size, UErrorCode* status) {
    return ICU::library().dat_format(_format.get(), milliseconds, text, size, nullptr, status);
  });
}

std::string DateText::textOfPeriod(std::optional<Date> start, std::optional<Date> end, Date now) const {
  const auto filled = [](const char* key, std::initializer_list<FormatArgument> dates) {
    return LocalizedFormat(LocalizedString(key), dates);
  };
  if (start && end) return filled("Window_Period_FromUntil", {textOf(*start), textOf(*end)});
  if (start) return filled(*start > now ? "Window_Period_From" : "Window_Period_Since", {textOf(*start)});
  if (end) return filled("Window_Period_Until", {textOf(*end)});
  return {};
}

}  // namespace nimbo
