#pragma once

#include <memory>
#include <string>

#include "desktop/gtfs/static/StaticFeedFiles.h"
#include "desktop/raii/FileDescriptor.h"
#include "desktop/raii/ZipArchive.h"

namespace nimbo {

/// A static feed as a zip archive, its files at the top or in one folder. Nothing is ever unpacked to a disk, so that
/// the paths in the archive mean nothing.
class ZipFeedFiles final : public StaticFeedFiles {
 public:
  /// Opens the archive in a file opened for reading. `place` names it in messages.
  static Outcome<std::unique_ptr<StaticFeedFiles>> open(const FileDescriptor& file, std::string place);

  Outcome<bool> read(std::string_view name, std::uint64_t limit, const Sink& sink) override;
  std::string_view place() const override { return _place; }

 private:
  ZipFeedFiles(ZipArchive archive, std::string folder, std::string place)
      : _archive(std::move(archive)), _folder(std::move(folder)), _place(std::move(place)) {}

  ZipArchive _archive;
  std::string _folder;  // "" or "name/"
  std::string _place;
};

}  // namespace nimbo
