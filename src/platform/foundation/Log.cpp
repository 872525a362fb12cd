#include "platform/foundation/Log.h"

#include <cstdio>

namespace nimbo {

namespace {

std::string textOfArgument(const LogArgument& argument, int precision) {
  return std::visit(
      [precision](const auto& value) -> std::string {
        using T = std::decay_t<decltype(value)>;
        if constexpr (std::is_same_v<T, std::string>) {
          return value;
        } else if constexpr (std::is_same_v<T, ObjectRef>) {
          return descriptionOf(value);
        } else if constexpr (std::is_same_v<T, double>) {
          char text[352];
          std::snprintf(text, sizeof text, "%.*f", precision, value);
          return text;
        } else {
          return std::to_string(value);
        }
      },
      argument.value());
}

}  // namespace

std::string formatLogLine(std::string_view format, std::span<const LogArgument> arguments, bool redact) {
  constexpr std::string_view kPrivate = "{private}";
  constexpr std::string_view kConversions = "@suidf";
  std::string line;
  std::size_t next = 0;
  for (std::size_t i = 0; i < format.size(); ++i) {
    if (format[i] != '%' || i + 1 == format.size()) {
      line += format[i];
      continue;
    }
    std::string_view rest = format.substr(i + 1);
    if (rest.front() == '%') {
      line += '%';
      ++i;
      continue;
    }
    const bool isPrivate = rest.starts_with(kPrivate);
    if (isPrivate) rest.remove_prefix(kPrivate.size());
    const std::size_t end = rest.find_first_of(kConversions);
    if (end == std::string_view::npos) {
      line += format.substr(i);
      break;
    }
    const std::string_view flags = rest.substr(0, end);
    const int precision =
        flags.size() == 2 && flags[0] == '.' && flags[1] >= '0' && flags[1] <= '9' ? flags[1] - '0' : 6;
    if (next >= arguments.size())
      line += "(missing)";
    else
      line += isPrivate && redact ? std::string(kRedacted) : textOfArgument(arguments[next], precision);
    ++next;
    i += (isPrivate ? kPrivate.size() : 0) + end + 1;
  }
  return line;
}

}  // namespace nimbo
