#pragma once

#include <array>
#include <optional>
#include <string>

#include "desktop/raii/CairoHandles.h"
#include "platform/ui/TextSystem.h"

typedef struct _PangoContext PangoContext;

namespace nimbo {

/// Text in the system's sans-serif family, shaped by Pango. Fonts are looked for on the first use, once. Where no font
/// has a character, a box stands for it; the first time is logged.
class PangoTextSystem final : public TextSystem {
 public:
  /// `language` is the user's, as a BCP 47 tag ("ja"): it chooses between the shapes that languages give a character.
  explicit PangoTextSystem(std::string language = "en") : _language(std::move(language)) {}

  /// Begins to look for fonts, on a thread of Pango's: for a program that will show text soon, and has other things to
  /// do until then. Main thread.
  static void lookForFonts();

  /// Throws std::invalid_argument for a point size that is not above 0.
  FontMetrics metrics(const FontDescriptor& font) override;
  /// Text that is limited in lines is one paragraph: its line ends become spaces. Of a text of more than
  /// `kMaximumCharacters` the beginning is laid out. Throws as `metrics` does.
  TextLayoutRef layOut(const std::string& text, const FontDescriptor& font, double maxWidth, std::size_t maxLines,
                       bool rightToLeft) override;

  /// More than any row shows. Pango breaks a single long word in time that grows with its square: a tenth of a second
  /// for this many, two seconds for four times as many.
  static constexpr std::size_t kMaximumCharacters = 1000;

 private:
  PangoContext* context(bool rightToLeft);
  void logMissingCharacters();

  std::string _language;
  // One for each paragraph direction: changing a context lays out anew what was made with it.
  std::array<GObjectHandle<PangoContext>, 2> _contexts;
  std::array<std::optional<FontMetrics>, 2> _unitMetrics;  // at a size of 1 point: regular, bold
  bool _loggedMissingCharacters = false;
};

}  // namespace nimbo
