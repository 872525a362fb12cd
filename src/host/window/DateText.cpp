#include "host/window/DateText.h"

#include "desktop/DesktopPlatform.h"
#include "desktop/system/LatePart.h"
#include "platform/Localization.h"

namespace nimbo {

DateText::DateText(const std::string& locale) {
  const std::string name = locale.empty() ? DesktopPlatform::localeOfEnvironment() : locale;
  try {
    _format = stringsPart().makeDateFormat(name);
  } catch (const LatePartMissing&) {
    // ISO dates it is, as for a locale without a format.
  }
}

std::string DateText::textOf(Date date) const { return _format ? _format->textOf(date) : isoTextOfDate(date); }

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
