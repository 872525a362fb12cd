#include "desktop/gtfs/feeds/GTFSTransitLineService.h"

#include <algorithm>
#include <future>

#include "desktop/gtfs/feeds/FeedLookup.h"
#include "desktop/gtfs/feeds/TransitLineServiceError.h"
#include "desktop/gtfs/static/LineItems.h"
#include "platform/DueAnswer.h"
#include "platform/Platform.h"
#include "platform/SystemServices.h"

namespace nimbo {

/// What lookups use on the service's threads.
struct GTFSTransitLineService::Shared {
  explicit Shared(const Paths& paths) : library(paths) {}

  void setVerdicts(std::vector<LineVerdict> found) {
    verdicts = std::move(found);
    askedAt = currentDate();
  }

  FeedLibrary library;
  std::map<std::string, HeldAnswer> held;  // by the names of feeds; of the one lookup that runs
  std::mutex lock;
  std::string language = "en";
  std::vector<MapItemIdentifierRef> goneLines;
  std::map<std::string, Date> asOf;
  std::vector<KnownIncident> known;
  std::vector<LineVerdict> verdicts;
  std::optional<Date> updatedAt, youngestAnswer;
  std::optional<Date> askedAt;  // of the verdicts
  bool tookShared = false;
};

namespace {

using KnownIncident = GTFSTransitLineService::KnownIncident;
using LineVerdict = GTFSTransitLineService::LineVerdict;

/// More than anybody reads beside an error.
constexpr std::size_t kMostKnownIncidents = 20;

/// The identifiers that may be of one feed, and their places in the lookup.
struct FeedPart {
  FeedSourceRef source;
  HeldAnswer* held;
  std::vector<MapItemIdentifierRef> identifiers;
  std::vector<std::size_t> places;
};

/// Sorts identifiers by feed; one that is only a number may be of any. `reasons` gets an error for each that is of a
/// feed which is not set up.
Outcome<std::vector<FeedPart>> partsOf(const std::vector<MapItemIdentifierRef>& identifiers, const FeedLibrary& library,
                                       std::map<std::string, HeldAnswer>& held, std::vector<ErrorRef>& reasons) {
  const auto sources = library.sources();
  if (!sources) return sources.error();
  std::vector<FeedPart> parts;
  for (const FeedSourceRef& source : *sources) parts.push_back({source, &held[source->name()], {}, {}});
  for (std::size_t i = 0; i < identifiers.size(); ++i) {
    const auto& locator = identifiers[i]->locator();
    bool found = !locator;
    for (FeedPart& part : parts) {
      if (locator && locator->feed != part.source->name()) continue;
      part.identifiers.push_back(identifiers[i]);
      part.places.push_back(i);
      found = true;
    }
    if (!found) reasons[i] = library.sourceNamed(locator->feed).error()->ofFeed(locator->feed);
  }
  std::erase_if(parts, [](const FeedPart& part) { return part.identifiers.empty(); });
  return parts;
}

Outcome<FeedAnswer> lookUpPart(const FeedPart& part, const std::string& language, Date notBefore,
                               const std::stop_token& stop) {
  try {
    return lookUpInFeed(*part.source, part.identifiers, language, *part.held, notBefore, stop);
  } catch (const std::exception& exception) {
    return transitLineServiceError(
        TransitLineServiceError::internal,
        "Looking up lines of feed \"" + part.source->name() + "\" failed: " + exception.what() + ".");
  }
}

struct Answer {
  TransitLineItems items;         ///< one for each identifier, null for lines that are gone or unknown
  std::vector<ErrorRef> reasons;  ///< one for each, null but for lines of feeds that failed
  std::map<std::string, Date> asOf;
  ErrorRef error;                        ///< of the first feed that failed; null without one
  std::optional<Date> oldest, youngest;  ///< answers of servers
  bool tookShared = false;
  std::vector<KnownIncident> known;  ///< of the other feeds, with an error
};

std::vector<KnownIncident> incidentsInForce(const TransitLineItems& items) {
  std::vector<KnownIncident> known;
  const Date now = currentDate();
  for (const TransitLineItemRef& item : items) {
    if (!item) continue;
    for (const TransitIncidentRef& incident : item->incidents()) {
      if (known.size() == kMostKnownIncidents) return known;
      const auto start = incident->startDate(), end = incident->endDate();
      if ((!start || *start <= now) && (!end || *end >= now))
        known.push_back({item->name().value_or(""), incident->title().value_or("")});
    }
  }
  return known;
}

Outcome<Answer> lookUpAll(const std::vector<MapItemIdentifierRef>& identifiers, const FeedLibrary& library,
                          std::map<std::string, HeldAnswer>& held, const std::string& language, Date notBefore,
                          const std::stop_token& stop) {
  Answer all;
  all.items.resize(identifiers.size());
  all.reasons.resize(identifiers.size());
  const auto parts = partsOf(identifiers, library, held, all.reasons);
  if (!parts) return parts.error();
  std::vector<std::future<Outcome<FeedAnswer>>> others;
  // Deferred where no thread can start: then one feed waits for another.
  for (std::size_t i = 1; i < parts->size(); ++i)
    others.push_back(std::async(std::launch::async | std::launch::deferred,
                                [&, i] { return lookUpPart((*parts)[i], language, notBefore, stop); }));
  std::vector<Outcome<FeedAnswer>> answers;
  if (!parts->empty()) answers.push_back(lookUpPart(parts->front(), language, notBefore, stop));
  for (auto& other : others) answers.push_back(other.get());

  for (std::size_t i = 0; i < answers.size(); ++i) {
    const FeedPart& part = (*parts)[i];
    if (!answers[i]) {
      const ErrorRef error = answers[i].error()->ofFeed(part.source->name());
      for (const std::size_t place : part.places) all.reasons[place] = error;
      continue;
    }
    for (std::size_t k = 0; k < answers[i]->items.size(); ++k)
      if (TransitLineItemRef& item = all.items[part.places[k]]; !item) item = answers[i]->items[k];
    if (answers[i]->asOf) all.asOf.emplace(part.source->name(), *answers[i]->asOf);
    all.tookShared = all.tookShared || answers[i]->isShared;
    if (const auto& answered = answers[i]->answeredAt) {
      all.oldest = std::min(all.oldest.value_or(*answered), *answered);
      all.youngest = std::max(all.youngest.value_or(*answered), *answered);
    }
  }
  for (std::size_t i = 0; i < all.items.size(); ++i) {
    // A line that is only a number may be of another feed than the one that failed.
    if (all.items[i]) all.reasons[i] = nullptr;
    if (!all.error) all.error = all.reasons[i];
  }
  if (all.error) all.known = incidentsInForce(all.items);
  return all;
}

ErrorRef gone(const MapItemIdentifier& identifier) {
  const std::string name = writtenNameOfLine(identifier);
  return transitLineServiceError(TransitLineServiceError::unknownLine,
                                 "The line " + name + " is not in its feed any more. Choose it anew.", name);
}

/// `failure` is the reason of lines that have no other; null: they are gone.
std::vector<LineVerdict> verdictsOf(const std::vector<MapItemIdentifierRef>& identifiers, const Answer& answer,
                                    const ErrorRef& failure) {
  std::vector<LineVerdict> verdicts;
  for (std::size_t i = 0; i < identifiers.size(); ++i) {
    const TransitLineItemRef item = answer.items.empty() ? nullptr : answer.items[i];
    ErrorRef reason = answer.reasons.empty() ? nullptr : answer.reasons[i];
    if (!item && !reason) reason = failure ? failure : gone(*identifiers[i]);
    verdicts.push_back({identifiers[i], item, reason});
  }
  return verdicts;
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
      "No line of the favorites is in its feed any more:" + names + ". Choose the lines anew.", names.substr(1));
}

ErrorRef tooLate(const FeedLibrary& library) {
  if (ErrorRef downloading = library.downloads().firstUnderWay()) return downloading;
  return transitLineServiceError(TransitLineServiceError::timedOut,
                                 "The feeds could not be read within a minute. Try again later.");
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

std::vector<LineVerdict> GTFSTransitLineService::verdicts() const {
  const std::lock_guard guard(_shared->lock);
  return _shared->verdicts;
}

std::optional<Date> GTFSTransitLineService::updatedAt() const {
  const std::lock_guard guard(_shared->lock);
  return _shared->updatedAt;
}

std::optional<Date> GTFSTransitLineService::askedAt() const {
  const std::lock_guard guard(_shared->lock);
  return _shared->askedAt;
}

const FeedLibrary& GTFSTransitLineService::library() const { return _shared->library; }

bool GTFSTransitLineService::tookShared() const {
  const std::lock_guard guard(_shared->lock);
  return _shared->tookShared;
}

std::optional<Date> GTFSTransitLineService::youngestAnswer() const {
  const std::lock_guard guard(_shared->lock);
  return _shared->youngestAnswer;
}

std::map<std::string, Date> GTFSTransitLineService::asOf() const {
  const std::lock_guard guard(_shared->lock);
  return _shared->asOf;
}

std::vector<KnownIncident> GTFSTransitLineService::knownIncidents() const {
  const std::lock_guard guard(_shared->lock);
  return _shared->known;
}

void GTFSTransitLineService::lookup(const std::vector<MapItemIdentifierRef>& identifiers, Handler answer) {
  const Handler handler = [answered = _answered, answer = std::move(answer)](const auto& items, const auto& error) {
    if (answered) answered();
    answer(items, error);
  };
  TimeInterval age = _nextAge.exchange(kUsualAge);
  if (age == kUsualAge && _sharedAge) age = _sharedAge();
  const bool asks = _asksServers.exchange(false) || age == kUsualAge;
  const Date notBefore = asks ? AlertsStore::kNow : dateByAdding(currentDate(), -age);
  std::stop_source giveUp;
  const auto due =
      DueAnswer::start([shared = _shared, serviceStop = _stop.get_token(), giveUp, identifiers, handler]() mutable {
        giveUp.request_stop();
        const ErrorRef error = tooLate(shared->library);
        {
          const std::lock_guard guard(shared->lock);
          shared->known.clear();
          shared->setVerdicts(verdictsOf(identifiers, {}, error));
        }
        if (!serviceStop.stop_requested()) handler({}, error);
      });
  const auto work = [shared = _shared, due, giveUp, serviceStop = _stop.get_token(), identifiers, notBefore, handler] {
    if (due->isClaimed()) return;
    const std::stop_callback endWithService(serviceStop, [giveUp = giveUp]() mutable { giveUp.request_stop(); });
    const std::stop_token stop = giveUp.get_token();
    std::string language;
    {
      const std::lock_guard guard(shared->lock);
      language = shared->language;
    }
    TransitLineItems items;
    ErrorRef error;
    try {
      auto outcome = lookUpAll(identifiers, shared->library, shared->held, language, notBefore, stop);
      if (due->isClaimed()) return;
      error = outcome ? outcome->error : outcome.error();
      auto verdicts = verdictsOf(identifiers, outcome ? *outcome : Answer(), outcome ? nullptr : error);
      std::vector<MapItemIdentifierRef> gone;
      if (!error) {
        items = std::move(outcome->items);
        gone = takeGone(items, identifiers);
        if (items.empty() && !gone.empty()) error = allGone(gone);
      }
      const std::lock_guard guard(shared->lock);
      shared->setVerdicts(std::move(verdicts));
      shared->tookShared = outcome && outcome->tookShared;
      shared->youngestAnswer = outcome ? outcome->youngest : std::nullopt;
      if (!error) shared->updatedAt = std::min(outcome->oldest.value_or(currentDate()), currentDate());
      shared->known = outcome ? std::move(outcome->known) : std::vector<KnownIncident>();
      if (outcome && !outcome->error) {
        shared->goneLines = std::move(gone);
        shared->asOf = std::move(outcome->asOf);
      }
    } catch (const std::exception& exception) {
      error = transitLineServiceError(TransitLineServiceError::internal,
                                      std::string("Looking up the lines failed: ") + exception.what() + ".");
      const std::lock_guard guard(shared->lock);
      shared->setVerdicts(verdictsOf(identifiers, {}, error));
    }
    if (stop.stop_requested()) return;
    Platform::current().mainRunLoop().dispatchAsync([due, serviceStop, handler, items = std::move(items), error] {
      if (!serviceStop.stop_requested() && due->claim()) handler(error ? TransitLineItems() : items, error);
    });
  };
  try {
    _queue.dispatchAsync(work);
  } catch (const std::exception& failure) {
    if (!due->claim()) return;
    const ErrorRef error = transitLineServiceError(
        TransitLineServiceError::internal,
        std::string("Cannot look the lines up: ") + failure.what() + ". Close some programs and try again.");
    {
      const std::lock_guard guard(_shared->lock);
      _shared->setVerdicts(verdictsOf(identifiers, {}, error));
    }
    Platform::current().mainRunLoop().dispatchAsync([serviceStop = _stop.get_token(), handler, error] {
      if (!serviceStop.stop_requested()) handler({}, error);
    });
  }
}

}  // namespace nimbo
