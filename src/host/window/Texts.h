#pragma once

#include <optional>
#include <string>
#include <vector>

#include "desktop/strings/StringsPart.h"
#include "platform/foundation/Error.h"
#include "platform/transit/TransitIncident.h"
#include "platform/transit/TransitLine.h"

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

/// The name by which riders know a line; its number where it has none.
std::string nameOfLine(const TransitLine& line);

/// The same for a place beside the line's shield, which says the short name already: "Ring Line" of "3, Ring Line".
std::string nameBesideShield(const TransitLine& line);

/// Name of the network that a line belongs to; empty where that is not known.
std::string systemNameOfLine(const TransitLine& line);

/// What a card says of an incident below its title, nothing twice: the description, with the summary before it where
/// the description does not say that too.
std::vector<std::string> textsBelowTitle(const TransitIncident& incident);

/// What failed and what to do about it, in the user's language; the error's own reason, which tells developers more, is
/// logged. Main thread.
std::string textOfError(const Error& error);

}  // namespace nimbo
