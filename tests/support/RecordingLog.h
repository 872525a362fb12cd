#pragma once

#include <algorithm>
#include <mutex>
#include <optional>
#include <string>
#include <vector>

#include "platform/foundation/Log.h"

namespace nimbo {

/// Keeps every log line. Any thread.
class RecordingLog final : public Log {
 public:
  struct Line {
    std::string subsystem;
    std::string category;
    LogLevel level;
    std::string text;      ///< private arguments shown
    std::string redacted;  ///< private arguments left out
  };

  bool isEnabled(LogLevel) const override { return true; }
  void write(const LogFacility& facility, LogLevel level, std::string_view format,
             std::span<const LogArgument> arguments) override {
    Line line{std::string(facility.subsystem), std::string(facility.category), level,
              formatLogLine(format, arguments, false), formatLogLine(format, arguments, true)};
    const std::lock_guard guard(_lock);
    _lines.push_back(std::move(line));
  }

  std::vector<Line> lines() const {
    const std::lock_guard guard(_lock);
    return _lines;
  }
  /// Texts of the lines of a category, of one level where that is given.
  std::vector<std::string> texts(std::string_view category, std::optional<LogLevel> level = {}) const {
    std::vector<std::string> texts;
    for (const Line& line : lines())
      if (line.category == category && (!level || line.level == *level)) texts.push_back(line.text);
    return texts;
  }
  /// Whether a line's text contains `part`.
  bool contains(std::string_view part) const {
    const auto all = lines();
    return std::ranges::any_of(all, [&](const Line& line) { return line.text.find(part) != std::string::npos; });
  }
  void clear() {
    const std::lock_guard guard(_lock);
    _lines.clear();
  }

 private:
  mutable std::mutex _lock;
  std::vector<Line> _lines;
};

}  // namespace nimbo
