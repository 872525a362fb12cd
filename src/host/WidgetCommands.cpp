#include "host/WidgetCommands.h"

#include <cerrno>
#include <cstring>
#include <filesystem>
#include <fstream>
#include <iostream>

#include "host/GoneLines.h"
#include "host/OnScreenWidget.h"
#include "host/ScriptPlayer.h"
#include "host/TerminalRows.h"

namespace nimbo {

namespace {

void tellGoneLines(const nlohmann::json& snapshot) {
  for (const nlohmann::json& line : snapshot.value("goneLines", nlohmann::json::array()))
    printMessage(goneLineText(line));
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
    std::cout << printableJSON(snapshot.dump(2)) << "\n";
  else
    std::cout << rowsAsText(snapshot, TerminalStyle::ofStandardOutput());
  widget.close();
  tellGoneLines(snapshot);
  if (failure) throw CommandFailure(*failure);
  return kExitSuccess;
}

int runUpdate(const CommandContext& context) {
  WidgetClient client(context.runLoop, context.widgetArguments);
  client.setNoticeHandler(context.tell);
  // Never on screen, so that no use of the widget is recorded, and without a host's sizes, so that the display mode
  // that was saved stays.
  for (const char* step : {"initialize", "loadView", "viewWillAppear"}) client.call(step);
  // The rows of the last time stay when there are no newer ones.
  if (const auto failure = failureOfUpdate(client.call("performUpdate"))) throw CommandFailure(*failure);
  for (const char* step : {"viewWillDisappear", "viewDidDisappear", "shutdown"}) client.call(step);
  return kExitSuccess;
}

int runRender(const CommandContext& context, const RenderOptions& options) {
  WidgetPresentation presentation;
  if (const auto category = contentSizeCategoryFromName(options.textSize)) {
    presentation.compactHeight = WidgetPresentation::rowHeightForTextSize(*category);
    presentation.expandedHeight = 4 * presentation.compactHeight;
  }
  if (options.size) {
    presentation.width = options.size->width;
    (options.expanded ? presentation.expandedHeight : presentation.compactHeight) = options.size->height;
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
