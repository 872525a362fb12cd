// Draws every shield, symbol and image in both appearances: nimbo-gallery OUT.png [SCALE]

#include <cstdio>
#include <cstdlib>
#include <memory>
#include <string>
#include <vector>

#include "desktop/drawing/CairoImage.h"
#include "desktop/drawing/CairoShieldRenderer.h"
#include "desktop/drawing/CairoSurface.h"
#include "desktop/drawing/PangoTextSystem.h"
#include "platform/ui/Color.h"
#include "support/TestPlatform.h"

namespace nimbo {

namespace {

struct Sample {
  ShieldType type;
  const char* text;
  const char* color;
  const char* textColor;
};

/// Colours and names as agencies publish them, and awkward ones.
constexpr Sample kSamples[] = {
    {ShieldType::circle, "A", "0039a6", "ffffff"},
    {ShieldType::circle, "7", "b933ad", nullptr},
    {ShieldType::circle, "N", "fccc0a", nullptr},
    {ShieldType::circle, "SIR", "053159", nullptr},
    {ShieldType::pill, "B", "00843d", "ffffff"},
    {ShieldType::pill, "SL1", "7c878e", "ffffff"},
    {ShieldType::roundedBox, "42", "be1e2d", "ffffff"},
    {ShieldType::roundedBox, "90А", "27aae1", "ffffff"},
    {ShieldType::roundedBox, "L6", "fcedc7", "000000"},
    {ShieldType::roundedBox, "x", "1c1c1e", "777777"},
    {ShieldType::roundedBox, "10", nullptr, nullptr},
    {ShieldType::roundedBox, "京王線", "dd0077", "ffffff"},
    {ShieldType::roundedBox, "Red Line", "da291c", "ffffff"},
    {ShieldType::pill, "Green D", "00843d", "ffffff"},
    {ShieldType::pill, "Hudson-Be…", "0076bb", "ffffff"},
    {ShieldType::pill, "S-Bahn 41", "aa3c1f", "ffffff"},
    {ShieldType::roundedBox, "Straße… 12", "fccc0a", nullptr},
    {ShieldType::roundedBox, "Providence", "80276c", "ffffff"},
};

TransitArtworkRef artwork(const Sample& sample, bool hasBadge) {
  TransitArtwork::Fields fields;
  fields.artworkSourceType = static_cast<std::int64_t>(ArtworkSourceType::shield);
  fields.shieldDataSource = TransitShield{static_cast<std::int64_t>(sample.type), sample.text, {}, {}};
  if (sample.color) fields.shieldDataSource->shieldColorString = sample.color;
  if (sample.textColor) fields.shieldDataSource->shieldTextColorString = sample.textColor;
  fields.hasRoutingIncidentBadge = hasBadge;
  return std::make_shared<const TransitArtwork>(fields);
}

TransitArtworkRef artwork(TransitMode mode) {
  TransitArtwork::Fields fields;
  fields.artworkSourceType = static_cast<std::int64_t>(ArtworkSourceType::icon);
  fields.iconDataSource = TransitIcon{.iconType = 1, .defaultTransitType = static_cast<std::int64_t>(mode)};
  return std::make_shared<const TransitArtwork>(fields);
}

/// Draws one appearance, from the painter's origin.
class Panel {
 public:
  static constexpr Size kSize{640, 620};

  Panel(Painter& painter, PangoTextSystem& text, double scale, bool nightMode)
      : _painter(painter),
        _text(text),
        _renderer(text),
        _scale(scale),
        _nightMode(nightMode),
        _appearance(nightMode ? Appearance::dark : Appearance::light) {}

  void draw() {
    _painter.fillRect({0, 0, kSize.width, kSize.height}, colorOf(SystemColor::background, _appearance));
    for (std::int64_t size = 7; size >= 0; --size) drawShields(size, size == 6);
    for (const std::int64_t size : {7, 4, 1}) drawModes(size);
    drawImages();
    drawWithHeadline();
  }

 private:
  void show(const ImageRef& image, double alpha = 1, Color tint = {0, 0, 0, 0}) {
    if (!image) return;
    if (_x + image->size().width > kSize.width - 12) next();
    _rowHeight = std::max(_rowHeight, image->size().height);
    _painter.drawImage(*image, {_x, _y, image->size().width, image->size().height}, alpha, tint);
    _x += image->size().width + 5;
  }
  void next() {
    _x = 12;
    _y += _rowHeight + 6;
    _rowHeight = 0;
  }
  void drawShields(std::int64_t size, bool hasBadge) {
    for (const Sample& sample : kSamples) show(_renderer.render(*artwork(sample, hasBadge), size, _scale, _nightMode));
    next();
  }
  void drawModes(std::int64_t size) {
    for (std::int64_t mode = 0; mode <= static_cast<std::int64_t>(TransitMode::monorail); ++mode)
      show(_renderer.render(*artwork(static_cast<TransitMode>(mode)), size, _scale, _nightMode));
    next();
  }
  void drawImages() {
    for (const char* name : {"good-v2", "good-alt-v2", "advisories-v2", "WidgetGenericTransit"})
      show(_images.image(name, _scale, _nightMode));
    for (const char* name : {"good-alt-v2", "advisories-v2", "WidgetGenericTransit"})
      show(_images.image(name, _scale, _nightMode), 0.3, colorOf(SystemColor::label, _appearance));
    next();
  }
  void drawWithHeadline() {
    const FontDescriptor headline{17, true};
    const auto layout = _text.layOut("Delays on the N line", headline, 300, 1, false);
    const double top = _y + 15 - layout->firstBaseline() + _text.metrics(headline).capHeight / 2;
    _painter.drawText(*layout, {12, top}, 300, colorOf(SystemColor::label, _appearance));
    _x = 24 + layout->size().width;
    show(_renderer.render(*artwork(kSamples[2], false), 7, _scale, _nightMode));
    show(_renderer.render(*artwork(kSamples[6], false), 7, _scale, _nightMode));
    show(_renderer.render(*artwork(TransitMode::bus), 7, _scale, _nightMode));
  }

  Painter& _painter;
  PangoTextSystem& _text;
  CairoShieldRenderer _renderer;
  CairoImageResources _images;
  double _scale;
  bool _nightMode;
  Appearance _appearance;
  double _x = 12, _y = 12, _rowHeight = 0;
};

int drawGallery(const char* path, double scale) {
  const TestPlatform platform;
  PangoTextSystem text;
  const auto draw = [&](Painter& painter) {
    for (const bool nightMode : {false, true}) {
      painter.save({nightMode ? Panel::kSize.width : 0, 0}, {0, 0, Panel::kSize.width, Panel::kSize.height});
      Panel(painter, text, scale, nightMode).draw();
      painter.restore();
    }
  };
  const ErrorRef error = renderToPNG(draw, {2 * Panel::kSize.width, Panel::kSize.height}, scale, {1, 1, 1, 1}, path);
  for (const auto& line : platform.log.lines()) std::fprintf(stderr, "%s\n", line.text.c_str());
  if (error) std::fprintf(stderr, "%s\n", error->reason().c_str());
  return error ? 1 : 0;
}

}  // namespace

}  // namespace nimbo

int main(int count, char** arguments) {
  if (count < 2 || count > 3) {
    std::fprintf(stderr, "usage: nimbo-gallery OUT.png [SCALE]\n");
    return 2;
  }
  return nimbo::drawGallery(arguments[1], count > 2 ? std::atof(arguments[2]) : 2);
}
