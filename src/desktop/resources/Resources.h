#pragma once

#include <cstddef>
#include <optional>
#include <string_view>

namespace nimbo {

/// A file of resources/ inside the program.
struct EmbeddedResource {
  std::string_view path;
  const char* begin;
  const char* end;
};

// Made by the build (cmake/NimboEmbed.cmake).
extern const EmbeddedResource* const kEmbeddedResourcesBegin;
extern const std::size_t kEmbeddedResourcesCount;

/// The bytes of the resource at `path` ("strings/en.json"); absent when the program holds none of that name. They live
/// as long as the program. Any thread.
std::optional<std::string_view> resourceNamed(std::string_view path);

}  // namespace nimbo
