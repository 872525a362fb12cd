#include "desktop/gtfs/text/PlainText.h"

#include <algorithm>
#include <array>
#include <optional>

#include "desktop/gtfs/text/Html.h"
#include "desktop/gtfs/text/Utf8.h"
#include "desktop/strings/GraphemeClusters.h"
#include "desktop/strings/Isolation.h"

namespace nimbo {

namespace {

bool isLineEnd(char32_t c) { return c == '\n' || c == '\r' || c == 0x85 || c == 0x2028 || c == 0x2029; }

bool isJoiner(char32_t c) { return c == 0x200C || c == 0x200D; }

bool isDirectionMark(char32_t c) { return c == 0x200E || c == 0x200F || c == 0x061C; }

/// Controls and characters that only ever confuse a line of text.
bool isUnwanted(char32_t c) {
  return c < 0x20 || (c >= 0x7F && c <= 0x9F) || c == 0xAD || c == 0x180E || c == 0x200B ||
         (c >= 0x202A && c <= 0x202E) || (c >= 0x2060 && c <= 0x206F) || c == 0xFEFF || (c >= 0xFFF9 && c <= 0xFFFC) ||
         (c & 0xFFFE) == 0xFFFE;
}

/// Whether an ASCII character means nothing but itself: no space, control or markup.
constexpr bool isPlain(char c) { return c > 0x20 && c < 0x7F && c != '<' && c != '&'; }

constexpr auto kPlain = [] {
  std::array<bool, 256> plain{};
  for (int c = 0; c < 0x7F; ++c) plain[static_cast<std::size_t>(c)] = isPlain(static_cast<char>(c));
  return plain;
}();

/// The bytes at the beginning of a text that begins with a plain character that are plain, or a space between two such.
std::size_t lengthOfPlain(std::string_view text) {
  const auto isPlainAt = [text](std::size_t i) {
    return i < text.size() && kPlain[static_cast<unsigned char>(text[i])];
  };
  std::size_t length = 1;
  for (;;) {
    while (isPlainAt(length)) ++length;
    if (length == text.size() || text[length] != ' ' || !isPlainAt(length + 1)) return length;
    length += 2;
  }
}

/// Takes characters and line ends; writes the folded text.
class FoldingWriter {
 public:
  /// For a text of so many bytes.
  FoldingWriter(std::size_t limit, std::size_t size) : _limit(limit) { _text.reserve(std::min(limit, size)); }

  void write(char32_t c) {
    if (isLineEnd(c)) {
      lineEnd();
    } else if (isWhiteSpace(c)) {
      _spacePending = true;
      _joinerPending = 0;
    } else if (isJoiner(c)) {
      _joinerPending = c;
    } else if (!isUnwanted(c)) {
      append(c);
    }
  }
  /// Characters that are plain, and single spaces between them; at least one.
  void write(std::string_view plain) {
    append(static_cast<unsigned char>(plain.front()));
    _count += plain.size() - 1;
    _text.append(plain.substr(1));
    _previous = static_cast<unsigned char>(plain.back());
  }
  void lineEnd() { ++_lineEndsPending, _joinerPending = 0; }
  void block() { _lineEndsPending = std::max(_lineEndsPending, 1), _joinerPending = 0; }
  void space() { _spacePending = true; }
  /// Whether more was written than there is room for.
  bool isFull() const { return _count > _limit; }

  std::string finish() {
    if (isFull()) {
      _text.resize(clusterBoundary(_text, firstCharacters(_text, _limit - 1).size()));
      _text += "…";
    }
    if (!_hasDirectionMark || hasRightToLeftLetters(_text)) {
      _text.shrink_to_fit();
      return std::move(_text);
    }
    std::string result;
    for (std::size_t position = 0; position < _text.size();)
      if (const char32_t c = takeCharacter(_text, position); !isDirectionMark(c)) appendCharacter(result, c);
    return result;
  }

 private:
  void append(char32_t c) {
    const bool isMark = isDirectionMark(c);
    if (isMark && _text.empty()) return;  // a mark alone is no text
    _hasDirectionMark = _hasDirectionMark || isMark;
    if (isMark) {
      if (_lineEndsPending == 0 && !_spacePending) put(c);
      return;
    }
    if (!_text.empty() && _lineEndsPending > 0)
      for (int i = 0; i < std::min(_lineEndsPending, 2); ++i) put('\n');
    else if (!_text.empty() && _spacePending)
      put(' ');
    else if (_joinerPending && _previous >= 0x80 && c >= 0x80)
      put(_joinerPending);
    put(c);
    _previous = c;
    _lineEndsPending = 0;
    _spacePending = false;
    _joinerPending = 0;
  }

  void put(char32_t c) {
    ++_count;
    appendCharacter(_text, c);
  }

  std::size_t _limit;
  std::string _text;
  std::size_t _count = 0;  // of the text's characters
  char32_t _previous = 0;
  char32_t _joinerPending = 0;
  int _lineEndsPending = 0;
  bool _spacePending = false;
  bool _hasDirectionMark = false;
};

/// Whether line ends in the text are mere spaces because markup makes the lines.
bool hasLinesOfMarkup(std::string_view text, const HtmlTagFinder& tags) {
  for (std::size_t i = text.find('<'); i != std::string_view::npos; i = text.find('<', i + 1)) {
    const auto tag = tags.tagAt(i);
    if (tag && (tag->effect == HtmlTagEffect::block || tag->effect == HtmlTagEffect::lineBreak)) return true;
    if (tag) i += tag->length - 1;
  }
  return false;
}

}  // namespace

std::string plainText(std::string_view text, std::size_t limit) {
  const HtmlTagFinder tags(text);
  std::optional<bool> lineEndsAreSpaces;  // found out for texts that have any
  FoldingWriter writer(limit, text.size());
  for (std::size_t position = 0; position < text.size() && !writer.isFull();) {
    const std::string_view rest = text.substr(position);
    if (isPlain(rest.front())) {  // most of any text
      const std::string_view run = rest.substr(0, lengthOfPlain(rest.substr(0, limit)));
      writer.write(run);
      position += run.size();
      continue;
    }
    if (rest.front() == '<') {
      if (const auto tag = tags.tagAt(position)) {
        position += tag->length;
        switch (tag->effect) {
          case HtmlTagEffect::none:
            break;
          case HtmlTagEffect::space:
            writer.space();
            break;
          case HtmlTagEffect::block:
            writer.block();
            break;
          case HtmlTagEffect::lineBreak:
            writer.lineEnd();
            break;
        }
        continue;
      }
    } else if (rest.front() == '&') {
      if (const auto entity = htmlEntityAt(rest)) {
        position += entity->length;
        writer.write(entity->character);
        if (entity->second) writer.write(entity->second);
        continue;
      }
    } else if (rest.starts_with("\r\n")) {
      ++position;
    }
    char32_t character = takeCharacter(text, position);
    if (isLineEnd(character)) {
      if (!lineEndsAreSpaces) lineEndsAreSpaces = hasLinesOfMarkup(text, tags);
      if (*lineEndsAreSpaces) character = ' ';
    }
    writer.write(character);
  }
  return writer.finish();
}

}  // namespace nimbo
