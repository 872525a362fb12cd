#include "host/layer/OutputWidget.h"

#include <linux/input-event-codes.h>

#include <algorithm>
#include <cmath>

namespace nimbo {

namespace {

/// Widgets are told apart in messages where there are several.
std::string placeText(const std::string& outputName) { return outputName.empty() ? "" : " on " + outputName; }

bool sumsUp(const std::optional<protocol::Item>& item) {
  const auto* single = item ? std::get_if<protocol::TransitItem>(&*item) : nullptr;
  const bool isIncident = single && single->openable && single->openable->activityType &&
                          *single->openable->activityType == kNimboTransitWidgetIncidentActivityType;
  return !isIncident;
}

}  // namespace

OutputWidget::OutputWidget(const Context& context, std::string outputName)
    : _context(context),
      _outputName(std::move(outputName)),
      _process(context.runLoop, context.clock, context.widgetArguments, *this) {
  _presentation.width = context.arguments.width;
  _process.setPresentation(_presentation);
  _process.setExpanded(context.arguments.expanded);
  // It lays its first rows out while the compositor makes room for them.
  _process.prepare();
}

OutputWidget::~OutputWidget() {
  for (const auto& timer : {_rest, _restart})
    if (timer) timer->invalidate();
}

void OutputWidget::appear(Compositor& compositor, const Compositor::Output* output) {
  _shm = compositor.memory();
  const double height = _rows.empty() ? _presentation.compactHeight : _rows.back().y + _rows.back().height;
  LayerSurface::Delegate& delegate = *this;
  _surface = std::make_unique<LayerSurface>(compositor, output, _context.arguments.placement, _context.arguments.width,
                                            static_cast<std::int32_t>(std::lround(height)), delegate);
  surfaceScaleChanged();
}

void OutputWidget::leave() {
  if (_rest) std::exchange(_rest, nullptr)->invalidate();
  handLeft();
  keyboardLeft();
  _surface.reset();
  _pool.reset();
  _oldPool.reset();
  _drawn = nullptr;
  _mayDraw = false;
  _process.setVisible(false);
}

void OutputWidget::updateScale() {
  if (_surface) _surface->updateScale();
}

void OutputWidget::setAppearance(Appearance appearance) {
  _presentation.appearance = appearance;
  _process.setPresentation(_presentation);
}

const PictureMemory& OutputWidget::newPictureMemory() {
  _drawn = nullptr;
  _oldPool = std::move(_pool);
  return _pictures.emplace();
}

std::optional<protocol::RenderParams> OutputWidget::roomForPicture() {
  if (!_surface) return std::nullopt;
  if (!_mayDraw) {
    _surface->askForFrame();
    if (!_mayDraw) return std::nullopt;
  }
  if (!_pool) _pool = std::make_unique<PicturePool>(_shm, *_pictures, [this] { _process.askForContent(); });
  const auto room = _pool->room();
  if (room) _mayDraw = false;
  return room;
}

bool OutputWidget::widgetDrew(const protocol::Rendered& picture) {
  if (PictureMemory::bytesOf(picture) == 0) return false;
  // Without a viewport the compositor wants whole points.
  const bool needsUnit = _surface && !_surface->hasViewport();
  _drawn =
      _pool ? _pool->take(picture, needsUnit ? std::max(1, static_cast<int>(std::lround(picture.scale))) : 1) : nullptr;
  _drawnPicture = picture;
  return true;
}

void OutputWidget::widgetDidChange(const protocol::Snapshot& snapshot, const protocol::Lines&) {
  _restarts.reset();
  _isExpanded = snapshot.expanded;
  _canExpand = snapshot.largestAvailableDisplayMode == WidgetDisplayMode::Expanded;
  _rows.clear();
  for (const protocol::Row& row : snapshot.rows) _rows.push_back({row.frame.y, row.frame.height, sumsUp(row.item)});
  for (auto* lit : {&_pressed, &_focused})
    if (*lit && **lit >= _rows.size()) lit->reset();
  if (!_surface || !_drawn) return;
  _surface->show(std::exchange(_drawn, nullptr), _drawnPicture);
}

void OutputWidget::widgetEnded(const std::string& reason) {
  _context.tell("the widget process" + placeText(_outputName) + " is ended: " + reason);
}

void OutputWidget::widgetDidFail(WidgetHostProcess::Failure, const std::string& detail) {
  _context.tell("the widget" + placeText(_outputName) + " cannot be shown: " + detail);
  _restart = _context.runLoop.scheduleTimer(_restarts.next(), false, [this](Timer&) { _process.restart(); });
}

void OutputWidget::surfaceMayBeDrawn() {
  _mayDraw = true;
  _process.setVisible(true);
  if (_mayDraw) _process.askForContent();
}

void OutputWidget::surfaceIsSeen(bool isSeen) {
  if (isSeen) {
    _rests.reset();
    _oldPool.reset();
  }
  _process.setVisible(isSeen);
}

void OutputWidget::surfaceScaleChanged() {
  _presentation.scale = _surface->scale();
  _process.setPresentation(_presentation);
}

void OutputWidget::surfaceWidthGiven(std::int32_t width) {
  _presentation.width = std::max(width, LayerArguments::kLeastWidth);
  _process.setPresentation(_presentation);
}

void OutputWidget::surfaceClosed() {
  leave();
  _rest = _context.runLoop.scheduleTimer(_rests.next(), false, [this](Timer&) {
    _rest = nullptr;
    _context.wantsToAppear(*this);
  });
}

std::optional<std::size_t> OutputWidget::rowAt(Point place) const {
  const auto found =
      std::ranges::find_if(_rows, [&](const Row& row) { return place.y >= row.y && place.y < row.y + row.height; });
  if (found == _rows.end()) return std::nullopt;
  return static_cast<std::size_t>(found - _rows.begin());
}

void OutputWidget::light(std::optional<std::size_t>& lit, std::optional<std::size_t> row) {
  if (lit == row) return;
  if (lit) _process.highlightRow(*lit, false);
  if (row) _process.highlightRow(*row, true);
  lit = row;
}

void OutputWidget::pressed(LayerSurface::Button button, Point place) {
  switch (button) {
    case LayerSurface::Button::left:
      return light(_pressed, rowAt(place));
    case LayerSurface::Button::middle:
      return setExpanded(!_isExpanded);
    case LayerSurface::Button::right:
      _context.launcher.openURL("nimbo://");
  }
}

void OutputWidget::released(LayerSurface::Button button, Point place) {
  if (button != LayerSurface::Button::left || !_pressed) return;
  const std::size_t row = *_pressed;
  const bool isOverIt = rowAt(place) == row;
  light(_pressed, std::nullopt);
  if (isOverIt) choose(row);
}

void OutputWidget::handMoved(Point place) {
  if (_pressed && rowAt(place) != _pressed) light(_pressed, std::nullopt);
}

void OutputWidget::handLeft() { light(_pressed, std::nullopt); }

void OutputWidget::keyboardLeft() { light(_focused, std::nullopt); }

void OutputWidget::choose(std::size_t row) {
  if (!_isExpanded && _canExpand)
    setExpanded(true);
  else if (_isExpanded && _rows[row].sumsUp)
    setExpanded(false);
  else
    _process.selectRow(row);
}

void OutputWidget::setExpanded(bool expanded) {
  light(_focused, std::nullopt);
  _process.setExpanded(expanded);
}

void OutputWidget::moveFocus(int step) {
  if (_rows.empty()) return;
  const auto count = static_cast<int>(_rows.size());
  const int from = _focused ? static_cast<int>(*_focused) : step > 0 ? -1 : count;
  light(_focused, static_cast<std::size_t>((from + step + count) % count));
}

void OutputWidget::keyPressed(std::uint32_t code, bool isShifted) {
  switch (code) {
    case KEY_TAB:
      return moveFocus(isShifted ? -1 : 1);
    case KEY_DOWN:
      return moveFocus(1);
    case KEY_UP:
      return moveFocus(-1);
    case KEY_ENTER:
    case KEY_KPENTER:
    case KEY_SPACE:
      if (!_rows.empty()) choose(_focused.value_or(0));
      return;
    case KEY_ESC:
      return setExpanded(false);
    case KEY_F5:
      return _process.update();
    case KEY_COMPOSE:
      _context.launcher.openURL("nimbo://");
  }
}

}  // namespace nimbo
