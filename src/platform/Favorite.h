#pragma once

#include <string>

#include "platform/foundation/Object.h"
#include "platform/transit/TransitLine.h"

namespace nimbo {

/// Something that the user keeps in the map application. Kinds that this program knows nothing of stand among them.
class Favorite : public Object {
 public:
  /// Kind as stored: "transit-line", or a kind of another application ("place", ...).
  virtual const std::string& kind() const = 0;
};

using FavoriteRef = std::shared_ptr<const Favorite>;

/// Kind of a favourite transit line.
inline constexpr std::string_view kFavoriteKindTransitLine = "transit-line";

class FavoriteTransitLine final : public Favorite {
 public:
  /// `transitLine` may be null: a favourite whose line could not be read.
  explicit FavoriteTransitLine(TransitLineRef transitLine) : _transitLine(std::move(transitLine)) {}

  /// The line as it was when the user kept it, or null.
  const TransitLineRef& transitLine() const { return _transitLine; }

  const std::string& kind() const override { return _kind; }
  std::string_view className() const override { return "FavoriteTransitLine"; }

 private:
  std::string _kind{kFavoriteKindTransitLine};
  TransitLineRef _transitLine;
};

/// A favourite of any other kind, kept for its owner.
class OtherFavorite final : public Favorite {
 public:
  explicit OtherFavorite(std::string kind) : _kind(std::move(kind)) {}
  const std::string& kind() const override { return _kind; }
  std::string_view className() const override { return "OtherFavorite"; }

 private:
  std::string _kind;
};

}  // namespace nimbo
