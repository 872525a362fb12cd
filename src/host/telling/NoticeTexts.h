#pragma once

#include <string>
#include <vector>

#include "host/notices/Notice.h"
#include "host/telling/DateText.h"
#include "protocol/Lines.h"

namespace nimbo {

/// An incident with the favorites that it is on.
struct IncidentOnLines {
  const protocol::LineIncident* incident = nullptr;  ///< null: only its title is known any more
  std::string title;
  std::vector<const protocol::LineReport*> lines;
};

/// The notices in the user's language. Main thread only.
class NoticeTexts {
 public:
  /// For dates: a BCP 47 tag or POSIX name; empty: the environment's.
  explicit NoticeTexts(const std::string& locale) : _dates(locale) {}

  /// One incident in full. `isWorse`: it was told before, and got worse.
  Notice noticeOf(const IncidentOnLines& told, bool isWorse, Date now) const;
  /// Several, at least one: their number, and the first ones with their lines.
  Notice noticeOfAll(const std::vector<IncidentOnLines>& told) const;
  /// Those that are over, at least one.
  Notice noticeOfEnded(const std::vector<IncidentOnLines>& ended) const;

 private:
  DateText _dates;
};

}  // namespace nimbo
