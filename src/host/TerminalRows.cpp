#include "host/TerminalRows.h"

#include <sys/ioctl.h>
#include <unistd.h>

#include <algorithm>
#include <cmath>
#include <cstdlib>
#include <map>
#include <set>
#include <vector>

#include "host/TerminalText.h"
#include "platform/transit/TransitArtwork.h"
#include "platform/ui/Color.h"

namespace nimbo {

namespace {

constexpr const char* kBold = "1";
constexpr const char* kFaint = "2";

std::string styled(const std::string& text, const std::string& attributes, const TerminalStyle& style) {
  return style.colors && !attributes.empty() && !text.empty() ? "\x1b[" + attributes + "m" + text + "\x1b[0m" : text;
}

std::string textOf(const std::optional<std::string>& text) { return text ? printableText(*text) : std::string(); }

std::string colorCode(const Color& color, int plane) {
  const auto part = [](double value) { return std::to_string(std::lround(value * 255)); };
  return std::to_string(plane) + ";2;" + part(color.red) + ";" + part(color.green) + ";" + part(color.blue);
}

/// A shield as " 12 " on its colour, or as [12]; a symbol by the name of its mode.
std::string shieldText(const protocol::Shield& shield, bool dimmed, const TerminalStyle& style) {
  std::string text = textOf(shield.text);
  if (text.empty()) text = textOf(shield.accessibilityText);
  if (text.empty()) return {};
  if (!style.colors) return "[" + text + "]";
  const auto color = colorFromHexText(textOf(shield.color));
  if (!color || dimmed) return styled("[" + text + "]", dimmed ? kFaint : kBold, style);
  constexpr Color kBlack{0, 0, 0, 1}, kWhite{1, 1, 1, 1};
  const Color& ink = contrastRatio(*color, kWhite) >= contrastRatio(*color, kBlack) ? kWhite : kBlack;
  return styled(" " + text + " ", colorCode(*color, 48) + ";" + colorCode(ink, 38) + ";1", style);
}

/// The four images of the rows as signs.
std::string imageText(const std::string& name) {
  if (name.starts_with("good")) return "✓";
  if (name.starts_with("advisories")) return "⚠";
  return "•";
}

/// Full names of lines by their short ones, as far as they are shown.
using NamesOfShields = std::map<std::string, std::set<std::string>>;

void addName(const protocol::Shield& shield, NamesOfShields& names) {
  if (shield.text) names[*shield.text].insert(shield.accessibilityText.value_or(""));
}

std::vector<protocol::Item> itemsOnScreen(const protocol::Snapshot& snapshot) {
  if (snapshot.expanded) return snapshot.listItem.expandedItems;
  return snapshot.listItem.summaryItem ? std::vector{*snapshot.listItem.summaryItem} : std::vector<protocol::Item>();
}

NamesOfShields namesOfShields(const std::vector<protocol::Item>& items) {
  NamesOfShields names;
  for (const protocol::Item& item : items) {
    if (const auto* summary = std::get_if<protocol::SummaryItem>(&item))
      for (const protocol::Shield& shield : summary->artworks) addName(shield, names);
    else if (const auto& artwork = std::get<protocol::TransitItem>(item).artwork; artwork && artwork->shield)
      addName(*artwork->shield, names);
  }
  return names;
}

/// The shield, with the line's full name in it where another line has the same short one.
protocol::Shield toldApart(protocol::Shield shield, const NamesOfShields& names) {
  const auto found = shield.text ? names.find(*shield.text) : names.end();
  if (found != names.end() && found->second.size() > 1 && shield.accessibilityText)
    shield.text = shield.accessibilityText;
  return shield;
}

std::string artworkText(const protocol::TransitItem& item, const NamesOfShields& names, const TerminalStyle& style) {
  const auto& artwork = item.artwork;
  if (!artwork || item.artworkHidden) return {};
  const bool dimmed = artwork->alpha < 1;
  if (artwork->image) return styled(imageText(textOf(artwork->image)), dimmed ? kFaint : kBold, style);
  return artwork->shield ? shieldText(toldApart(*artwork->shield, names), dimmed, style) : std::string();
}

std::string shieldsText(const std::vector<protocol::Shield>& shields, const NamesOfShields& names,
                        const TerminalStyle& style) {
  std::string text;
  for (const protocol::Shield& shield : shields) {
    const std::string one = shieldText(toldApart(shield, names), false, style);
    if (!one.empty()) text += (text.empty() ? "" : " ") + one;
  }
  return text;
}

constexpr int kIndent = 2;

/// Folded, with a sign at the end of the first line.
std::string titleText(const std::string& title, const std::string& artwork, const TerminalStyle& style) {
  const int room = style.columns - (artwork.empty() ? 0 : terminalWidth(artwork) + 1);
  std::string text;
  for (const std::string& line : foldedText(title, room)) {
    const bool first = text.empty();
    text += styled(line, kBold, style);
    if (first && !artwork.empty())
      text += std::string(static_cast<std::size_t>(room - terminalWidth(line) + 1), ' ') + artwork;
    text += "\n";
  }
  return text;
}

std::string indented(const std::string& text, const TerminalStyle& style) {
  std::string lines;
  for (const std::string& line : foldedText(text, style.columns - kIndent))
    lines += std::string(kIndent, ' ') + line + "\n";
  return lines;
}

/// What rows need to know besides their items.
struct RowContext {
  const TerminalStyle& style;
  const NamesOfShields& names;
  const std::function<std::string(const std::string& title)>& timeOf;
};

std::string textOfItem(const protocol::TransitItem& item, const RowContext& context) {
  const auto& [style, names, timeOf] = context;
  std::string text = titleText(textOf(item.primaryText), artworkText(item, names, style), style);
  text += indented(textOf(item.secondaryText), style);
  return timeOf ? text + indented(timeOf(item.primaryText.value_or("")), style) : text;
}

std::string textOfItem(const protocol::SummaryItem& item, const RowContext& context) {
  const auto& [style, names, timeOf] = context;
  const std::string text = titleText(textOf(item.primaryText), "", style);
  const std::string shields = shieldsText(item.artworks, names, style);
  return shields.empty() ? text : text + std::string(kIndent, ' ') + shields + "\n";
}

}  // namespace

TerminalStyle TerminalStyle::ofStandardOutput() {
  TerminalStyle style;
  const char* noColor = std::getenv("NO_COLOR");
  const char* terminal = std::getenv("TERM");
  style.colors = isatty(STDOUT_FILENO) && !(noColor && *noColor) && terminal && std::string_view(terminal) != "dumb";
  constexpr int kNarrowest = 20;
  winsize size{};
  if (ioctl(STDOUT_FILENO, TIOCGWINSZ, &size) == 0 && size.ws_col > 0)
    style.columns = size.ws_col;
  else if (const char* columns = std::getenv("COLUMNS"); columns && std::atoi(columns) > 0)
    style.columns = std::atoi(columns);
  style.columns = std::max(style.columns, kNarrowest);
  return style;
}

std::string shieldAsText(const protocol::Shield& shield, const TerminalStyle& style) {
  return shieldText(shield, false, style);
}

std::string rowsAsText(const protocol::Snapshot& snapshot, const TerminalStyle& style,
                       const std::function<std::string(const std::string& title)>& timeOf) {
  std::string text;
  const std::vector<protocol::Item> items = itemsOnScreen(snapshot);
  const NamesOfShields names = namesOfShields(items);
  const RowContext context{style, names, timeOf};
  for (const protocol::Item& item : items)
    text += std::visit([&](const auto& shown) { return textOfItem(shown, context); }, item);
  if (!snapshot.goneLines.empty()) {
    text += titleText(goneLinesTitle(snapshot.goneLines), styled("⚠", kBold, style), style);
    for (const std::string& line : snapshot.goneLines) text += indented(printableText(line), style);
  }
  return text;
}

}  // namespace nimbo
