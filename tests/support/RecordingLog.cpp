#include "support/RecordingLog.h"

namespace nimbo {

void RecordingLog::write(const LogFacility& facility, LogLevel level, std::string_view format,
                         std::span<const LogArgument> arguments) {
  Line line{std::string(facility.subsystem), std::string(facility.category), level,
            formatLogLine(format, arguments, false), formatLogLine(format, arguments, true)};
  const std::lock_guard guard(_lock);
  _lines.push_back(std::move(line));
}

std::vector<RecordingLog::Line> RecordingLog::lines() const {
  const std::lock_guard guard(_lock);
  return _lines;
}

std::vector<std::string> RecordingLog::texts(std::string_view category, std::optional<LogLevel> level) const {
  std::vector<std::string> texts;
  for (const Line& line : lines())
    if (line.category == category && (!level || line.level == *level)) texts.push_back(line.text);
  return texts;
}

bool RecordingLog::contains(std::string_view part) const {
  for (const Line& line : lines())
    if (line.text.find(part) != std::string::npos) return true;
  return false;
}

void RecordingLog::clear() {
  const std::lock_guard guard(_lock);
  _lines.clear();
}

}  // namespace nimbo
