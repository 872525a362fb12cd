// An address that any program hands to the window.

#include "host/window/OpenRequest.h"

#include "Fuzz.h"
#include "host/HostPlatform.h"
#include "support/TemporaryFolder.h"

namespace nimbo {

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  static const TemporaryFolder folder;
  static GLibRunLoop runLoop;
  static HostPlatform platform({runLoop, Paths::resolve(folder.path(), folder.path()), {}}, "en");
  const auto request = openRequestOfURL(textOf(data, size));
  if (!request) {
    require(!request.error()->reason().empty(), "what cannot be opened has a reason");
  } else if (const auto* line = std::get_if<ShowLine>(&*request)) {
    require(line->line != nullptr, "a line to be shown is there");
  }
  return 0;
}

}  // namespace nimbo
