#include "platform/Localization.h"

#include "platform/Platform.h"

namespace nimbo {

std::string LocalizedString(std::string_view key) {
  return Platform::current().strings().stringForKey(key).value_or("localized string not found");
}

std::string LocalizedFormat(const std::string& format, std::initializer_list<FormatArgument> arguments) {
  return Platform::current().strings().format(format, std::span(arguments.begin(), arguments.size()));
}

std::string CommaDelimitedList(const std::vector<std::string>& texts) {
  return Platform::current().strings().commaDelimitedList(texts);
}

}  // namespace nimbo
