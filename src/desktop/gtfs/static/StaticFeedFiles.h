#pragma once

#include <cstdint>
#include <filesystem>
#include <functional>
#include <memory>
#include <string>
#include <string_view>

#include "platform/foundation/Outcome.h"

namespace nimbo {

/// The files of a GTFS static feed, read piece by piece.
class StaticFeedFiles {
 public:
  /// Takes a piece of a file; false stops the reading.
  using Sink = std::function<bool(std::string_view piece)>;

  virtual ~StaticFeedFiles() = default;

  /// Reads the file of this name ("routes.txt"). False when the feed has none; an error when it cannot be read to its
  /// end or is longer than `limit` bytes.
  virtual Outcome<bool> read(std::string_view name, std::uint64_t limit, const Sink& sink) = 0;

  /// Where the feed is, for messages.
  virtual std::string_view place() const = 0;
};

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
