#include "host/window/ShieldImage.h"

#include <gtkmm/box.h>

#include <cmath>

#include "desktop/drawing/CairoImage.h"
#include "host/window/WidgetTexts.h"
#include "platform/Platform.h"
#include "platform/transit/TransitLine.h"

namespace nimbo {

ShieldImage::ShieldImage(DesktopPreferences& preferences, TransitArtworkRef artwork, std::int64_t shieldSize)
    : _preferences(preferences), _artwork(std::move(artwork)), _shieldSize(shieldSize) {
  set_halign(Gtk::Align::START);
  set_valign(Gtk::Align::CENTER);
  set_draw_func(sigc::mem_fun(*this, &ShieldImage::draw));
  hideFromAccessibility(*this);
  _connection = preferences.signalLookChanged().connect([this] { update(); });
  property_scale_factor().signal_changed().connect([this] { update(); });
  update();
}

void ShieldImage::update() {
  const double scale = _preferences.textScale();
  const auto& renderer = Platform::current().shieldRenderer();
  // Drawn at the pixels that are there, then taken as an image larger by the text's scale.
  _image = _artwork && renderer ? renderer->render(*_artwork, _shieldSize, scale * get_scale_factor(),
                                                   _preferences.appearance() == Appearance::dark)
                                : nullptr;
  const Size size = _image ? _image->size() : Size{};
  set_content_width(static_cast<int>(std::ceil(size.width * scale)));
  set_content_height(static_cast<int>(std::ceil(size.height * scale)));
  queue_draw();
}

void ShieldImage::draw(const Cairo::RefPtr<Cairo::Context>& context, int, int) const {
  const auto* image = dynamic_cast<const CairoImage*>(_image.get());
  if (!image) return;
  const double scale = _preferences.textScale();
  context->scale(scale, scale);
  cairo_set_source_surface(context->cobj(), image->surface().get(), 0, 0);
  context->paint();
}

Gtk::Widget& shieldOfRow(DesktopPreferences& preferences, TransitArtworkRef artwork) {
  constexpr std::int64_t kSize = 5;
  constexpr int kColumn = 60;
  auto* column = Gtk::make_managed<Gtk::Box>();
  column->set_size_request(kColumn, -1);
  column->append(*Gtk::make_managed<ShieldImage>(preferences, std::move(artwork), kSize));
  return *column;
}

TransitArtworkRef artworkOfLine(const TransitLine& line) {
  if (line.alternateArtwork()) return line.alternateArtwork();
  if (line.artwork()) return line.artwork();
  return line.system() ? line.system()->artwork() : nullptr;
}

}  // namespace nimbo
