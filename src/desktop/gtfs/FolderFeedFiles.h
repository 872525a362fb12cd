#pragma once

#include <filesystem>
#include <string>

#include "desktop/gtfs/StaticFeedFiles.h"

namespace nimbo {

/// A static feed as a folder of files.
class FolderFeedFiles final : public StaticFeedFiles {
 public:
  explicit FolderFeedFiles(std::filesystem::path folder) : _folder(std::move(folder)) {}
  Outcome<bool> read(std::string_view name, std::uint64_t limit, const Sink& sink) override;
  std::string_view place() const override { return _folder.native(); }

 private:
  std::filesystem::path _folder;
};

}  // namespace nimbo
