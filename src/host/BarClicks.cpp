#include "host/BarClicks.h"

#include <unistd.h>

#include <cerrno>
#include <nlohmann/json.hpp>
#include <optional>
#include <utility>
#include <vector>

#include "host/BarFormats.h"

namespace nimbo {

using nlohmann::json;

namespace {

/// Of an event, which has some 300 bytes.
constexpr std::size_t kLongestLine = 4096;
constexpr std::size_t kMostAtOnce = 65536;
/// Seconds.
constexpr TimeInterval kRestBetweenReads = 0.1, kRestBetweenClicks = 1;

/// The button of an event on our block. Events stand in an array: the bracket before the first, and the commas before
/// or behind, are the bar's.
std::optional<int> buttonOf(std::string_view line) {
  const std::size_t begin = line.find('{'), end = line.rfind('}');
  if (begin == line.npos || end == line.npos || end < begin) return std::nullopt;
  const json event = json::parse(line.substr(begin, end + 1 - begin), nullptr, false);
  if (!event.is_object()) return std::nullopt;
  const auto name = event.find("name"), button = event.find("button");
  if (name == event.end() || *name != kBarBlockName || button == event.end() || !button->is_number_integer())
    return std::nullopt;
  const auto number = button->get<std::int64_t>();
  return number > 0 && number < 100 ? std::optional(static_cast<int>(number)) : std::nullopt;
}

}  // namespace

BarClicks::BarClicks(GLibRunLoop& runLoop, int descriptor, std::function<void(int)> clicked)
    : _runLoop(runLoop), _descriptor(descriptor), _clicked(std::move(clicked)) {
  // Reading from a terminal in the background would stop the program.
  if (!isatty(_descriptor)) listen();
}

BarClicks::~BarClicks() {
  if (_rest) _rest->invalidate();
}

void BarClicks::listen() {
  _readable = _runLoop.watchReadable(_descriptor, [this] { read(); });
}

void BarClicks::rest(TimeInterval seconds) {
  _readable = nullptr;
  _rest = _runLoop.scheduleTimer(seconds, false, [this](Timer&) {
    _rest = nullptr;
    listen();
  });
}

void BarClicks::read() {
  std::vector<char> bytes(kMostAtOnce);
  const ssize_t count = ::read(_descriptor, bytes.data(), bytes.size());
  if (count < 0 && (errno == EINTR || errno == EAGAIN)) return;
  if (count <= 0) {
    // A bar that sends no clicks.
    _readable = nullptr;
    return;
  }
  std::optional<int> clicked;
  for (const char c : std::string_view(bytes.data(), static_cast<std::size_t>(count))) {
    if (c != '\n') {
      if (_line.size() < kLongestLine)
        _line += c;
      else
        _isTooLong = true;
      continue;
    }
    if (!clicked && !_isTooLong) clicked = buttonOf(_line);
    _line.clear();
    _isTooLong = false;
  }
  rest(clicked ? kRestBetweenClicks : kRestBetweenReads);
  if (clicked) _clicked(*clicked);
}

}  // namespace nimbo
