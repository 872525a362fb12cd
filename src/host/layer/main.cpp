// nimbo-transit-layer: the widget on a Wayland desktop.

#include <CLI/CLI.hpp>
#include <cstdio>

#include "desktop/system/SmallMemory.h"
#include "desktop/system/StandardDescriptors.h"
#include "host/TerminalText.h"
#include "host/layer/LayerHost.h"
#include "platform/foundation/Version.h"

int main(int argc, char** argv) {
  nimbo::keepHeapSmall();
  nimbo::prepareStandardDescriptors();
  CLI::App app{"How your transit lines run, on the desktop of a Wayland compositor."};
  nimbo::LayerArguments arguments;
  arguments.addTo(app);
  app.set_version_flag("--version", nimbo::kVersion);
  try {
    app.parse(argc, argv);
  } catch (const CLI::ParseError& error) {
    return app.exit(error) == 0 ? nimbo::kExitSuccess : nimbo::kExitUsage;
  }

  const auto tell = [](const std::string& message) {
    std::fprintf(stderr, "nimbo-transit-layer: %s\n", nimbo::printableText(message).c_str());
  };
  std::vector<std::string> folders;
  if (arguments.config) folders.insert(folders.end(), {"--config", std::filesystem::absolute(*arguments.config)});
  if (arguments.state) folders.insert(folders.end(), {"--state", std::filesystem::absolute(*arguments.state)});
  try {
    nimbo::GLibRunLoop runLoop;
    const nimbo::CommandContext context{runLoop, nimbo::Paths::resolve(arguments.config, arguments.state), folders,
                                        tell};
    return nimbo::LayerHost(context, arguments).run();
  } catch (const std::exception& failure) {
    tell(failure.what());
    return nimbo::kExitFailure;
  }
}
