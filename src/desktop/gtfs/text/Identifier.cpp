#include "desktop/gtfs/text/Identifier.h"

#include <algorithm>

#include "desktop/gtfs/text/Utf8.h"

namespace nimbo {

namespace {

constexpr std::string_view kByteOrderMark = "\xEF\xBB\xBF";

std::string_view withoutMarks(std::string_view text) {
  for (;;) {
    text = trimmed(text);
    if (text.starts_with(kByteOrderMark))
      text.remove_prefix(kByteOrderMark.size());
    else if (text.ends_with(kByteOrderMark))
      text.remove_suffix(kByteOrderMark.size());
    else
      return text;
  }
}

}  // namespace

void Identifier::clean(std::string_view published) {
  _text = withoutMarks(published);
  const bool isPlain = std::all_of(_text.begin(), _text.end(), [](unsigned char c) { return c < 0x80; });
  if (isPlain) return;
  _mended = validUtf8(_text);
  _text = _mended;
}

}  // namespace nimbo
