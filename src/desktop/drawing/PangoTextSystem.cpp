#include "desktop/drawing/PangoTextSystem.h"

#include <hb.h>
#include <pango/pangocairo.h>

#include <algorithm>
#include <cmath>
#include <stdexcept>
#include <string_view>
#include <vector>

#include "desktop/drawing/PangoTextLayout.h"
#include "platform/foundation/Log.h"

namespace nimbo {

namespace {

constexpr LogFacility kTextLogFacility{kDefaultLogSubsystem, "Text"};

/// Pango counts in 1024ths of a point with 32 bits.
constexpr double kUnlimitedWidth = 1e6;

/// The one size in which texts are laid out, in points; nothing is hinted, so that other sizes are the same, scaled.
/// Pango looks through all fonts anew for each size: a start with five rows takes 0.6 of the instructions.
constexpr double kLayoutSize = 32;

/// How large a font is, measured in `kLayoutSize`.
double scaleOf(const FontDescriptor& font) {
  if (!(font.pointSize > 0) || !std::isfinite(font.pointSize))
    throw std::invalid_argument("a font's point size is above 0");
  return std::min(font.pointSize, 1000.0) / kLayoutSize;
}

struct FontDescriptionDeleter {
  void operator()(PangoFontDescription* description) const { pango_font_description_free(description); }
};
struct HarfBuzzFontDeleter {
  void operator()(hb_font_t* font) const { hb_font_destroy(font); }
};
struct FontOptionsDeleter {
  void operator()(cairo_font_options_t* options) const { cairo_font_options_destroy(options); }
};

using FontDescription = std::unique_ptr<PangoFontDescription, FontDescriptionDeleter>;

FontDescription describe(const FontDescriptor& font) {
  FontDescription description(pango_font_description_new());
  pango_font_description_set_family_static(description.get(), "sans-serif");
  pango_font_description_set_weight(description.get(), font.bold ? PANGO_WEIGHT_BOLD : PANGO_WEIGHT_NORMAL);
  pango_font_description_set_absolute_size(description.get(), kLayoutSize * PANGO_SCALE);
  return description;
}

/// Measures at a size of 1 point, from the font's own units; absent where the font has no capital H.
std::optional<FontMetrics> unitMetrics(PangoFont* font) {
  hb_face_t* const face = hb_font_get_face(pango_font_get_hb_font(font));
  const std::unique_ptr<hb_font_t, HarfBuzzFontDeleter> unscaled(hb_font_create(face));
  hb_font_extents_t line;
  hb_codepoint_t glyph = 0;
  hb_glyph_extents_t capital;
  if (!hb_font_get_h_extents(unscaled.get(), &line) || !hb_font_get_nominal_glyph(unscaled.get(), 'H', &glyph) ||
      !hb_font_get_glyph_extents(unscaled.get(), glyph, &capital))
    return std::nullopt;
  const double units = hb_face_get_upem(face);
  return FontMetrics{line.ascender / units, -line.descender / units, capital.y_bearing / units};
}

/// The text in valid UTF-8.
std::string valid(const std::string& text) {
  if (g_utf8_validate_len(text.data(), text.size(), nullptr)) return text;
  const std::unique_ptr<char, decltype(&g_free)> repaired(
      g_utf8_make_valid(text.data(), static_cast<gssize>(text.size())), &g_free);
  return repaired.get();
}

/// Cuts a text that has more than the characters allowed, between two that a reader takes for one each.
bool cutToMaximum(std::string& text) {
  constexpr std::size_t kMaximum = PangoTextSystem::kMaximumCharacters;
  // No character is shorter than a byte.
  if (text.size() <= kMaximum) return false;
  const char* const begin = text.c_str();
  const char* const end = begin + text.size();
  const char* next = begin;  // behind the first character too many
  std::size_t count = 0;
  for (; next < end && count <= kMaximum; ++count) next = g_utf8_next_char(next);
  if (count <= kMaximum) return false;
  std::vector<PangoLogAttr> breaks(kMaximum + 2);
  pango_get_log_attrs(begin, static_cast<int>(next - begin), -1, pango_language_from_string("en"), breaks.data(),
                      static_cast<int>(breaks.size()));
  std::size_t characters = kMaximum;
  while (characters > 0 && !breaks[characters].is_cursor_position) --characters;
  if (characters == 0) characters = kMaximum;  // all of it is one
  text.resize(static_cast<std::size_t>(g_utf8_offset_to_pointer(begin, static_cast<glong>(characters)) - begin));
  text += "\u2026";
  return true;
}

/// The direction of the first letter that is not inside isolates; `otherwise` without such a letter.
bool runsRightToLeft(const std::string& text, bool otherwise) {
  constexpr gunichar kFirstIsolate = 0x2066, kLastIsolate = 0x2068, kPopIsolate = 0x2069;
  int depth = 0;
  for (const char* at = text.c_str(); *at; at = g_utf8_next_char(at)) {
    const gunichar character = g_utf8_get_char(at);
    if (character >= kFirstIsolate && character <= kLastIsolate) ++depth;
    if (character == kPopIsolate) depth = std::max(depth - 1, 0);
    const hb_script_t script = hb_unicode_script(hb_unicode_funcs_get_default(), character);
    const bool hasDirection =
        script != HB_SCRIPT_COMMON && script != HB_SCRIPT_INHERITED && script != HB_SCRIPT_UNKNOWN;
    if (depth == 0 && hasDirection) return hb_script_get_horizontal_direction(script) == HB_DIRECTION_RTL;
  }
  return otherwise;
}

/// Line ends become spaces.
void joinLines(std::string& text) {
  std::string joined;
  joined.reserve(text.size());
  const std::string_view view = text;
  for (std::size_t i = 0; i < view.size();) {
    const std::string_view rest = view.substr(i);
    std::size_t length = 0;
    for (std::string_view lineEnd : {"\r\n", "\n", "\r", "\v", "\f", "\u0085", "\u2028", "\u2029"})
      if (length == 0 && rest.starts_with(lineEnd)) length = lineEnd.size();
    joined += length > 0 ? ' ' : view[i];
    i += std::max<std::size_t>(length, 1);
  }
  text = std::move(joined);
}

bool isVowel(gunichar letter) {
  gunichar base = letter;
  g_unichar_fully_decompose(letter, FALSE, &base, 1);
  constexpr std::u32string_view kVowels = U"aeiouyæœøаеёиіоуыэюяєαεηιουω";
  return kVowels.find(static_cast<char32_t>(g_unichar_tolower(base))) != std::u32string_view::npos;
}

/// Puts soft hyphens into words that are too wide for a line, where Pango would leave a letter or two of them for the
/// next one ("Retraso-s"): before a syllable of three letters or more. Whether there are such words.
bool hyphenate(PangoLayout* layout, std::string& text) {
  constexpr std::ptrdiff_t kFewest = 3, kMost = 6;
  int count = 0;
  const PangoLogAttr* const attributes = pango_layout_get_log_attrs_readonly(layout, &count);
  std::vector<std::size_t> places;
  for (int i = 0; i + 1 < pango_layout_get_line_count(layout); ++i) {
    const PangoLayoutLine* const line = pango_layout_get_line_readonly(layout, i);
    const char* const rest = text.c_str() + line->start_index + line->length;
    const glong offset = g_utf8_pointer_to_offset(text.c_str(), rest);
    if (offset + 1 >= count || attributes[offset].is_line_break) continue;
    glong end = offset;
    while (end + 1 < count && !attributes[end].is_word_end) ++end;
    if (end - offset >= kFewest) continue;
    // From the end of the word, whose letters are of a script that has hyphens.
    const char* at = g_utf8_offset_to_pointer(text.c_str(), end);
    std::size_t place = 0;
    bool isBeforeVowel = false, isFound = false;
    for (std::ptrdiff_t letters = 1; letters <= kMost && at > text.c_str() && !isFound; ++letters) {
      at = g_utf8_prev_char(at);
      const gunichar letter = g_utf8_get_char(at);
      const GUnicodeScript script = g_unichar_get_script(letter);
      if (script != G_UNICODE_SCRIPT_LATIN && script != G_UNICODE_SCRIPT_CYRILLIC && script != G_UNICODE_SCRIPT_GREEK)
        break;
      isFound = letters >= kFewest && isBeforeVowel && !isVowel(letter);
      if (letters == kFewest || isFound) place = static_cast<std::size_t>(at - text.c_str());
      isBeforeVowel = isVowel(letter);
    }
    if (place > static_cast<std::size_t>(line->start_index)) places.push_back(place);
  }
  for (auto place = places.rbegin(); place != places.rend(); ++place) text.insert(*place, "\u00AD");
  return !places.empty();
}

/// Digits belong to no script. The user's language would give "17" another font than "F1", and shields with them.
void drawAsLatinIfASCII(PangoLayout* layout, const std::string& text) {
  if (!std::all_of(text.begin(), text.end(), [](char byte) { return g_ascii_isprint(byte); })) return;
  const std::unique_ptr<PangoAttrList, decltype(&pango_attr_list_unref)> attributes(pango_attr_list_new(),
                                                                                    pango_attr_list_unref);
  pango_attr_list_insert(attributes.get(), pango_attr_language_new(pango_language_from_string("en")));
  pango_layout_set_attributes(layout, attributes.get());
}

}  // namespace

void PangoTextSystem::lookForFonts() { pango_cairo_font_map_get_default(); }

PangoContext* PangoTextSystem::context(bool rightToLeft) {
  GObjectHandle<PangoContext>& context = _contexts[rightToLeft];
  if (context) return context.get();
  context.reset(pango_font_map_create_context(pango_cairo_font_map_get_default()));
  pango_context_set_base_dir(context.get(), rightToLeft ? PANGO_DIRECTION_RTL : PANGO_DIRECTION_LTR);
  pango_context_set_language(context.get(), pango_language_from_string(_language.c_str()));
  pango_context_set_round_glyph_positions(context.get(), FALSE);
  const std::unique_ptr<cairo_font_options_t, FontOptionsDeleter> options(cairo_font_options_create());
  cairo_font_options_set_antialias(options.get(), CAIRO_ANTIALIAS_GRAY);
  cairo_font_options_set_hint_style(options.get(), CAIRO_HINT_STYLE_NONE);
  cairo_font_options_set_hint_metrics(options.get(), CAIRO_HINT_METRICS_OFF);
  pango_cairo_context_set_font_options(context.get(), options.get());
  return context.get();
}

FontMetrics PangoTextSystem::metrics(const FontDescriptor& font) {
  const double size = scaleOf(font) * kLayoutSize;
  std::optional<FontMetrics>& unit = _unitMetrics[font.bold];
  if (!unit) {
    const GObjectHandle<PangoFont> face(pango_context_load_font(context(false), describe(font).get()));
    if (face) unit = unitMetrics(face.get());
    if (!unit) {
      logMissingCharacters();
      unit = FontMetrics{0.8, 0.2, 0.7};
    }
  }
  return {unit->ascent * size, unit->descent * size, unit->capHeight * size};
}

TextLayoutRef PangoTextSystem::layOut(const std::string& text, const FontDescriptor& font, double maxWidth,
                                      std::size_t maxLines, bool rightToLeft) {
  const double scale = scaleOf(font);
  std::string shown = valid(text);
  const bool wasCut = cutToMaximum(shown);
  if (maxLines > 0) joinLines(shown);
  rightToLeft = runsRightToLeft(shown, rightToLeft);
  GObjectHandle<PangoLayout> layout(pango_layout_new(context(rightToLeft)));
  pango_layout_set_font_description(layout.get(), describe(font).get());
  pango_layout_set_auto_dir(layout.get(), FALSE);
  pango_layout_set_text(layout.get(), shown.data(), static_cast<int>(shown.size()));
  drawAsLatinIfASCII(layout.get(), shown);
  if (!(maxWidth > 0)) {
    pango_layout_set_width(layout.get(), 0);
    pango_layout_set_wrap(layout.get(), PANGO_WRAP_WORD);
  } else if (const double width = maxWidth / scale; width < kUnlimitedWidth) {
    pango_layout_set_width(layout.get(), static_cast<int>(std::lround(width * PANGO_SCALE)));
    pango_layout_set_wrap(layout.get(), PANGO_WRAP_WORD_CHAR);
  }
  if (maxLines > 0) {
    pango_layout_set_ellipsize(layout.get(), PANGO_ELLIPSIZE_END);
    pango_layout_set_height(layout.get(), -static_cast<int>(std::min<std::size_t>(maxLines, 1'000'000)));
  }
  if (hyphenate(layout.get(), shown)) pango_layout_set_text(layout.get(), shown.data(), static_cast<int>(shown.size()));
  if (pango_layout_get_unknown_glyphs_count(layout.get()) > 0) logMissingCharacters();
  return std::make_shared<const PangoTextLayout>(std::move(layout), scale, rightToLeft, wasCut);
}

void PangoTextSystem::logMissingCharacters() {
  if (_loggedMissingCharacters) return;
  _loggedMissingCharacters = true;
  writeLog(kTextLogFacility, LogLevel::error,
           "No font has some of the characters to show; boxes stand for them. Install fonts for them, such as the "
           "packages fonts-noto-core and fonts-noto-cjk.");
}

}  // namespace nimbo
