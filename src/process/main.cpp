// nimbo-transit-widget: the widget process. A host drives it over standard input and output (docs/protocol.md).

#include <fcntl.h>
#include <unistd.h>

#include <CLI/CLI.hpp>
#include <csignal>
#include <cstdio>

#include "desktop/drawing/DrawingPart.h"
#include "desktop/system/SmallMemory.h"
#include "platform/foundation/Version.h"
#include "process/Sandbox.h"
#include "process/WidgetProcess.h"

namespace {

/// Keeps the protocol's output to the protocol: whatever else prints to standard output goes to standard error.
int takeStandardOutput() {
  const int output = fcntl(STDOUT_FILENO, F_DUPFD_CLOEXEC, STDERR_FILENO + 1);
  if (output >= 0) dup2(STDERR_FILENO, STDOUT_FILENO);
  return output;
}

}  // namespace

int main(int argc, char** argv) {
  nimbo::keepHeapSmall();
  CLI::App app{"The transit widget, driven over JSON-RPC 2.0 on standard input and output, one message a line."};
  std::optional<std::filesystem::path> config, state;
  std::string virtualTime;
  app.add_option("--config", config, "Folder of feeds.json (default: $XDG_CONFIG_HOME/nimbo-transit)");
  app.add_option("--state", state, "Folder of what the widget keeps (default: $XDG_STATE_HOME/nimbo-transit)");
  app.add_option("--virtual-time", virtualTime, "ISO date at which time stands still; \"advanceTime\" moves it");
  app.set_version_flag("--version", nimbo::kVersion);
  CLI11_PARSE(app, argc, argv);

  nimbo::WidgetProcess::Options options{nimbo::Paths::resolve(config, state), std::nullopt};
  if (!virtualTime.empty()) {
    options.virtualTime = nimbo::dateFromISOText(virtualTime);
    if (!options.virtualTime) {
      std::fprintf(stderr, "nimbo-transit-widget: --virtual-time: \"%s\" is no ISO date such as 2026-01-05T12:00:00Z\n",
                   virtualTime.c_str());
      return 2;
    }
  }

  std::signal(SIGPIPE, SIG_IGN);
  if (const nimbo::ErrorRef refused = nimbo::giveUpPrivileges())
    std::fprintf(stderr, "nimbo-transit-widget: %s\n", refused->reason().c_str());
  const int output = takeStandardOutput();
  if (output < 0) {
    std::perror("nimbo-transit-widget: standard output");
    return 1;
  }
  try {
    nimbo::drawingPart().lookForFonts();
    return nimbo::WidgetProcess(std::move(options), STDIN_FILENO, output).run();
  } catch (const std::exception& exception) {
    std::fprintf(stderr, "nimbo-transit-widget: %s\n", exception.what());
    return 1;
  }
}
