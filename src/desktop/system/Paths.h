#pragma once

#include <filesystem>
#include <optional>

namespace nimbo {

/// Where the program keeps its files. Source: XDG Base Directory Specification, version 0.8.
struct Paths {
  std::filesystem::path config;  ///< what the user sets up: feeds.json
  std::filesystem::path state;   ///< what the program keeps for him: state.sqlite
  std::filesystem::path cache;   ///< what can be made again: feeds as parsed

  /// The folders given, else "nimbo-transit" below the XDG folders. A state folder that is given holds the cache too.
  /// Makes nothing; a relative XDG variable counts as unset.
  static Paths resolve(const std::optional<std::filesystem::path>& config,
                       const std::optional<std::filesystem::path>& state);

  /// The folder of what the user has in place of data that came with the program, below $XDG_DATA_HOME.
  static std::filesystem::path data();
};

}  // namespace nimbo
