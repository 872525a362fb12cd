#include "host/StatusBarCommand.h"

#include <glib-unix.h>
#include <unistd.h>

#include <csignal>
#include <iostream>

#include "host/OnScreenWidget.h"
#include "host/StatusBarLine.h"
#include "host/StatusWatch.h"

namespace nimbo {

namespace {

/// Rows that a tooltip has room for.
constexpr int kTooltipRows = 10;

WidgetPresentation presentationForBar() {
  WidgetPresentation presentation;
  presentation.expandedHeight = kTooltipRows * WidgetPresentation::kDefaultRowHeight;
  return presentation;
}

/// Ends the loop when the signal comes, instead of the process, for as long as the handle lives.
GSourceHandle quitOnSignal(GLibRunLoop& runLoop, int signal) {
  GSourceHandle source(g_unix_signal_source_new(signal));
  const auto quit = [](gpointer loop) -> gboolean {
    static_cast<GLibRunLoop*>(loop)->quit();
    return G_SOURCE_CONTINUE;
  };
  g_source_set_callback(source.get(), quit, &runLoop, nullptr);
  g_source_attach(source.get(), nullptr);
  return source;
}

}  // namespace

int runStatusBar(const CommandContext& context, const std::optional<std::string>& now) {
  WidgetPresentation presentation = presentationForBar();
  presentation.virtualTime = now;
  try {
    OnScreenWidget widget(context, presentation);
    const std::optional<std::string> failure = widget.update();
    std::cout << statusBarLine(widget.snapshot()).value_or("") << "\n";
    widget.close();
    if (failure) throw CommandFailure(*failure);
  } catch (const WidgetClientFailure& failure) {
    std::cout << statusBarErrorLine(failure.what()) << "\n";
    throw;
  }
  return kExitSuccess;
}

int runStatusWatch(const CommandContext& context) {
  const GSourceHandle handles[] = {quitOnSignal(context.runLoop, SIGTERM), quitOnSignal(context.runLoop, SIGINT),
                                   context.runLoop.watchUrgent(STDOUT_FILENO, [&](bool inError) {
                                     // The reader of the pipe is gone.
                                     if (inError) context.runLoop.quit();
                                   })};
  const StatusWatch watch(context, presentationForBar(), [&](const std::string& line) {
    if (!(std::cout << line << std::endl)) context.runLoop.quit();
  });
  context.runLoop.run();
  return kExitSuccess;
}

}  // namespace nimbo
