#pragma once

#include <memory>
#include <string>

#include "platform/archive/SecureCoding.h"
#include "platform/foundation/Geometry.h"
#include "platform/foundation/Object.h"

namespace nimbo {

/// A drawn picture, ready to be painted at one screen scale. Immutable; the pixels belong to the platform's drawing.
class Image : public Object {
 public:
  /// Points.
  virtual Size size() const = 0;
  /// Device pixels for each point.
  virtual double scale() const = 0;
};

using ImageRef = std::shared_ptr<const Image>;

/// Something that an image view can show: described by value, drawn when asked.
class ArtworkImageSource : public Object {
 public:
  /// The picture for a screen scale and an appearance; null when it cannot be drawn. Main thread only.
  virtual ImageRef imageToDisplayWithScreenScale_nightMode(double screenScale, bool nightMode) const = 0;
};

using ArtworkImageSourceRef = std::shared_ptr<const ArtworkImageSource>;

/// Draws the widget's own images. Main thread only.
class ImageResources {
 public:
  virtual ~ImageResources() = default;
  /// Those of the platform in force.
  static ImageResources& current();
  /// The image of this name; null, and a log line, when there is none.
  virtual ImageRef image(std::string_view name, double screenScale, bool nightMode) = 0;
};

/// An image from the widget's own resources, by name. Each look-up makes a new object; two of one name archive to the
/// same bytes, but are not the same object to `isEqual`, as two loads of a file are not.
class NamedImage final : public ArtworkImageSource, public SecureCoding {
 public:
  static std::shared_ptr<const NamedImage> imageNamed(std::string name);
  explicit NamedImage(std::string name) : _name(std::move(name)) {}

  const std::string& name() const { return _name; }

  ImageRef imageToDisplayWithScreenScale_nightMode(double screenScale, bool nightMode) const override;

  static const ArchivableClass& archivedClass();
  const ArchivableClass& archivableClass() const override { return archivedClass(); }
  void encodeWithCoder(KeyedEncoder& coder) const override;

  std::string_view className() const override { return "NamedImage"; }
  std::uint64_t hash() const override;

 private:
  std::string _name;
};

}  // namespace nimbo
