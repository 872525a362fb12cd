#include "host/telling/DateText.h"

#include "desktop/DesktopPlatform.h"
#include "desktop/strings/ICUStringTables.h"
#include "desktop/system/LatePart.h"
#include "platform/Localization.h"

namespace nimbo {

DateText::DateText(const std::string& locale) {
  const std::string name = locale.empty() ? DesktopPlatform::localeOfEnvironment() : locale;
  try {
    // Of the language of the phrases around them.
    _format = stringsPart().makeDateFormat(ICUStringTables::speak(name) ? name : "en");
  } catch (const LatePartMissing&) {
    // ISO dates it is, as for a locale without a format.
  }
}

std::string DateText::textOf(Date date, DateFormat::Place place) const {
  return _format ? _format->textOf(date, place) : isoTextOfDate(date);
}

std::string DateText::textOfPeriod(std::optional<Date> start, std::optional<Date> end, Date now) const {
  const auto filled = [this](const char* key, Date first, std::optional<Date> second = std::nullopt) {
    const std::string pattern = LocalizedString(key);
    const std::string text =
        textOf(first, pattern.starts_with("{0}") ? DateFormat::Place::beginning : DateFormat::Place::middle);
    return second ? LocalizedFormat(pattern, {text, textOf(*second)}) : LocalizedFormat(pattern, {text});
  };
  if (start && end) return filled("Window_Period_FromUntil", *start, *end);
  if (start) return filled(*start > now ? "Window_Period_From" : "Window_Period_Since", *start);
  if (end) return filled("Window_Period_Until", *end);
  return {};
}

}  // namespace nimbo
