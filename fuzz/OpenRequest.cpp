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
  } else {
    require(!std::holds_alternative<ShowLine>(*request) && !std::holds_alternative<ShowIncidents>(*request),
            "what others hand over goes through the widget process");
  }
  return 0;
}

}  // namespace nimbo
