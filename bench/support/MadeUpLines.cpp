#include "support/MadeUpLines.h"

#include <stdlib.h>

#include <stdexcept>

#include "platform/transit/BasicTransitLineItem.h"
#include "platform/transit/TransitIncident.h"

namespace nimbo {

namespace {

std::filesystem::path makeFolder() {
  std::string name = (std::filesystem::temp_directory_path() / "nimbo-bench.XXXXXX").native();
  if (!mkdtemp(name.data())) throw std::runtime_error("cannot make a folder for the benchmarks");
  return name;
}

TransitIncidentRef incident(std::uint64_t number) {
  static const Date now = currentDate();  // what two fetches bring is equal
  const std::string text = std::to_string(number);
  TransitIncidentFields fields;
  fields.muid = 0x9E3779B97F4A7C15u * (number + 1);
  fields.title = "Delays of up to 15 minutes after incident " + text;
  fields.summary = "Trains run at a lower frequency between Northgate and Old Docks because of works, number " + text;
  fields.fullDescription = *fields.summary + ". Buses replace trains from 22:00 on. Allow more time for your journey.";
  fields.messageForRoutePlanning = fields.messageForRouteStepping = fields.messageForNonRoutable = fields.title;
  fields.startDate = now - std::chrono::hours(1);
  fields.endDate = now + std::chrono::hours(24);
  fields.affectedEntities = {std::make_shared<const BasicAffectedEntity>(number)};
  fields.linkURL = "https://example.org/incidents/" + text;
  return std::make_shared<const BasicTransitIncident>(std::move(fields));
}

TransitArtworkRef shield(const std::string& name, std::size_t line) {
  static constexpr const char* kColors[] = {"#c8102e", "#0057b7", "#00843d", "#6d2077", "#f2a900"};
  return std::make_shared<const TransitArtwork>(TransitArtwork::Fields{
      .artworkSourceType = static_cast<std::int64_t>(ArtworkSourceType::shield),
      .shieldDataSource = TransitShield{.shieldText = name, .shieldColorString = kColors[line % std::size(kColors)]},
      .accessibilityText = name + ", Northgate - Seabrook"});
}

}  // namespace

TransitLineItems madeUpLines(std::size_t count, std::size_t incidentsEach, bool shared) {
  const auto system = std::make_shared<const TransitSystem>(1, "Metro", nullptr);
  TransitLineItems lines;
  TransitIncidents incidents;
  for (std::size_t line = 0; line < count; ++line) {
    if (!shared || line % 2 == 0) {
      incidents.clear();
      for (std::size_t i = 0; i < incidentsEach; ++i) incidents.push_back(incident(line * incidentsEach + i));
    }
    const std::string name = "M" + std::to_string(line + 1);
    BasicTransitLineItem::Fields fields;
    fields.identifier = std::make_shared<const MapItemIdentifier>(
        line + 1, TransitLineLocator{"metro", "agency", name, name, TransitMode::subway});
    fields.name = name;
    fields.system = system;
    fields.artwork = fields.alternateArtwork = shield(name, line);
    fields.lineColorString = "#c8102e";
    fields.incidents = incidents;
    lines.push_back(std::make_shared<const BasicTransitLineItem>(std::move(fields)));
  }
  return lines;
}

BenchPlatform::BenchPlatform()
    : _folder(makeFolder()),
      _platform({.paths = {_folder, _folder, _folder / "cache"},
                 .locale = "en",
                 .runLoop = _runLoop,
                 .activityLauncher = *this}) {}

BenchPlatform::~BenchPlatform() { std::filesystem::remove_all(_folder); }

}  // namespace nimbo
