#include "host/TerminalText.h"

#include <glib.h>

#include <algorithm>
#include <memory>
#include <utility>

namespace nimbo {

namespace {

int widthOfCharacter(gunichar c) {
  if (g_unichar_iszerowidth(c)) return 0;
  return g_unichar_iswide(c) ? 2 : 1;
}

/// Calls `visit(character, its bytes)` for each character of valid UTF-8.
template <class Visit>
void forEachCharacter(std::string_view text, Visit visit) {
  for (const char* at = text.data(); at < text.data() + text.size();) {
    const char* next = g_utf8_next_char(at);
    visit(g_utf8_get_char(at), std::string_view(at, static_cast<std::size_t>(next - at)));
    at = next;
  }
}

}  // namespace

std::string printableText(std::string_view text) {
  const std::unique_ptr<char, decltype(&g_free)> valid(g_utf8_make_valid(text.data(), static_cast<gssize>(text.size())),
                                                       &g_free);
  std::string result;
  forEachCharacter(valid.get(), [&](gunichar c, std::string_view bytes) {
    if (c == '\n' || !g_unichar_iscntrl(c))
      result += bytes;
    else
      result += ' ';
  });
  return result;
}

int terminalWidth(std::string_view text) {
  int width = 0;
  bool escape = false;
  forEachCharacter(text, [&](gunichar c, std::string_view) {
    if (escape)
      escape = c != 'm';
    else if (c == 0x1b)
      escape = true;
    else
      width += widthOfCharacter(c);
  });
  return width;
}

std::vector<std::string> foldedText(std::string_view text, int columns) {
  columns = std::max(columns, 2);
  std::vector<std::string> lines;
  std::string line, word;
  const auto endLine = [&] {
    if (!line.empty()) lines.push_back(std::exchange(line, {}));
  };
  const auto endWord = [&] {
    if (word.empty()) return;
    if (!line.empty() && terminalWidth(line) + 1 + terminalWidth(word) > columns) endLine();
    line += (line.empty() ? "" : " ") + std::exchange(word, {});
  };
  forEachCharacter(text, [&](gunichar c, std::string_view bytes) {
    if (c == ' ' || c == '\n') {
      endWord();
      if (c == '\n') endLine();
      return;
    }
    if (terminalWidth(word) + widthOfCharacter(c) > columns) {
      endWord();
      endLine();
    }
    word += bytes;
  });
  endWord();
  endLine();
  return lines;
}

}  // namespace nimbo
