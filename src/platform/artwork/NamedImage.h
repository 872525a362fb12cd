#pragma once

#include <memory>
#include <string>

#include "platform/archive/SecureCoding.h"
#include "platform/artwork/ArtworkImageSource.h"

namespace nimbo {

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
