#include <set>

#include "platform/ui/Color.h"
#include "platform/ui/TableView.h"
#include "support/RecordingPainter.h"
#include "support/TestPlatform.h"

namespace nimbo {
namespace {

/// A cell whose constraints want a height.
class TallCell final : public StyledTableCell {
 public:
  using StyledTableCell::StyledTableCell;
  static std::shared_ptr<TallCell> make(TableCellStyle style, const std::string& identifier) {
    auto cell = std::make_shared<TallCell>(style, identifier);
    auto box = std::make_shared<View>();
    box->setUsesAutomaticConstraints(false);
    cell->contentView()->addSubview(box);
    cell->height = box->heightAnchor().constraintEqualToConstant(0);
    LayoutConstraint::activateConstraints(
        {cell->height, box->topAnchor().constraintEqualToAnchor(cell->contentView()->topAnchor(), 4),
         box->bottomAnchor().constraintEqualToAnchor(cell->contentView()->bottomAnchor(), -4)});
    return cell;
  }
  LayoutConstraintRef height;
};

/// Rows of given heights; one of height 0 has an empty cell of the table's own class.
class Rows final : public TableViewDataSource, public TableViewDelegate {
 public:
  std::vector<double> heights{20, 30, 40};
  std::set<std::int64_t> dead;  // rows that cannot be touched
  std::vector<std::int64_t> selected;

  std::int64_t numberOfSectionsInTableView(TableView&) override { return 1; }
  std::int64_t tableView_numberOfRowsInSection(TableView&, std::int64_t) override {
    return static_cast<std::int64_t>(heights.size());
  }
  std::shared_ptr<StyledTableCell> tableView_cellForRowAtIndexPath(TableView& tableView, IndexPath path) override {
    const double height = heights[static_cast<std::size_t>(path.row)];
    if (height == 0) return std::make_shared<StyledTableCell>(TableCellStyle::standard, "StyledTableCell");
    const auto cell =
        std::static_pointer_cast<TallCell>(tableView.dequeueReusableCellWithIdentifier_forIndexPath("tall", path));
    cell->height->setConstant(height);
    cell->setSeparatorStyleOverride(path.row + 1 < static_cast<std::int64_t>(heights.size()) ? 1 : 0);
    return cell;
  }
  double tableView_estimatedHeightForRowAtIndexPath(TableView&, IndexPath) override { return 25; }
  void tableView_didSelectRowAtIndexPath(TableView& tableView, IndexPath path) override {
    selected.push_back(path.row);
    EXPECT_EQ(tableView.highlightedRow(), path);
    tableView.deselectRowAtIndexPath_animated(path, true);
  }
  bool tableView_shouldHighlightRowAtIndexPath(TableView&, IndexPath path) override { return !dead.contains(path.row); }
};

class Table : public testing::Test {
 protected:
  Table() {
    table->registerClass_forCellReuseIdentifier(&TallCell::make, "tall");
    table->setDelegate(rows);
    table->setDataSource(rows);
  }
  Rect rectOf(std::int64_t row) { return table->rectForRowAtIndexPath({0, row}); }

