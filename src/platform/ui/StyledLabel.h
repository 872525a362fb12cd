#pragma once

#include <cstddef>
#include <optional>
#include <string>

#include "platform/ui/Color.h"
#include "platform/ui/Font.h"
#include "platform/ui/View.h"

namespace nimbo {

/// A text in one font. It wants to be as wide as the text without breaks, and as tall as its lines at the width it
/// gets; a height that is too small for them shows as many lines as fit, the last with an ellipsis.
class StyledLabel : public View {
 public:
  /// In the preferred body font.
  StyledLabel();

  /// UTF-8; absent shows nothing, in the room of one line outside stacks.
  const std::optional<std::string>& text() const { return _text; }
  void setText(std::optional<std::string> text);
  const FontRef& font() const { return _font; }
  /// Null gives the preferred body font.
  void setFont(FontRef font);
  /// The most lines; 0: any number. 1 until set.
  void setNumberOfLines(std::size_t lines);

  bool isBlank() const override { return isHidden() || !_text || _text->empty(); }

  std::string_view className() const override { return "StyledLabel"; }

 protected:
  ContentSize contentSize() override;
  void forgetAdaptedSize() override { _linesThatFit = 0; }
  bool adaptToSize(Size size) override;
  std::optional<double> firstBaselineFromTop() override;
  std::optional<double> lastBaselineFromBottom() override;
  double reachAboveBaseline() override { return _font->capHeight(); }
  double reachBelowBaseline() override { return _font->descent(); }
  void drawContent(Painter& painter, const DrawingContext& context) override;
  bool clipsToBounds() const override { return _clips; }

 private:
  /// A measured text and what it was measured for.
  struct Measured {
    TextLayoutRef layout;
    double width = 0;
    std::size_t lines = 0;
    bool rightToLeft = false;
  };
  void invalidateText();
  const TextLayoutRef& layOut(Measured& measured, double width, std::size_t lines);
  const TextLayoutRef& unbrokenLayout();
  TextLayoutRef layoutForWidth(double width, std::size_t lines);
  std::size_t linesShown() const;

  std::optional<std::string> _text;
  FontRef _font;
  std::size_t _numberOfLines = 1;
  std::optional<double> _foundWidth;  // of the last layout
  std::size_t _linesThatFit = 0;      // in the height that was found; 0: all
  Measured _unbroken, _broken;
  bool _clips = false;
};

}  // namespace nimbo
