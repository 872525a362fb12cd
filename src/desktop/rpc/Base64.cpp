#include "desktop/rpc/Base64.h"

#include <glib.h>

#include <memory>

namespace nimbo {

std::string base64(std::span<const std::uint8_t> bytes) {
  if (bytes.empty()) return {};
  const std::unique_ptr<char, decltype(&g_free)> text(g_base64_encode(bytes.data(), bytes.size()), &g_free);
  return text.get();
}

std::string base64(std::string_view text) {
  return base64(std::span(reinterpret_cast<const std::uint8_t*>(text.data()), text.size()));
}

std::optional<Bytes> bytesFromBase64(std::string_view text) {
  constexpr std::string_view kAlphabet = "ABCDEFGHIJKLMNOPQRSTUVWXYZabcdefghijklmnopqrstuvwxyz0123456789+/";
  const std::size_t digits = text.find_last_not_of('=') == std::string_view::npos ? 0 : text.find_last_not_of('=') + 1;
  // GLib skips what it does not know; a text that holds anything else is refused here.
  if (text.size() % 4 != 0 || text.size() - digits > 2 ||
      text.substr(0, digits).find_first_not_of(kAlphabet) != std::string_view::npos)
    return std::nullopt;
  gsize size = 0;
  const std::unique_ptr<guchar, decltype(&g_free)> bytes(g_base64_decode(std::string(text).c_str(), &size), &g_free);
  return Bytes(bytes.get(), bytes.get() + size);
}

}  // namespace nimbo
