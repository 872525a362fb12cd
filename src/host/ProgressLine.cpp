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
  if (progress.received > 0) {
    text += ": " + std::to_string(progress.received >> 20);
    if (progress.length) text += " of " + std::to_string(*progress.length >> 20);
    text += " MiB have come";
  }
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

DownloadProgress::DownloadProgress(WidgetClient& client) {
  if (!_line.isSeen()) return;
  _timer = client.runLoop().scheduleTimer(1, true, [this, &client](Timer&) {
    client.connection().call(protocol::kDownloads.name, nlohmann::json::object(),
                             [this, alive = std::weak_ptr(_alive)](const nlohmann::json& answer, const auto& error) {
                               if (!alive.expired() && !error) show(protocol::read<protocol::Downloads>(answer));
                             });
  });
}

DownloadProgress::~DownloadProgress() {
  if (_timer) _timer->invalidate();
}

void DownloadProgress::show(const protocol::Downloads& downloads) {
  if (downloads.downloads.empty()) return _line.clear();
  const protocol::Download& first = downloads.downloads.front();
  _line.show({.feed = first.feed, .received = first.received, .length = first.length});
}

WidgetWithProgress::WidgetWithProgress(const CommandContext& context)
    : _client(context.runLoop, context.widgetArguments) {
  _client.setProgressHandler([this](const protocol::ProgressParams& progress) { _line.show(progress); });
}

}  // namespace nimbo
