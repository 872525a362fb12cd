#pragma once

#include <gtkmm/drawingarea.h>
#include <gtkmm/widget.h>

#include "host/window/DesktopPreferences.h"
#include "platform/artwork/ArtworkImageSource.h"
#include "platform/transit/TransitArtwork.h"

namespace nimbo {

/// A line's shield or a system's symbol, as large as the texts and in the appearance of the moment. Screen readers hear
/// what stands beside it. Takes no room without an artwork.
class ShieldImage final : public Gtk::DrawingArea {
 public:
  /// `shieldSize` from 0 to 7. The preferences outlive it.
  ShieldImage(DesktopPreferences& preferences, TransitArtworkRef artwork, std::int64_t shieldSize);
  ~ShieldImage() override { _connection.disconnect(); }

 private:
  void update();
  void draw(const Cairo::RefPtr<Cairo::Context>& context, int width, int height) const;

  DesktopPreferences& _preferences;
  TransitArtworkRef _artwork;
  std::int64_t _shieldSize;
  ImageRef _image;
  sigc::connection _connection;
};

/// A shield at the beginning of a row, in a column of one width, so that names begin below each other. The row's own.
Gtk::Widget& shieldOfRow(DesktopPreferences& preferences, TransitArtworkRef artwork);

/// The shield that shows a line, else its system's symbol; null where there is neither.
TransitArtworkRef artworkOfLine(const class TransitLine& line);

}  // namespace nimbo
