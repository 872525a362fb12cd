#pragma once

#include <cstdint>
#include <memory>

#include "platform/ui/IndexPath.h"
#include "platform/ui/StyledTableCell.h"

namespace nimbo {

class TableView;

/// Tells a table what its rows are. Called on the main thread.
class TableViewDataSource {
 public:
  virtual ~TableViewDataSource() = default;
  virtual std::int64_t numberOfSectionsInTableView(TableView& tableView) = 0;
  virtual std::int64_t tableView_numberOfRowsInSection(TableView& tableView, std::int64_t section) = 0;
  /// Never null.
  virtual std::shared_ptr<StyledTableCell> tableView_cellForRowAtIndexPath(TableView& tableView,
                                                                           IndexPath indexPath) = 0;
};

/// Hears of a table's rows being touched. Called on the main thread.
class TableViewDelegate {
 public:
  virtual ~TableViewDelegate() = default;
  /// Points.
  virtual double tableView_estimatedHeightForRowAtIndexPath(TableView& tableView, IndexPath indexPath) = 0;
  virtual void tableView_didSelectRowAtIndexPath(TableView& tableView, IndexPath indexPath) = 0;
  virtual bool tableView_shouldHighlightRowAtIndexPath(TableView& tableView, IndexPath indexPath) = 0;
};

}  // namespace nimbo
