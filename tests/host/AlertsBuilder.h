#pragma once

#include <cstdint>
#include <protozero/pbf_writer.hpp>
#include <string>
#include <utility>
#include <vector>

#include "platform/foundation/Date.h"

namespace nimbo {

/// The bytes of a GTFS-Realtime feed of alerts.
/// Source of the field numbers: https://gtfs.org/documentation/realtime/proto/
class AlertsBuilder {
 public:
  struct Alert {
    std::string id;
    std::vector<std::string> routes;
    std::string header;
    std::string description;
    std::int64_t start = 0;  ///< seconds since 1970; 0: open
    std::int64_t end = 0;
    std::int32_t effect = 8;  ///< UNKNOWN_EFFECT
    std::int32_t cause = 1;   ///< UNKNOWN_CAUSE
    std::int32_t severity = 1;
    std::string image = {};  ///< address of a PNG file
  };

  static std::string feed(Date timestamp, const std::vector<Alert>& alerts) {
    std::string bytes;
    protozero::pbf_writer feed(bytes);
    {
      protozero::pbf_writer header(feed, 1);
      header.add_string(1, "2.0");
      header.add_uint64(3, static_cast<std::uint64_t>(timestamp.time_since_epoch().count() / 1000000));
    }
    for (const Alert& alert : alerts) {
      protozero::pbf_writer entity(feed, 2);
      entity.add_string(1, alert.id);
      protozero::pbf_writer body(entity, 5);
      {
        protozero::pbf_writer period(body, 1);
        if (alert.start != 0) period.add_uint64(1, static_cast<std::uint64_t>(alert.start));
        if (alert.end != 0) period.add_uint64(2, static_cast<std::uint64_t>(alert.end));
      }
      for (const std::string& route : alert.routes) protozero::pbf_writer(body, 5).add_string(2, route);
      body.add_enum(6, alert.cause);
      body.add_enum(7, alert.effect);
      body.add_enum(14, alert.severity);
      if (!alert.image.empty()) {
        protozero::pbf_writer translated(body, 15);
        protozero::pbf_writer image(translated, 1);
        image.add_string(1, alert.image);
        image.add_string(2, "image/png");
      }
      for (const auto& [field, text] : {std::pair{10u, &alert.header}, {11u, &alert.description}}) {
        if (text->empty()) continue;
        protozero::pbf_writer translated(body, field);
        protozero::pbf_writer(translated, 1).add_string(1, *text);
      }
    }
    return bytes;
  }
};

}  // namespace nimbo
