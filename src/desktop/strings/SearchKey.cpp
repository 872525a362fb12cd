#include "desktop/strings/SearchKey.h"

#include <algorithm>
#include <stdexcept>

#include "desktop/strings/StringsPart.h"
#include "platform/foundation/Log.h"

namespace nimbo {

namespace {

char lowerCase(char c) { return c >= 'A' && c <= 'Z' ? static_cast<char>(c - 'A' + 'a') : c; }

}  // namespace

std::string searchKey(std::string_view text) {
  if (std::any_of(text.begin(), text.end(), [](char c) { return static_cast<unsigned char>(c) >= 0x80; })) try {
      return stringsPart().searchKey(text);
    } catch (const std::runtime_error& failure) {
      writeLog({kDefaultLogSubsystem, "StringTables"}, LogLevel::error, "Unable to fold a text: %@", {failure.what()});
    }
  std::string key(text);
  std::transform(key.begin(), key.end(), key.begin(), lowerCase);
  return key;
}

}  // namespace nimbo
