#pragma once

#include <cstddef>
#include <memory>
#include <string>

#include "platform/foundation/Geometry.h"
#include "platform/foundation/Object.h"

namespace nimbo {

/// Measures of a face at a size, in points; each is positive.
struct FontMetrics {
  double ascent = 0;     ///< baseline to the top of a line
  double descent = 0;    ///< baseline to the bottom of a line
  double capHeight = 0;  ///< height of capital letters, from the font itself
};

/// What a face is chosen by.
struct FontDescriptor {
  double pointSize = 0;
  bool bold = false;
  bool operator==(const FontDescriptor&) const = default;
};

/// A text broken into lines, measured, ready to be painted. Immutable.
class TextLayout : public Object {
 public:
  /// Width of the widest line and height of all lines, in points.
  virtual Size size() const = 0;
  virtual std::size_t lineCount() const = 0;
  /// Distance from the top to the baseline of the first and of the last line, in points.
  virtual double firstBaseline() const = 0;
  virtual double lastBaseline() const = 0;
  /// Whether text was left out (an ellipsis stands for it).
  virtual bool isTruncated() const = 0;
};

using TextLayoutRef = std::shared_ptr<const TextLayout>;

/// Points; a width for texts that are not to be broken.
inline constexpr double kUnboundedTextWidth = 1e6;

/// Fonts and text of the platform. Main thread only. A missing font is replaced by another, and logged.
class TextSystem {
 public:
  virtual ~TextSystem() = default;
  /// That of the platform in force.
  static TextSystem& current();
  virtual FontMetrics metrics(const FontDescriptor& font) = 0;
  /// Breaks `text` (UTF-8; bad bytes are replaced) at `maxWidth` points into at most `maxLines` lines (0: any number),
  /// with an ellipsis where it is cut. Text runs and its lines begin on the side of its first
  /// letter that has a direction and is not isolated; `rightToLeft` is the direction of text without one. A width that
  /// is not positive gives one column of words.
  virtual TextLayoutRef layOut(const std::string& text, const FontDescriptor& font, double maxWidth,
                               std::size_t maxLines, bool rightToLeft) = 0;
};

}  // namespace nimbo
