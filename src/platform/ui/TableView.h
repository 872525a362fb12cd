#pragma once

#include <functional>
#include <map>
#include <memory>
#include <string>
#include <vector>

#include "platform/ui/IndexPath.h"
#include "platform/ui/StyledTableCell.h"
#include "platform/ui/View.h"

namespace nimbo {

class TableView;

class TableViewDataSource {
 public:
  virtual ~TableViewDataSource() = default;
  virtual std::int64_t numberOfSectionsInTableView(TableView& tableView) = 0;
  virtual std::int64_t tableView_numberOfRowsInSection(TableView& tableView, std::int64_t section) = 0;
  /// Never null.
  virtual std::shared_ptr<StyledTableCell> tableView_cellForRowAtIndexPath(TableView& tableView,
                                                                           IndexPath indexPath) = 0;
};

class TableViewDelegate {
 public:
  virtual ~TableViewDelegate() = default;
  /// Points.
  virtual double tableView_estimatedHeightForRowAtIndexPath(TableView& tableView, IndexPath indexPath) = 0;
  virtual void tableView_didSelectRowAtIndexPath(TableView& tableView, IndexPath indexPath) = 0;
  virtual bool tableView_shouldHighlightRowAtIndexPath(TableView& tableView, IndexPath indexPath) = 0;
};

}  // namespace nimbo
