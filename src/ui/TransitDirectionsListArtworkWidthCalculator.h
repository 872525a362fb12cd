#pragma once

#include <memory>
#include <unordered_map>
#include <vector>

#include "platform/artwork/ArtworkCache.h"
#include "platform/foundation/Geometry.h"
#include "platform/foundation/Object.h"

namespace nimbo {

/// The room for the shield column, in points.
struct ArtworkWidthCalculatorSizeParameter {
  double defaultArtworkViewWidth = 0;  ///< the narrowest the column may be, and its width without shields
  double maxArtworkViewWidth = 0;      ///< the widest the column may be
  Insets artworkInsets;                ///< left and right are added to every shield's width
  bool operator==(const ArtworkWidthCalculatorSizeParameter&) const = default;
};

using SizedTransitArtworkRef = std::shared_ptr<const SizedTransitArtwork>;

struct SizedTransitArtworkHash {
  std::size_t operator()(const SizedTransitArtworkRef& artwork) const { return artwork->hash(); }
};
struct SizedTransitArtworkEqual {
  bool operator()(const SizedTransitArtworkRef& a, const SizedTransitArtworkRef& b) const {
    return a->isEqual(b.get());
  }
};
/// Keys are compared by equality.
template <class Value>
using SizedTransitArtworkMap =
    std::unordered_map<SizedTransitArtworkRef, Value, SizedTransitArtworkHash, SizedTransitArtworkEqual>;

/// Finds the width of a column of shields, shrinking the widest, step by step, while they do not fit. Main thread only.
class TransitDirectionsListArtworkWidthCalculator final : public Object {
 public:
  /// No shield is null. A budget that makes no sense is put right: a negative default becomes 50 points, and the
  /// maximum is at least the default.
  static std::shared_ptr<TransitDirectionsListArtworkWidthCalculator> initWithSizedArtworks_sizeParameter(
      std::vector<SizedTransitArtworkRef> artworks, const ArtworkWidthCalculatorSizeParameter& sizeParameter);
  TransitDirectionsListArtworkWidthCalculator(std::vector<SizedTransitArtworkRef> artworks,
                                              const ArtworkWidthCalculatorSizeParameter& sizeParameter);

  const std::vector<SizedTransitArtworkRef>& artworks() const { return _artworks; }
  const ArtworkWidthCalculatorSizeParameter& sizeParameter() const { return _sizeParameter; }

  /// The shields that had to shrink, as given, with what replaces them; the column's width in points is written to
  /// `outArtworkViewWidth` unless it is null. A shield that is too wide at the smallest size does not count.
  SizedTransitArtworkMap<SizedTransitArtworkRef> calculateArtworkViewWidthAndArtworkSizes(
      double* outArtworkViewWidth) const;

  std::string_view className() const override { return "TransitDirectionsListArtworkWidthCalculator"; }

 private:
  std::vector<SizedTransitArtworkRef> _artworks;
  ArtworkWidthCalculatorSizeParameter _sizeParameter;
};

}  // namespace nimbo
