#pragma once

#include "desktop/drawing/DrawingPart.h"

namespace nimbo {

/// Text, images and shields by libnimbo-drawing, which is opened with the first that is asked for: a program that draws
/// nothing does without. Where it is missing there are no images and shields, which is logged; asking for text throws
/// LatePartMissing. Main thread only.
class LateDrawing final : public TextSystem, public ImageResources, public ShieldIconRenderer {
 public:
  /// `language` is the user's, as a BCP 47 tag ("ja").
  explicit LateDrawing(std::string language) : _language(std::move(language)) {}

  FontMetrics metrics(const FontDescriptor& font) override;
  TextLayoutRef layOut(const std::string& text, const FontDescriptor& font, double maxWidth, std::size_t maxLines,
                       bool rightToLeft) override;
  ImageRef image(std::string_view name, double screenScale, bool nightMode) override;
  ImageRef render(const TransitArtwork& artwork, std::int64_t shieldSize, double screenScale, bool nightMode) override;
  void setCachesIconAtlases(bool caches) override;

 private:
  TextSystem& text();

  std::string _language;
  bool _cachesIconAtlases = true;
  std::unique_ptr<TextSystem> _text;
  std::unique_ptr<ImageResources> _images;
  std::unique_ptr<ShieldIconRenderer> _shields;
};

}  // namespace nimbo
