#pragma once

#include <map>
#include <memory>
#include <string>
#include <string_view>
#include <variant>

#include "platform/foundation/Boxed.h"
#include "platform/foundation/Outcome.h"
#include "platform/transit/TransitLine.h"
#include "protocol/Handoff.h"

namespace nimbo {

/// The widget screen.
struct ShowWidget {};
/// The favourites, with the lines there are to choose from.
struct ShowFavorites {
  std::string query = {};  ///< what is looked for among the lines; empty: nothing yet
};
/// The feeds.
struct ShowFeeds {};
/// A line with its incidents, as handed over.
struct ShowLine {
  TransitLineItemRef line;
};
/// A list of incidents, as handed over.
struct ShowIncidents {
  TransitIncidents incidents;
};

/// A line that is named "FEED:ROUTE_ID".
struct ShowFavoriteLine {
  std::string identifier;
};
/// The incident of a favourite line that has this number.
struct ShowIncident {
  std::uint64_t muid = 0;
};
/// What is to come on the favourite lines.
struct ShowPlanned {};

/// What a hand-off holds, which the widget process has to read first.
struct ShowHandoff {
  bool isLine = false;  ///< a line is expected, else a list of incidents
  Bytes payload;
};

/// A place in the application that somebody asks for: a row of the widget, another program, or a user.
using OpenRequest = std::variant<ShowWidget, ShowFavorites, ShowFeeds, ShowLine, ShowIncidents, ShowHandoff,
                                 ShowFavoriteLine, ShowIncident, ShowPlanned>;

/// What a URL of the application's scheme asks for: "nimbo://?favorites=2&t=r" and "nimbo://?t=r" for the favourites,
/// "nimbo://" for the widget screen, "nimbo://line?id=FEED:ROUTE_ID" for a line, "nimbo://incident?id=NUMBER" for an
/// incident of the favourites, "nimbo://planned" for what is to come on them, or a hand-off as
/// "nimbo://activity?type=TYPE&KEY=BASE64", percent-encoded. Errors tell the user what is wrong with it.
Outcome<OpenRequest> openRequestOfURL(std::string_view url);

/// What a hand-off activity asks for, from its payload alone.
Outcome<OpenRequest> openRequestOfActivity(std::string_view activityType,
                                           const std::map<std::string, Bytes, std::less<>>& userInfo);

/// The line or the incidents that a hand-off turned out to hold; `decoded` is the answer to "decode".
Outcome<OpenRequest> openRequestOfHandoff(const ShowHandoff& handoff, const Outcome<protocol::Handoff>& decoded);

}  // namespace nimbo
