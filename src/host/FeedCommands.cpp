#include <algorithm>
#include <iostream>
#include <nlohmann/json.hpp>
#include <vector>

#include "desktop/gtfs/feeds/FeedCache.h"
#include "desktop/gtfs/feeds/FeedConfiguration.h"
#include "desktop/gtfs/static/LineItems.h"
#include "host/Commands.h"
#include "host/FeedAnswers.h"
#include "host/HostPlatform.h"
#include "host/ProgressLine.h"
#include "host/TerminalText.h"

namespace nimbo {

namespace {

void printLine(const std::string& text) { std::cout << "  " << printableText(text) << "\n"; }

void printReport(const char* what, const std::vector<protocol::Skipped>& report) {
  for (const protocol::Skipped& entry : report) {
    const std::string text = std::string(what) + ": " + std::to_string(entry.count) + " × " + entry.reason;
    printLine(entry.example.empty() ? text : text + " (first: " + entry.example + ")");
  }
}

}  // namespace

bool printCheck(const protocol::FeedReport& report) {
  std::cout << printableText(report.name) << "\n";
  if (const auto& feed = report.staticFeed) {
    printLine(counted(feed->agencies, "agency", "agencies"));
    printLine(counted(feed->lines, "line"));
    if (feed->trips > 0) printLine(counted(feed->trips, "trip"));
    if (!feed->language.empty()) printLine("language: " + feed->language);
    printReport("skipped in the static feed", feed->skipped);
  }
  if (const auto& alerts = report.alerts) {
    if (alerts->timestamp) printLine("alerts as of: " + isoTextOfDate(*alerts->timestamp));
    printLine(counted(alerts->alerts, "alert"));
    if (report.staticFeed) {
      printLine(counted(alerts->periods, "period"));
      printLine(counted(alerts->selectors, "selector"));
      printLine(counted(alerts->incidents, "incident") + " in force or to come");
      printLine(counted(alerts->affectedLines, "line") + " affected now");
    }
    printReport("skipped in the alerts", alerts->skipped);
    printReport("fits nothing", alerts->unfit);
  }
  const auto faults = report.faults();
  for (const protocol::FetchError& fault : faults) printLine("error: " + fault.reason);
  return faults.empty();
}

namespace {

/// The parts of a line: how it is written, its shield's text, its name, its agency.
std::vector<std::string> partsOfLine(const TransitLine& line) {
  const auto& locator = line.identifier()->locator();
  const auto& artwork = line.artwork();
  const std::string fullName =
      artwork && artwork->accessibilityText() ? *artwork->accessibilityText() : line.name().value_or("");
  return {writtenNameOfLine(*line.identifier()), locator ? locator->shortName : "", fullName,
          line.system() ? line.system()->name().value_or("") : ""};
}

std::vector<std::string> columnsOfLine(const TransitLine& line) {
  std::vector<std::string> columns = partsOfLine(line);
  for (std::string& column : columns) column = printableText(column);
  return columns;
}

nlohmann::json jsonOfLine(const TransitLine& line) {
  const std::vector<std::string> parts = partsOfLine(line);
  return {{"id", parts[0]}, {"shortName", parts[1]}, {"name", parts[2]}, {"agency", parts[3]}};
}

}  // namespace

void printLines(const std::vector<TransitLineRef>& lines, bool asJSON) {
  if (asJSON) {
    auto array = nlohmann::json::array();
    for (const TransitLineRef& line : lines) array.push_back(jsonOfLine(*line));
    std::cout << printableJSON(array.dump(2, ' ', false, nlohmann::json::error_handler_t::replace)) << "\n";
    return;
  }

  std::vector<std::vector<std::string>> table;
  table.reserve(lines.size());
  for (const TransitLineRef& line : lines) table.push_back(columnsOfLine(*line));
  printTable(table);
}

int runFeedRemove(const CommandContext& context, const std::string& name) {
  const HostPlatform platform(context);
  FeedConfiguration configuration(context.paths.config);
  const Feed feed = require(configuration.feedNamed(name));
  require(configuration.remove(name));
  FeedCache(context.paths.cache).remove(feed);
  return kExitSuccess;
}

int runFeedList(const CommandContext& context, bool json) {
  const HostPlatform platform(context);
  const auto feeds = require(FeedConfiguration(context.paths.config).feeds());
  if (json) {
    auto array = nlohmann::json::array();
    for (const Feed& feed : feeds)
      array.push_back({{"name", feed.name},
                       {"static", feed.staticFeed.publicText()},
                       {"alerts", feed.alerts.publicText()},
                       {"combined", feed.isCombined}});
    std::cout << printableJSON(array.dump(2, ' ', false, nlohmann::json::error_handler_t::replace)) << "\n";
    return kExitSuccess;
  }
  for (const Feed& feed : feeds)
    std::cout << printableText(feed.name) << "\n  static: " << printableText(feed.staticFeed.publicText())
              << "\n  alerts: " << printableText(feed.alerts.publicText()) << "\n";
  if (feeds.empty()) std::cout << "No feed is set up; the sample city serves. Set one up with \"feed add\".\n";
  return kExitSuccess;
}

int runFeedCheck(const CommandContext& context, const std::string& name) {
  const HostPlatform platform(context);
  const FeedConfiguration configuration(context.paths.config);
  const auto feeds =
      name.empty() ? require(configuration.feeds()) : std::vector<Feed>{require(configuration.feedNamed(name))};
  if (feeds.empty()) throw CommandFailure("no feed is set up to be checked. Set one up with \"feed add\".");
  WidgetWithProgress widget(context);
  std::size_t bad = 0;
  for (const Feed& feed : feeds) bad += printCheck(widget.call(protocol::kCheckFeed, {.feed = feed.name})) ? 0 : 1;
  if (bad > 0) throw CommandFailure(counted(bad, "feed") + " of " + std::to_string(feeds.size()) + " cannot be used");
  return kExitSuccess;
}

int runLines(const CommandContext& context, const std::string& text, bool json) {
  WidgetWithProgress widget(context);
  std::vector<TransitLineRef> lines;
  protocol::FoundLines page;
  do {
    page = widget.call(protocol::kFindLines, {.query = text, .offset = lines.size()});
    for (const protocol::FeedLine& line : page.lines) lines.push_back(lineOf(line));
  } while (!page.lines.empty() && lines.size() < page.total);
  printLines(lines, json);
  for (const protocol::FetchError& failure : page.failures) printMessage(failure.reason);
  if (!page.failures.empty()) return kExitFailure;
  if (lines.empty()) throw CommandFailure("no line contains \"" + text + "\"");
  return kExitSuccess;
}

}  // namespace nimbo
