#pragma once

#include <cstdint>
#include <string_view>

namespace nimbo {

/// Tells one state of a document from another, and damage, not malice. Source: XXH3 of 64 bits,
/// https://github.com/Cyan4973/xxHash/blob/dev/doc/xxhash_spec.md
std::uint64_t contentHash(std::string_view bytes);

}  // namespace nimbo
