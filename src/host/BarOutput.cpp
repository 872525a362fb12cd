#include "host/BarOutput.h"

#include <limits.h>
#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <utility>

namespace nimbo {

BarOutput::BarOutput(GLibRunLoop& runLoop, int descriptor, std::function<void(int)> ended)
    : _runLoop(runLoop), _descriptor(descriptor), _ended(std::move(ended)) {
  _gone = _runLoop.watchUrgent(_descriptor, [this](bool inError) {
    if (inError) _ended(0);
  });
}

void BarOutput::begin(std::string text) {
  _underWay = std::move(text);
  if (!_underWay.empty()) writeWhenItCan();
}

void BarOutput::writeWhenItCan() {
  if (!_writable) _writable = _runLoop.watchWritable(_descriptor, [this] { write(); });
}

void BarOutput::show(std::string line) {
  line += "\n";
  if (line == _last) return;
  _last = line;
  _next = std::move(line);
  writeWhenItCan();
}

void BarOutput::write() {
  if (_underWay.empty() && _next) _underWay = *std::exchange(_next, std::nullopt);
  // A pipe that is writable takes so much without having its writer wait.
  const ssize_t written = ::write(_descriptor, _underWay.data(), std::min<std::size_t>(_underWay.size(), PIPE_BUF));
  if (written < 0 && errno != EINTR && errno != EAGAIN) {
    const int failure = errno;
    _writable = nullptr;
    return _ended(failure == EPIPE ? 0 : failure);
  }
  if (written > 0) _underWay.erase(0, static_cast<std::size_t>(written));
  if (_underWay.empty() && !_next) _writable = nullptr;
}

}  // namespace nimbo
