#include "desktop/gtfs/SampleCity.h"

#include <nlohmann/json.hpp>

#include "desktop/gtfs/AlertsWriter.h"
#include "desktop/gtfs/FeedConfiguration.h"
#include "desktop/gtfs/FeedMuid.h"
#include "desktop/gtfs/LineItems.h"
#include "desktop/gtfs/StaticFeedReader.h"
#include "desktop/resources/Resources.h"

namespace nimbo {

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
  return LoadedStaticFeed{readSampleFeed(_anchor), nullptr};
}

Outcome<AlertsFeed> SampleCity::alerts(const std::stop_token&) const {
  return AlertsFeed::read(alertsFeedBytes(nlohmann::json::parse(sampleFile("alerts.json").value()), _anchor), _name);
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
