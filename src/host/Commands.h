#pragma once

#include <functional>
#include <optional>
#include <stdexcept>
#include <string>
#include <vector>

#include "desktop/system/GLibRunLoop.h"
#include "desktop/system/Paths.h"
#include "host/TerminalText.h"
#include "platform/foundation/Geometry.h"
#include "platform/foundation/Outcome.h"
#include "platform/transit/TransitLine.h"

namespace nimbo::protocol {
struct FeedReport;
}

namespace nimbo {

/// What every command of the command line has at hand.
struct CommandContext {
  GLibRunLoop& runLoop;
  Paths paths;
  /// Arguments that give the widget process the same folders.
  std::vector<std::string> widgetArguments;
  /// Tells the user, whatever the command goes on to do, something that he must hear, such as that a damaged database
  /// was set aside. Any thread.
  std::function<void(const std::string& message)> tell = printMessage;
};

/// Ends a command: the message says what failed, where, and what to do.
struct CommandFailure : std::runtime_error {
  using std::runtime_error::runtime_error;
};

/// Throws the failure that an error tells of; nothing happens for null.
inline void require(const ErrorRef& error) {
  if (error) throw CommandFailure(error->reason());
}
template <class T>
T require(Outcome<T> outcome) {
  require(outcome.error());
  return std::move(*outcome);
}

/// Exit statuses of the programs.
inline constexpr int kExitSuccess = 0;
inline constexpr int kExitFailure = 1;
inline constexpr int kExitUsage = 2;

// Lines are named FEED:ROUTE_ID.

int runFavoriteAdd(const CommandContext& context, const std::vector<std::string>& lines);
int runFavoriteRemove(const CommandContext& context, const std::vector<std::string>& lines);
/// `position` counts from 1.
int runFavoriteMove(const CommandContext& context, const std::string& line, int position);
int runFavoriteList(const CommandContext& context, bool json);

/// Prints the feeds of the catalog whose agency, name, identifier or place `text` has the words of. Fails when there
/// are none, after it has told what there is in which country; as JSON that is an empty array.
int runFeedFind(const CommandContext& context, const std::string& text, bool json);

/// What a feed is to be like; for one that is there, what of it is to change.
struct FeedOptions {
  std::string name;                                       ///< may be empty with `from`
  std::string from;                                       ///< identifier of the catalog; empty: by the addresses
  std::optional<std::string> staticFeed, alerts, mirror;  ///< folder, file or http(s) address
  std::optional<std::string> key;                         ///< goes where the catalog says
  std::string keyFile;                                    ///< holds the key; "-" is the standard input
  std::vector<std::string> headers, staticHeaders, alertsHeaders;  ///< "NAME: VALUE"
  bool withoutKeys = false;                                        ///< those that are kept are dropped
  std::optional<bool> isCombined;                                  ///< whether other entities may come without alerts
  std::optional<bool> minorAlerts;  ///< whether alerts count that change nothing for most riders
  std::optional<int> maximumAlertsAgeMinutes;
  bool force = false;  ///< keeps what cannot be used
};

/// Reads what is to be set up, says what is in it, and keeps it when it can be used.
int runFeedAdd(const CommandContext& context, const FeedOptions& options);
/// The same for a feed that is there.
int runFeedEdit(const CommandContext& context, const FeedOptions& options);
int runFeedRemove(const CommandContext& context, const std::string& name);
int runFeedList(const CommandContext& context, bool json);
/// Reads a feed, or with an empty name every one, and prints what it holds. Fails when one cannot be read.
int runFeedCheck(const CommandContext& context, const std::string& name);

/// Prints the lines of all feeds that contain `text`, one a line, as FEED:ROUTE_ID, names and agency.
int runLines(const CommandContext& context, const std::string& text, bool json);

/// Prints what a check found. Answers whether both halves can be used.
bool printCheck(const protocol::FeedReport& report);

/// Prints a line each, or an array as docs/formats.md has it.
void printLines(const std::vector<TransitLineRef>& lines, bool json);

/// Prints a setting: "true", "false", the text (as it is but to a terminal), or the bytes as base64. Fails when it is
/// not set.
int runSettingsGet(const CommandContext& context, const std::string& key);
/// Stores "true", "YES", "false" or "NO" as a boolean, anything else as a text.
int runSettingsSet(const CommandContext& context, const std::string& key, const std::string& value);
int runSettingsUnset(const CommandContext& context, const std::string& key);

/// Prints the analytics that are kept, the oldest first.
int runAnalytics(const CommandContext& context, bool json);

/// Has the widget process read a hand-off payload or a saved state, and prints it as JSON; "-" is the standard input.
/// Fails with what is wrong and where.
int runDecode(const CommandContext& context, const std::string& file);

struct StatusOptions {
  bool expanded = false;
  bool json = false;      ///< the snapshot of docs/protocol.md instead of text
  bool lines = false;     ///< each favourite line with its state, instead of the rows
  bool planned = false;   ///< what is to come within seven days, instead of the rows
  bool saved = false;     ///< the rows of the last time, without a fetch
  bool exitCode = false;  ///< the exit status tells the state
  /// "json": the state of each favourite line as docs/formats.md has it; a bar's format is no concern of `runStatus`.
  std::string format = "text";
  std::optional<std::string> now;  ///< ISO date by which incidents are judged
};

/// Prints how the favourite lines run. Fails, after printing the error row, when the update failed; with `exitCode`
/// the status tells the state then too.
int runStatus(const CommandContext& context, const StatusOptions& options);

/// Fetches and saves the rows for the next start of the widget, and tells the desktop of incidents, with `notify` or
/// where the settings have it so. A failed fetch fails, and leaves the rows of the last time.
int runUpdate(const CommandContext& context, bool notify);

struct RenderOptions {
  bool expanded = false;
  std::optional<Size> size;  ///< the most room in points; absent: as `status` has it
  double scale = 2;
  std::string textSize = "large";
  bool dark = false;
  std::optional<std::string> locale;
  std::optional<std::string> now;
  std::string output;  ///< path of the PNG file
};

/// Draws the rows into a PNG file.
int runRender(const CommandContext& context, const RenderOptions& options);

/// Plays a file of host events to a widget process; "-" is the standard input. The widget's time stands still at
/// `virtualTime` when that is given.
int runScript(const CommandContext& context, const std::string& file, const std::optional<std::string>& virtualTime);

}  // namespace nimbo
