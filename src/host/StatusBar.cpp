#include "host/StatusBar.h"

#include <unistd.h>

#include <algorithm>
#include <csignal>
#include <ctime>
#include <iostream>
#include <nlohmann/json.hpp>
#include <vector>

#include "host/HostPlatform.h"
#include "host/LineStatus.h"
#include "host/OnScreenWidget.h"
#include "host/QuitOnSignal.h"
#include "host/StatusWatch.h"
#include "host/TerminalText.h"
#include "host/telling/Teller.h"

namespace nimbo {

using nlohmann::json;

namespace {

constexpr const char* kErrorWord = "error";
constexpr const char* kGoneWord = "gone";
constexpr const char* kOldWord = "old";

/// A line without a line end, which a bar has no room for.
std::string inOneLine(std::string text) {
  std::replace(text.begin(), text.end(), '\n', ' ');
  return text;
}

std::string lineOf(const std::string& text, const std::vector<std::string>& words, const std::string& tooltip) {
  json line{{"text", inOneLine(text)}, {"alt", words.front()}, {"class", words.front()}, {"tooltip", tooltip}};
  if (words.size() > 1) line["class"] = words;
  return printableJSON(line.dump());
}

const std::string& titleOf(const protocol::TransitItem& item) {
  static const std::string kNone;
  return item.primaryText ? *item.primaryText : kNone;
}
const std::string& titleOf(const protocol::SummaryItem& item) { return item.primaryText; }

std::string secondaryTextOf(const protocol::TransitItem& item) { return item.secondaryText.value_or(""); }
std::string secondaryTextOf(const protocol::SummaryItem&) { return {}; }

/// Tells the rows apart by what they open: incidents an activity, good service and no favourites a URL, an error
/// nothing.
std::string wordOf(const protocol::TransitItem& item, bool isFetched) {
  if (!item.openable) return isFetched ? "advisories" : kErrorWord;
  if (!item.openable->url) return "advisories";
  return item.artwork ? "good" : "none";
}
std::string wordOf(const protocol::SummaryItem&, bool) { return "advisories"; }

/// "[12] " for a row with the shield of a line.
std::string shieldOf(const protocol::TransitItem& item) {
  if (!item.artwork || !item.artwork->shield) return {};
  const std::string text = item.artwork->shield->text.value_or("");
  return text.empty() ? text : "[" + text + "] ";
}
std::string shieldOf(const protocol::SummaryItem&) { return {}; }

std::string headingOf(const protocol::Item& row) {
  return std::visit([](const auto& item) { return markupText(shieldOf(item) + titleOf(item)); }, row);
}

std::string tooltipOf(const protocol::Snapshot& snapshot) {
  std::vector<protocol::Item> rows = snapshot.listItem.expandedItems;
  if (rows.empty() && snapshot.listItem.summaryItem) rows.push_back(*snapshot.listItem.summaryItem);
  std::string tooltip;
  const auto addLine = [&](const std::string& markup) { tooltip += (tooltip.empty() ? "" : "\n") + markup; };
  if (!snapshot.result) addLine("<i>as it was the last time; asking now</i>");
  for (const protocol::Item& row : rows) {
    addLine("<b>" + headingOf(row) + "</b>");
    const std::string text = std::visit([](const auto& item) { return secondaryTextOf(item); }, row);
    if (!text.empty()) addLine(markupText(text));
  }
  if (snapshot.error) addLine(markupText(snapshot.error->reason));
  for (const auto& [line, title] : snapshot.knownIncidents)
    addLine(markupText(line).append(": ").append(markupText(title)));
  if (snapshot.updated && !snapshot.error)
    addLine("<i>" + updatedText(*snapshot.updated, dateFromUnixTime(static_cast<TimeInterval>(std::time(nullptr)))) +
            "</i>");
  for (const std::string& line : snapshot.goneLines) addLine("<i>" + markupText(goneLineText(line)) + "</i>");
  return tooltip;
}

}  // namespace

std::optional<std::string> statusBarLine(const protocol::Snapshot& snapshot) {
  const auto& row = snapshot.listItem.summaryItem;
  if (!row) return std::nullopt;
  const bool isFetched = snapshot.result.has_value();
  const bool hasFailed = snapshot.result == protocol::FetchResult::error;
  const std::string word =
      hasFailed ? kErrorWord : std::visit([&](const auto& item) { return wordOf(item, isFetched); }, *row);
  if (!isFetched && word != "good" && word != "advisories") return std::nullopt;
  std::string text = headingOf(*row);
  std::vector<std::string> words{word};
  if (!isFetched) {
    words = {kOldWord};
    text += " (old)";
  }
  if (!snapshot.goneLines.empty()) {
    // Good service of the others is no good service of all.
    words = word == "good" && isFetched ? std::vector<std::string>{kGoneWord}
                                        : std::vector{words.front(), std::string(kGoneWord)};
    text += " · " + goneLinesTitle(snapshot.goneLines);
  }
  return lineOf(text, words, tooltipOf(snapshot));
}

std::string statusBarErrorLine(const std::string& reason) {
  return lineOf("⚠", {kErrorWord}, "<b>Nimbo Transit</b>\n" + markupText(reason));
}

namespace {

/// Rows that a tooltip has room for.
constexpr int kTooltipRows = 10;

WidgetPresentation presentationForBar() {
  WidgetPresentation presentation;
  presentation.expandedHeight = kTooltipRows * WidgetPresentation::kDefaultRowHeight;
  return presentation;
}

}  // namespace

int runStatusBar(const CommandContext& context, const std::optional<std::string>& now) {
  WidgetPresentation presentation = presentationForBar();
  presentation.virtualTime = now;
  try {
    OnScreenWidget widget(context, presentation);
    // A bar may ask every few seconds.
    const std::optional<std::string> failure = widget.update(sharedAge(context));
    std::cout << statusBarLine(widget.snapshot({.rows = false})).value_or("") << "\n";
    widget.close();
    if (failure) throw CommandFailure(*failure);
  } catch (const WidgetClientFailure& failure) {
    std::cout << statusBarErrorLine(failure.what()) << "\n";
    throw;
  }
  return kExitSuccess;
}

int runStatusWatch(const CommandContext& context, bool notify) {
  HostPlatform platform(context);
  Teller teller(context.runLoop, *platform.operator->(), {.isAsked = notify});
  const GSourceHandle handles[] = {quitOnSignal(context.runLoop, SIGTERM), quitOnSignal(context.runLoop, SIGINT),
                                   context.runLoop.watchUrgent(STDOUT_FILENO, [&](bool inError) {
                                     // The reader of the pipe is gone.
                                     if (inError) context.runLoop.quit();
                                   })};
  StatusWatch watch(context, presentationForBar(), [&](const std::string& line) {
    if (!(std::cout << line << std::endl)) context.runLoop.quit();
  });
  std::string toldFailure;
  watch.setLinesObserver([&](const protocol::Lines& lines) {
    teller.take(lines, [&](const ErrorRef& error) {
      const std::string failure = error ? "cannot notify: " + error->reason() : "";
      if (!failure.empty() && failure != toldFailure) context.tell(failure);
      toldFailure = failure;
    });
  });
  context.runLoop.run();
  return kExitSuccess;
}

}  // namespace nimbo
