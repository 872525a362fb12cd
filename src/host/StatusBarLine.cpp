#include "host/StatusBarLine.h"

#include <algorithm>
#include <nlohmann/json.hpp>

#include "host/GoneLines.h"
#include "host/TerminalText.h"

namespace nimbo {

using nlohmann::json;

namespace {

constexpr const char* kErrorWord = "error";

/// A line without a line end, which a bar has no room for.
std::string inOneLine(std::string text) {
  std::replace(text.begin(), text.end(), '\n', ' ');
  return text;
}

std::string lineOf(const std::string& text, const std::string& word, const std::string& tooltip) {
  return printableJSON(json{{"text", inOneLine(text)}, {"alt", word}, {"class", word}, {"tooltip", tooltip}}.dump());
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
  for (const protocol::Item& row : rows) {
    addLine("<b>" + headingOf(row) + "</b>");
    const std::string text = std::visit([](const auto& item) { return secondaryTextOf(item); }, row);
    if (!text.empty()) addLine(markupText(text));
  }
  if (snapshot.error) addLine(markupText(snapshot.error->reason));
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
  return lineOf(headingOf(*row), word, tooltipOf(snapshot));
}

std::string statusBarErrorLine(const std::string& reason) {
  return lineOf("⚠", kErrorWord, "<b>Nimbo Transit</b>\n" + markupText(reason));
}

}  // namespace nimbo
