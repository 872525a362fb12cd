#pragma once

#include <map>
#include <memory>
#include <mutex>
#include <stop_token>
#include <string>
#include <vector>

#include "desktop/gtfs/feeds/FeedLibrary.h"
#include "platform/SerialQueue.h"
#include "platform/TransitLineService.h"

namespace nimbo {

/// The line service over GTFS static feeds and GTFS-Realtime alerts. Works on threads of its own; lookups come one
/// after the other, the feeds of one lookup at the same time, so that no feed waits for another one's server. A lookup
/// that takes longer than `DueAnswer::kPatience` is answered with an error; a static feed that it waits for goes on
/// coming, and the next lookup joins that. Nothing
/// is opened, and no thread begins, before the first lookup.
class GTFSTransitLineService final : public TransitLineService {
 public:
  explicit GTFSTransitLineService(const Paths& paths);
  /// Ends a running lookup early; its handler is not called. Main thread.
  ~GTFSTransitLineService() override;

  /// The feeds that lookups read, with what is coming of them. As long as this lives.
  const FeedLibrary& library() const;

  /// The language of incidents' texts for lookups from now on, a BCP 47 tag; "en" until set. Any thread.
  void setLanguage(std::string tag);

  /// Errors are of kTransitLineServiceErrorDomain and carry a reason for the user. A lookup of which no line is known
  /// any more is an error too.
  void lookup(const std::vector<MapItemIdentifierRef>& identifiers, Handler handler) override;

  /// The lines that the last lookup which succeeded left out, since their feeds do not know them any more. Any thread.
  std::vector<MapItemIdentifierRef> goneLines() const;

  /// An incident in force that is known although the lookup failed, since another feed answered.
  struct KnownIncident {
    std::string line;  ///< name of a line that it hits
    std::string title;
  };
  /// Those of the last lookup, where it failed; the first ones, when they are many. Any thread.
  std::vector<KnownIncident> knownIncidents() const;

  /// When the publishers made the alerts that the last lookup which succeeded went by, by the names of their feeds;
  /// without those that do not say. Any thread.
  std::map<std::string, Date> asOf() const;

 private:
  struct Shared;
  std::shared_ptr<Shared> _shared;
  std::stop_source _stop;
  SerialQueue _queue;
};

}  // namespace nimbo
