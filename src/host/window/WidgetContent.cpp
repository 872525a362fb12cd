#include "host/window/WidgetContent.h"

#include <algorithm>

#include "host/FeedAnswers.h"
#include "platform/Localization.h"

namespace nimbo {

namespace {

void addName(const protocol::Shield& shield, std::vector<std::string>& names) {
  std::string name = shield.accessibilityText.value_or("");
  if (name.empty()) name = shield.text.value_or("");
  if (!name.empty() && std::find(names.begin(), names.end(), name) == names.end()) names.push_back(std::move(name));
}

/// The lines that an item's shields stand for, then what it says.
std::vector<std::string> textsOf(const protocol::TransitItem& item) {
  std::vector<std::string> texts;
  if (item.artwork && item.artwork->shield && !item.artworkHidden) addName(*item.artwork->shield, texts);
  for (const auto* text : {&item.primaryText, &item.secondaryText})
    if (*text && !(*text)->empty()) texts.push_back(**text);
  return texts;
}

std::vector<std::string> textsOf(const protocol::SummaryItem& item) {
  std::vector<std::string> texts;
  for (const protocol::Shield& shield : item.artworks) addName(shield, texts);
  if (!item.primaryText.empty()) texts.push_back(item.primaryText);
  return texts;
}

WidgetRow rowOf(const protocol::Row& row) {
  std::vector<std::string> texts;
  if (row.item) texts = std::visit([](const auto& item) { return textsOf(item); }, *row.item);
  return {row.frame.y, row.frame.height, CommaDelimitedList(texts)};
}

}  // namespace

WidgetContent WidgetContent::ofSnapshot(const protocol::Snapshot& snapshot) {
  WidgetContent content;
  for (const protocol::Row& row : snapshot.rows) content.rows.push_back(rowOf(row));
  content.canExpand = snapshot.largestAvailableDisplayMode == WidgetDisplayMode::Expanded;
  content.goneLines = snapshot.goneLines;
  content.asOf = snapshot.asOf;
  content.updated = snapshot.updated;
  content.isFetched = snapshot.result.has_value();
  for (const auto& [line, title] : snapshot.knownIncidents) content.known.push_back(CommaDelimitedList({line, title}));
  if (snapshot.error) content.failure = errorOf(*snapshot.error);
  return content;
}

}  // namespace nimbo
