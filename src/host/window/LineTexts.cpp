#include "host/window/LineTexts.h"

namespace nimbo {

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

}  // namespace nimbo
