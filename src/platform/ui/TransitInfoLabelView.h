#pragma once

#include <cstdint>
#include <functional>
#include <memory>
#include <optional>
#include <string>
#include <utility>
#include <vector>

#include "platform/artwork/ArtworkCache.h"
#include "platform/ui/Color.h"
#include "platform/ui/Font.h"
#include "platform/ui/View.h"

namespace nimbo {

/// Shields in a row, centred on the capital letters of its line of text. Those that do not fit the maximum width give
/// way to a text that counts them. Artworks that cannot be drawn are passed over.
class TransitInfoLabelView : public View {
 public:
  /// What stands for this many shields that are not shown.
  using TruncationTextGenerator = std::function<std::string(std::uint64_t notShown)>;

  /// In the preferred body font.
  TransitInfoLabelView();

  /// None is null.
  const std::vector<TransitArtworkRef>& labelItems() const { return _labelItems; }
  void setLabelItems(std::vector<TransitArtworkRef> items);
  /// Draws the shields; none are shown without it.
  const std::shared_ptr<ArtworkCache>& artworkCache() const { return _artworkCache; }
  void setArtworkCache(std::shared_ptr<ArtworkCache> cache);

  /// Sizes of symbols and of shields, from 0 to 7. 7 until set.
  void setIconSize(std::int64_t size);
  void setShieldSize(std::int64_t size);
  /// Points. 0 until set.
  void setSpaceBetweenShields(double space);
  /// The width in points that the shields have, any until set, and the text for those that do not fit; without a
  /// generator they are left out silently. The width that it has already changes nothing.
  void setMaxWidth_truncationTextGenerator(double width, TruncationTextGenerator generator);

  const FontRef& font() const { return _font; }
  void setFont(FontRef font);
  /// Of the text. Grey until set.
  void setTextColor(SystemColor color) { _textColor = color; }

  std::string_view className() const override { return "TransitInfoLabelView"; }

 protected:
  ContentSize contentSize() override;
  std::optional<double> firstBaselineFromTop() override;
  std::optional<double> lastBaselineFromBottom() override;
  double reachAboveBaseline() override { return row().reachAbove; }
  double reachBelowBaseline() override { return *lastBaselineFromBottom(); }
  void drawContent(Painter& painter, const DrawingContext& context) override;

 private:
  /// What fits.
  struct Row {
    std::vector<std::size_t> shown;  // positions of the label items
    std::string text;
    TextLayoutRef textLayout;
    double textX = 0;
    Size size;
    double baseline = 0;    // from the top
    double reachAbove = 0;  // of shields and capitals, from the baseline
    double scale = 0;       // what it was measured for
    bool rightToLeft = false;
  };
  ImageRef image(std::size_t item, double screenScale, bool nightMode) const;
  const Row& row();
  void fillRow(Row& row, const std::vector<std::pair<std::size_t, Size>>& shields);
  void invalidateRow();

  std::vector<TransitArtworkRef> _labelItems;
  std::shared_ptr<ArtworkCache> _artworkCache;
  std::int64_t _iconSize = 7;
  std::int64_t _shieldSize = 7;
  double _spaceBetweenShields = 0;
  std::optional<double> _maxWidth;
  TruncationTextGenerator _truncationTextGenerator;
  FontRef _font;
  SystemColor _textColor = SystemColor::systemGrey;
  std::optional<Row> _row;
};

}  // namespace nimbo
