#include "platform/ui/ArtworkImageView.h"

#include "platform/ui/Painter.h"

namespace nimbo {

void ArtworkImageView::setImageSource(ArtworkImageSourceRef imageSource) {
  if (imageSource == _imageSource) return;
  _imageSource = std::move(imageSource);
  setNeedsUpdateConstraints();
}

ImageRef ArtworkImageView::image(double screenScale, bool nightMode) const {
  return _imageSource ? _imageSource->imageToDisplayWithScreenScale_nightMode(screenScale, nightMode) : nullptr;
}

ContentSize ArtworkImageView::contentSize() {
  const ImageRef picture = image(screenScale(), Environment::current().appearance() == Appearance::dark);
  if (!picture) return {0, 0};
  return {picture->size().width, picture->size().height};
}

void ArtworkImageView::drawContent(Painter& painter, const DrawingContext& context) {
  const ImageRef picture = image(context.screenScale, context.appearance == Appearance::dark);
  constexpr Color kNoTint{0, 0, 0, 0};
  if (picture) painter.drawImage(*picture, bounds(), _alpha, context.vibrantColor.value_or(kNoTint));
}

}  // namespace nimbo
