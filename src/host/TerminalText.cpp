#include "host/TerminalText.h"

#include <glib.h>

#include <algorithm>
#include <cstdio>
#include <iostream>
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

template <class Visit>
void forEachValidCharacter(std::string_view text, Visit visit) {
  const std::unique_ptr<char, decltype(&g_free)> valid(g_utf8_make_valid(text.data(), static_cast<gssize>(text.size())),
                                                       &g_free);
  forEachCharacter(valid.get(), visit);
}

bool isControl(gunichar c) { return c != '\n' && g_unichar_iscntrl(c); }

/// Makes what follows run another way whatever it is.
bool isOverride(gunichar c) { return c >= 0x202A && c <= 0x202E; }

bool isDirection(gunichar c) {
  return isOverride(c) || (c >= 0x2066 && c <= 0x2069) || c == 0x200E || c == 0x200F || c == 0x061C;
}

}  // namespace

std::string printableText(std::string_view text) {
  std::string result;
  forEachValidCharacter(text, [&](gunichar c, std::string_view bytes) {
    if (isDirection(c)) return;
    if (isControl(c))
      result += ' ';
    else
      result += bytes;
  });
  return result;
}

std::string markupText(std::string_view text) {
  std::string result;
  forEachValidCharacter(text, [&](gunichar c, std::string_view bytes) {
    if (isOverride(c)) return;
    if (isControl(c))
      result += ' ';
    else if (c == '&')
      result += "&amp;";
    else if (c == '<')
      result += "&lt;";
    else if (c == '>')
      result += "&gt;";
    else if (c == '"')
      result += "&quot;";
    else if (c == '\'')
      result += "&apos;";
    else
      result += bytes;
  });
  return result;
}

std::string printableJSON(std::string_view json) {
  std::string result;
  forEachValidCharacter(json, [&](gunichar c, std::string_view bytes) {
    if (isControl(c) || isDirection(c)) {
      char escaped[7];
      std::snprintf(escaped, sizeof escaped, "\\u%04x", c);
      result += escaped;
    } else {
      result += bytes;
    }
  });
  return result;
}

std::string counted(std::size_t count, const std::string& noun, const std::string& plural) {
  return std::to_string(count) + " " + (count == 1 ? noun : plural.empty() ? noun + "s" : plural);
}

void printMessage(const std::string& message) {
  std::cout << std::flush;
  std::cerr << "nimbo-transit: " << printableText(message) << "\n";
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

void printTable(const std::vector<std::vector<std::string>>& rows) {
  std::vector<int> widths;
  for (const auto& row : rows) {
    widths.resize(row.size());
    for (std::size_t i = 0; i < row.size(); ++i) widths[i] = std::max(widths[i], terminalWidth(row[i]));
  }
  for (const auto& row : rows) {
    std::string text;
    for (std::size_t i = 0; i < row.size(); ++i)
      if (widths[i] > 0)
        text += row[i] + std::string(static_cast<std::size_t>(widths[i] - terminalWidth(row[i]) + 2), ' ');
    std::cout << text.substr(0, text.find_last_not_of(' ') + 1) << "\n";
  }
}

std::string shortenedText(std::string_view text, int columns) {
  const std::size_t room = 8 * static_cast<std::size_t>(columns);  // marks have no width, and may be any number
  std::string result;
  std::size_t end = 0;  // of what stands before an ellipsis
  int width = 0;
  bool isCut = false;
  forEachValidCharacter(text, [&](gunichar c, std::string_view bytes) {
    width += widthOfCharacter(c);
    isCut = isCut || width > columns || result.size() + bytes.size() > room;
    if (isCut) return;
    result += c == '\n' ? " " : bytes;
    if (width < columns) end = result.size();
  });
  return isCut ? result.substr(0, end) + "…" : result;
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
