#pragma once

#include <atomic>
#include <functional>
#include <map>
#include <memory>
#include <mutex>
#include <optional>
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

  /// Hears of each answer, before its handler does, on the main thread. For lookups from now on; main thread.
  void setAnswerObserver(std::function<void()> observer) { _answered = std::move(observer); }

  /// How many seconds old an answer of a server may be that serves without asking again, whichever process got it;
  /// asked at the beginning of each lookup from now on, on its thread. Until set, servers are asked each time. Main
  /// thread.
  void setSharedAge(std::function<TimeInterval()> age) { _sharedAge = std::move(age); }
  /// For the next lookup it is this age. Main thread.
  void shareNext(TimeInterval age) { _nextAge = age; }
  /// Has the next lookup ask all servers, however young their answers are. Main thread.
  void askServersNext(bool asks) { _asksServers = asks; }
  /// Whether the last lookup took an answer that was there. Any thread.
  bool tookShared() const;
  /// When the youngest answer came that the last lookup went by; absent where no server was needed. Any thread.
  std::optional<Date> youngestAnswer() const;

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

  /// What is known of a line that was asked for.
  struct LineVerdict {
    MapItemIdentifierRef identifier;
    TransitLineItemRef item;  ///< null where nothing is known
    ErrorRef unknownReason;   ///< null where something is
  };
  /// What the last lookup found out, also where it failed for other lines; empty before the first one. Any thread.
  std::vector<LineVerdict> verdicts() const;
  /// Of when the answers are that the last lookup which succeeded went by, the oldest of them; absent before that. Any
  /// thread.
  std::optional<Date> updatedAt() const;
  /// When the verdicts were found; absent before the first lookup has ended. Any thread.
  std::optional<Date> askedAt() const;

  /// When the publishers made the alerts that the last lookup which succeeded went by, by the names of their feeds;
  /// without those that do not say. Any thread.
  std::map<std::string, Date> asOf() const;

 private:
  struct Shared;
  std::shared_ptr<Shared> _shared;
  std::function<void()> _answered;
  std::function<TimeInterval()> _sharedAge;
  std::atomic<TimeInterval> _nextAge = kUsualAge;
  std::atomic<bool> _asksServers = false;
  static constexpr TimeInterval kUsualAge = -1;
  std::stop_source _stop;
  SerialQueue _queue;
};

}  // namespace nimbo
