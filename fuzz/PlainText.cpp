// What publishers write, as riders read it.

#include "desktop/gtfs/text/PlainText.h"

#include "Fuzz.h"
#include "desktop/gtfs/alerts/AlertTexts.h"
#include "desktop/gtfs/text/Utf8.h"

namespace nimbo {

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  const std::string plain = plainText(textOf(data, size));
  requirePlain(plain);
  if (plain.find_first_of("<&") == std::string::npos) require(plainText(plain) == plain, "a plain text stays as it is");
  const std::string cut = plainText(textOf(data, size), 10);
  requirePlain(cut);
  require(firstCharacters(cut, 10) == cut && (cut == plain || cut.ends_with("…")), "a limit is kept");
  const std::string summary = summaryOfText(plain);
  requirePlain(summary);
  require(summary.empty() == plain.empty() && summary.find('\n') == std::string::npos, "a summary is one line");
  return 0;
}

}  // namespace nimbo
