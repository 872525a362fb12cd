#include <cerrno>
#include <cstdio>
#include <cstring>
#include <fstream>
#include <iostream>
#include <set>

#include "desktop/drawing/DrawingPart.h"
#include "host/Commands.h"
#include "host/HostPlatform.h"
#include "host/LineStatus.h"
#include "host/OnScreenWidget.h"
#include "host/ProgressLine.h"
#include "host/SavedRows.h"
#include "host/ScriptPlayer.h"
#include "host/TerminalRows.h"
#include "host/TerminalText.h"
#include "host/telling/Teller.h"
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

namespace {

Date nowOf(const StatusOptions& options) {
  const auto date = options.now ? dateFromISOText(*options.now) : std::nullopt;
  return date.value_or(std::chrono::time_point_cast<Date::duration>(std::chrono::system_clock::now()));
}

/// The time of the incidents in force that have this title; empty where they differ in it, or none has.
std::string timeOfIncident(const std::string& title, const protocol::Lines& lines, Date now) {
  std::set<std::string> times;
  for (const protocol::LineReport& line : lines.lines)
    for (const protocol::LineIncident& incident : line.incidents)
      if (incident.title == title) times.insert(periodText(incident.from, incident.until, now));
  return times.size() == 1 ? *times.begin() : std::string();
}

void printRows(const protocol::Snapshot& snapshot, const StatusOptions& options, const protocol::Lines& lines) {
  if (options.json) {
    std::cout << printableJSON(protocol::write(snapshot).dump(2)) << "\n";
    return;
  }
  const Date now = nowOf(options);
  std::function<std::string(const std::string&)> timeOf;
  if (options.expanded) timeOf = [&](const std::string& title) { return timeOfIncident(title, lines, now); };
  std::cout << rowsAsText(snapshot, TerminalStyle::ofStandardOutput(), timeOf) << knownIncidentsText(snapshot);
  if (snapshot.updated) std::cout << updatedText(*snapshot.updated, now) << "\n";
}

/// Room for all rows that there may be.
WidgetPresentation presentationForStatus(const StatusOptions& options) {
  constexpr int kMostRows = 900;  // a length has a limit in the protocol
  WidgetPresentation presentation;
  presentation.expandedHeight = kMostRows * presentation.compactHeight;
  presentation.virtualTime = options.now;
  return presentation;
}

/// The rows of the last time.
int runSavedStatus(const CommandContext& context, const StatusOptions& options) {
  const auto mode = options.expanded ? WidgetDisplayMode::Expanded : WidgetDisplayMode::Compact;
  WidgetPresentation presentation = presentationForStatus(options);
  // Of rows that are not shown come as few as may be.
  if (!options.expanded && !options.json) presentation.expandedHeight = presentation.compactHeight;
  printRows(savedSnapshot(context, presentation, mode, {.rows = options.json}), options, {});
  return kExitSuccess;
}

}  // namespace

int runStatus(const CommandContext& context, const StatusOptions& options) {
  if (options.saved) return runSavedStatus(context, options);
  OnScreenWidget widget(context, presentationForStatus(options));
  const std::optional<std::string> failure = widget.update();
  if (options.expanded) widget.expand();
  const protocol::Snapshot snapshot = widget.snapshot({.rows = options.json});
  const protocol::Lines lines = widget.lines();
  const TerminalStyle style = TerminalStyle::ofStandardOutput();
  if (options.format == "json")
    std::cout << printableJSON(statusAsJSON(lines).dump(2)) << "\n";
  else if (options.lines)
    std::cout << linesAsText(lines, nowOf(options), style);
  else if (options.planned)
    std::cout << plannedAsText(lines, style);
  else
    printRows(snapshot, options, lines);
  widget.close();
  tellGoneLines(snapshot);
  if (options.exitCode) {
    if (failure) printMessage(*failure);
    return exitCodeOfState(overallState(lines));
  }
  if (failure) throw CommandFailure(*failure);
  return kExitSuccess;
}

namespace {

/// Waits until no static feed is being downloaded any more, which ends with the process, and says so.
void waitForDownloads(WidgetClient& client, GLibRunLoop& runLoop) {
  constexpr TimeInterval kLook = 0.2;
  constexpr int kLooks = 660 * 5;  // a minute more than a download takes at most
  bool isSaid = false;
  const DownloadProgress progress(client);
  for (int i = 0; i < kLooks; ++i) {
    const protocol::Downloads under = client.call(protocol::kDownloads);
    if (under.downloads.empty()) return;
    if (!std::exchange(isSaid, true))
      printMessage("waiting for the static feed of \"" + under.downloads.front().feed + "\"");
    bool isOver = false;
    const auto timer = runLoop.scheduleTimer(kLook, false, [&isOver](Timer&) { isOver = true; });
    client.waitUntil([&isOver] { return isOver; });
  }
  throw CommandFailure("a static feed is still being downloaded, and will be asked for again");
}

/// Tells the desktop what begins and ends. Absent when all went well.
std::optional<std::string> failureOfTelling(const CommandContext& context, DesktopPlatform& platform,
                                            WidgetClient& client, bool notify) {
  Teller teller(context.runLoop, platform, {.isAsked = notify, .needsState = true});
  if (!teller.isOn()) return std::nullopt;
  std::optional<std::string> failure;
  bool isDone = false;
  teller.take(client.call(protocol::kLines), [&](const ErrorRef& error) {
    if (error) failure = error->reason();
    isDone = true;
  });
  client.waitUntil([&isDone] { return isDone; });
  return failure;
}

}  // namespace

int runUpdate(const CommandContext& context, bool notify) {
  HostPlatform platform(context);
  WidgetClient client(context.runLoop, context.widgetArguments);
  client.setNoticeHandler(context.tell);
  // Never on screen, so that no use of the widget is recorded, and without a host's sizes, so that the display mode
  // that was saved stays.
  client.call(protocol::kInitialize);
  for (const auto& step : {protocol::kLoadView, protocol::kViewWillAppear}) client.call(step);
  const auto failed = failureOfUpdate(client, sharedAge(context));
  // Of lines of feeds that answered it is known what begins and ends.
  const auto untold = failureOfTelling(context, *platform.operator->(), client, notify);
  // The rows of the last time stay when there are no newer ones.
  if (failed) throw CommandFailure(*failed);
  if (const auto failure = client.call(protocol::kViewWillDisappear).failure)
    throw CommandFailure("the rows cannot be kept: " + *failure);
  client.call(protocol::kViewDidDisappear);
  waitForDownloads(client, context.runLoop);
  client.call(protocol::kShutdown);
  if (untold) throw CommandFailure("cannot notify: " + *untold);
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
