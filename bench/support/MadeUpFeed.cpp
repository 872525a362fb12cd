#include "support/MadeUpFeed.h"

#include <gtfs-realtime.pb.h>

namespace nimbo {

namespace {

std::string sentences(const std::string& about, std::size_t size) {
  std::string text;
  while (text.size() < size)
    text += "Because of " + about + " trains run at a lower frequency between Northgate and Old Docks. ";
  return text;
}

void addTexts(transit_realtime::TranslatedString& texts, const std::string& english, const std::string& german) {
  for (const auto& [text, language] : {std::pair(english, "en"), std::pair(german, "de")}) {
    auto& translation = *texts.add_translation();
    translation.set_text(text);
    translation.set_language(language);
  }
}

}  // namespace

std::string madeUpRoutes() {
  std::string text = "route_id,agency_id,route_short_name,route_long_name,route_type,route_color,route_text_color\n";
  for (std::size_t i = 0; i < kMadeUpRoutes; ++i) {
    const std::string number = std::to_string(i);
    text.append("R").append(number).append(",A").append(std::to_string(i % 10)).append(",").append(number);
    text.append(",\"Central Station - Terminal ").append(number).append(" via Harbour Square\",3,0057B7,FFFFFF\n");
  }
  return text;
}

std::string madeUpAgencies() {
  std::string text = "agency_id,agency_name,agency_url,agency_timezone\n";
  for (int i = 0; i < 10; ++i) {
    const std::string number = std::to_string(i);
    text.append("A").append(number).append(",Agency ").append(number).append(",https://example.org,Europe/Berlin\n");
  }
  return text;
}

std::string madeUpAlerts(std::uint64_t now) {
  transit_realtime::FeedMessage feed;
  feed.mutable_header()->set_gtfs_realtime_version("2.0");
  feed.mutable_header()->set_timestamp(now);
  for (std::size_t i = 0; i < kMadeUpAlerts; ++i) {
    const std::string number = std::to_string(i);
    auto& entity = *feed.add_entity();
    entity.set_id("alert-" + number);
    auto& alert = *entity.mutable_alert();
    alert.add_active_period()->set_start(now - 3600);
    alert.mutable_active_period(0)->set_end(now + 86400);
    for (const std::size_t route : {i % kMadeUpRoutes, (i * 7 + 1) % kMadeUpRoutes, (i * 31 + 5) % kMadeUpRoutes}) {
      auto& selector = *alert.add_informed_entity();
      selector.set_agency_id("A" + std::to_string(route % 10));
      selector.set_route_id("R" + std::to_string(route));
    }
    for (std::size_t stop = 0; stop < 3; ++stop)
      alert.add_informed_entity()->set_stop_id("stop-" + std::to_string(i * 3 + stop));
    alert.set_cause(9);
    alert.set_effect(3);
    addTexts(*alert.mutable_url(), "https://example.org/en/" + number, "https://example.org/de/" + number);
    addTexts(*alert.mutable_header_text(), "Delays after works, number " + number, "Verzögerungen, Nummer " + number);
    addTexts(*alert.mutable_description_text(), sentences("works of number " + number, 280),
             sentences("Bauarbeiten der Nummer " + number, 280));
  }
  return feed.SerializeAsString();
}

}  // namespace nimbo
