#pragma once

#include <cstdint>
#include <functional>
#include <map>
#include <memory>
#include <optional>
#include <string>
#include <vector>

#include "platform/ui/StyledTableCell.h"
#include "platform/ui/VisualEffectView.h"

namespace nimbo {

/// A row of a table.
struct IndexPath {
  std::int64_t section = 0;
  std::int64_t row = 0;
  bool operator==(const IndexPath&) const = default;
};

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

enum class TableViewStyle { plain };
enum class TableRowAnimation { automatic };

/// Rows one under the other, each as tall as its cell's constraints want. Never scrolls: all rows have cells. A change
/// of the rows is taken in at the next layout or question about a row; it is not animated.
class TableView : public View {
 public:
  /// Makes a cell with its content.
  using CellFactory = std::function<std::shared_ptr<StyledTableCell>(TableCellStyle, const std::string&)>;

  static std::shared_ptr<TableView> initWithFrame_style(const Rect& frame, TableViewStyle style);

  void registerClass_forCellReuseIdentifier(CellFactory factory, std::string identifier);
  /// A cell that fell out of the table, rather the one that showed this row, or a new one. Throws
  /// std::invalid_argument for an identifier that is not registered.
  std::shared_ptr<StyledTableCell> dequeueReusableCellWithIdentifier_forIndexPath(const std::string& identifier,
                                                                                  IndexPath indexPath);

  /// Under the last row; may be null.
  void setTableFooterView(std::shared_ptr<View> view);
  void setDataSource(std::weak_ptr<TableViewDataSource> dataSource);
  void setDelegate(std::weak_ptr<TableViewDelegate> delegate) { _delegate = std::move(delegate); }
  /// The colour of the lines between rows.
  void setSeparatorEffect(std::shared_ptr<const VisualEffect> effect) { _separatorEffect = std::move(effect); }

  void reloadData();
  /// Reloads every section: a table of one section is all there is.
  void reloadSection_withRowAnimation(std::int64_t section, TableRowAnimation animation);

  std::int64_t numberOfRows();
  /// Null beyond the rows.
  std::shared_ptr<StyledTableCell> cellForRowAtIndexPath(IndexPath indexPath);
  /// In the table's coordinates; empty beyond the rows.
  Rect rectForRowAtIndexPath(IndexPath indexPath);

  /// What a tap does: nothing unless the delegate lets the row be highlighted; else the row is highlighted and
  /// selected. Answers whether the row was selected.
  bool selectRowAtIndexPath(IndexPath indexPath);
  void deselectRowAtIndexPath_animated(IndexPath indexPath, bool animated);
  /// A touch that has not become a tap; absent: no row is touched. Rows that cannot be highlighted stay as they are.
  void highlightRowAtIndexPath(std::optional<IndexPath> indexPath);
  std::optional<IndexPath> highlightedRow() const { return _highlightedRow; }

  void layoutSubviews() override;
  std::string_view className() const override { return "TableView"; }

 protected:
  void drawContent(Painter& painter, const DrawingContext& context) override;
  bool clipsToBounds() const override { return true; }

 private:
  struct Row {
    IndexPath indexPath;
    std::shared_ptr<StyledTableCell> cell;
    double estimatedHeight = 0;
  };
  void loadIfNeeded();
  void emptyIntoPool();
  const Row* rowAt(IndexPath indexPath);
  void setHighlightedRow(std::optional<IndexPath> indexPath);

  std::map<std::string, CellFactory> _factories;
  std::vector<Row> _rows;
  std::vector<Row> _pool;
  std::shared_ptr<View> _footer;
  std::weak_ptr<TableViewDataSource> _dataSource;
  std::weak_ptr<TableViewDelegate> _delegate;
  std::shared_ptr<const VisualEffect> _separatorEffect;
  std::optional<IndexPath> _highlightedRow;
  bool _needsReload = true;
};

}  // namespace nimbo
