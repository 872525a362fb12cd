// nimbo-transit-widget: the widget process. A host drives it over standard input and output (docs/protocol.md).

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include <CLI/CLI.hpp>
#include <csignal>
#include <cstdio>
#include <filesystem>
#include <vector>

#include "desktop/drawing/DrawingPart.h"
#include "desktop/system/AtomicFile.h"
#include "desktop/system/LinuxMemoryPressure.h"
#include "desktop/system/SmallMemory.h"
#include "platform/foundation/Version.h"
#include "process/Sandbox.h"
#include "process/WidgetProcess.h"

namespace {

/// Whether a host can speak over the standard descriptors; says which is closed, where that can be heard.
bool hasStandardDescriptors() {
  const auto isMissing = [](int descriptor, int wrongMode) {
    const int mode = fcntl(descriptor, F_GETFL);
    return mode < 0 || (mode & O_ACCMODE) == wrongMode;
  };
  const bool hasInput = !isMissing(STDIN_FILENO, O_WRONLY), hasOutput = !isMissing(STDOUT_FILENO, O_RDONLY);
  if (isMissing(STDERR_FILENO, O_RDONLY)) return false;
  if (!hasInput || !hasOutput)
    std::fprintf(stderr, "nimbo-transit-widget: the standard %s is closed, over which a host speaks\n",
                 hasInput ? "output" : "input");
  return hasInput && hasOutput;
}

/// Whether pictures can be drawn into the descriptor.
bool isMemory(int descriptor) {
  struct stat status {};
  const int mode = fcntl(descriptor, F_GETFL);
  return descriptor > STDERR_FILENO && mode >= 0 && (mode & O_ACCMODE) == O_RDWR && fstat(descriptor, &status) == 0 &&
         S_ISREG(status.st_mode);
}

/// The places that the widget writes to; its folders are made.
std::vector<std::filesystem::path> writablePlaces(const nimbo::Paths& paths) {
  // What cannot be made is told by whoever then cannot write to it.
  for (const auto& folder : {paths.state, paths.cache}) nimbo::makeFolders(folder);
  std::vector<std::filesystem::path> places{paths.state, paths.cache,
                                            nimbo::LinuxMemoryPressure::Files::ofThisProcess().pressure};
#ifdef NIMBO_COVERAGE_FOLDER
  places.emplace_back(NIMBO_COVERAGE_FOLDER);
#endif
  return places;
}

/// Keeps the protocol's output to the protocol: whatever else prints to standard output goes to standard error.
int takeStandardOutput() {
  const int output = fcntl(STDOUT_FILENO, F_DUPFD_CLOEXEC, STDERR_FILENO + 1);
  if (output >= 0) dup2(STDERR_FILENO, STDOUT_FILENO);
  return output;
}

}  // namespace

int main(int argc, char** argv) {
  nimbo::keepHeapSmall();
  if (!hasStandardDescriptors()) return 1;
  CLI::App app{"The transit widget, driven over JSON-RPC 2.0 on standard input and output, one message a line."};
  std::optional<std::filesystem::path> config, state;
  std::string virtualTime;
  app.add_option("--config", config, "Folder of feeds.json (default: $XDG_CONFIG_HOME/nimbo-transit)");
  app.add_option("--state", state, "Folder of what the widget keeps (default: $XDG_STATE_HOME/nimbo-transit)");
  app.add_option("--virtual-time", virtualTime, "ISO date at which time stands still; \"advanceTime\" moves it");
  int pictures = -1;
  app.add_option("--pictures", pictures, "Descriptor of the memory that \"render\" draws into");
  app.set_version_flag("--version", nimbo::kVersion);
  CLI11_PARSE(app, argc, argv);

  nimbo::WidgetProcess::Options options{nimbo::Paths::resolve(config, state), std::nullopt, pictures};
  if (!virtualTime.empty()) {
    options.virtualTime = nimbo::dateFromISOText(virtualTime);
    if (!options.virtualTime) {
      std::fprintf(stderr, "nimbo-transit-widget: --virtual-time: \"%s\" is no ISO date such as 2026-01-05T12:00:00Z\n",
                   virtualTime.c_str());
      return 2;
    }
  }

  if (pictures != -1 && !isMemory(pictures)) {
    std::fprintf(stderr,
                 "nimbo-transit-widget: --pictures: descriptor %d is no file of memory that can be read and written\n",
                 pictures);
    return 2;
  }

  std::signal(SIGPIPE, SIG_IGN);
  std::signal(SIGXFSZ, SIG_IGN);  // a file at its limit is an error of its writer
  nimbo::closeInheritedDescriptors(pictures);
  if (const nimbo::ErrorRef refused = nimbo::giveUpPrivileges(writablePlaces(options.paths)))
    std::fprintf(stderr, "nimbo-transit-widget: %s\n", refused->reason().c_str());
  const int output = takeStandardOutput();
  if (output < 0) {
    std::perror("nimbo-transit-widget: standard output");
    return 1;
  }
  try {
    if (pictures != -1) nimbo::drawingPart().lookForFonts();
    return nimbo::WidgetProcess(std::move(options), STDIN_FILENO, output).run();
  } catch (const std::exception& exception) {
    std::fprintf(stderr, "nimbo-transit-widget: %s\n", exception.what());
    return 1;
  }
}
