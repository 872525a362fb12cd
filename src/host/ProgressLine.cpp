#include "host/ProgressLine.h"

#include <sys/ioctl.h>
#include <unistd.h>

#include <algorithm>
#include <cstdio>

#include "host/TerminalText.h"

namespace nimbo {

namespace {

std::string textOf(const protocol::ProgressParams& progress) {
  std::string text = progress.part == protocol::FeedPart::alerts ? "Reading the alerts of " : "Reading the lines of ";
  text += progress.feed;
  if (progress.total > 1)
    text += ", feed " + std::to_string(progress.done + 1) + " of " + std::to_string(progress.total);
  if (progress.received > 0) text += ": " + std::to_string(progress.received >> 20) + " MiB have come";
  return printableText(text);
}

}  // namespace

ProgressLine::ProgressLine() : _isTerminal(::isatty(STDERR_FILENO) != 0) {}

void ProgressLine::show(const protocol::ProgressParams& progress) {
  if (!_isTerminal) return;
  constexpr int kDefaultColumns = 80;
  winsize size{};
  const int columns = ::ioctl(STDERR_FILENO, TIOCGWINSZ, &size) == 0 && size.ws_col > 0 ? size.ws_col : kDefaultColumns;
  const auto lines = foldedText(textOf(progress) + " ...", columns - 1);
  std::fprintf(stderr, "\r\x1b[K%s", lines.empty() ? "" : lines.front().c_str());
  std::fflush(stderr);
  _isShown = true;
}

void ProgressLine::clear() {
  if (!std::exchange(_isShown, false)) return;
  std::fputs("\r\x1b[K", stderr);
  std::fflush(stderr);
}

WidgetWithProgress::WidgetWithProgress(const CommandContext& context)
    : _client(context.runLoop, context.widgetArguments) {
  _client.setProgressHandler([this](const protocol::ProgressParams& progress) { _line.show(progress); });
}

}  // namespace nimbo
