#include "host/window/DateText.h"

#include "desktop/DesktopPlatform.h"
#include "platform/Localization.h"

namespace nimbo {

DateText::DateText(const std::string& locale) {
  const std::string name = locale.empty() ? DesktopPlatform::localeOfEnvironment() : locale;
  _format.reset(icu::DateFormat::createDateTimeInstance(icu::DateFormat::kLongRelative, icu::DateFormat::kShort,
                                                        icu::Locale::createCanonical(name.c_str())));
  UErrorCode ignored = U_ZERO_ERROR;
  if (_format) _format->setContext(UDISPCTX_CAPITALIZATION_FOR_MIDDLE_OF_SENTENCE, ignored);
}

std::string DateText::textOf(Date date) const {
  if (!_format) return isoTextOfDate(date);
  icu::UnicodeString text;
  std::string result;
  return _format->format(static_cast<UDate>(date.time_since_epoch().count()) / 1000, text).toUTF8String(result);
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
