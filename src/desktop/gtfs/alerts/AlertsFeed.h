#pragma once

#include <deque>
#include <memory>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

#include "desktop/gtfs/feeds/SkipReport.h"
#include "platform/foundation/Date.h"
#include "platform/foundation/Outcome.h"

namespace nimbo {

/// An alert where it stands in the feed's bytes.
struct AlertEntity {
  std::string_view id;      ///< not empty
  std::string_view body;    ///< the Alert message
  bool isRepeated = false;  ///< another alert before it has the same identifier
};

/// A GTFS-Realtime feed of service alerts: its header, and its alerts as views of its bytes. Immutable.
class AlertsFeed {
 public:
  /// Reads the frame of the feed; alerts are looked into by who needs them. `place` names the feed in errors: bytes
  /// that are no feed, are cut off, have no header, or tell only what changed since another feed. Entities that cannot
  /// be used are skipped and counted. Entities of one identifier that differ in their languages are one alert.
  static Outcome<AlertsFeed> read(std::string bytes, const std::string& place);

  /// When the publisher made the feed; absent when he does not say.
  std::optional<Date> timestamp() const { return _timestamp; }
  /// "2.0"; may be empty.
  std::string_view version() const { return _version; }
  /// In the feed's order.
  const std::vector<AlertEntity>& alerts() const { return _alerts; }
  /// Entities that are left out, by reason.
  const SkipReport& skipped() const { return _skipped; }
  const std::string& bytes() const { return *_bytes; }

 private:
  void readHeader(std::string_view body);
  void readEntity(std::string_view body);
  void joinLanguages();

  // Both where they are for good: the views point into them.
  std::shared_ptr<const std::string> _bytes;
  std::shared_ptr<std::deque<std::string>> _joined = std::make_shared<std::deque<std::string>>();
  std::optional<Date> _timestamp;
  bool _isDifferential = false;
  bool _hasHeader = false;
  std::string_view _version;
  std::vector<AlertEntity> _alerts;
  SkipReport _skipped;
};

}  // namespace nimbo