  TestPlatform platform;
  std::shared_ptr<Rows> rows = std::make_shared<Rows>();
  std::shared_ptr<TableView> table = TableView::initWithFrame_style({0, 0, 300, 200}, TableViewStyle::plain);
};

TEST_F(Table, RowsAreAsTallAsTheirConstraintsWant) {
  const auto footer = std::make_shared<View>();
  footer->setFrame({0, 0, 0, 12});
  table->setTableFooterView(footer);
  rows->heights = {20, 0, 40};
  EXPECT_EQ(rectOf(0), (Rect{0, 0, 300, 28}));
  EXPECT_EQ(rectOf(1), (Rect{0, 28, 300, 44}));
  EXPECT_EQ(rectOf(2), (Rect{0, 72, 300, 48}));
  EXPECT_EQ(footer->frame(), (Rect{0, 120, 300, 12}));

  const auto first = std::static_pointer_cast<TallCell>(table->cellForRowAtIndexPath({0, 0}));
  first->height->setPriority(500);  // stronger than the estimate
  first->height->setConstant(50);
  EXPECT_EQ(rectOf(2).y, 102);
  table->setFrame({0, 0, 100, 200});
  EXPECT_EQ(rectOf(2), (Rect{0, 102, 100, 48}));
  first->height->setPriority(40);  // weaker
  EXPECT_EQ(rectOf(0).height, 25);
  const auto plain = table->cellForRowAtIndexPath({0, 1});
  const auto others = std::make_shared<Rows>();
  others->heights = {30};
  table->setDataSource(others);
  EXPECT_EQ(table->numberOfRows(), 1);
  EXPECT_EQ(plain->superview(), nullptr);
}

TEST_F(Table, CellsThatFallOutAreUsedAgain) {
  const auto first = table->cellForRowAtIndexPath({0, 0}), last = table->cellForRowAtIndexPath({0, 2});
  // The same row gets the same cell, so that unchanged rows change nothing.
  table->reloadSection_withRowAnimation(0, TableRowAnimation::automatic);
  EXPECT_EQ(table->cellForRowAtIndexPath({0, 2}), last);
  rows->heights = {20};
  table->reloadData();
  EXPECT_EQ(table->numberOfRows(), 1);
  EXPECT_EQ(last->superview(), nullptr);
  rows->heights = {20, 30, 40};
  table->reloadData();
  EXPECT_EQ(table->cellForRowAtIndexPath({0, 0}), first);
  EXPECT_EQ(table->cellForRowAtIndexPath({0, 2}), last);
  EXPECT_EQ(rectOf(2), (Rect{0, 66, 300, 48}));
  EXPECT_THAT(table->subviews(), testing::SizeIs(3));
  EXPECT_THROW(table->dequeueReusableCellWithIdentifier_forIndexPath("unknown", {0, 0}), std::invalid_argument);
}

TEST_F(Table, TapsOnlyWhatMayBeHighlighted) {
  rows->dead = {1};
  EXPECT_TRUE(table->selectRowAtIndexPath({0, 2}));
  EXPECT_FALSE(table->selectRowAtIndexPath({0, 1}));
  EXPECT_THAT(rows->selected, testing::ElementsAre(2));
  EXPECT_EQ(table->highlightedRow(), std::nullopt);

  table->highlightRowAtIndexPath(IndexPath{0, 0});
  table->deselectRowAtIndexPath_animated({0, 2}, true);
  EXPECT_TRUE(table->cellForRowAtIndexPath({0, 0})->isHighlighted());
  table->highlightRowAtIndexPath(IndexPath{0, 1});
  EXPECT_EQ(table->highlightedRow(), std::nullopt);
  table->highlightRowAtIndexPath(IndexPath{0, 2});
  table->reloadData();
  EXPECT_EQ(table->highlightedRow(), std::nullopt);
  EXPECT_FALSE(table->cellForRowAtIndexPath({0, 2})->isHighlighted());
}

TEST_F(Table, DrawsSeparatorsBetweenRowsAndTheTouchedRow) {
  Environment::current().setScreenScale(2);
  const auto effect = VisualEffect::widgetTertiaryVibrancyEffect();
  table->setSeparatorEffect(effect);
  table->layoutIfNeeded();
  table->highlightRowAtIndexPath(IndexPath{0, 1});
  const auto root = std::make_shared<View>();
  root->addSubview(table);
  RecordingPainter painter;
  root->draw(painter);
  EXPECT_EQ(painter.clips.at(0), table->bounds());
  ASSERT_THAT(painter.fills, testing::SizeIs(3));
  EXPECT_EQ(painter.fills[0].rect, (Rect{0, 27.5, 300, 0.5}));
  EXPECT_EQ(painter.fills[0].color, effect->color(Appearance::light));
  EXPECT_EQ(painter.fills[1].rect, (Rect{0, 28, 300, 38}));
  EXPECT_EQ(painter.fills[1].color, colorOf(SystemColor::rowHighlight, Appearance::light));
  EXPECT_EQ(painter.fills[2].rect, (Rect{0, 65.5, 300, 0.5}));
}

}  // namespace
}  // namespace nimbo
