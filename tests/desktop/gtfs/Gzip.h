#pragma once

#include <zlib.h>

#include <string>

#include "desktop/gtfs/net/FileReading.h"
#include "support/TemporaryFolder.h"

namespace nimbo {

/// The text packed as a server packs it.
inline std::string gzip(const std::string& text) {
  const TemporaryFolder folder;
  const auto path = folder.path() / "packed.gz";
  const gzFile file = gzopen(path.c_str(), "wb9");
  gzwrite(file, text.data(), static_cast<unsigned>(text.size()));
  gzclose(file);
  return *readFile(path, 1 << 20);
}

}  // namespace nimbo
