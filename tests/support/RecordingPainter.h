#pragma once

#include <vector>

#include "platform/ui/Painter.h"
#include "support/DrawingDoubles.h"

namespace nimbo {

/// Keeps what was painted with the doubles' images and texts, in the coordinates of the whole picture.
class RecordingPainter final : public Painter {
 public:
  struct Text {
    Point origin;
    double width;
    Color color;
    std::size_t lines;
    std::string text;
    FontDescriptor font;
  };
  struct Picture {
    Rect rect;
    double alpha;
    Color tint;
    bool isForNight;
  };
  struct Fill {
    Rect rect;
    Color color;
  };

  void fillRect(const Rect& rect, const Color& color) override { fills.push_back({moved(rect), color}); }
  void drawText(const TextLayout& layout, Point origin, double width, const Color& color) override {
    const auto& known = dynamic_cast<const TextLayoutDouble&>(layout);
    texts.push_back(
        {{_origin.x + origin.x, _origin.y + origin.y}, width, color, layout.lineCount(), known.text, known.font});
  }
  void drawImage(const Image& image, const Rect& rect, double alpha, const Color& tint) override {
    pictures.push_back({moved(rect), alpha, tint, dynamic_cast<const ImageDouble&>(image).isForNight});
  }
  void save(Point offset, const Rect& clip) override {
    clips.push_back(clip);
    _saved.push_back(_origin);
    _origin = {_origin.x + offset.x, _origin.y + offset.y};
  }
  void restore() override {
    _origin = _saved.back();
    _saved.pop_back();
  }

  std::vector<Fill> fills;
  std::vector<Text> texts;
  std::vector<Picture> pictures;
  std::vector<Rect> clips;  ///< of every `save`

 private:
  Rect moved(const Rect& rect) const { return {_origin.x + rect.x, _origin.y + rect.y, rect.width, rect.height}; }

  Point _origin;
  std::vector<Point> _saved;
};

}  // namespace nimbo
