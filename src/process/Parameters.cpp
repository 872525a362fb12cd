#include "process/Parameters.h"

#include <cmath>

namespace nimbo {

using nlohmann::json;

namespace {

[[noreturn]] void fail(std::string_view name, std::string_view expected) {
  throw JSONRPCFailure(JSONRPCError::kInvalidParams,
                       "parameter \"" + std::string(name) + "\" must be " + std::string(expected));
}

bool isLength(const json& value) {
  constexpr double kLargest = 100000;
  return value.is_number() && value.get<double>() >= 0 && value.get<double>() <= kLargest;
}

}  // namespace

std::string_view nameOfDisplayMode(WidgetDisplayMode mode) {
  return mode == WidgetDisplayMode::Expanded ? "expanded" : "compact";
}

const json& Parameters::value(std::string_view name) const {
  const auto found = _params.find(name);
  if (found == _params.end()) fail(name, "given");
  return *found;
}

std::string Parameters::text(std::string_view name) const {
  const json& found = value(name);
  if (!found.is_string()) fail(name, "a text");
  return found.get<std::string>();
}

std::optional<std::string> Parameters::optionalText(std::string_view name) const {
  return has(name) ? std::optional(text(name)) : std::nullopt;
}

double Parameters::number(std::string_view name, double minimum, double maximum) const {
  const json& found = value(name);
  if (!found.is_number() || !(found.get<double>() >= minimum && found.get<double>() <= maximum))
    fail(name, "a number from " + json(minimum).dump() + " to " + json(maximum).dump());
  return found.get<double>();
}

Size Parameters::size(std::string_view name) const {
  const json& found = value(name);
  if (!found.is_array() || found.size() != 2 || !isLength(found[0]) || !isLength(found[1]))
    fail(name, "[width, height], each from 0 to 100000 points");
  return {found[0].get<double>(), found[1].get<double>()};
}

IndexPath Parameters::indexPath() const {
  const auto index = [this](std::string_view name) {
    const json& found = value(name);
    if (!found.is_number_integer() || found < 0 || found > INT32_MAX) fail(name, "a whole number, 0 or more");
    return found.get<std::int64_t>();
  };
  return {index("section"), index("row")};
}

bool Parameters::flag(std::string_view name) const {
  const json& found = value(name);
  if (!found.is_boolean()) fail(name, "true or false");
  return found.get<bool>();
}

WidgetDisplayMode Parameters::displayMode(std::string_view name) const {
  const std::string mode = text(name);
  if (mode == "compact") return WidgetDisplayMode::Compact;
  if (mode == "expanded") return WidgetDisplayMode::Expanded;
  fail(name, "\"compact\" or \"expanded\"");
}

ContentSizeCategory Parameters::textSize(std::string_view name) const {
  const auto category = contentSizeCategoryFromName(text(name));
  if (!category) fail(name, "a text size from \"extraSmall\" to \"accessibilityExtraExtraExtraLarge\"");
  return *category;
}

Appearance Parameters::appearance(std::string_view name) const {
  const std::string appearance = text(name);
  if (appearance == "light") return Appearance::light;
  if (appearance == "dark") return Appearance::dark;
  fail(name, "\"light\" or \"dark\"");
}

Parameters Parameters::object(std::string_view name) const {
  const json& found = value(name);
  if (!found.is_object()) fail(name, "an object");
  return Parameters(found);
}

}  // namespace nimbo
