#pragma once

#include <cstdint>
#include <map>
#include <optional>
#include <string>
#include <variant>
#include <vector>

#include "platform/foundation/Date.h"
#include "platform/foundation/Geometry.h"
#include "platform/foundation/Presentation.h"
#include "protocol/Shield.h"

// The table as it stands. Absent optionals stand as null, but where something else is said.
namespace nimbo::protocol {

/// The picture at a row's side: an image of the widget's own, or a shield.
struct Artwork {
  std::optional<std::string> image;  ///< a name; absent for a shield
  std::optional<Shield> shield;      ///< absent for an image
  std::optional<std::int64_t> size;  ///< of the shield, 0 to 7; absent for an image
  double alpha = 1;
};

/// What a row opens: one of the two, absent otherwise.
struct Openable {
  std::optional<std::string> url;
  std::optional<std::string> activityType;
};

/// What a row of one artwork says.
struct TransitItem {
  std::optional<std::string> primaryText;
  std::optional<std::string> secondaryText;
  std::optional<Artwork> artwork;
  bool artworkHidden = false;
  std::optional<Openable> openable;

  static constexpr std::string_view kClass = "NBTransitItem";
};

/// What the row for all incidents says.
struct SummaryItem {
  std::string primaryText;
  std::vector<Shield> artworks;
  std::optional<Openable> userActivityData;

  static constexpr std::string_view kClass = "NBTransitSummaryItem";
};

using Item = std::variant<TransitItem, SummaryItem>;

/// A view in a row.
struct ViewNode {
  std::string className;
  Rect frame;  ///< in the view above
  bool hidden = false;
  std::vector<ViewNode> views;
};

/// A row on screen; its item's keys stand among its own.
struct Row {
  std::optional<Item> item;  ///< absent for a row without content
  std::string cell;
  bool highlightable = false;
  std::int64_t separatorStyleOverride = 0;
  Rect frame;  ///< in the widget
  std::vector<ViewNode> views;
};

struct ListItem {
  std::optional<Item> summaryItem;
  std::vector<Item> expandedItems;
};

/// An incident that another feed tells of while one fails.
struct KnownIncident {
  std::string line;
  std::string title;
};

/// How the last fetch ended.
enum class FetchResult { success, error };

struct FetchError {
  std::string domain;
  std::int64_t code = 0;
  std::string reason;                  ///< for people
  std::optional<std::string> subject;  ///< what failed, as text of no language
  std::optional<std::string> feed;     ///< name of the feed that it happened to
};

struct Snapshot {
  WidgetDisplayMode displayMode = WidgetDisplayMode::Compact;
  bool expanded = false;
  bool visible = false;
  double rowHeight = 0;
  std::optional<std::uint64_t> maxNumberOfRows;
  std::optional<double> artworkColumnWidth;  ///< absent without rows
  std::optional<Size> preferredContentSize;  ///< absent without a host's sizes
  WidgetDisplayMode largestAvailableDisplayMode = WidgetDisplayMode::Compact;
  std::optional<FetchResult> result;
  std::optional<FetchError> error;  ///< absent without one
  std::vector<Row> rows;            ///< empty where they were not asked for
  ListItem listItem;
  std::vector<Date> updateDates;
  std::vector<KnownIncident> knownIncidents;  ///< in force, with an error that left other feeds' known
  std::vector<std::string> goneLines;         ///< "FEED:ROUTE_ID"
  /// When the publishers made the alerts that the last successful fetch went by, by the names of the feeds that say so.
  std::map<std::string, Date> asOf;
  /// When the fetch ended that the rows are of, in this process or an earlier one; absent where that is not known.
  std::optional<Date> updated;
};

}  // namespace nimbo::protocol
