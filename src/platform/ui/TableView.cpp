#include "platform/ui/TableView.h"

#include <algorithm>
#include <stdexcept>

#include "platform/ui/Color.h"
#include "platform/ui/Painter.h"
#include "platform/ui/View.h"

namespace nimbo {

std::shared_ptr<TableView> TableView::initWithFrame_style(const Rect& frame, TableViewStyle) {
  auto table = std::make_shared<TableView>();
  table->setFrame(frame);
  return table;
}

void TableView::registerClass_forCellReuseIdentifier(CellFactory factory, std::string identifier) {
  if (!factory) throw std::invalid_argument("a cell factory is not empty");
  _factories[std::move(identifier)] = std::move(factory);
}

std::shared_ptr<StyledTableCell> TableView::dequeueReusableCellWithIdentifier_forIndexPath(
    const std::string& identifier, IndexPath indexPath) {
  const auto factory = _factories.find(identifier);
  if (factory == _factories.end())
    throw std::invalid_argument("no cell class is registered for the reuse identifier " + identifier);
  auto best = _pool.end();
  for (auto row = _pool.begin(); row != _pool.end(); ++row) {
    if (row->cell->reuseIdentifier() != identifier) continue;
    best = row;
    if (row->indexPath == indexPath) break;
  }
  if (best == _pool.end()) return factory->second(TableCellStyle::standard, identifier);
  auto cell = std::move(best->cell);
  _pool.erase(best);
  return cell;
}

void TableView::setTableFooterView(std::shared_ptr<View> view) {
  if (view == _footer) return;
  if (_footer) _footer->removeFromSuperview();
  _footer = std::move(view);
  if (_footer) addSubview(_footer);
  setNeedsLayout();
}

void TableView::setDataSource(std::weak_ptr<TableViewDataSource> dataSource) {
  _dataSource = std::move(dataSource);
  reloadData();
}

void TableView::reloadData() {
  _needsReload = true;
  setHighlightedRow(std::nullopt);
  setNeedsLayout();
}

void TableView::reloadSection_withRowAnimation(std::int64_t, TableRowAnimation) { reloadData(); }

std::int64_t TableView::numberOfRows() {
  loadIfNeeded();
  return static_cast<std::int64_t>(_rows.size());
}

std::shared_ptr<StyledTableCell> TableView::cellForRowAtIndexPath(IndexPath indexPath) {
  const Row* row = rowAt(indexPath);
  return row ? row->cell : nullptr;
}

Rect TableView::rectForRowAtIndexPath(IndexPath indexPath) {
  layoutIfNeeded();
  const Row* row = rowAt(indexPath);
  return row ? row->cell->frame() : Rect{};
}

bool TableView::selectRowAtIndexPath(IndexPath indexPath) {
  highlightRowAtIndexPath(indexPath);
  const auto delegate = _delegate.lock();
  if (!delegate || _highlightedRow != indexPath) return false;
  delegate->tableView_didSelectRowAtIndexPath(*this, indexPath);
  return true;
}

void TableView::deselectRowAtIndexPath_animated(IndexPath indexPath, bool) {
  if (_highlightedRow == indexPath) setHighlightedRow(std::nullopt);
}

void TableView::highlightRowAtIndexPath(std::optional<IndexPath> indexPath) {
  const auto delegate = _delegate.lock();
  if (indexPath &&
      !(delegate && rowAt(*indexPath) && delegate->tableView_shouldHighlightRowAtIndexPath(*this, *indexPath)))
    indexPath = std::nullopt;
  setHighlightedRow(indexPath);
}

void TableView::setHighlightedRow(std::optional<IndexPath> indexPath) {
  _highlightedRow = indexPath;
  for (const Row& row : _rows) row.cell->setHighlighted(row.indexPath == indexPath);
}

const TableView::Row* TableView::rowAt(IndexPath indexPath) {
  loadIfNeeded();
  const auto found = std::ranges::find(_rows, indexPath, &Row::indexPath);
  return found == _rows.end() ? nullptr : &*found;
}

void TableView::loadIfNeeded() {
  if (!_needsReload) return;
  _needsReload = false;
  emptyIntoPool();
  const auto dataSource = _dataSource.lock();
  const auto delegate = _delegate.lock();
  const std::int64_t sections = dataSource ? dataSource->numberOfSectionsInTableView(*this) : 0;
  for (IndexPath path; path.section < sections; ++path.section) {
    const auto count = dataSource->tableView_numberOfRowsInSection(*this, path.section);
    for (path.row = 0; path.row < count; ++path.row) {
      auto cell = dataSource->tableView_cellForRowAtIndexPath(*this, path);
      if (!cell) throw std::invalid_argument("the data source answered no cell for a row");
      addSubview(cell);
      const double estimate = delegate ? delegate->tableView_estimatedHeightForRowAtIndexPath(*this, path) : 0;
      _rows.push_back({path, std::move(cell), estimate});
    }
  }
  // Those left in the pool are not shown. They keep their content and are taken up by later rows.
  for (const Row& row : _pool) row.cell->removeFromSuperview();
  setNeedsLayout();
}

void TableView::emptyIntoPool() {
  for (Row& row : _rows) {
    if (_factories.contains(row.cell->reuseIdentifier()))
      _pool.push_back(std::move(row));
    else
      row.cell->removeFromSuperview();
  }
  _rows.clear();
}

void TableView::layoutSubviews() {
  View::layoutSubviews();
  loadIfNeeded();
  const double width = bounds().width;
  double y = 0;
  for (const Row& row : _rows) {
    StyledTableCell& cell = *row.cell;
    const double before = cell.frame().height;
    cell.setFrame({0, y, width, before > 0 ? before : row.estimatedHeight});
    cell.setFrame({0, y, width, cell.fittingHeight(row.estimatedHeight)});
    y += cell.frame().height;
  }
  if (_footer) _footer->setFrame({0, y, width, _footer->frame().height});
}

void TableView::drawContent(Painter& painter, const DrawingContext& context) {
  const double pixel = 1 / context.screenScale;
  for (const Row& row : _rows) {
    const Rect& frame = row.cell->frame();
    if (row.cell->isHighlighted()) painter.fillRect(frame, colorOf(SystemColor::rowHighlight, context.appearance));
    if (row.cell->separatorStyleOverride() != 0 && _separatorEffect)
      painter.fillRect({frame.x, roundToViewScale(frame.maxY(), this) - pixel, frame.width, pixel},
                       _separatorEffect->color(context.appearance));
  }
}

}  // namespace nimbo
