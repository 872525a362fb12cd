#include "desktop/system/Paths.h"

#include <cstdlib>

namespace nimbo {

namespace {

std::filesystem::path xdgFolder(const char* variable, const char* belowHome) {
  const char* value = std::getenv(variable);
  if (value && std::filesystem::path(value).is_absolute()) return std::filesystem::path(value) / "nimbo-transit";
  const char* home = std::getenv("HOME");
  return std::filesystem::path(home && *home ? home : "/") / belowHome / "nimbo-transit";
}

}  // namespace

Paths Paths::resolve(const std::optional<std::filesystem::path>& config,
                     const std::optional<std::filesystem::path>& state) {
  return {config ? *config : xdgFolder("XDG_CONFIG_HOME", ".config"),
          state ? *state : xdgFolder("XDG_STATE_HOME", ".local/state"),
          state ? *state / "cache" : xdgFolder("XDG_CACHE_HOME", ".cache")};
}

std::filesystem::path Paths::data() { return xdgFolder("XDG_DATA_HOME", ".local/share"); }

}  // namespace nimbo
