#include "desktop/gtfs/feeds/SampleCity.h"

#include <nlohmann/json.hpp>
#include <protozero/pbf_builder.hpp>

#include "desktop/gtfs/alerts/RealtimeFields.h"
#include "desktop/gtfs/feeds/FeedConfiguration.h"
#include "desktop/gtfs/feeds/FeedMuid.h"
#include "desktop/gtfs/static/LineItems.h"
#include "desktop/gtfs/static/StaticFeedBuilder.h"
#include "desktop/resources/Resources.h"

namespace nimbo {

namespace {

using nlohmann::json;
using AlertBuilder = protozero::pbf_builder<AlertField>;

// Names as published, in the order of their numbers from 1 on.
constexpr std::array<std::string_view, 12> kCauses = {
    "UNKNOWN_CAUSE", "OTHER_CAUSE", "TECHNICAL_PROBLEM", "STRIKE",       "DEMONSTRATION",   "ACCIDENT",
    "HOLIDAY",       "WEATHER",     "MAINTENANCE",       "CONSTRUCTION", "POLICE_ACTIVITY", "MEDICAL_EMERGENCY"};
constexpr std::array<std::string_view, 11> kEffects = {
    "NO_SERVICE",   "REDUCED_SERVICE", "SIGNIFICANT_DELAYS", "DETOUR",    "ADDITIONAL_SERVICE", "MODIFIED_SERVICE",
    "OTHER_EFFECT", "UNKNOWN_EFFECT",  "STOP_MOVED",         "NO_EFFECT", "ACCESSIBILITY_ISSUE"};
constexpr std::array<std::string_view, 4> kSeverities = {"UNKNOWN_SEVERITY", "INFO", "WARNING", "SEVERE"};

void writeName(AlertBuilder& alert, AlertField field, const json& value, std::span<const std::string_view> names) {
  const auto found = std::find(names.begin(), names.end(), value.get<std::string>());
  if (found == names.end()) throw std::invalid_argument("not a name of GTFS-Realtime: " + value.dump());
  alert.add_enum(field, static_cast<std::int32_t>(found - names.begin()) + 1);
}

void writeText(AlertBuilder& alert, AlertField field, const json& texts) {
  protozero::pbf_builder<TranslatedStringField> string(alert, field);
  for (const auto& [language, text] : texts.items()) {
    protozero::pbf_builder<TranslationField> translation(string, TranslatedStringField::translation);
    translation.add_string(TranslationField::text, text.get<std::string>());
    if (!language.empty()) translation.add_string(TranslationField::language, language);
  }
}

void writeAlert(AlertBuilder alert, const json& description, std::int64_t anchor) {
  for (const json& period : description.at("periods")) {
    protozero::pbf_builder<TimeRangeField> range(alert, AlertField::activePeriod);
    const auto write = [&](TimeRangeField field, const char* key) {
      if (period.contains(key))
        range.add_uint64(field, static_cast<std::uint64_t>(anchor + period.at(key).get<std::int64_t>()));
    };
    write(TimeRangeField::start, "start");
    write(TimeRangeField::end, "end");
  }
  for (const json& route : description.at("routes")) {
    protozero::pbf_builder<EntitySelectorField> selector(alert, AlertField::informedEntity);
    selector.add_string(EntitySelectorField::routeID, route.get<std::string>());
  }
  writeName(alert, AlertField::cause, description.at("cause"), kCauses);
  writeName(alert, AlertField::effect, description.at("effect"), kEffects);
  if (description.contains("url")) writeText(alert, AlertField::url, {{"", description.at("url")}});
  writeText(alert, AlertField::headerText, description.at("header"));
  if (description.contains("description")) writeText(alert, AlertField::descriptionText, description.at("description"));
  if (description.contains("severity"))
    writeName(alert, AlertField::severityLevel, description.at("severity"), kSeverities);
}

}  // namespace

std::string alertsFeedBytes(const json& alerts, Date anchor) {
  const std::int64_t seconds = anchor.time_since_epoch() / std::chrono::seconds(1);
  std::string bytes;
  protozero::pbf_builder<FeedMessageField> message(bytes);
  {
    protozero::pbf_builder<FeedHeaderField> header(message, FeedMessageField::header);
    header.add_string(FeedHeaderField::gtfsRealtimeVersion, "2.0");
    header.add_enum(FeedHeaderField::incrementality, 0);
    header.add_uint64(FeedHeaderField::timestamp, static_cast<std::uint64_t>(seconds));
  }
  for (const json& description : alerts) {
    protozero::pbf_builder<FeedEntityField> entity(message, FeedMessageField::entity);
    entity.add_string(FeedEntityField::id, description.at("id").get<std::string>());
    writeAlert(AlertBuilder(entity, FeedEntityField::alert), description, seconds);
  }
  return bytes;
}

namespace {

std::optional<std::string_view> sampleFile(std::string_view name) {
  return resourceNamed("sample-city/" + std::string(name));
}

class SampleFiles final : public StaticFeedFiles {
 public:
  Outcome<bool> read(std::string_view name, std::uint64_t, const Sink& sink) override {
    const auto bytes = sampleFile(name);
    return bytes && (sink(*bytes), true);
  }
  std::string_view place() const override { return "of the sample city"; }
};

StaticFeed readSampleFeed(Date date) {
  SampleFiles files;
  const auto parsed = readStaticFeed(files, std::string(kSampleFeedName));
  if (!parsed) throw std::logic_error(parsed.error()->reason());
  return parsed->feed.finish(kSampleFeedName, date);
}

}  // namespace

SampleCity::SampleCity(Date now) : _name(kSampleFeedName), _anchor(std::chrono::floor<std::chrono::minutes>(now)) {}

Outcome<LoadedStaticFeed> SampleCity::staticFeed(const std::stop_token&) const {
  // It has no trips, and its alerts name none.
  return LoadedStaticFeed{readSampleFeed(_anchor), [](auto) { return std::optional<std::uint32_t>(); }};
}

Outcome<std::optional<AlertsFeed>> SampleCity::alerts(AlertsState& state, bool needsFeed, Date,
                                                      const std::stop_token&) const {
  // It stands still while it lives.
  const auto hash = static_cast<std::size_t>(_anchor.time_since_epoch().count());
  if (!needsFeed && state.hash == hash) return std::optional<AlertsFeed>();
  auto alerts =
      AlertsFeed::read(alertsFeedBytes(nlohmann::json::parse(sampleFile("alerts.json").value()), _anchor), _name);
  if (!alerts) return alerts.error();
  state.hash = hash;
  state.timestamp = alerts->timestamp();
  return std::optional(std::move(*alerts));
}

std::vector<TransitLineRef> SampleCity::favorites() {
  const StaticFeed feed = readSampleFeed(Date{});
  LineItems items{std::string(kSampleFeedName), feed};
  std::vector<TransitLineRef> lines;
  for (const char* route : {"m1", "m2", "m3", "t4", "f1", "b17", "t9", "b31"})
    for (std::size_t i = 0; i < feed.lineCount(); ++i)
      if (feed.line(i).routeID == route) lines.push_back(items.item(i, feed.line(i).muid));
  return lines;
}

}  // namespace nimbo
