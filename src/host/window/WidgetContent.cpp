#include "host/window/WidgetContent.h"

#include <algorithm>

#include "platform/Localization.h"

namespace nimbo {

using nlohmann::json;

namespace {

/// The text under the first of the keys that holds one; empty without.
std::string textOf(const json& object, std::initializer_list<const char*> keys) {
  if (!object.is_object()) return {};
  for (const char* key : keys)
    if (const auto found = object.find(key); found != object.end() && found->is_string())
      if (auto text = found->get<std::string>(); !text.empty()) return text;
  return {};
}

std::string nameOfShield(const json& shield) { return textOf(shield, {"accessibilityText", "text"}); }

/// The lines that a row's shields stand for.
std::vector<std::string> linesOf(const json& row) {
  std::vector<std::string> names;
  const auto add = [&](const json& shield) {
    std::string name = nameOfShield(shield);
    if (!name.empty() && std::find(names.begin(), names.end(), name) == names.end()) names.push_back(std::move(name));
  };
  if (const json artwork = row.value("artwork", json()); artwork.is_object() && !row.value("artworkHidden", false))
    add(artwork.value("shield", json()));
  for (const json& shield : row.value("artworks", json::array())) add(shield);
  return names;
}

WidgetRow rowOf(const json& row) {
  const json& frame = row.at("frame");
  std::vector<std::string> texts = linesOf(row);
  for (const char* key : {"primaryText", "secondaryText"})
    if (std::string text = textOf(row, {key}); !text.empty()) texts.push_back(std::move(text));
  return {frame.at(1), frame.at(3), CommaDelimitedList(texts)};
}

}  // namespace

WidgetContent WidgetContent::ofSnapshot(const json& snapshot) {
  WidgetContent content;
  for (const json& row : snapshot.at("rows")) content.rows.push_back(rowOf(row));
  content.canExpand = snapshot.at("largestAvailableDisplayMode") == "expanded";
  content.isExpanded = snapshot.at("expanded");
  for (const auto& [feed, text] : snapshot.at("asOf").items())
    if (const auto date = dateFromISOText(text.get<std::string>())) content.asOf.emplace(feed, *date);
  return content;
}

}  // namespace nimbo
