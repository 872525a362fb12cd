#pragma once

#include <zip.h>

#include <map>
#include <string>

#include "desktop/gtfs/net/FileReading.h"
#include "support/TemporaryFolder.h"

namespace nimbo {

/// A zip archive of these files.
inline std::string zipOf(const std::map<std::string, std::string>& files) {
  const TemporaryFolder folder;
  const auto path = folder.path() / "made.zip";
  zip_t* archive = zip_open(path.c_str(), ZIP_CREATE, nullptr);
  for (const auto& [name, text] : files)
    zip_file_add(archive, name.c_str(), zip_source_buffer(archive, text.data(), text.size(), 0), 0);
  zip_close(archive);
  return *readFile(path, 1 << 20);
}

/// A zip archive of a routes.txt.
inline std::string zipOfRoutes(const std::string& routes) { return zipOf({{"routes.txt", routes}}); }

}  // namespace nimbo
