#pragma once

#include <algorithm>
#include <functional>
#include <limits>
#include <vector>

#include "platform/artwork/ArtworkCache.h"
#include "platform/artwork/ArtworkImageSource.h"
#include "platform/ui/TextSystem.h"

namespace nimbo {

/// An image that is only its size, and whether it is for the night.
class ImageDouble final : public Image {
 public:
  ImageDouble(Size size, double scale, bool forNight) : isForNight(forNight), _size(size), _scale(scale) {}
  Size size() const override { return _size; }
  double scale() const override { return _scale; }
  std::string_view className() const override { return "ImageDouble"; }
  const bool isForNight;

 private:
  Size _size;
  double _scale;
};

/// Images of 24 by 24 points.
class ImageResourcesDouble final : public ImageResources {
 public:
  ImageRef image(std::string_view, double screenScale, bool nightMode) override {
    return std::make_shared<const ImageDouble>(Size{24, 24}, screenScale, nightMode);
  }
};

/// Shields of 14 points' height at size 0 and 28 at size 7, each step 2 points; as wide as `width` says. Icons are as
/// wide as high; an artwork without either gives nothing.
class ShieldRendererDouble final : public ShieldIconRenderer {
 public:
  ImageRef render(const TransitArtwork& artwork, std::int64_t shieldSize, double screenScale, bool nightMode) override {
    const std::int64_t size = std::max<std::int64_t>(shieldSize, 0);
    const double height = 14 + 2 * static_cast<double>(size);
    if (artwork.shieldDataSource()) {
      const std::string text = artwork.shieldDataSource()->shieldText.value_or("");
      const double wide = width ? width(size, text) : std::max(height, height / 2 * static_cast<double>(text.size()));
      return std::make_shared<const ImageDouble>(Size{wide, height}, screenScale, nightMode);
    }
    if (!artwork.iconDataSource()) return nullptr;
    return std::make_shared<const ImageDouble>(Size{height, height}, screenScale, nightMode);
  }
  void setCachesIconAtlases(bool caches) override { cachesIconAtlases = caches; }

  /// Points for a shield size and a text. Until set: half the height for each byte of the text, at least the height.
  std::function<double(std::int64_t shieldSize, const std::string& text)> width;
  bool cachesIconAtlases = true;
};

/// A text with what it was laid out for.
class TextLayoutDouble final : public TextLayout {
 public:
  TextLayoutDouble(std::string shown, FontDescriptor inFont, std::size_t lines, std::size_t longest, bool truncated)
      : text(std::move(shown)), font(inFont), _lines(lines), _longest(longest), _truncated(truncated) {}
  Size size() const override {
    return {font.pointSize / 2 * static_cast<double>(_longest), font.pointSize * static_cast<double>(_lines)};
  }
  std::size_t lineCount() const override { return _lines; }
  double firstBaseline() const override { return 0.8 * font.pointSize; }
  double lastBaseline() const override { return font.pointSize * (static_cast<double>(_lines) - 0.2); }
  bool isTruncated() const override { return _truncated; }
  std::string_view className() const override { return "TextLayoutDouble"; }

  const std::string text;
  const FontDescriptor font;

 private:
  std::size_t _lines;
  std::size_t _longest;
  bool _truncated;
};

/// Text of exact made-up measures: each character is half the point size wide; ascent 0.8, descent 0.2 and capital
/// height 0.7 of the point size. Lines break at spaces, and inside a word that does not fit a line.
class TextSystemDouble final : public TextSystem {
 public:
  FontMetrics metrics(const FontDescriptor& font) override {
    return {0.8 * font.pointSize, 0.2 * font.pointSize, 0.7 * font.pointSize};
  }
  TextLayoutRef layOut(const std::string& text, const FontDescriptor& font, double maxWidth, std::size_t maxLines,
                       bool) override {
    const double characters = maxWidth / (font.pointSize / 2) + 1e-9;  // a width of exactly n characters holds n
    constexpr std::size_t kAny = std::numeric_limits<std::size_t>::max();
    const bool oneColumn = !(maxWidth > 0);
    const std::size_t fits =
        oneColumn || characters > 1e9 ? kAny : std::max<std::size_t>(1, static_cast<std::size_t>(characters));

    std::vector<std::size_t> lines{0};
    bool lineIsEmpty = true;
    for (std::size_t word : wordLengths(text)) {
      if (!lineIsEmpty && !oneColumn && lines.back() + 1 + word <= fits) {
        lines.back() += 1 + word;
        continue;
      }
      if (!lineIsEmpty) lines.push_back(0);
      for (; word > fits; word -= fits) {
        lines.back() = fits;
        lines.push_back(0);
      }
      lines.back() = word;
      lineIsEmpty = false;
    }
    const bool truncated = maxLines > 0 && lines.size() > maxLines;
    if (truncated) {
      lines.resize(maxLines);
      lines.back() = std::min(fits, lines.back() + 1);  // the ellipsis
    }
    return std::make_shared<const TextLayoutDouble>(text, font, lines.size(), *std::ranges::max_element(lines),
                                                    truncated);
  }

 private:
  /// Lengths of the words in characters; every byte that continues a UTF-8 character counts for nothing.
  static std::vector<std::size_t> wordLengths(const std::string& text) {
    std::vector<std::size_t> lengths{0};
    for (const char c : text) {
      if (c == ' ')
        lengths.push_back(0);
      else if ((static_cast<unsigned char>(c) & 0xc0) != 0x80)
        ++lengths.back();
    }
    return lengths;
  }
};

}  // namespace nimbo
