#include "platform/ui/StyledLabel.h"

#include <algorithm>
#include <cmath>

#include "platform/ui/Painter.h"

namespace nimbo {

namespace {

// Widths go through the solver and through rounding; a text must not break or be cut for so little.
constexpr double kTolerance = 1e-3;

}  // namespace

StyledLabel::StyledLabel() : _font(Font::preferredFont(TextStyle::body)) {}

void StyledLabel::setText(std::optional<std::string> text) {
  if (text == _text) return;
  _text = std::move(text);
  invalidateText();
}

void StyledLabel::setFont(FontRef font) {
  if (!font) font = Font::preferredFont(TextStyle::body);
  if (font->isEqual(_font.get())) return;
  _font = std::move(font);
  invalidateText();
}

void StyledLabel::setNumberOfLines(std::size_t lines) {
  if (lines == _numberOfLines) return;
  _numberOfLines = lines;
  invalidateText();
}

void StyledLabel::invalidateText() {
  _unbroken.layout = nullptr;
  _broken.layout = nullptr;
  setNeedsUpdateConstraints();
}

const TextLayoutRef& StyledLabel::layOut(Measured& measured, double width, std::size_t lines) {
  const bool rightToLeft = isRightToLeft();
  if (!measured.layout || measured.width != width || measured.lines != lines || measured.rightToLeft != rightToLeft) {
    measured = {TextSystem::current().layOut(*_text, _font->descriptor(), width, lines, rightToLeft), width, lines,
                rightToLeft};
  }
  return measured.layout;
}

/// Only as many lines as the text itself has.
const TextLayoutRef& StyledLabel::unbrokenLayout() { return layOut(_unbroken, kUnboundedTextWidth, _numberOfLines); }

/// The unbroken text serves as long as it fits: most texts are measured once.
TextLayoutRef StyledLabel::layoutForWidth(double width, std::size_t lines) {
  const TextLayoutRef& unbroken = unbrokenLayout();
  const bool fits = unbroken->size().width <= width + kTolerance && (lines == 0 || unbroken->lineCount() <= lines);
  return fits ? unbroken : layOut(_broken, width, lines);
}

std::size_t StyledLabel::linesShown() const {
  if (_linesThatFit == 0) return _numberOfLines;
  return _numberOfLines == 0 ? _linesThatFit : std::min(_numberOfLines, _linesThatFit);
}

ContentSize StyledLabel::contentSize() {
  const double scale = screenScale();
  // Up to the next device pixel: a text is not broken because it is rounded.
  const auto ceiled = [scale](double length) { return std::ceil(length * scale - kTolerance) / scale; };
  const double lineHeight = ceiled(_font->lineHeight());
  if (!_text || _text->empty()) return {0, lineHeight, lineHeight};
  const double width = unbrokenLayout()->size().width;
  const TextLayoutRef layout = layoutForWidth(_foundWidth.value_or(width), linesShown());
  const double height = ceiled(layout->size().height);
  return {ceiled(width), height, layout->lineCount() > 1 ? lineHeight : height};
}

bool StyledLabel::adaptToSize(Size size) {
  _clips = size.height < _font->lineHeight() - kTolerance;
  if (!_text || _text->empty()) return false;
  const ContentSize before = contentSize();
  if (_foundWidth != size.width) {
    _foundWidth = size.width;
    const ContentSize after = contentSize();
    if (after != before) return true;
  }
  if (size.height >= *before.height - kTolerance) return false;
  const auto layout = layoutForWidth(*_foundWidth, linesShown());
  const auto lines = static_cast<double>(layout->lineCount());
  const double fitting = std::floor((size.height + kTolerance) / (layout->size().height / lines));
  _linesThatFit = static_cast<std::size_t>(std::clamp(fitting, 1.0, lines));
  return contentSize() != before;
}

std::optional<double> StyledLabel::firstBaselineFromTop() {
  if (!_text || _text->empty()) return _font->ascent();
  return unbrokenLayout()->firstBaseline();
}

std::optional<double> StyledLabel::lastBaselineFromBottom() {
  if (!_text || _text->empty()) return *contentSize().height - _font->ascent();
  const TextLayoutRef layout = layoutForWidth(_foundWidth.value_or(kUnboundedTextWidth), linesShown());
  return *contentSize().height - layout->lastBaseline();
}

void StyledLabel::drawContent(Painter& painter, const DrawingContext& context) {
  if (!_text || _text->empty()) return;
  const TextLayoutRef layout = layoutForWidth(frame().width, linesShown());
  // A line that is cut through cannot be read: at the largest text sizes a row may have no room for its second text.
  constexpr double kLeastShareOfALine = 0.8;
  if (frame().height < kLeastShareOfALine * layout->size().height) return;
  const Color color = context.vibrantColor.value_or(colorOf(SystemColor::label, context.appearance));
  painter.drawText(*layout, {0, 0}, frame().width, color);
}

}  // namespace nimbo
