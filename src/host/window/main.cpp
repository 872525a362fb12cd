// nimbo-transit-desktop: the widget in a window, and the places that its rows open into.

#include <gtk/gtk.h>

#include <CLI/CLI.hpp>
#include <cstdio>
#include <cstdlib>

#include "desktop/system/SmallMemory.h"
#include "desktop/system/StandardDescriptors.h"
#include "host/window/WindowApplication.h"
#include "platform/foundation/Version.h"

namespace {

/// The window is small and seldom changes: it is drawn without a graphics driver, which would take more memory than
/// all else together. Whoever names another way gets it.
void drawWithoutDriver() {
  setenv("GSK_RENDERER", "cairo", 0);
  setenv("GDK_DEBUG", "gl-disable", 0);
}

}  // namespace

int main(int argc, char** argv) {
  nimbo::keepHeapSmall();
  nimbo::prepareStandardDescriptors();
  CLI::App app{"How your transit lines run, in a window."};
  std::optional<std::filesystem::path> config, state;
  std::vector<std::string> urls;
  app.add_option("--config", config, "Folder of feeds.json (default: $XDG_CONFIG_HOME/nimbo-transit)");
  app.add_option("--state", state, "Folder of favorites and last rows (default: $XDG_STATE_HOME/nimbo-transit)");
  app.add_option("URL", urls, "What to show, such as nimbo://?favorites=2&t=r");
  app.set_version_flag("--version", nimbo::kVersion);
  std::string serviceOption = "--gapplication-service";  // GLib's
  bool isService = false;
  app.add_flag(serviceOption, isService)->group("");
  CLI11_PARSE(app, argc, argv);

  drawWithoutDriver();
  if (!gtk_init_check()) {
    std::fprintf(
        stderr,
        "nimbo-transit-desktop: there is no display to open a window on. Set DISPLAY or WAYLAND_DISPLAY, or use "
        "nimbo-transit in the terminal.\n");
    return nimbo::kExitFailure;
  }
  std::vector<std::string> folders;
  if (config) folders.insert(folders.end(), {"--config", std::filesystem::absolute(*config)});
  if (state) folders.insert(folders.end(), {"--state", std::filesystem::absolute(*state)});
  try {
    nimbo::GLibRunLoop runLoop;
    const nimbo::CommandContext context{runLoop, nimbo::Paths::resolve(config, state), std::move(folders)};
    std::vector<char*> arguments{argv[0]};
    if (isService) arguments.push_back(serviceOption.data());
    for (std::string& url : urls) arguments.push_back(url.data());
    return nimbo::WindowApplication::create(context)->run(static_cast<int>(arguments.size()), arguments.data());
  } catch (const std::exception& failure) {
    std::fprintf(stderr, "nimbo-transit-desktop: %s\n", failure.what());
    return nimbo::kExitFailure;
  }
}
