#include "host/window/LineSearch.h"

#include <algorithm>
#include <iterator>
#include <map>
#include <nlohmann/json.hpp>

#include "desktop/gtfs/feeds/FeedConfiguration.h"
#include "desktop/gtfs/feeds/TransitLineServiceError.h"
#include "desktop/gtfs/static/LineItems.h"
#include "desktop/strings/SearchKey.h"
#include "host/window/Texts.h"
#include "platform/Localization.h"
#include "platform/SystemServices.h"
#include "platform/foundation/Log.h"
#include "protocol/Coding.h"
#include "protocol/Lines.h"

namespace nimbo {

namespace {

protocol::Lines savedLines(HostPlatform& platform) {
  const auto text = platform->sharedSettings().groupStore()->stringForKey(protocol::kSavedLinesKey);
  if (!text) return {};
  try {
    return protocol::read<protocol::Lines>(nlohmann::json::parse(*text));
  } catch (const std::exception& failure) {
    writeLog({kDefaultLogSubsystem, "LineSearch"}, LogLevel::error, "The saved lines cannot be read: %@",
             {failure.what()});
    return {};
  }
}

/// How a line ran at `updated`, as it can be told of `now`.
std::string textOfSavedState(protocol::LineReport line, Date updated, Date now, const DateText& dates) {
  if (line.state == protocol::LineState::unknown) return textOfState(line);
  const bool wasGood = line.state == protocol::LineState::good;
  const auto begun = [now](const protocol::LineIncident& incident) { return !incident.from || *incident.from <= now; };
  std::copy_if(line.planned.begin(), line.planned.end(), std::back_inserter(line.incidents), begun);
  std::erase_if(line.incidents, [now](const auto& incident) { return incident.until && *incident.until < now; });
  const TimeInterval age = intervalBetween(updated, now);
  const bool isFresh = age >= 0 && age <= kFreshFor;
  if (line.incidents.empty()) {
    // Where all incidents have ended, others may have come since.
    if (isFresh && wasGood) return textOfState(line);
    return LocalizedFormat(LocalizedString("Window_Line_Old"), {dates.textOf(updated)});
  }
  line.state = protocol::LineState::affected;
  if (isFresh) return textOfState(line);
  return textOfState(line) + " · " + LocalizedFormat(LocalizedString("Window_Updated"), {dates.textOf(updated)});
}

}  // namespace

std::vector<KnownLine> knownFavorites(HostPlatform& platform, const std::string& locale) {
  const auto favorites = platform->favoritesEditor().left();
  if (!favorites) return {};
  const protocol::Lines saved = savedLines(platform);
  std::map<std::string, const protocol::LineReport*> reports;
  if (saved.updated)
    for (const protocol::LineReport& report : saved.lines) reports.emplace(report.id, &report);
  const protocol::LineReport notAsked{
      .reason = protocol::FetchError{std::string(kTransitLineServiceErrorDomain),
                                     static_cast<std::int64_t>(TransitLineServiceError::notAsked),
                                     "",
                                     {},
                                     {}}};
  const DateText dates(locale);
  const Date now = currentDate();
  std::vector<KnownLine> lines;
  for (const FavoriteRef& favorite : *favorites) {
    const auto* kept = dynamic_cast<const FavoriteTransitLine*>(favorite.get());
    if (!kept || !kept->transitLine()) continue;
    const TransitLine& line = *kept->transitLine();
    const auto& locator = line.identifier()->locator();
    if (locator && locator->feed == kSampleFeedName) continue;
    const std::string id = writtenNameOfLine(*line.identifier());
    const auto report = reports.find(id);
    lines.push_back({id, nameOfLine(line), systemNameOfLine(line),
                     textOfSavedState(report == reports.end() ? notAsked : *report->second, saved.updated.value_or(now),
                                      now, dates)});
  }
  return lines;
}

bool hasWords(const KnownLine& line, const std::vector<std::string>& words) {
  const std::string text = searchKey(line.name + "\n" + line.agency + "\n" + line.id);
  return std::all_of(words.begin(), words.end(),
                     [&](const std::string& word) { return text.find(searchKey(word)) != std::string::npos; });
}

}  // namespace nimbo
