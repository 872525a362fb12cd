#pragma once

#include <filesystem>
#include <optional>
#include <string>

#include "desktop/gtfs/HTTPFetcher.h"
#include "platform/foundation/Date.h"
#include "platform/foundation/Error.h"

namespace nimbo {

/// The last good answer of an alerts feed's server, kept in the cache: for conditional requests, and to stand in for a
/// while when the server fails.
struct KeptAlerts {
  std::string address;
  HTTPValidators validators;
  Date fetchedAt;  ///< when the server last said that this is the present state
  std::string body;

  /// Absent when there is none at `path`, it is damaged, or of another address.
  static std::optional<KeptAlerts> read(const std::filesystem::path& path, const FeedAddress& address);
  /// Replaces what is kept. Null on success.
  ErrorRef write(const std::filesystem::path& path) const;
};

}  // namespace nimbo
