#include "platform/ui/TransitInfoLabelView.h"

#include <algorithm>
#include <cmath>

#include "platform/ui/Painter.h"
#include "platform/ui/View.h"

namespace nimbo {

namespace {

// What rounding to device pixels may take away must not cost a shield.
constexpr double kLayoutTolerance = 1e-3;

}  // namespace

TransitInfoLabelView::TransitInfoLabelView() : _font(Font::preferredFont(TextStyle::body)) {}

void TransitInfoLabelView::setLabelItems(std::vector<TransitArtworkRef> items) {
  const auto isSame = [](const TransitArtworkRef& a, const TransitArtworkRef& b) {
    return artworksAreEquivalent(a.get(), b.get());
  };
  if (std::ranges::equal(items, _labelItems, isSame)) return;
  _labelItems = std::move(items);
  invalidateRow();
}

void TransitInfoLabelView::setArtworkCache(std::shared_ptr<ArtworkCache> cache) {
  if (cache == _artworkCache) return;
  _artworkCache = std::move(cache);
  invalidateRow();
}

void TransitInfoLabelView::setIconSize(std::int64_t size) {
  _iconSize = size;
  invalidateRow();
}

void TransitInfoLabelView::setShieldSize(std::int64_t size) {
  _shieldSize = size;
  invalidateRow();
}

void TransitInfoLabelView::setSpaceBetweenShields(double space) {
  _spaceBetweenShields = space;
  invalidateRow();
}

void TransitInfoLabelView::setMaxWidth_truncationTextGenerator(double width, TruncationTextGenerator generator) {
  if (width == _maxWidth) return;
  _maxWidth = width;
  _truncationTextGenerator = std::move(generator);
  invalidateRow();
}

void TransitInfoLabelView::setFont(FontRef font) {
  _font = std::move(font);
  invalidateRow();
}

void TransitInfoLabelView::invalidateRow() {
  _row.reset();
  setNeedsUpdateConstraints();
}

ImageRef TransitInfoLabelView::image(std::size_t item, double screenScale, bool nightMode) const {
  if (!_artworkCache) return nullptr;
  const TransitArtworkRef& artwork = _labelItems[item];
  const auto size =
      artwork->artworkSourceType() == static_cast<std::int64_t>(ArtworkSourceType::icon) ? _iconSize : _shieldSize;
  return _artworkCache->imageForArtwork(artwork, size, screenScale, nightMode);
}

const TransitInfoLabelView::Row& TransitInfoLabelView::row() {
  const double scale = screenScale();
  if (_row && _row->scale == scale && _row->rightToLeft == isRightToLeft()) return *_row;
  const bool nightMode = Environment::current().appearance() == Appearance::dark;
  std::vector<std::pair<std::size_t, Size>> shields;
  double highest = 0;
  for (std::size_t item = 0; item < _labelItems.size(); ++item) {
    const ImageRef picture = image(item, scale, nightMode);
    if (!picture) continue;
    shields.emplace_back(item, picture->size());
    highest = std::max(highest, picture->size().height);
  }
  Row made;
  made.scale = scale;
  made.rightToLeft = isRightToLeft();
  fillRow(made, shields);
  const auto ceiled = [scale](double length) { return std::ceil(length * scale - kLayoutTolerance) / scale; };
  made.size.width = ceiled(made.size.width);
  // The middle of the capital letters is the middle of the shields.
  const double aboveMiddle = std::max(highest / 2, _font->ascent() - _font->capHeight() / 2);
  const double belowMiddle = std::max(highest / 2, _font->descent() + _font->capHeight() / 2);
  made.size.height = ceiled(aboveMiddle + belowMiddle);
  made.baseline = aboveMiddle + _font->capHeight() / 2;
  made.reachAbove = std::max(highest + _font->capHeight(), 2 * _font->capHeight()) / 2;
  return _row.emplace(std::move(made));
}

/// The most shields that fit together with the text that counts the others.
void TransitInfoLabelView::fillRow(Row& row, const std::vector<std::pair<std::size_t, Size>>& shields) {
  std::vector<double> ends{0};  // where the row ends after so many shields
  for (const auto& [item, size] : shields)
    ends.push_back(ends.back() + (ends.size() > 1 ? _spaceBetweenShields : 0) + size.width);
  std::size_t shown = shields.size();
  if (_maxWidth) {
    const double room = std::max(*_maxWidth, 0.0) + kLayoutTolerance;
    while (shown > 0 && ends[shown] > room) --shown;
    if (shown < shields.size() && _truncationTextGenerator && *_maxWidth > 0) {
      for (;; --shown) {
        row.text = _truncationTextGenerator(shields.size() - shown);
        row.textX = ends[shown] + (shown > 0 ? _spaceBetweenShields : 0);
        // Alone it is cut off if need be; after shields it has to fit.
        row.textLayout = TextSystem::current().layOut(row.text, _font->descriptor(),
                                                      shown > 0 ? kUnboundedTextWidth : *_maxWidth, 1, row.rightToLeft);
        if (shown == 0 || row.textX + row.textLayout->size().width <= room) break;
      }
    }
  }
  for (std::size_t index = 0; index < shown; ++index) row.shown.push_back(shields[index].first);
  row.size.width = row.textLayout ? row.textX + row.textLayout->size().width : ends[shown];
}

ContentSize TransitInfoLabelView::contentSize() {
  const Size size = row().size;
  return {size.width, size.height, size.height};
}

std::optional<double> TransitInfoLabelView::firstBaselineFromTop() { return row().baseline; }

std::optional<double> TransitInfoLabelView::lastBaselineFromBottom() { return row().size.height - row().baseline; }

void TransitInfoLabelView::drawContent(Painter& painter, const DrawingContext& context) {
  const Row& content = row();
  const bool mirrored = isRightToLeft();
  const auto leftOf = [&](double x, double width) { return mirrored ? frame().width - x - width : x; };
  const double middle = content.baseline - _font->capHeight() / 2;
  constexpr Color kNoTint{0, 0, 0, 0};
  double x = 0;
  for (const std::size_t item : content.shown) {
    const ImageRef picture = image(item, context.screenScale, context.appearance == Appearance::dark);
    if (!picture) continue;
    const Size size = picture->size();
    const double left = roundToViewScale(leftOf(x, size.width), this);
    const double top = roundToViewScale(middle - size.height / 2, this);
    painter.drawImage(*picture, {left, top, size.width, size.height}, 1, context.vibrantColor.value_or(kNoTint));
    x += size.width + _spaceBetweenShields;
  }
  if (!content.textLayout) return;
  const double width = content.textLayout->size().width;
  painter.drawText(*content.textLayout,
                   {leftOf(content.textX, width), content.baseline - content.textLayout->firstBaseline()}, width,
                   context.vibrantColor.value_or(colorOf(_textColor, context.appearance)));
}

}  // namespace nimbo
