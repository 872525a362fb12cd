#include "host/BarFormats.h"

#include <nlohmann/json.hpp>

#include "host/TerminalText.h"

namespace nimbo {

using nlohmann::json;

namespace {

/// `text` for a bar that may take some of it for an order: polybar's "%{", tmux's "#{", and what genmon and Pango find
/// between angle brackets.
std::string textWithoutOrders(const std::string& text) {
  const std::string printable = printableText(text);
  std::string result;
  for (std::size_t i = 0; i < printable.size(); ++i) {
    const char c = printable[i], next = i + 1 < printable.size() ? printable[i + 1] : ' ';
    const bool isHarmless = next == ' ' || (next >= '0' && next <= '9');
    if (c == '<' || c == '>')
      result += c == '<' ? "‹" : "›";
    else
      result += c == '\n' ? ' ' : c;
    if ((c == '%' && next == '{') || (c == '#' && !isHarmless)) result += ' ';
  }
  return result;
}

std::string plainLine(const BarContent& content) { return textWithoutOrders(content.text); }

std::string markupOf(const BarContent::Detail& detail) {
  switch (detail.style) {
    case BarContent::Detail::Style::title:
      return "<b>" + markupText(detail.text) + "</b>";
    case BarContent::Detail::Style::remark:
      return "<i>" + markupText(detail.text) + "</i>";
    case BarContent::Detail::Style::text:
      break;
  }
  return markupText(detail.text);
}

std::string waybarLine(const BarContent& content) {
  std::string tooltip;
  for (const BarContent::Detail& detail : content.details) tooltip += (tooltip.empty() ? "" : "\n") + markupOf(detail);
  json classes{content.state};
  if (content.hasGoneLines && content.state != "gone") classes.push_back("gone");
  if (content.isNew) classes.push_back("new");
  if (content.isStale) classes.push_back("stale");
  json line{{"text", markupText(content.text)}, {"alt", content.state}, {"class", classes}, {"tooltip", tooltip}};
  if (content.percentage) line["percentage"] = *content.percentage;
  return printableJSON(line.dump());
}

std::string i3barLine(const BarContent& content) {
  json block{{"full_text", printableText(content.text)},
             {"short_text", content.isNew ? "● " + content.sign : content.sign},
             {"name", kBarBlockName},
             {"instance", "favorites"},
             {"urgent", content.isNew},
             {"markup", "none"}};
  if (content.isStale)
    block["color"] = "#9a9a9a";
  else if (content.state == "error")
    block["color"] = "#ff6b6b";
  else if (content.state == "advisories" || content.hasGoneLines)
    block["color"] = "#ffb000";
  return "," + printableJSON(json::array({block}).dump());
}

// Bars stop who writes to them while they are hidden, by the signal that the header names: none, since the desktop is
// told of incidents all the same.
constexpr BarFormat kFormats[] = {{.name = "waybar", .write = waybarLine},
                                  {.name = "i3bar",
                                   .write = i3barLine,
                                   .beginning = "{\"version\":1,\"click_events\":true,\"stop_signal\":0}\n[[]\n",
                                   .end = "]\n",
                                   .takesClicks = true},
                                  {.name = "line", .write = plainLine}};

}  // namespace

const BarFormat* barFormatNamed(std::string_view name) {
  for (const BarFormat& format : kFormats)
    if (format.name == name) return &format;
  return nullptr;
}

}  // namespace nimbo
