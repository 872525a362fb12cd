#pragma once

#include <functional>
#include <map>

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
  ImageRef render(const TransitArtwork& artwork, std::int64_t shieldSize, double screenScale, bool) override;
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
                       bool rightToLeft) override;
};

}  // namespace nimbo
