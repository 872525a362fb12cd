#pragma once

#include <cstdio>
#include <cstdlib>
#include <string_view>

#include "desktop/gtfs/text/Utf8.h"

namespace nimbo {

/// What a target is about: takes one input, and answers 0. Source: https://llvm.org/docs/LibFuzzer.html
extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size);

/// A finding, besides what the sanitizers find.
inline void require(bool holds, const char* what) {
  if (holds) return;
  std::fprintf(stderr, "fuzz: it must hold that %s\n", what);
  std::abort();
}

inline std::string_view textOf(const std::uint8_t* data, std::size_t size) {
  return {reinterpret_cast<const char*>(data), size};
}

/// A text that a publisher wrote, as it is shown: valid UTF-8 without controls, invisible characters and directional
/// embeddings, with no white space at its ends or twice in a row, and no more than one empty line.
inline void requirePlain(std::string_view text) {
  require(validUtf8(text) == text, "a plain text is UTF-8");
  const auto isSpace = [](char c) { return c == ' ' || c == '\n'; };
  require(text.empty() || (!isSpace(text.front()) && !isSpace(text.back())), "a plain text has no blank ends");
  for (const char* twice : {"  ", " \n", "\n ", "\n\n\n"})
    require(text.find(twice) == std::string_view::npos, "white space is folded");
  for (std::size_t position = 0; position < text.size();) {
    const char32_t c = takeCharacter(text, position);
    require((c >= 0x20 || c == '\n') && (c < 0x7F || c > 0x9F), "a plain text has no controls");
    require((c < 0x202A || c > 0x202E) && (c < 0x2066 || c > 0x2069), "a plain text embeds no direction");
    require(c != 0x200B && c != 0xFEFF && c != 0xAD, "a plain text has no invisible characters");
  }
}

}  // namespace nimbo
