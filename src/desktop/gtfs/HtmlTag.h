#pragma once

#include <cstddef>
#include <optional>
#include <string_view>

namespace nimbo {

/// What a piece of markup means to the text around it.
enum class HtmlTagEffect {
  none,       ///< text goes on: <b>, <a>, a comment
  space,      ///< a table cell
  block,      ///< text goes on in a new line: <p>, <li>, <div>
  lineBreak,  ///< <br>: one more line end
};

/// A piece of markup as found in a text.
struct HtmlTag {
  HtmlTagEffect effect;
  std::size_t length;  ///< bytes from "<" on
};

/// Finds the markup of one text. Linear over all questions about that text.
class HtmlTagFinder {
 public:
  /// The text outlives the finder.
  explicit HtmlTagFinder(std::string_view text)
      : _text(text), _lastEnd(text.rfind('>')), _lastEquals(text.rfind('=')) {}

  /// The markup at `position`, where a "<" stands: a tag of an HTML element, also one that the text's end cuts off, a
  /// comment, a document type; a script or style sheet as a whole. Absent when it is none: the "<" of "<5 min" or of a
  /// train called <F> stands for itself.
  std::optional<HtmlTag> tagAt(std::size_t position) const;

 private:
  std::string_view _text;
  std::size_t _lastEnd;
  std::size_t _lastEquals;
};

}  // namespace nimbo
