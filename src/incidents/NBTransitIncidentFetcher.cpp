#include "incidents/NBTransitIncidentFetcher.h"

#include "incidents/DebugTransitIncident.h"
#include "incidents/FavoritesStore+Nimbo.h"
#include "incidents/SharedSettingsStore+Nimbo.h"
#include "platform/Platform.h"
#include "platform/SerialQueue.h"
#include "platform/foundation/Log.h"
#include "util/NimboMap.h"

namespace nimbo {

std::shared_ptr<_NBTransitIncidentFetcherRequest> _NBTransitIncidentFetcherRequest::initWithCompletionHandler(
    NBTransitIncidentFetcherHandler handler) {
  auto request = std::make_shared<_NBTransitIncidentFetcherRequest>();
  if (handler) request->_handlers.push_back(std::move(handler));
  return request;
}

void _NBTransitIncidentFetcherRequest::addHandler(NBTransitIncidentFetcherHandler handler) {
  if (!handler) return;
  std::unique_lock guard(_lock);
  if (!_result) return _handlers.push_back(std::move(handler));
  const ResultRef result = _result;
  guard.unlock();
  handler(result);
}

ResultRef _NBTransitIncidentFetcherRequest::result() const {
  const std::lock_guard guard(_lock);
  return _result;
}

std::vector<NBTransitIncidentFetcherHandler> _NBTransitIncidentFetcherRequest::handlers() const {
  const std::lock_guard guard(_lock);
  return _handlers;
}

void _NBTransitIncidentFetcherRequest::setResultAndInvokeCompletionHandlers(ResultRef result) {
  std::unique_lock guard(_lock);
  _result = result;
  const auto handlers = _handlers;
  guard.unlock();
  // One that throws keeps no other from hearing.
  for (const auto& handler : handlers) runGuarded("handler of a fetch", [&] { handler(result); });
}

namespace {

TransitLineRef transitLineOfFavorite(const FavoriteRef& favorite, std::size_t) {
  const auto* lineFavorite = dynamic_cast<const FavoriteTransitLine*>(favorite.get());
  return lineFavorite ? lineFavorite->transitLine() : nullptr;
}

/// Runs a step of a fetch. One that throws ends the fetch with an error, since nothing else would.
template <class Step>
void runStep(const std::shared_ptr<_NBTransitIncidentFetcherRequest>& request, const Step& step) try {
  step();
} catch (const std::exception& exception) {
  const ErrorRef error = Error::errorWithDomain_code_reason(
      "NBTransitIncidentFetcher", 0, std::string("Fetching the incidents failed: ") + exception.what() + ".");
  Platform::current().mainRunLoop().dispatchAsync(
      [request, error] { request->setResultAndInvokeCompletionHandlers(Result::resultWithError(error)); });
}

}  // namespace

std::shared_ptr<NBTransitIncidentFetcherRequest>
NBTransitIncidentFetcher::fetchFavoriteLinesTransitIncidentsWithCompletionHandler(
    NBTransitIncidentFetcherHandler handler) {
  auto request = _NBTransitIncidentFetcherRequest::initWithCompletionHandler(std::move(handler));
  const auto self = std::static_pointer_cast<NBTransitIncidentFetcher>(shared_from_this());
  const auto fetchForFavorites = [self, request](const std::optional<Favorites>& favorites) {
    writeLog(NBTransitWidgetLogFacility, LogLevel::debug, "Received %lu favorites from container.",
             {favorites ? favorites->size() : 0});
    const auto lines = NimboMap(favorites, transitLineOfFavorite);
    if (lines && !lines->empty()) return self->_fetchIncidentsForLines_withRequest(*lines, request);
    writeLog(NBTransitWidgetLogFacility, LogLevel::debug, "0 Favorite lines, returning early.");
    Platform::current().mainRunLoop().dispatchAsync([request] {
      request->setResultAndInvokeCompletionHandlers(
          Result::resultWithValue(BoxedArray::of<TransitLineItem>(TransitLineItems{})));
    });
  };
  runStep(request, [&] {
    defaultContainer()->readContents([request, fetchForFavorites](const std::optional<Favorites>& favorites) {
      runStep(request, [&] { fetchForFavorites(favorites); });
    });
  });
  return request;
}

void NBTransitIncidentFetcher::_fetchIncidentsForLines_withRequest(
    const std::vector<TransitLineRef>& lines, std::shared_ptr<_NBTransitIncidentFetcherRequest> request) {
  const auto identifiers = NimboMap(lines, [](const TransitLineRef& line, std::size_t) { return line->identifier(); });
  writeLog(NBTransitWidgetLogFacility, LogLevel::debug, "Issuing favorite lines lookup request for Muids: %{private}@.",
           {BoxedArray::of<MapItemIdentifier>(identifiers)});
  const auto self = std::static_pointer_cast<NBTransitIncidentFetcher>(shared_from_this());
  Platform::current().transitLines().lookup(
      identifiers, [self, request = std::move(request)](const TransitLineItems& items, const ErrorRef& error) {
        if (error) {
          writeLog(NBTransitWidgetLogFacility, LogLevel::debug, "Received error: %{private}@.", {error});
          return request->setResultAndInvokeCompletionHandlers(Result::resultWithError(error));
        }
        runStep(request, [&] {
          const bool fakes = __nimbo_groupUserDefaults()->boolForKey(kNimboTransitWidgetDebugInjectFakeIncidents);
          const TransitLineItems delivered = fakes ? self->_fakeLineItemsFromItems(items) : items;
          writeLog(NBTransitWidgetLogFacility, LogLevel::debug, "Received %lu line items.", {delivered.size()});
          request->setResultAndInvokeCompletionHandlers(
              Result::resultWithValue(BoxedArray::of<TransitLineItem>(delivered)));
        });
      });
}

TransitLineItems NBTransitIncidentFetcher::_fakeLineItemsFromItems(const TransitLineItems& items) const {
  RandomSource& random = Platform::current().random();
  const bool randomNumber = __nimbo_groupUserDefaults()->boolForKey(kNimboTransitWidgetDebugRandomNumberIncidents);
  return NimboMap(items, [&](const TransitLineItemRef& item, std::size_t) -> TransitLineItemRef {
    if (!item->incidents().empty() || random.next() % 3 == 0) return item;
    TransitIncidents incidents(randomNumber ? random.next() % 3 : 1);
    for (TransitIncidentRef& incident : incidents)
      incident = DebugTransitIncident::__debug_fakeIncidentAffectingLine(*item);
    return DebugTransitLineItem::initWithLine_incidents(item, std::move(incidents));
  });
}

}  // namespace nimbo
