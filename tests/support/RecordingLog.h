#pragma once

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
             std::span<const LogArgument> arguments) override;

  std::vector<Line> lines() const;
  /// Texts of the lines of a category, of one level where that is given.
  std::vector<std::string> texts(std::string_view category, std::optional<LogLevel> level = {}) const;
  /// Whether a line's text contains `part`.
  bool contains(std::string_view part) const;
  void clear();

 private:
  mutable std::mutex _lock;
  std::vector<Line> _lines;
};

}  // namespace nimbo
