#pragma once

#include <glib.h>

#include <string_view>

namespace nimbo {

/// Whether a text may stand in CBOR: valid UTF-8, zero characters included, which GLib does not take for text.
inline bool isUTF8(std::string_view text) {
  for (;;) {
    const std::string_view part = text.substr(0, text.find('\0'));
    if (!g_utf8_validate_len(part.data(), part.size(), nullptr)) return false;
    if (part.size() == text.size()) return true;
    text.remove_prefix(part.size() + 1);
  }
}

}  // namespace nimbo
