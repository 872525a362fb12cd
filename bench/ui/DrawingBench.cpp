// Six rows of the widget: drawn again with nothing changed, beside bare Pango and Cairo; and laid out again after a
// changed constant.

#include <benchmark/benchmark.h>

#include <cstdlib>

#include "desktop/drawing/DrawingPart.h"
#include "peers/BareRows.h"
#include "platform/Platform.h"
#include "platform/ui/Color.h"
#include "platform/ui/Environment.h"
#include "support/MadeUpLines.h"
#include "ui/ArtworkCache+Nimbo.h"
#include "ui/NBTransitIncidentDataSource.h"

namespace nimbo {
namespace {

constexpr std::size_t kRows = 6;

/// The widget's table with its rows, 359 points wide.
class Rows {
 public:
  Rows() {
    const auto result = Result::resultWithValue(BoxedArray::of(madeUpLines(kRows, 1, false)));
    constexpr Rect kFrame{16, 0, BareRows::kWidth - 32, BareRows::kRowHeight * kRows};
    _table = TableView::initWithFrame_style(kFrame, TableViewStyle::plain);
    _table->setSeparatorEffect(VisualEffect::widgetTertiaryVibrancyEffect());
    _source = NBTransitIncidentDataSource::
        initWithTransitLineItemsResult_expanded_artworkCache_maxNumberOfRows_availableWidth(
            result, true, memoryConstrainedImageViewCache(), 0, kFrame.width);
    _source->configureTableView(*_table);
    _view->setFrame({0, 0, BareRows::kWidth, kFrame.height});
    _view->addSubview(_table);
    _view->layoutIfNeeded();
  }

  void draw() {
    _view->layoutIfNeeded();
    const auto draw = [this](Painter& painter) { _view->draw(painter); };
    const auto picture =
        drawingPart().render(draw, _view->bounds().size(), 1, colorOf(SystemColor::background, Appearance::light));
    benchmark::DoNotOptimize((*picture)->pixels().data());
  }

  void layOut(double rowHeight) {
    _source->setRowHeight_maxNumberOfRows(rowHeight, 0);
    _table->reloadData();
    _view->layoutIfNeeded();
  }

 private:
  BenchPlatform _platform;
  std::shared_ptr<View> _view = std::make_shared<View>();
  std::shared_ptr<TableView> _table;
  std::shared_ptr<NBTransitIncidentDataSource> _source;
};

std::vector<BareRows::Row> bareRows() {
  const BenchPlatform platform;
  std::vector<BareRows::Row> rows;
  for (const TransitLineItemRef& line : madeUpLines(kRows, 1, false)) {
    const TransitIncidentRef& incident = line->incidents().front();
    rows.push_back({*incident->title(), *incident->summary(), *line->name(), 0.8, 0.1, 0.2});
  }
  return rows;
}

void redraw(benchmark::State& state) {
  Rows rows;
  for (auto _ : state) rows.draw();
}
BENCHMARK(redraw)->Unit(benchmark::kMicrosecond);

void redrawPeer(benchmark::State& state) {
  const BareRows rows(bareRows());
  for (auto _ : state) {
    cairo_surface_t* surface = rows.draw();
    cairo_surface_flush(surface);
    benchmark::DoNotOptimize(cairo_image_surface_get_data(surface));
    cairo_surface_destroy(surface);
  }
}
BENCHMARK(redrawPeer)->Unit(benchmark::kMicrosecond);

void layOut(benchmark::State& state) {
  Rows rows;
  double height = 110;
  for (auto _ : state) {
    height = height == 110 ? 100 : 110;
    rows.layOut(height);
  }
}
BENCHMARK(layOut)->Unit(benchmark::kMicrosecond);

}  // namespace
}  // namespace nimbo
