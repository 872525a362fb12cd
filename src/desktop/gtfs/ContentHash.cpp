#include "desktop/gtfs/ContentHash.h"

#define XXH_INLINE_ALL  // no library to load
#include <xxhash.h>

namespace nimbo {

std::uint64_t contentHash(std::string_view bytes) { return XXH3_64bits(bytes.data(), bytes.size()); }

}  // namespace nimbo
