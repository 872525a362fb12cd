#pragma once

#include "platform/artwork/ArtworkImageSource.h"
#include "platform/ui/View.h"

namespace nimbo {

/// Shows the picture of an image source, as large as it is. A picture that cannot be drawn takes no room.
class ArtworkImageView : public View {
 public:
  const ArtworkImageSourceRef& imageSource() const { return _imageSource; }
  /// Null shows nothing.
  void setImageSource(ArtworkImageSourceRef imageSource);

  /// From 0, not to be seen, to 1. 1 until set.
  double alpha() const { return _alpha; }
  void setAlpha(double alpha) { _alpha = alpha; }

  std::string_view className() const override { return "ArtworkImageView"; }

 protected:
  ContentSize contentSize() override;
  void drawContent(Painter& painter, const DrawingContext& context) override;

 private:
  ImageRef image(double screenScale, bool nightMode) const;

  ArtworkImageSourceRef _imageSource;
  double _alpha = 1;
};

}  // namespace nimbo
