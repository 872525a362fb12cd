#include "desktop/drawing/CairoShieldRenderer.h"

#include <cairo.h>

#include <algorithm>
#include <cmath>
#include <numbers>

#include "desktop/drawing/CairoImage.h"
#include "desktop/drawing/CairoPainter.h"
#include "desktop/drawing/VectorImage.h"
#include "platform/ui/Color.h"

namespace nimbo {

namespace {

constexpr std::string_view kUnknownModeSymbol = "WidgetGenericTransit";

/// The image of a TransitMode; empty for a value that is none.
std::string_view symbolName(std::int64_t mode) {
  switch (static_cast<TransitMode>(mode)) {
    case TransitMode::unknown:
      return kUnknownModeSymbol;
    case TransitMode::tram:
      return "mode-tram";
    case TransitMode::subway:
      return "mode-subway";
    case TransitMode::rail:
      return "mode-rail";
    case TransitMode::bus:
      return "mode-bus";
    case TransitMode::ferry:
      return "mode-ferry";
    case TransitMode::cableTram:
      return "mode-cable-tram";
    case TransitMode::aerialLift:
      return "mode-aerial-lift";
    case TransitMode::funicular:
      return "mode-funicular";
    case TransitMode::trolleybus:
      return "mode-trolleybus";
    case TransitMode::monorail:
      return "mode-monorail";
  }
  return {};
}

std::string trimmed(const std::optional<std::string>& text) {
  constexpr std::string_view kSpace = " \t\r\n";
  const std::size_t begin = text ? text->find_first_not_of(kSpace) : std::string::npos;
  return begin == std::string::npos ? std::string() : text->substr(begin, text->find_last_not_of(kSpace) + 1 - begin);
}

/// The format strings with their separators, "{name}" standing for the token of that name; without format strings the
/// alternative string.
std::string plainText(const ServerFormattedString& string) {
  if (!string.formatStrings || string.formatStrings->empty()) return trimmed(string.alternativeString);
  std::string text;
  for (std::size_t i = 0; i < string.formatStrings->size(); ++i) {
    if (i > 0 && string.separators && i <= string.separators->size()) text += (*string.separators)[i - 1].value_or("");
    text += (*string.formatStrings)[i].value_or("");
  }
  if (string.formatTokens)
    for (const ServerFormatToken& token : *string.formatTokens) {
      const std::string placeholder = "{" + token.name + "}";
      for (std::size_t at = text.find(placeholder); at != std::string::npos;
           at = text.find(placeholder, at + token.value.size()))
        text.replace(at, placeholder.size(), token.value);
    }
  return trimmed(text);
}

/// Of a shield's padding what a text keeps that does not fit otherwise, and how far letters can be condensed and still
/// look like letters.
constexpr double kTightPadding = 0.5, kMostCondensed = 0.75;

/// The next length at which a right edge is as sharp as the left one.
double wholePixels(double length, double screenScale) { return std::ceil(length * screenScale - 1e-6) / screenScale; }

void addRoundedBox(cairo_t* context, const Rect& box, double radius) {
  constexpr double kQuarter = std::numbers::pi / 2;
  cairo_new_sub_path(context);
  cairo_arc(context, box.maxX() - radius, box.y + radius, radius, -kQuarter, 0);
  cairo_arc(context, box.maxX() - radius, box.maxY() - radius, radius, 0, kQuarter);
  cairo_arc(context, box.x + radius, box.maxY() - radius, radius, kQuarter, 2 * kQuarter);
  cairo_arc(context, box.x + radius, box.y + radius, radius, 2 * kQuarter, 3 * kQuarter);
  cairo_close_path(context);
}

void fillShape(cairo_t* context, Size size, double radius, const ShieldColors& colors) {
  addRoundedBox(context, {0, 0, size.width, size.height}, radius);
  setColor(context, colors.fill);
  cairo_fill(context);
  if (colors.outline.alpha == 0) return;
  constexpr double kWidth = 1;
  addRoundedBox(context, {kWidth / 2, kWidth / 2, size.width - kWidth, size.height - kWidth}, radius - kWidth / 2);
  setColor(context, colors.outline);
  cairo_set_line_width(context, kWidth);
  cairo_stroke(context);
}

double badgeDiameter(double height) { return 0.42 * height; }

/// How far the badge stands out of the shape.
double badgeOverhang(double height) { return 0.8 * badgeDiameter(height); }

/// An exclamation mark on a disc in the top right corner, with a gap around it.
void drawBadge(cairo_t* context, double width, double height) {
  const double radius = badgeDiameter(height) / 2;
  const double x = width - radius, y = radius;
  const auto disc = [&](double r) { cairo_arc(context, x, y, r, 0, 2 * std::numbers::pi); };
  cairo_set_operator(context, CAIRO_OPERATOR_CLEAR);
  disc(radius * 1.22);
  cairo_fill(context);
  cairo_set_operator(context, CAIRO_OPERATOR_OVER);
  setColor(context, {0.79, 0.23, 0.03, 1});
  disc(radius);
  cairo_fill(context);
  setColor(context, {1, 1, 1, 1});
  cairo_set_line_cap(context, CAIRO_LINE_CAP_ROUND);
  cairo_set_line_width(context, radius * 0.3);
  cairo_move_to(context, x, y - radius * 0.5);
  cairo_line_to(context, x, y + radius * 0.08);
  cairo_stroke(context);
  cairo_arc(context, x, y + radius * 0.52, radius * 0.18, 0, 2 * std::numbers::pi);
  cairo_fill(context);
}

}  // namespace

ImageRef CairoShieldRenderer::render(const TransitArtwork& artwork, std::int64_t shieldSize, double screenScale,
                                     bool nightMode) {
  const Look look{shieldMetrics(shieldSize), screenScale, nightMode, artwork.hasRoutingIncidentBadge()};
  switch (static_cast<ArtworkSourceType>(artwork.artworkSourceType())) {
    case ArtworkSourceType::shield:
      return artwork.shieldDataSource() ? renderShield(*artwork.shieldDataSource(), look) : nullptr;
    case ArtworkSourceType::icon: {
      const auto& icon = artwork.iconDataSource();
      const std::string_view name = icon && icon->iconType == 1 ? symbolName(icon->defaultTransitType) : "";
      if (!name.empty()) return renderSymbol(name, look);
      if (const auto& fallback = artwork.iconFallbackShieldDataSource())
        if (ImageRef shield = renderShield(*fallback, look)) return shield;
      return renderSymbol(kUnknownModeSymbol, look);
    }
    case ArtworkSourceType::text: {
      const auto& text = artwork.textDataSource();
      return text && text->text ? renderText(plainText(*text->text), look) : nullptr;
    }
    case ArtworkSourceType::none:
      break;
  }
  return nullptr;
}

double CairoShieldRenderer::circleTextWidth(const ShieldMetrics& metrics) const {
  const double inside = 0.44 * metrics.height;
  const double capitals = _text.metrics({metrics.textSize, true}).capHeight;
  return 2 * std::sqrt(inside * inside - capitals * capitals / 4);
}

ImageRef CairoShieldRenderer::renderShield(const TransitShield& shield, const Look& look) {
  const std::string text = trimmed(shield.shieldText);
  if (text.empty() && !(shield.shieldColorString && colorFromHexText(*shield.shieldColorString))) return nullptr;
  const ShieldMetrics& metrics = look.metrics;
  const ShieldColors colors = shieldColors(shield, look.nightMode);
  Size size{metrics.height, metrics.height};
  double radius = metrics.height / 2, padding = metrics.padding;
  std::optional<FittedText> fitted;
  const auto type = static_cast<ShieldType>(shield.shieldType);
  const auto inCircle = [&](const ShieldMetrics& of) { return squeezed(text, of, circleTextWidth(of), 1); };
  // A text that would lose its end in the smallest circle makes a pill of every size, so that smaller is narrower.
  if (type == ShieldType::circle && !inCircle(shieldMetrics(0)).layout->isTruncated())
    fitted = inCircle(metrics);
  else if (type != ShieldType::pill && type != ShieldType::circle)
    radius = metrics.cornerRadius;
  if (!fitted) {
    if (radius == metrics.height / 2) {
      padding *= 1.2;
      size.width *= 1.25;
    }
    const double widest = widestWithin(look);
    fitted = whole(text, metrics, widest - 2 * padding);
    size.width = fitted ? std::max(size.width, fitted->width() + 2 * padding) : widest;
    if (!fitted) fitted = squeezed(text, metrics, widest - 2 * kTightPadding * padding, kMostCondensed);
  }
  size.width = wholePixels(size.width, look.screenScale);
  return drawFramed(size.width, look, [&](cairo_t* context) {
    fillShape(context, size, radius, colors);
    drawCentered(context, *fitted, size, colors.text);
  });
}

ImageRef CairoShieldRenderer::renderSymbol(std::string_view name, const Look& look) {
  const VectorImage* drawing = vectorImageNamed(name);
  if (!drawing) return nullptr;
  const double height = look.metrics.height;
  const ShieldColors colors = symbolColors(look.nightMode);
  return drawFramed(height, look, [&](cairo_t* context) {
    fillShape(context, {height, height}, look.metrics.cornerRadius, colors);
    const double margin = 0.1 * height;
    drawing->draw(context, {margin, margin, height - 2 * margin, height - 2 * margin}, colors.text);
  });
}

ImageRef CairoShieldRenderer::renderText(const std::string& text, const Look& look) {
  if (text.empty()) return nullptr;
  const double widest = widestWithin(look);
  std::optional<FittedText> fitted = whole(text, look.metrics, widest);
  if (!fitted) fitted = squeezed(text, look.metrics, widest, kMostCondensed);
  const double width = fitted->width();
  return drawFramed(width, look, [&](cairo_t* context) {
    drawCentered(context, *fitted, {width, look.metrics.height},
                 colorOf(SystemColor::label, look.nightMode ? Appearance::dark : Appearance::light));
  });
}

ImageRef CairoShieldRenderer::drawFramed(double width, const Look& look,
                                         const std::function<void(cairo_t*)>& draw) const {
  const double height = look.metrics.height;
  const double wholeWidth = wholePixels(look.hasBadge ? width + badgeOverhang(height) : width, look.screenScale);
  return drawImage({wholeWidth, height}, look.screenScale, [&](cairo_t* context) {
    draw(context);
    if (look.hasBadge) drawBadge(context, wholeWidth, height);
  });
}

double CairoShieldRenderer::widestWithin(const Look& look) {
  return look.metrics.maximumWidth - (look.hasBadge ? badgeOverhang(look.metrics.height) : 0);
}

TextLayoutRef CairoShieldRenderer::layOut(const std::string& text, double pointSize, double width) const {
  return _text.layOut(text, {pointSize, true}, width, 1, false);
}

std::optional<CairoShieldRenderer::FittedText> CairoShieldRenderer::whole(const std::string& text,
                                                                          const ShieldMetrics& metrics,
                                                                          double width) const {
  FittedText fitted{layOut(text, metrics.textSize, kUnboundedTextWidth), metrics.textSize};
  if (fitted.width() > width || fitted.layout->isTruncated()) return std::nullopt;
  return fitted;
}

CairoShieldRenderer::FittedText CairoShieldRenderer::squeezed(const std::string& text, const ShieldMetrics& metrics,
                                                              double width, double mostCondensed) const {
  const TextLayoutRef natural = layOut(text, metrics.textSize, kUnboundedTextWidth);
  const double naturalWidth = natural->size().width;
  if (naturalWidth <= width && !natural->isTruncated()) return {natural, metrics.textSize};
  const double pointSize =
      std::clamp(metrics.textSize * width / naturalWidth, metrics.smallestTextSize, metrics.textSize);
  const double condensed = std::clamp(width / (naturalWidth * pointSize / metrics.textSize), mostCondensed, 1.0);
  // Rounding of the size must not cost the last letter of a text that was shrunk to fit.
  return {layOut(text, pointSize, (width + 0.01) / condensed), pointSize, condensed};
}

void CairoShieldRenderer::drawCentered(cairo_t* context, const FittedText& text, Size box, const Color& color) const {
  const double baseline = (box.height + _text.metrics({text.pointSize, true}).capHeight) / 2;
  cairo_save(context);
  cairo_translate(context, (box.width - text.width()) / 2, baseline - text.layout->firstBaseline());
  cairo_scale(context, text.condensed, 1);
  CairoPainter(context).drawText(*text.layout, {0, 0}, text.layout->size().width, color);
  cairo_restore(context);
}

}  // namespace nimbo
