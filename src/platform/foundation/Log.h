#pragma once

#include <cstdint>
#include <initializer_list>
#include <span>
#include <string>
#include <string_view>
#include <type_traits>
#include <variant>

#include "platform/foundation/Object.h"

namespace nimbo {

enum class LogLevel { debug, info, error };

/// Where a line belongs: a subsystem and a category in it. Both texts outlive every line (literals).
struct LogFacility {
  std::string_view subsystem;
  std::string_view category;
};

/// Logging subsystem of the widget's own lines.
inline constexpr std::string_view kDefaultLogSubsystem = "org.nimbo.TransitWidget";

/// Where the widget's own log lines belong.
inline constexpr LogFacility NBTransitWidgetLogFacility{kDefaultLogSubsystem, "TransitWidget"};

/// One argument of a log line: a text, a number or an object, whose description is made only for a line that is kept.
class LogArgument {
 public:
  using Value = std::variant<std::string, std::int64_t, std::uint64_t, double, ObjectRef>;

  LogArgument(std::string_view text) : _value(std::string(text)) {}
  LogArgument(const std::string& text) : _value(text) {}
  LogArgument(const char* text) : _value(std::string(text)) {}
  template <class T>
  LogArgument(const std::shared_ptr<T>& object) : _value(ObjectRef(object)) {}
  template <class T>
  requires std::is_arithmetic_v<T> LogArgument(T value) : _value(convert(value)) {}

  const Value& value() const { return _value; }

 private:
  template <class T>
  static Value convert(T value) {
    if constexpr (std::is_floating_point_v<T>)
      return double{value};
    else if constexpr (std::is_unsigned_v<T>)
      return std::uint64_t{value};
    else
      return std::int64_t{value};
  }

  Value _value;
};

/// Receives log lines. Any thread may write; a sink that throws loses its line, never its caller.
class Log {
 public:
  virtual ~Log() = default;

  /// Whether lines of this level are kept at all; asked first, so that a dropped line costs no formatting.
  virtual bool isEnabled(LogLevel level) const = 0;

  /// One line: the format text and its arguments, apart (see `formatLogLine`).
  virtual void write(const LogFacility& facility, LogLevel level, std::string_view format,
                     std::span<const LogArgument> arguments) = 0;
};

/// What stands in a line for a private argument.
inline constexpr std::string_view kRedacted = "<private>";

/// Fills `format`: "%@", "%s", "%lu", "%llu", "%i", "%d", "%zu" and "%.Nf" take the next argument, "%{private}@" does
/// so too but gives `kRedacted` where `redact` is set, "%%" is a percent sign. A missing argument gives "(missing)".
std::string formatLogLine(std::string_view format, std::span<const LogArgument> arguments, bool redact);

/// Writes one line to the log of the platform in force.
void writeLog(const LogFacility& facility, LogLevel level, std::string_view format,
              std::initializer_list<LogArgument> arguments = {});

}  // namespace nimbo
