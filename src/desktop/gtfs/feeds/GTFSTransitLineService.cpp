#include "desktop/gtfs/feeds/GTFSTransitLineService.h"

#include <algorithm>
#include <future>

#include "desktop/gtfs/feeds/FeedLookup.h"
#include "desktop/gtfs/feeds/TransitLineServiceError.h"
#include "desktop/gtfs/static/LineItems.h"
#include "platform/Platform.h"

namespace nimbo {

/// What lookups use on the service's threads.
struct GTFSTransitLineService::Shared {
  explicit Shared(const Paths& paths) : library(paths) {}

  FeedLibrary library;
  std::mutex lock;
  std::string language = "en";
  std::vector<MapItemIdentifierRef> goneLines;
  std::map<std::string, Date> asOf;
};

namespace {

/// The identifiers that may be of one feed, and their places in the lookup.
struct FeedPart {
  FeedSourceRef source;
  std::vector<MapItemIdentifierRef> identifiers;
  std::vector<std::size_t> places;
};

/// Sorts identifiers by feed; one that is only a number may be of any.
Outcome<std::vector<FeedPart>> partsOf(const std::vector<MapItemIdentifierRef>& identifiers,
                                       const FeedLibrary& library) {
  const auto sources = library.sources();
  if (!sources) return sources.error();
  std::vector<FeedPart> parts;
  for (const FeedSourceRef& source : *sources) parts.push_back({source, {}, {}});
  for (std::size_t i = 0; i < identifiers.size(); ++i) {
    const auto& locator = identifiers[i]->locator();
    bool found = !locator;
    for (FeedPart& part : parts) {
      if (locator && locator->feed != part.source->name()) continue;
      part.identifiers.push_back(identifiers[i]);
      part.places.push_back(i);
      found = true;
    }
    if (!found) return library.sourceNamed(locator->feed).error();
  }
  std::erase_if(parts, [](const FeedPart& part) { return part.identifiers.empty(); });
  return parts;
}

Outcome<FeedAnswer> lookUpPart(const FeedPart& part, const std::string& language, const std::stop_token& stop) {
  try {
    return lookUpInFeed(*part.source, part.identifiers, language, stop);
  } catch (const std::exception& exception) {
    return transitLineServiceError(
        TransitLineServiceError::internal,
        "Looking up lines of feed \"" + part.source->name() + "\" failed: " + exception.what() + ".");
  }
}

struct Answer {
  TransitLineItems items;  ///< one for each identifier, null for lines that are gone
  std::map<std::string, Date> asOf;
};

Outcome<Answer> lookUpAll(const std::vector<MapItemIdentifierRef>& identifiers, const FeedLibrary& library,
                          const std::string& language, const std::stop_token& stop) {
  const auto parts = partsOf(identifiers, library);
  if (!parts) return parts.error();
  std::vector<std::future<Outcome<FeedAnswer>>> others;
  for (std::size_t i = 1; i < parts->size(); ++i)
    others.push_back(std::async(std::launch::async, [&, i] { return lookUpPart((*parts)[i], language, stop); }));
  std::vector<Outcome<FeedAnswer>> answers;
  if (!parts->empty()) answers.push_back(lookUpPart(parts->front(), language, stop));
  for (auto& other : others) answers.push_back(other.get());

  Answer all{TransitLineItems(identifiers.size()), {}};
  for (std::size_t i = 0; i < answers.size(); ++i) {
    if (!answers[i]) return answers[i].error();
    const FeedPart& part = (*parts)[i];
    for (std::size_t k = 0; k < answers[i]->items.size(); ++k)
      if (TransitLineItemRef& item = all.items[part.places[k]]; !item) item = answers[i]->items[k];
    if (answers[i]->asOf) all.asOf.emplace(part.source->name(), *answers[i]->asOf);
  }
  return all;
}

/// The lines that are left out, taken out of `items`.
std::vector<MapItemIdentifierRef> takeGone(TransitLineItems& items,
                                           const std::vector<MapItemIdentifierRef>& identifiers) {
  std::vector<MapItemIdentifierRef> gone;
  for (std::size_t i = 0; i < items.size(); ++i)
    if (!items[i]) gone.push_back(identifiers[i]);
  std::erase(items, nullptr);
  for (const MapItemIdentifierRef& identifier : gone)
    writeLog(kFeedLogFacility, LogLevel::error, "The line %{private}@ is gone from its feed",
             {writtenNameOfLine(*identifier)});
  return gone;
}

ErrorRef allGone(const std::vector<MapItemIdentifierRef>& gone) {
  std::string names;
  for (const MapItemIdentifierRef& identifier : gone) names += " " + writtenNameOfLine(*identifier);
  return transitLineServiceError(
      TransitLineServiceError::unknownLine,
      "No line of the favorites is in its feed any more:" + names + ". Choose the lines anew.");
}

}  // namespace

GTFSTransitLineService::GTFSTransitLineService(const Paths& paths)
    : _shared(std::make_shared<Shared>(paths)), _queue("org.nimbo.TransitLineService") {}

GTFSTransitLineService::~GTFSTransitLineService() { _stop.request_stop(); }

void GTFSTransitLineService::setLanguage(std::string tag) {
  const std::lock_guard guard(_shared->lock);
  _shared->language = std::move(tag);
}

std::vector<MapItemIdentifierRef> GTFSTransitLineService::goneLines() const {
  const std::lock_guard guard(_shared->lock);
  return _shared->goneLines;
}

std::map<std::string, Date> GTFSTransitLineService::asOf() const {
  const std::lock_guard guard(_shared->lock);
  return _shared->asOf;
}

void GTFSTransitLineService::lookup(const std::vector<MapItemIdentifierRef>& identifiers, Handler handler) {
  const auto work = [shared = _shared, stop = _stop.get_token(), identifiers, handler = std::move(handler)] {
    std::string language;
    {
      const std::lock_guard guard(shared->lock);
      language = shared->language;
    }
    TransitLineItems items;
    ErrorRef error;
    try {
      auto outcome = lookUpAll(identifiers, shared->library, language, stop);
      error = outcome.error();
      if (outcome) {
        items = std::move(outcome->items);
        const auto gone = takeGone(items, identifiers);
        if (items.empty() && !gone.empty()) error = allGone(gone);
        const std::lock_guard guard(shared->lock);
        shared->goneLines = gone;
        shared->asOf = std::move(outcome->asOf);
      }
    } catch (const std::exception& exception) {
      error = transitLineServiceError(TransitLineServiceError::internal,
                                      std::string("Looking up the lines failed: ") + exception.what() + ".");
    }
    if (stop.stop_requested()) return;
    Platform::current().mainRunLoop().dispatchAsync([stop, handler, items = std::move(items), error] {
      if (!stop.stop_requested()) handler(error ? TransitLineItems() : items, error);
    });
  };
  _queue.dispatchAsync(work);
}

}  // namespace nimbo
