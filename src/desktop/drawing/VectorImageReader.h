#pragma once

#include <map>
#include <string>
#include <string_view>

#include "desktop/drawing/VectorImage.h"

namespace nimbo {

/// Reads the SVG of one vector image.
class VectorImageReader final {
 public:
  /// The text outlives the reader.
  explicit VectorImageReader(std::string_view svg) : _svg(svg), _rest(svg) {}

  /// Whether the whole text was understood. Called once.
  bool read(VectorImage& image);
  const std::string& problem() const { return _problem; }

 private:
  using Attributes = std::map<std::string_view, std::string_view>;

  struct Element {
    std::string_view name;
    Attributes attributes;
    bool isEnd = false;  // "</name>"
  };

  /// Fails where it stands in the text; always false.
  bool fail(std::string problem);
  void skipSpace();
  /// The next tag; comments and texts before it are passed over.
  bool readElement(Element& element);
  bool readSize(const Attributes& attributes, Size& size);
  bool readShape(const Element& element, VectorImage::Shape& shape);
  bool readStyle(const Attributes& attributes, VectorImage::Shape& shape);
  bool readPaint(std::string_view text, VectorImage::Paint& paint);
  bool readPath(std::string_view data, VectorImage::Shape& shape);
  bool readRect(const Attributes& attributes, VectorImage::Shape& shape);
  /// Takes `count` numbers off `text`.
  bool readNumbers(std::string_view& text, double* numbers, int count);
  /// An attribute's one number; `fallback` where it does not stand.
  bool readNumber(const Attributes& attributes, std::string_view name, double& number);

  std::string_view _svg;
  std::string_view _rest;
  std::string _problem;
};

}  // namespace nimbo
