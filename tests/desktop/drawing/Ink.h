#pragma once

#include <algorithm>
#include <cstdint>
#include <cstring>
#include <functional>
#include <vector>

#include "desktop/drawing/CairoImage.h"
#include "desktop/drawing/CairoSurface.h"
#include "platform/ui/Color.h"

namespace nimbo {

inline constexpr Color kBlack{0, 0, 0, 1}, kWhite{1, 1, 1, 1};

/// Device pixels; right and bottom are outside.
struct PixelBox {
  int left = 0, top = 0, right = 0, bottom = 0;
};

/// What was drawn on a surface, pixel by pixel.
class Ink {
 public:
  explicit Ink(const CairoSurface& surface) : _width(surface.pixelWidth()), _height(surface.pixelHeight()) {
    const auto bytes = surface.pixels();
    for (int y = 0; y < _height; ++y)
      for (int x = 0; x < _width; ++x) {
        std::uint32_t pixel = 0;
        std::memcpy(&pixel, bytes.data() + y * surface.stride() + x * 4, sizeof pixel);
        _pixels.push_back(pixel);
      }
  }
  explicit Ink(const ImageRef& image) : Ink(dynamic_cast<const CairoImage&>(*image).surface()) {}

  int width() const { return _width; }
  int height() const { return _height; }
  std::uint32_t at(int x, int y) const { return _pixels[static_cast<std::size_t>(y * _width + x)]; }
  std::uint32_t alphaAt(int x, int y) const { return at(x, y) >> 24; }

  /// Pixels that `counts` picks: how many, and the smallest box around them, in pixels.
  struct Found {
    std::size_t count = 0;
    int left = 1 << 20, top = 1 << 20, right = 0, bottom = 0;
  };
  Found find(const std::function<bool(std::uint32_t)>& counts) const { return find({0, 0, _width, _height}, counts); }
  Found find(const PixelBox& in, const std::function<bool(std::uint32_t)>& counts) const {
    Found found;
    for (int y = std::max(in.top, 0); y < std::min(in.bottom, _height); ++y)
      for (int x = std::max(in.left, 0); x < std::min(in.right, _width); ++x) {
        if (!counts(at(x, y))) continue;
        ++found.count;
        found.left = std::min(found.left, x), found.right = std::max(found.right, x + 1);
        found.top = std::min(found.top, y), found.bottom = std::max(found.bottom, y + 1);
      }
    return found;
  }
  /// Where more is drawn than the faintest edge.
  Found drawn() const {
    return find([](std::uint32_t pixel) { return pixel >> 24 > 40; });
  }
  /// Opaque pixels of exactly this colour.
  Found ofColor(std::uint32_t rgb) const {
    return find([rgb](std::uint32_t pixel) { return pixel == (0xff000000 | rgb); });
  }

 private:
  int _width;
  int _height;
  std::vector<std::uint32_t> _pixels;
};

}  // namespace nimbo
