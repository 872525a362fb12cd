#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <variant>
#include <vector>

#include "protocol/Shield.h"
#include "protocol/Snapshot.h"

// What hosts ask of feeds, which the widget process alone fetches and reads. An optional is absent from the message
// unless it is said to stand as null.
namespace nimbo::protocol {

/// The agency that runs a line.
struct Agency {
  std::string id;          ///< as its feed has it, may be empty
  std::uint64_t muid = 0;  ///< number of its system
  std::optional<std::string> name;
  std::optional<Shield> artwork;  ///< symbol of the mode that all its lines share; null where they share none
};

/// A line as its feed has it.
struct FeedLine {
  std::string id;  ///< "FEED:ROUTE_ID"
  std::uint64_t muid = 0;
  std::string feed;
  std::string routeID;
  std::string shortName;            ///< may be empty
  std::string longName;             ///< may be empty
  std::optional<std::string> name;  ///< the one that there is; null for a line without names
  Agency agency;
  std::int64_t mode = 0;             ///< a TransitMode
  std::optional<std::string> color;  ///< "#rrggbb"; null: none published
  std::optional<Shield> artwork;     ///< null for a line without names of an unknown mode
};

struct FindLinesParams {
  std::string query;                ///< empty: every line
  std::optional<std::string> feed;  ///< absent: of all feeds
  std::uint64_t offset = 0;         ///< hits that are passed over
  std::uint64_t limit = kMostLines;

  /// So many come in one answer at most, fewer where they are long.
  static constexpr std::uint64_t kMostLines = 1000;
};

struct FoundLines {
  std::uint64_t total = 0;           ///< hits
  std::vector<FeedLine> lines;       ///< from the offset on
  std::vector<FetchError> failures;  ///< of feeds that could not be read
};

/// A line that is asked for, by its identifier or else by its number. What is told besides the identifier finds it
/// after its agency has renumbered it.
struct LineKey {
  std::optional<std::string> id;      ///< "FEED:ROUTE_ID"
  std::optional<std::uint64_t> muid;  ///< of a line of any feed
  std::optional<std::string> agencyID;
  std::optional<std::string> shortName;
  std::optional<std::int64_t> mode;  ///< a TransitMode
};

struct DescribeLinesParams {
  std::vector<LineKey> lines;
};

struct DescribedLine {
  std::optional<FeedLine> line;  ///< null for one that could not be found
  bool isGone = false;           ///< the feeds that could have it were read, and do not
};

struct DescribedLines {
  std::vector<DescribedLine> lines;  ///< as they were asked for
  std::vector<FetchError> failures;  ///< of feeds that could not be read or are not set up, once each
};

/// What a server lets its clients in by.
struct FeedKey {
  std::vector<std::string> headers;  ///< "NAME: VALUE"
  std::string query;                 ///< goes to the end of the address's query; may be empty
};

/// A feed as its user sets it up.
struct FeedDefinition {
  std::string name;
  std::string staticFeed;  ///< path or address
  std::string alerts;      ///< path or address
  bool minorAlerts = false;
  bool isCombined = false;
  std::optional<std::int64_t> maximumAlertsAgeMinutes;
  std::optional<std::string> staticMirror;  ///< address
  std::optional<FeedKey> staticKey, alertsKey;
  bool sharesAlerts = false;  ///< other feeds go with the same alerts
};

/// One of the two.
struct CheckFeedParams {
  std::optional<std::string> feed;  ///< name of one that is set up
  std::optional<FeedDefinition> definition;
};

/// What was skipped for one reason.
struct Skipped {
  std::string reason;
  std::uint64_t count = 0;
  std::string example;  ///< may be empty
};

struct StaticFeedReport {
  std::uint64_t agencies = 0;
  std::uint64_t lines = 0;
  std::uint64_t trips = 0;
  std::string language;  ///< empty where the feed does not say
  std::vector<Skipped> skipped;
};

struct AlertsReport {
  std::string version;
  std::optional<Date> timestamp;
  std::optional<FetchError> staleness;  ///< when the feed is too old to be used
  std::optional<FetchError> gap;        ///< when no verdict on a line can be had from the alerts
  std::uint64_t alerts = 0;
  std::vector<Skipped> skipped;
  bool hasOthers = false;  ///< positions of vehicles or times of trips come beside the alerts
  // Against the static feed; 0 and empty where that cannot be read.
  std::uint64_t periods = 0;  ///< of alerts that concern a line
  std::uint64_t selectors = 0;
  std::uint64_t incidents = 0;      ///< different ones, in force or to come
  std::uint64_t affectedLines = 0;  ///< with an incident in force now
  std::vector<Skipped> unfit;       ///< selectors that fit no line
};

/// What a feed holds and how well its two halves fit together.
struct FeedReport {
  std::string name;
  std::optional<StaticFeedReport> staticFeed;
  std::optional<FetchError> staticError;
  std::optional<AlertsReport> alerts;
  std::optional<FetchError> alertsError;
  bool isOtherFeed = false;  ///< the alerts are another kind of feed, which may hold some at other times

  /// What keeps lines from a verdict; empty for a feed that can be used.
  std::vector<FetchError> faults() const {
    std::vector<FetchError> found;
    for (const auto* error : {&staticError, &alertsError})
      if (*error) found.push_back(**error);
    if (alerts)
      for (const auto* error : {&alerts->staleness, &alerts->gap})
        if (*error) found.push_back(**error);
    return found;
  }
};

/// The identifier of a request.
using RequestID = std::variant<std::int64_t, std::string>;

struct CancelParams {
  RequestID request;
};

/// Which half of a feed is read.
enum class FeedPart { staticFeed, alerts };

/// How far a request is that takes long.
struct ProgressParams {
  RequestID request;
  std::string feed;  ///< the one that is read
  FeedPart part = FeedPart::staticFeed;
  std::uint64_t received = 0;           ///< bytes of it that have come
  std::optional<std::uint64_t> length;  ///< bytes that it has, where its server says so
  std::uint64_t done = 0;               ///< feeds that have been read
  std::uint64_t total = 0;              ///< feeds that are to be read
};

}  // namespace nimbo::protocol
