#include "support/DrawingDoubles.h"

#include <algorithm>
#include <limits>
#include <vector>

namespace nimbo {

namespace {

/// Lengths of the words in characters; every byte that continues a UTF-8 character counts for nothing.
std::vector<std::size_t> wordLengths(const std::string& text) {
  std::vector<std::size_t> lengths{0};
  for (const char c : text) {
    if (c == ' ')
      lengths.push_back(0);
    else if ((static_cast<unsigned char>(c) & 0xc0) != 0x80)
      ++lengths.back();
  }
  return lengths;
}

}  // namespace

ImageRef ShieldRendererDouble::render(const TransitArtwork& artwork, std::int64_t shieldSize, double screenScale,
                                      bool nightMode) {
  const std::int64_t size = std::max<std::int64_t>(shieldSize, 0);
  const double height = 14 + 2 * static_cast<double>(size);
  if (artwork.shieldDataSource()) {
    const std::string text = artwork.shieldDataSource()->shieldText.value_or("");
    const double wide = width ? width(size, text) : std::max(height, height / 2 * static_cast<double>(text.size()));
    return std::make_shared<const ImageDouble>(Size{wide, height}, screenScale, nightMode);
  }
  if (!artwork.iconDataSource()) return nullptr;
  return std::make_shared<const ImageDouble>(Size{height, height}, screenScale, nightMode);
}

TextLayoutRef TextSystemDouble::layOut(const std::string& text, const FontDescriptor& font, double maxWidth,
                                       std::size_t maxLines, bool) {
  const double characters = maxWidth / (font.pointSize / 2) + 1e-9;  // a width of exactly n characters holds n
  constexpr std::size_t kAny = std::numeric_limits<std::size_t>::max();
  const bool oneColumn = !(maxWidth > 0);
  const std::size_t fits =
      oneColumn || characters > 1e9 ? kAny : std::max<std::size_t>(1, static_cast<std::size_t>(characters));

  std::vector<std::size_t> lines{0};
  bool lineIsEmpty = true;
  for (std::size_t word : wordLengths(text)) {
    if (!lineIsEmpty && !oneColumn && lines.back() + 1 + word <= fits) {
      lines.back() += 1 + word;
      continue;
    }
    if (!lineIsEmpty) lines.push_back(0);
    for (; word > fits; word -= fits) {
      lines.back() = fits;
      lines.push_back(0);
    }
    lines.back() = word;
    lineIsEmpty = false;
  }
  const bool truncated = maxLines > 0 && lines.size() > maxLines;
  if (truncated) {
    lines.resize(maxLines);
    lines.back() = std::min(fits, lines.back() + 1);  // the ellipsis
  }
  return std::make_shared<const TextLayoutDouble>(text, font, lines.size(), *std::ranges::max_element(lines),
                                                  truncated);
}

}  // namespace nimbo
