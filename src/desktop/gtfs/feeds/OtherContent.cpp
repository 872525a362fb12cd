#include "desktop/gtfs/feeds/OtherContent.h"

#include "desktop/gtfs/feeds/TransitLineServiceError.h"
#include "desktop/gtfs/text/Utf8.h"

namespace nimbo {

namespace {

/// The header of a GTFS-Realtime feed, which begins with its version: "1.0" or "2.0".
bool isRealtime(std::string_view beginning) {
  constexpr std::size_t kVersion = 4;
  return beginning.size() > kVersion + 2 && beginning[0] == '\x0A' && beginning[2] == '\x0A' && beginning[3] == '\3' &&
         beginning.substr(kVersion + 1, 2) == ".0";
}

bool isZip(std::string_view beginning) { return beginning.starts_with("PK\3\4"); }

/// A page, or an answer meant for programs that are none.
ErrorRef errorOfText(std::string_view beginning, const std::string& place) {
  if (beginning.starts_with("\xEF\xBB\xBF")) beginning.remove_prefix(3);
  beginning = trimmed(beginning);
  const bool isMarkup = beginning.starts_with('<'), isJSON = beginning.starts_with('{') || beginning.starts_with('[');
  if (!isMarkup && !isJSON) return nullptr;
  return transitLineServiceError(TransitLineServiceError::webPage,
                                 place + " is " + (isMarkup ? "a web page or XML" : "JSON") +
                                     ", and no feed. Check the address, or try again later.",
                                 place);
}

}  // namespace

ErrorRef otherThanStatic(std::string_view beginning, const std::string& place) {
  if (isRealtime(beginning))
    return transitLineServiceError(TransitLineServiceError::alertsForStatic,
                                   place +
                                       " is a GTFS-Realtime feed, and no static one, which is a zip file or a "
                                       "folder. Perhaps the two addresses are swapped.",
                                   place);
  return errorOfText(beginning, place);
}

ErrorRef otherThanAlerts(std::string_view beginning, const std::string& place) {
  if (isRealtime(beginning)) return nullptr;
  if (isZip(beginning))
    return transitLineServiceError(TransitLineServiceError::staticForAlerts,
                                   place +
                                       " is a zip file, as static feeds are, and no alerts feed. Perhaps the two "
                                       "addresses are swapped.",
                                   place);
  return errorOfText(beginning, place);
}

}  // namespace nimbo
