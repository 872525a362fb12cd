// libnimbo-drawing.so: what DrawingPart.h declares.

#include <cairo.h>

#include "desktop/drawing/CairoImage.h"
#include "desktop/drawing/CairoShieldRenderer.h"
#include "desktop/drawing/CairoSurface.h"
#include "desktop/drawing/DrawingPart.h"
#include "desktop/drawing/PangoTextSystem.h"

namespace nimbo {

namespace {

class PangoAndCairo final : public DrawingPart {
  void lookForFonts() override { PangoTextSystem::lookForFonts(); }
  std::unique_ptr<TextSystem> makeTextSystem(const std::string& language) override {
    return std::make_unique<PangoTextSystem>(language);
  }
  std::unique_ptr<ImageResources> makeImages() override { return std::make_unique<CairoImageResources>(); }
  std::unique_ptr<ShieldIconRenderer> makeShieldRenderer(TextSystem& text) override {
    return std::make_unique<CairoShieldRenderer>(text);
  }
  Outcome<PictureRef> render(const DrawOperation& draw, Size size, double scale, const Color& background) override {
    const auto surface = renderToSurface(draw, size, scale, background);
    if (!surface) return surface.error();
    return PictureRef(*surface);
  }
  ErrorRef writePNG(std::span<const std::uint8_t> pixels, int width, int stride,
                    const std::filesystem::path& path) override {
    // Cairo takes memory to draw on, and only reads it here.
    auto* const data = const_cast<std::uint8_t*>(pixels.data());
    const int height = static_cast<int>(pixels.size() / static_cast<std::size_t>(stride));
    CairoSurfaceHandle surface(cairo_image_surface_create_for_data(data, CAIRO_FORMAT_ARGB32, width, height, stride));
    return CairoSurface(std::move(surface), {}, 1).writePNG(path);
  }
};

}  // namespace

}  // namespace nimbo

extern "C" nimbo::DrawingPart* nimbo_drawing() {
  static nimbo::PangoAndCairo part;
  return &part;
}
