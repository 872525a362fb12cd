#include "host/StatusBarLine.h"

#include "host/GoneLines.h"
#include "host/TerminalText.h"

namespace nimbo {

using nlohmann::json;

namespace {

constexpr const char* kErrorWord = "error";

std::string memberText(const json& object, const char* key) {
  const json text = object.value(key, json());
  return text.is_string() ? text.get<std::string>() : std::string();
}

/// A line without a line end, which a bar has no room for.
std::string inOneLine(std::string text) {
  std::replace(text.begin(), text.end(), '\n', ' ');
  return text;
}

std::string lineOf(const std::string& text, const std::string& word, const std::string& tooltip) {
  return printableJSON(json{{"text", inOneLine(text)}, {"alt", word}, {"class", word}, {"tooltip", tooltip}}.dump());
}

bool isFetched(const json& snapshot) { return snapshot.at("result").is_string(); }

/// Tells the rows apart by what they open: incidents an activity, good service and no favourites a URL, an error
/// nothing.
std::string classOf(const json& snapshot) {
  if (snapshot.at("result") == "error") return kErrorWord;
  const json& row = snapshot.at("listItem").at("summaryItem");
  if (row.contains("artworks")) return "advisories";
  const json& openable = row.at("openable");
  if (!openable.is_object()) return isFetched(snapshot) ? "advisories" : kErrorWord;
  if (!openable.contains("url")) return "advisories";
  return row.at("artwork").is_object() ? "good" : "none";
}

/// "[12] " for a row with the shield of a line.
std::string shieldOf(const json& row) {
  const json artwork = row.value("artwork", json());
  if (!artwork.is_object()) return {};
  const json shield = artwork.value("shield", json());
  const std::string text = shield.is_object() ? memberText(shield, "text") : std::string();
  return text.empty() ? text : "[" + text + "] ";
}

std::string tooltipOf(const json& snapshot) {
  const json& listItem = snapshot.at("listItem");
  json rows = listItem.at("expandedItems");
  if (rows.empty()) rows.push_back(listItem.at("summaryItem"));
  std::string tooltip;
  const auto addLine = [&](const std::string& markup) { tooltip += (tooltip.empty() ? "" : "\n") + markup; };
  for (const json& row : rows) {
    addLine("<b>" + markupText(shieldOf(row) + memberText(row, "primaryText")) + "</b>");
    if (const std::string text = memberText(row, "secondaryText"); !text.empty()) addLine(markupText(text));
  }
  if (const json error = snapshot.value("error", json()); error.is_object())
    addLine(markupText(memberText(error, "reason")));
  for (const json& line : snapshot.at("goneLines")) addLine("<i>" + markupText(goneLineText(line)) + "</i>");
  return tooltip;
}

}  // namespace

std::optional<std::string> statusBarLine(const json& snapshot) {
  const std::string word = classOf(snapshot);
  if (!isFetched(snapshot) && word != "good" && word != "advisories") return std::nullopt;
  const json& row = snapshot.at("listItem").at("summaryItem");
  return lineOf(markupText(shieldOf(row) + memberText(row, "primaryText")), word, tooltipOf(snapshot));
}

std::string statusBarErrorLine(const std::string& reason) {
  return lineOf("⚠", kErrorWord, "<b>Nimbo Transit</b>\n" + markupText(reason));
}

}  // namespace nimbo
