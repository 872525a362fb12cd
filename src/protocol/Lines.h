#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

#include "platform/foundation/Date.h"
#include "protocol/Shield.h"
#include "protocol/Snapshot.h"

// How each favorite line runs. Absent optionals stand as null, but where something else is said.
namespace nimbo::protocol {

/// How a line runs.
enum class LineState { good, affected, unknown };

/// How grave a publisher says an incident is, the least first.
enum class Severity { unknown, info, warning, severe };

/// What an incident means for riders of its lines, the least first: by the detail of its effect where that is known,
/// else by its effect. One that is severe is not none.
enum class Concern { none, additionalService, other, detour, delays, reducedService, noService };

/// An incident of a line, in one of its periods.
struct LineIncident {
  std::string id;  ///< its number in decimal
  std::string title;
  std::optional<std::string> text;  ///< what its publisher says beyond the title
  std::optional<Date> from;         ///< absent: since ever
  std::optional<Date> until;        ///< absent: until further notice
  std::optional<std::string> url;
  Severity severity = Severity::unknown;
  std::string effect;  ///< the reference's word in lower case, such as "detour"
  std::string cause;   ///< the same, such as "construction"
  Concern concern = Concern::other;
  bool isNew = true;                     ///< the rider has not seen it as it is
  bool hasImage = false;                 ///< `image` can be asked for it
  std::optional<std::string> imageText;  ///< what the image of the alert says, also of one that cannot be shown
};

/// What is known of a favorite line.
struct LineReport {
  std::string id;  ///< "FEED:ROUTE_ID"
  std::uint64_t muid = 0;
  std::string name;
  std::optional<std::string> agency;
  std::optional<Shield> shield;
  LineState state = LineState::unknown;
  std::optional<FetchError> reason;     ///< of an unknown state, else absent
  std::vector<LineIncident> incidents;  ///< in force, the gravest first
  std::vector<LineIncident> planned;    ///< that begin within seven days, the earliest first
};

/// The favorites in their order, by the last fetch of the process.
struct Lines {
  std::optional<Date> updated;  ///< when a fetch last ended well; absent: none did
  std::vector<LineReport> lines;
  std::optional<FetchError> error;  ///< why not all favorites are known; left out where they are
  std::optional<Date> asked;        ///< when the last fetch ended, well or not; left out where none did
  bool isCut = false;               ///< incidents were left out for want of room
};

struct LinesParams {
  bool texts = true;  ///< without them incidents have no title, text, address and text of their image
};

struct MarkSeenParams {
  std::vector<std::string> ids;  ///< numbers of incidents in decimal
};

/// Setting: what the last fetch of any process found out, `Lines` as JSON, with the date of that fetch as `updated` and
/// without shields and what its incidents say.
inline constexpr std::string_view kSavedLinesKey = "Nimbo.TransitWidget.savedLines";

/// A static feed that is being downloaded.
struct Download {
  std::string feed;
  std::uint64_t received = 0;           ///< bytes
  std::optional<std::uint64_t> length;  ///< bytes that it has; left out where its server does not say
};

struct Downloads {
  std::vector<Download> downloads;
};

}  // namespace nimbo::protocol
