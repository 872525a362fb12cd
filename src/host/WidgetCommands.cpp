#include <cerrno>
#include <cstdio>
#include <cstring>
#include <fstream>
#include <iostream>

#include "desktop/drawing/DrawingPart.h"
#include "host/Commands.h"
#include "host/OnScreenWidget.h"
#include "host/ScriptPlayer.h"
#include "host/TerminalRows.h"
#include "host/TerminalText.h"
#include "protocol/Names.h"

namespace nimbo {

namespace {

void tellGoneLines(const protocol::Snapshot& snapshot) {
  for (const std::string& line : snapshot.goneLines) printMessage(goneLineText(line));
}

/// What the rows leave out while they show an error; empty when nothing is known.
std::string knownIncidentsText(const protocol::Snapshot& snapshot) {
  std::string text = snapshot.knownIncidents.empty() ? "" : "Known from other feeds:\n";
  for (const auto& [line, title] : snapshot.knownIncidents)
    text.append("  ").append(printableText(line)).append(": ").append(printableText(title)).append("\n");
  return text;
}

}  // namespace

int runStatus(const CommandContext& context, const StatusOptions& options) {
  WidgetPresentation presentation;
  presentation.virtualTime = options.now;
  OnScreenWidget widget(context, presentation);
  const std::optional<std::string> failure = widget.update();
  if (options.expanded) widget.expand();
  const protocol::Snapshot snapshot = widget.snapshot();
  if (options.json)
    std::cout << printableJSON(protocol::write(snapshot).dump(2)) << "\n";
  else
    std::cout << rowsAsText(snapshot, TerminalStyle::ofStandardOutput()) << knownIncidentsText(snapshot);
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
  client.call(protocol::kInitialize);
  for (const auto& step : {protocol::kLoadView, protocol::kViewWillAppear}) client.call(step);
  // The rows of the last time stay when there are no newer ones.
  if (const auto failure = failureOfUpdate(client.call(protocol::kPerformUpdate))) throw CommandFailure(*failure);
  for (const auto& step : {protocol::kViewWillDisappear, protocol::kViewDidDisappear, protocol::kShutdown})
    client.call(step);
  return kExitSuccess;
}

int runRender(const CommandContext& context, const RenderOptions& options) {
  WidgetPresentation presentation;
  presentation.textSize = protocol::named<ContentSizeCategory>(options.textSize).value_or(presentation.textSize);
  presentation.compactHeight = WidgetPresentation::rowHeightForTextSize(presentation.textSize);
  presentation.expandedHeight = 4 * presentation.compactHeight;
  if (options.size) {
    presentation.width = options.size->width;
    (options.expanded ? presentation.expandedHeight : presentation.compactHeight) = options.size->height;
  }
  presentation.scale = options.scale;
  presentation.appearance = options.dark ? Appearance::dark : Appearance::light;
  presentation.locale = options.locale;
  presentation.virtualTime = options.now;
  const PictureMemory memory;
  OnScreenWidget widget(context, presentation, &memory);
  const std::optional<std::string> failure = widget.update();
  if (options.expanded) widget.expand();
  const std::optional<WidgetPicture> picture = memory.take(widget.render());
  if (!picture) throw CommandFailure("the widget process has not drawn what it says");
  const protocol::Rendered& layout = picture->layout;
  if (const ErrorRef error = drawingPart().writePNG(picture->pixels, layout.width, layout.stride, options.output))
    throw CommandFailure(error->reason());
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
  const PictureMemory memory;
  WidgetClient client(context.runLoop, arguments, &memory);
  std::istream& input = file == "-" ? std::cin : opened;
  ScriptPlayer(client, std::cout).play(input);
  if (input.bad() || std::ferror(stdin)) throw CommandFailure("cannot read " + file + ": " + std::strerror(errno));
  return kExitSuccess;
}

}  // namespace nimbo
