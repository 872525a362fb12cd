#include "host/BarContent.h"

#include <algorithm>

#include "host/LineStatus.h"
#include "host/TerminalText.h"

namespace nimbo {

using protocol::LineState;

namespace {

constexpr int kTitleColumns = 80;
constexpr const char* kErrorState = "error";

/// Tells the rows apart by what they open: incidents an activity, good service and no favourites a URL, an error
/// nothing.
std::string stateOf(const protocol::TransitItem& item, bool isFetched) {
  if (!item.openable) return isFetched ? "advisories" : kErrorState;
  if (!item.openable->url) return "advisories";
  return item.artwork ? "good" : "none";
}
std::string stateOf(const protocol::SummaryItem&, bool) { return "advisories"; }

const char* signOf(const std::string& state) {
  return state == "good" ? "✓" : state == "none" ? "–" : state == "advisories" || state == "gone" ? "⚠" : "?";
}

/// "[12] Works" for a row with the shield of a line.
std::string headingOf(const protocol::TransitItem& item) {
  const std::string title = item.primaryText.value_or("");
  if (!item.artwork || !item.artwork->shield) return title;
  const std::string shield = item.artwork->shield->text.value_or("");
  return shield.empty() ? title : "[" + shield + "] " + title;
}
std::string headingOf(const protocol::SummaryItem& item) { return item.primaryText; }

std::string secondaryTextOf(const protocol::TransitItem& item) { return item.secondaryText.value_or(""); }
std::string secondaryTextOf(const protocol::SummaryItem&) { return {}; }

std::vector<BarContent::Detail> detailsOf(const protocol::Snapshot& snapshot, Date now) {
  using Style = BarContent::Detail::Style;
  std::vector<protocol::Item> rows = snapshot.listItem.expandedItems;
  if (rows.empty() && snapshot.listItem.summaryItem) rows.push_back(*snapshot.listItem.summaryItem);
  std::vector<BarContent::Detail> details;
  if (!snapshot.result) details.push_back({Style::remark, "as it was the last time; asking now"});
  for (const protocol::Item& row : rows) {
    details.push_back({Style::title, std::visit([](const auto& item) { return headingOf(item); }, row)});
    const std::string text = std::visit([](const auto& item) { return secondaryTextOf(item); }, row);
    if (!text.empty()) details.push_back({Style::text, text});
  }
  if (snapshot.error) details.push_back({Style::text, snapshot.error->reason});
  for (const auto& [line, title] : snapshot.knownIncidents)
    details.push_back({Style::text, std::string(line).append(": ").append(title)});
  if (snapshot.updated && !snapshot.error) details.push_back({Style::remark, updatedText(*snapshot.updated, now)});
  for (const std::string& line : snapshot.goneLines) details.push_back({Style::remark, goneLineText(line)});
  return details;
}

std::optional<int> percentageOf(const protocol::Lines& lines) {
  const std::string state = overallState(lines);
  if (state == "unknown" || state == "none") return std::nullopt;
  const auto good = std::count_if(lines.lines.begin(), lines.lines.end(),
                                  [](const auto& line) { return line.state == LineState::good; });
  return static_cast<int>(100 * good / static_cast<std::ptrdiff_t>(lines.lines.size()));
}

bool hasNewIncident(const protocol::Lines& lines) {
  return std::any_of(lines.lines.begin(), lines.lines.end(), [](const protocol::LineReport& line) {
    return std::any_of(line.incidents.begin(), line.incidents.end(),
                       [](const protocol::LineIncident& incident) { return incident.isNew; });
  });
}

}  // namespace

std::optional<BarContent> barContentOf(const protocol::Snapshot& snapshot, const protocol::Lines& lines, Date now) {
  const auto& row = snapshot.listItem.summaryItem;
  if (!row) return std::nullopt;
  const bool isFetched = snapshot.result.has_value();
  const bool hasFailed = snapshot.result == protocol::FetchResult::error;
  std::string state =
      hasFailed ? kErrorState : std::visit([&](const auto& item) { return stateOf(item, isFetched); }, *row);
  if (!isFetched && state != "good" && state != "advisories") return std::nullopt;

  BarContent content;
  content.hasGoneLines = !snapshot.goneLines.empty();
  content.isNew = hasNewIncident(lines);
  content.isStale =
      !isFetched || (!hasFailed && snapshot.updated && intervalBetween(*snapshot.updated, now) > kBarStaleAfter);
  content.percentage = percentageOf(lines);
  content.details = detailsOf(snapshot, now);
  content.text = content.isNew ? "● " : "";
  content.text += shortenedText(std::visit([](const auto& item) { return headingOf(item); }, *row), kTitleColumns);
  if (content.isStale) content.text += " (old)";
  if (content.hasGoneLines) content.text += " · " + goneLinesTitle(snapshot.goneLines);
  // Good service of the others is no good service of all.
  if (content.hasGoneLines && state == "good") state = "gone";
  content.sign = signOf(state);
  content.state = isFetched ? std::move(state) : "old";
  return content;
}

BarContent barContentOfFailure(const std::string& reason) {
  using Style = BarContent::Detail::Style;
  return {.text = "⚠ Nimbo Transit",
          .sign = "?",
          .state = kErrorState,
          .details = {{Style::title, "Nimbo Transit"}, {Style::text, reason}}};
}

}  // namespace nimbo
