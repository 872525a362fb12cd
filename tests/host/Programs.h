#pragma once

#include <nlohmann/json.hpp>
#include <string>
#include <vector>

#include "host/AlertsBuilder.h"
#include "platform/foundation/Date.h"
#include "support/TemporaryFolder.h"

namespace nimbo {

/// What a program said and how it ended.
struct ProgramRun {
  int status = 0;
  std::string output;
  std::string errors;
};

/// The built programs in folders of the test's own, with a small city of two agencies to set up:
/// agency M (metro): lines 1 and 2; agency B (buses): lines 10, 11 and 12.
class Programs {
 public:
  Programs();

  /// The virtual date of the tests.
  static Date now() { return *dateFromISOText("2026-01-05T12:00:00Z"); }
  static std::int64_t unixNow() { return now().time_since_epoch().count() / 1000000; }

  /// Runs nimbo-transit with these arguments, folders given. Where `output` names a device, the output goes there.
  ProgramRun run(const std::vector<std::string>& arguments, const std::string& input = {},
                 const std::string& output = {}) const;
  /// Plays host events with time standing still at `now`, and gives every line that came back.
  std::vector<nlohmann::json> play(const std::vector<nlohmann::json>& events) const;

  /// Sets the city's feed up with these favourites; `alerts` is what its alerts file then holds.
  void setUpCity(const std::vector<std::string>& favorites, const std::vector<AlertsBuilder::Alert>& alerts) const;
  void publish(const std::vector<AlertsBuilder::Alert>& alerts) const;
  void publishBytes(std::string_view bytes) const { folder.write("feed/alerts.pb", bytes); }
  std::string alertsFile() const { return folder.path() / "feed/alerts.pb"; }

  TemporaryFolder folder;
};

/// A request of a host; the identifiers count up by themselves.
nlohmann::json request(const std::string& method, nlohmann::json params = nlohmann::json::object());
/// initialize with the most room of both modes, loadView, viewWillAppear and viewDidAppear.
std::vector<nlohmann::json> appearing(double compactHeight = 110, double expandedHeight = 440);
/// The answers to snapshot requests among what came back.
std::vector<nlohmann::json> snapshots(const std::vector<nlohmann::json>& lines);
/// The primary texts of a snapshot's rows.
std::vector<std::string> titles(const nlohmann::json& snapshot);

}  // namespace nimbo
