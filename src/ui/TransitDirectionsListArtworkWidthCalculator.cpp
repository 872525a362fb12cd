#include "ui/TransitDirectionsListArtworkWidthCalculator.h"

#include <algorithm>

#include "platform/ui/Environment.h"

namespace nimbo {

namespace {

constexpr double kDefaultWidthForNegative = 50.0;

ArtworkWidthCalculatorSizeParameter normalised(ArtworkWidthCalculatorSizeParameter parameter) {
  if (parameter.defaultArtworkViewWidth < 0) parameter.defaultArtworkViewWidth = kDefaultWidthForNegative;
  parameter.maxArtworkViewWidth = std::max(parameter.maxArtworkViewWidth, parameter.defaultArtworkViewWidth);
  return parameter;
}

/// A shield as it stands in the working list.
struct Candidate {
  SizedTransitArtworkRef given;
  double width;  // of the current form, without insets
};

}  // namespace

std::shared_ptr<TransitDirectionsListArtworkWidthCalculator>
TransitDirectionsListArtworkWidthCalculator::initWithSizedArtworks_sizeParameter(
    std::vector<SizedTransitArtworkRef> artworks, const ArtworkWidthCalculatorSizeParameter& sizeParameter) {
  return std::make_shared<TransitDirectionsListArtworkWidthCalculator>(std::move(artworks), sizeParameter);
}

TransitDirectionsListArtworkWidthCalculator::TransitDirectionsListArtworkWidthCalculator(
    std::vector<SizedTransitArtworkRef> artworks, const ArtworkWidthCalculatorSizeParameter& sizeParameter)
    : _artworks(std::move(artworks)), _sizeParameter(normalised(sizeParameter)) {}

SizedTransitArtworkMap<SizedTransitArtworkRef>
TransitDirectionsListArtworkWidthCalculator::calculateArtworkViewWidthAndArtworkSizes(
    double* outArtworkViewWidth) const {
  SizedTransitArtworkMap<SizedTransitArtworkRef> replacements;
  const double screenScale = Environment::current().screenScale();
  const auto currentForm = [&](const SizedTransitArtworkRef& given) {
    const auto replacement = replacements.find(given);
    return replacement == replacements.end() ? given : replacement->second;
  };
  std::vector<Candidate> candidates;
  for (const auto& artwork : _artworks) candidates.push_back({artwork, 0});
  const auto sortByWidth = [&] {
    for (Candidate& candidate : candidates) {
      const ImageRef image = currentForm(candidate.given)->imageToDisplayWithScreenScale_nightMode(screenScale, false);
      candidate.width = image ? image->size().width : 0;
    }
    std::ranges::stable_sort(candidates, {}, &Candidate::width);
  };

  double columnWidth = _sizeParameter.defaultArtworkViewWidth;
  sortByWidth();
  while (!candidates.empty()) {
    const Candidate& widest = candidates.back();
    const double width = widest.width + _sizeParameter.artworkInsets.left + _sizeParameter.artworkInsets.right;
    if (width <= _sizeParameter.maxArtworkViewWidth) {
      columnWidth = std::max(width, _sizeParameter.defaultArtworkViewWidth);
      break;
    }
    const SizedTransitArtworkRef form = currentForm(widest.given);
    if (form->shieldSize() < 1) {
      candidates.pop_back();
      continue;
    }
    replacements[widest.given] = SizedTransitArtwork::initWithArtwork_shieldSize_artworkCache(
        form->artwork(), form->shieldSize() - 1, form->artworkCache());
    sortByWidth();
  }
  if (outArtworkViewWidth) *outArtworkViewWidth = columnWidth;
  return replacements;
}

}  // namespace nimbo
