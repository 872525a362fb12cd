#pragma once

#include <cstddef>
#include <cstdint>
#include <string_view>

namespace nimbo {

/// Tells one state of a document from another, and damage, not malice. Source: XXH3 of 64 bits,
/// https://github.com/Cyan4973/xxHash/blob/dev/doc/xxhash_spec.md
std::uint64_t contentHash(std::string_view bytes);

/// For tables by text. By the standard's own hash, which counts as slow, those of up to 20 texts compare each.
struct TextHash {
  std::size_t operator()(std::string_view text) const { return contentHash(text); }
};

}  // namespace nimbo
