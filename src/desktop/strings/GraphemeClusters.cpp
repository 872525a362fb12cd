#include "desktop/strings/GraphemeClusters.h"

#include <algorithm>
#include <stdexcept>

#include "desktop/strings/StringsPart.h"
#include "platform/foundation/Log.h"

namespace nimbo {

namespace {

bool isASCII(char byte) { return static_cast<unsigned char>(byte) < 0x80; }

}  // namespace

std::size_t clusterBoundary(std::string_view text, std::size_t position) {
  if (position == 0 || position >= text.size()) return position;
  // Two of ASCII are one only where a line ends with "\r\n".
  if (isASCII(text[position - 1]) && isASCII(text[position]) && text[position] != '\n') return position;
  constexpr std::size_t kFollowing = 4;  // of the next character, which decides; ICU looks no further
  try {
    const std::size_t boundary = stringsPart().clusterBoundary(text.substr(0, position + kFollowing), position);
    return boundary > 0 ? boundary : position;
  } catch (const std::runtime_error& failure) {
    writeLog({kDefaultLogSubsystem, "StringTables"}, LogLevel::error, "Unable to tell characters apart: %@",
             {failure.what()});
    return position;
  }
}

}  // namespace nimbo
