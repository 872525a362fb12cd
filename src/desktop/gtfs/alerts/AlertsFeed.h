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
  std::string_view id;      ///< empty for one that has none
  std::string_view body;    ///< the Alert message
  bool isRepeated = false;  ///< another alert before it has the same identifier
  bool breaksOff = false;   ///< the feed has no more of it than `body`
};

/// A GTFS-Realtime feed of service alerts: its header, and its alerts as views of its bytes. Immutable.
class AlertsFeed {
 public:
  /// Reads the frame of the feed; alerts are looked into by who needs them. `place` names the feed in errors: bytes
  /// that are no feed, are cut off, have no header with a version, or tell only what changed since another feed; and
  /// entities of which none is an alert, unless `isCombined` says that alerts come beside others. Entities that are
  /// whole and cannot be used are skipped and counted. Entities of one identifier that differ in their languages are
  /// one alert.
  static Outcome<AlertsFeed> read(std::string bytes, const std::string& place, bool isCombined = false);

  /// When the publisher made the feed; absent when he does not say.
  std::optional<Date> timestamp() const { return _timestamp; }
  /// "2.0"; not empty.
  std::string_view version() const { return _version; }
  /// In the feed's order.
  const std::vector<AlertEntity>& alerts() const { return _alerts; }
  /// Entities that are left out, by reason.
  const SkipReport& skipped() const { return _skipped; }
  /// Whether there are entities of another kind beside the alerts.
  bool hasOthers() const { return _vehicles + _tripUpdates + _others > 0; }
  /// Why the feed is no whole evidence; null where it is, as far as its frame goes.
  const ErrorRef& gap() const { return _gap; }
  const std::string& place() const { return _place; }
  const std::string& bytes() const { return *_bytes; }

 private:
  void readHeader(std::string_view body);
  void readEntity(std::string_view body);
  /// Whether an identifier comes again, which few feeds have.
  bool hasRepeated() const;
  void joinLanguages();
  std::string otherContent() const;

  // Both where they are for good: the views point into them.
  std::shared_ptr<const std::string> _bytes;
  std::shared_ptr<std::deque<std::string>> _joined = std::make_shared<std::deque<std::string>>();
  std::optional<Date> _timestamp;
  bool _isDifferential = false;
  std::string_view _version;
  std::string _place;
  ErrorRef _gap;
  std::size_t _vehicles = 0, _tripUpdates = 0, _others = 0, _alertEntities = 0;
  std::vector<AlertEntity> _alerts;
  SkipReport _skipped;
};

/// The error for an alert of the feed at `place` whose bytes break off before it says what it is about.
ErrorRef alertBreaksOff(const std::string& place);

}  // namespace nimbo
