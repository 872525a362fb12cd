#include "desktop/strings/GraphemeClusters.h"

#include <algorithm>
#include <stdexcept>

#include "desktop/raii/ICUHandles.h"
#include "platform/foundation/Log.h"

namespace nimbo {

namespace {

bool isASCII(char byte) { return static_cast<unsigned char>(byte) < 0x80; }

/// The last boundary at `position` or before it. Throws std::runtime_error.
std::size_t boundaryOfICU(std::string_view text, std::size_t position) {
  const ICU& icu = ICU::library();
  UErrorCode status = U_ZERO_ERROR;
  const ICUText bytes(icu.text_openUTF8(nullptr, text.data(), static_cast<std::int64_t>(text.size()), &status));
  const ICUBreakIterator clusters(icu.brk_open(UBRK_CHARACTER, "", nullptr, 0, &status));
  checkICU(status);
  icu.brk_setUText(clusters.get(), bytes.get(), &status);
  checkICU(status);
  const auto wanted = static_cast<std::int32_t>(position);
  const std::int32_t found =
      icu.brk_isBoundary(clusters.get(), wanted) ? wanted : icu.brk_preceding(clusters.get(), wanted);
  return static_cast<std::size_t>(std::max(found, 0));
}

}  // namespace

std::size_t clusterBoundary(std::string_view text, std::size_t position) {
  if (position == 0 || position >= text.size()) return position;
  // Two of ASCII are one only where a line ends with "\r\n".
  if (isASCII(text[position - 1]) && isASCII(text[position]) && text[position] != '\n') return position;
  constexpr std::size_t kFollowing = 4;  // of the next character, which decides; ICU looks no further
  try {
    const std::size_t boundary = boundaryOfICU(text.substr(0, position + kFollowing), position);
    return boundary > 0 ? boundary : position;
  } catch (const std::runtime_error& failure) {
    writeLog({kDefaultLogSubsystem, "StringTables"}, LogLevel::error, "Unable to tell characters apart: %@",
             {failure.what()});
    return position;
  }
}

}  // namespace nimbo
