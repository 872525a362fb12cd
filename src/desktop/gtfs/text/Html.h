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
  explicit HtmlTagFinder(std::string_view text) : _text(text), _lastEnd(lastOf('>')), _lastEquals(lastOf('=')) {}

  /// The markup at `position`, where a "<" stands: a tag of an HTML element, also one that the text's end cuts off, a
  /// comment, a document type; a script or style sheet as a whole. Absent when it is none: the "<" of "<5 min" or of a
  /// train called <F> stands for itself.
  std::optional<HtmlTag> tagAt(std::size_t position) const;

 private:
  /// Not looked for in a text without markup, as most are.
  std::size_t lastOf(char c) const {
    return _text.find('<') == std::string_view::npos ? std::string_view::npos : _text.rfind(c);
  }

  std::string_view _text;
  std::size_t _lastEnd;
  std::size_t _lastEquals;
};

/// A character reference as found in a text.
struct HtmlEntity {
  char32_t character;
  char32_t second;     ///< of a name for two characters; 0 for most
  std::size_t length;  ///< bytes from "&" on, the ";" with them
};

/// The character reference at the start of `text`, which begins with "&": numeric ("&#233;", "&#xE9;") or by one of the
/// 2125 names of HTML 5 that end in ";". Absent when it is none: the "&" then stands for itself. Browsers' forgiving
/// readings are followed: numbers 128 to 159 are Windows-1252, and numbers that no character has give U+FFFD. Sources:
/// https://html.spec.whatwg.org/multipage/parsing.html#numeric-character-reference-end-state,
/// https://html.spec.whatwg.org/multipage/named-characters.html
std::optional<HtmlEntity> htmlEntityAt(std::string_view text);

}  // namespace nimbo
