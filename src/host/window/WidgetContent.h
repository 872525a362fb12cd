#pragma once

#include <map>
#include <memory>
#include <optional>
#include <string>
#include <vector>

#include "host/PictureMemory.h"
#include "platform/foundation/Date.h"
#include "platform/foundation/Error.h"
#include "protocol/Lines.h"

namespace nimbo {

/// A row of the widget as keyboard and screen reader know it.
struct WidgetRow {
  double y = 0;       ///< points, from the widget's top
  double height = 0;  ///< points
  std::string name;   ///< the line, how it runs, and the text
};

/// What the widget shows at one moment.
struct WidgetContent {
  std::shared_ptr<const WidgetPicture> picture;
  std::vector<WidgetRow> rows;
  bool canExpand = false;
  std::vector<std::string> goneLines;  ///< "FEED:ROUTE_ID", of favorites that their feeds do not know any more
  ErrorRef failure;                    ///< of the last fetch; null without one
  std::vector<std::string> known;      ///< incidents of other feeds, with a failure, each as one line of text
  std::map<std::string, Date> asOf;    ///< when the publishers made their alerts, by the names of the feeds
  std::optional<Date> updated;         ///< when the fetch ended that the rows are of
  bool isFetched = false;              ///< whether a fetch of this process has ended
  protocol::Lines lines;               ///< the favorites, by that fetch

  /// Takes rows and modes from a snapshot.
  static WidgetContent ofSnapshot(const protocol::Snapshot& snapshot);
};

using WidgetContentRef = std::shared_ptr<const WidgetContent>;

}  // namespace nimbo
