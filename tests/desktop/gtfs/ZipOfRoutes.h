#pragma once

#include <zip.h>

#include <string>

#include "desktop/gtfs/net/FileReading.h"
#include "support/TemporaryFolder.h"

namespace nimbo {

/// A zip archive of a routes.txt.
inline std::string zipOfRoutes(const std::string& routes) {
  const TemporaryFolder folder;
  const auto path = folder.path() / "made.zip";
  zip_t* archive = zip_open(path.c_str(), ZIP_CREATE, nullptr);
  zip_file_add(archive, "routes.txt", zip_source_buffer(archive, routes.data(), routes.size(), 0), 0);
  zip_close(archive);
  return *readFile(path, 1 << 20);
}

}  // namespace nimbo
