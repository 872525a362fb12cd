#pragma once

#include <memory>
#include <optional>
#include <string>

#include "desktop/strings/StringsPart.h"
#include "platform/foundation/Date.h"

namespace nimbo {

/// Dates in the words of a locale and the machine's time zone: "today at 14:00", "yesterday at 9:30", "5 January 2026
/// at 14:00". Main thread only.
class DateText {
 public:
  /// A BCP 47 tag or POSIX name; empty: the environment's. English where there are no texts in its language; without a
  /// format for it, dates are told in ISO form.
  explicit DateText(const std::string& locale);

  std::string textOf(Date date, DateFormat::Place place = DateFormat::Place::middle) const;
  /// The day alone: "Monday, 5 January 2026".
  std::string dayOf(Date date) const { return _format ? _format->dayOf(date) : isoTextOfDate(date).substr(0, 10); }
  /// From when until when something lasts, as one phrase; empty when neither is known.
  std::string textOfPeriod(std::optional<Date> start, std::optional<Date> end, Date now) const;

 private:
  std::unique_ptr<DateFormat> _format;  // null without one
};

}  // namespace nimbo
