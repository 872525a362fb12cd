#include "host/window/LineTexts.h"

#include "platform/transit/IncidentStringProvider.h"

namespace nimbo {

namespace {

/// Whether a text says what an excerpt says. Excerpts are on one line, with a colon after what was a heading.
bool says(const std::string& text, const std::string& excerpt) {
  const auto words = [](std::string all) {
    std::erase_if(all, [](char c) { return c == ' ' || c == '\n' || c == ':'; });
    return all;
  };
  return words(text).find(words(excerpt)) != std::string::npos;
}

}  // namespace

std::string nameOfLine(const TransitLine& line) {
  const TransitArtworkRef& artwork = line.artwork();
  if (artwork && artwork->accessibilityText() && !artwork->accessibilityText()->empty())
    return *artwork->accessibilityText();
  return line.name() && !line.name()->empty() ? *line.name() : std::to_string(line.muid());
}

std::string nameBesideShield(const TransitLine& line) {
  const std::string name = nameOfLine(line);
  const TransitArtworkRef& artwork = line.artwork();
  if (!artwork || !artwork->shieldDataSource()) return name;
  const std::string shortName = artwork->shieldDataSource()->shieldText.value_or("") + ", ";
  return name.starts_with(shortName) ? name.substr(shortName.size()) : name;
}

std::string systemNameOfLine(const TransitLine& line) {
  return line.system() ? line.system()->name().value_or("") : std::string();
}

std::vector<std::string> textsBelowTitle(const TransitIncident& incident) {
  const std::string title = IncidentStringProvider::cellTitleForIncident(&incident);
  const std::string summary = incident.summary().value_or(""), description = incident.fullDescription().value_or("");
  std::vector<std::string> texts;
  if (!summary.empty() && summary != title && !says(description, summary)) texts.push_back(summary);
  if (!description.empty() && description != title) texts.push_back(description);
  return texts;
}

}  // namespace nimbo
