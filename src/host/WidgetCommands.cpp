#include "host/WidgetCommands.h"

#include <cerrno>
#include <cstdio>
#include <cstring>
#include <filesystem>
#include <fstream>
#include <iostream>

#include "host/OnScreenWidget.h"
#include "host/ScriptPlayer.h"
#include "host/TerminalRows.h"
#include "platform/ui/Geometry.h"

namespace nimbo {

namespace {

/// Reads "359x110".
Size sizeOfText(const std::string& text) {
  Size size;
  char after = 0;
  if (std::sscanf(text.c_str(), "%lfx%lf%c", &size.width, &size.height, &after) != 2)
    throw CommandFailure("--size: \"" + text + "\" is no size such as 359x110");
  return size;
}

}  // namespace

int runStatus(const CommandContext& context, const StatusOptions& options) {
  WidgetPresentation presentation;
  presentation.virtualTime = options.now;
  OnScreenWidget widget(context, presentation);
  const std::optional<std::string> failure = widget.update();
  if (options.expanded) widget.expand();
  const nlohmann::json snapshot = widget.snapshot();
  if (options.json)
    std::cout << snapshot.dump(2) << "\n";
  else
    std::cout << rowsAsText(snapshot, TerminalStyle::ofStandardOutput());
  widget.close();
  if (failure) throw CommandFailure(*failure);
  return kExitSuccess;
}

int runRender(const CommandContext& context, const RenderOptions& options) {
  WidgetPresentation presentation;
  if (!options.size.empty()) {
    const Size size = sizeOfText(options.size);
    presentation.width = size.width;
    (options.expanded ? presentation.expandedHeight : presentation.compactHeight) = size.height;
  }
  presentation.scale = options.scale;
  presentation.textSize = options.textSize;
  presentation.appearance = options.dark ? "dark" : "light";
  presentation.locale = options.locale;
  presentation.virtualTime = options.now;
  OnScreenWidget widget(context, presentation);
  const std::optional<std::string> failure = widget.update();
  if (options.expanded) widget.expand();
  // The widget process has a working folder of its own to come.
  widget.render(std::filesystem::absolute(options.output));
  widget.close();
  if (failure) throw CommandFailure(*failure);
  return kExitSuccess;
}

int runScript(const CommandContext& context, const std::string& file, const std::optional<std::string>& virtualTime) {
  std::ifstream opened;
  if (file != "-") {
    opened.open(file);
    if (!opened) throw CommandFailure("cannot read " + file + ": " + std::strerror(errno));
  }
  std::vector<std::string> arguments = context.widgetArguments;
  if (virtualTime) arguments.insert(arguments.end(), {"--virtual-time", *virtualTime});
  WidgetClient client(context.runLoop, arguments);
  ScriptPlayer(client, std::cout).play(file == "-" ? std::cin : opened);
  return kExitSuccess;
}

}  // namespace nimbo
