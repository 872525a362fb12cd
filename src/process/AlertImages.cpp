#include "process/AlertImages.h"

#include <algorithm>
#include <mutex>

#include "desktop/drawing/ImagesPart.h"
#include "desktop/gtfs/alerts/IncidentReader.h"
#include "desktop/gtfs/net/HTTPFetcher.h"
#include "desktop/gtfs/text/Utf8.h"

namespace nimbo {

namespace {

constexpr std::uint64_t kLargestImage = 4 << 20;  // bytes
constexpr std::chrono::seconds kLongestImageFetch{60};

ErrorRef noImage(const std::string& reason) {
  return Error::errorWithDomain_code_reason(std::string(kDrawingErrorDomain), kDrawingErrorNotDrawn, reason);
}

bool isEncrypted(const FeedAddress& address) { return asciiLowerCase(address.text()).starts_with("https:"); }

}  // namespace

Outcome<FeedAddress> imageOfIncident(const std::string& incident, const GTFSTransitLineService& service) {
  for (const GTFSTransitLineService::LineVerdict& verdict : service.verdicts()) {
    if (!verdict.item) continue;
    for (const TransitIncidentRef& found : verdict.item->incidents()) {
      const auto* alert = dynamic_cast<const AlertIncident*>(found.get());
      if (!alert || !alert->fields().image.address || std::to_string(alert->muid()) != incident) continue;
      const auto address = FeedAddress::parse(*alert->fields().image.address);
      if (!address) return address;
      const auto& locator = verdict.identifier->locator();
      const auto feed = service.library().configuration().feedNamed(locator ? locator->feed : "");
      const bool mayBePlain = feed && !isEncrypted(feed->alerts);
      // Whoever chose https is not led off it.
      if (!mayBePlain && !isEncrypted(*address)) return noImage("the image of a feed by https does not come by it");
      return address;
    }
  }
  return noImage("no incident " + incident + " with an image is known");
}

Outcome<PictureRef> fetchImage(const FeedAddress& address, std::uint32_t width, const std::stop_token& stop) {
  std::string file;
  const auto fetched =
      HTTPFetcher::fetch({address, {}, kLargestImage, kLongestImageFetch}, stop, [&file](std::string_view piece) {
        file += piece;
        return true;
      });
  if (!fetched) return fetched.error();
  static std::mutex decoding;  // the pixels of a large one take 64 MiB
  const std::lock_guard guard(decoding);
  return imagesPart().decode(file, static_cast<int>(std::min<std::uint32_t>(width, kLargestImageSide)));
}

}  // namespace nimbo
