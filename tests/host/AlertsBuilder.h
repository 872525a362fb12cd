#pragma once

#include <cstdint>
#include <string>
#include <utility>
#include <vector>

#include "platform/foundation/Date.h"
#include "platform/wire/ProtobufWriter.h"

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
    std::uint64_t effect = 8;  ///< UNKNOWN_EFFECT
  };

  static std::string feed(Date timestamp, const std::vector<Alert>& alerts) {
    ProtobufWriter writer;
    const std::size_t header = writer.beginMessage(1);
    writer.writeString("2.0", 1);
    writer.writeUInt64(static_cast<std::uint64_t>(timestamp.time_since_epoch().count() / 1000000), 3);
    writer.endMessage(header);
    for (const Alert& alert : alerts) write(writer, alert);
    const Bytes bytes = writer.takeBytes();
    return {bytes.begin(), bytes.end()};
  }

 private:
  static void write(ProtobufWriter& writer, const Alert& alert) {
    const std::size_t entity = writer.beginMessage(2);
    writer.writeString(alert.id, 1);
    const std::size_t body = writer.beginMessage(5);
    if (alert.start != 0 || alert.end != 0) {
      const std::size_t period = writer.beginMessage(1);
      if (alert.start != 0) writer.writeUInt64(static_cast<std::uint64_t>(alert.start), 1);
      if (alert.end != 0) writer.writeUInt64(static_cast<std::uint64_t>(alert.end), 2);
      writer.endMessage(period);
    }
    for (const std::string& route : alert.routes) {
      const std::size_t selector = writer.beginMessage(5);
      writer.writeString(route, 2);
      writer.endMessage(selector);
    }
    writer.writeUInt64(alert.effect, 7);
    for (const auto& [field, text] : {std::pair{10u, &alert.header}, {11u, &alert.description}}) {
      if (text->empty()) continue;
      const std::size_t translated = writer.beginMessage(field);
      const std::size_t translation = writer.beginMessage(1);
      writer.writeString(*text, 1);
      writer.endMessage(translation);
      writer.endMessage(translated);
    }
    writer.endMessage(body);
    writer.endMessage(entity);
  }
};

}  // namespace nimbo
