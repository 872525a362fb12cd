#include "desktop/gtfs/alerts/AlertsFeed.h"

#include <algorithm>
#include <array>
#include <set>
#include <unordered_map>

#include "desktop/gtfs/ContentHash.h"
#include "desktop/gtfs/alerts/AlertPeriods.h"
#include "desktop/gtfs/alerts/RealtimeFields.h"
#include "desktop/gtfs/feeds/TransitLineServiceError.h"
#include "desktop/gtfs/text/Translation.h"

namespace nimbo {

namespace {

constexpr std::size_t kMostEntities = 100'000;  // no network comes near; each costs memory

ErrorRef badAlerts(const std::string& place, const std::string& what) {
  return transitLineServiceError(TransitLineServiceError::badAlerts,
                                 "The alerts feed " + place + " cannot be used: " + what, place);
}

/// Why bytes that are no feed are none.
std::string whatElse(std::string_view bytes) {
  const std::size_t begin = bytes.find_first_not_of(" \t\r\n\xEF\xBB\xBF");
  if (bytes.empty()) return "it is empty. Try again later, or check the address.";
  const char first = begin == std::string_view::npos ? ' ' : bytes[begin];
  if (first == '<') return "it is a web page or XML. Give the address of the GTFS-Realtime feed in binary form.";
  if (first == '{' || first == '[') return "it is JSON. Give the address of the GTFS-Realtime feed in binary form.";
  return "it is cut off or no GTFS-Realtime feed in binary form. Try again later, or check the address.";
}

/// The languages of an alert's header and of its description.
using Languages = std::array<std::set<std::string_view>, 2>;

/// Absent when the alert is damaged, which is found again, and counted, when it is read.
std::optional<Languages> languagesOf(std::string_view alert) {
  constexpr std::array kFields{AlertField::headerText, AlertField::descriptionText};
  Languages languages;
  try {
    for (std::size_t i = 0; i < kFields.size(); ++i)
      for (const Translation& text : translationsIn(alert, kFields[i])) languages[i].insert(text.language);
  } catch (const protozero::exception&) {
    return std::nullopt;
  }
  return languages;
}

/// Whether no text of the one may be in the same language as the same text of the other.
bool areApart(const Languages& languages, const Languages& others) {
  for (std::size_t i = 0; i < languages.size(); ++i) {
    if (languages[i].empty() || others[i].empty()) continue;
    if (languages[i].contains({}) || others[i].contains({})) return false;
    for (const std::string_view language : others[i])
      if (languages[i].contains(language)) return false;
  }
  return true;
}

}  // namespace

ErrorRef alertBreaksOff(const std::string& place) {
  return transitLineServiceError(TransitLineServiceError::cutOff,
                                 "The alerts feed " + place +
                                     " cannot be used: one of its alerts breaks off before it says what it is about. "
                                     "Try again later, or tell the publisher.",
                                 place);
}

void AlertsFeed::readHeader(std::string_view body) {
  for (auto header = messageIn<FeedHeaderField>(body); header.next();) {
    switch (header.tag()) {
      case FeedHeaderField::gtfsRealtimeVersion:
        _version = takeRequiredView(header);
        break;
      case FeedHeaderField::incrementality:
        _isDifferential = takeRequiredNumber(header) == kIncrementalityDifferential;
        break;
      case FeedHeaderField::timestamp:
        _timestamp = dateOfFeedTime(takeRequiredNumber(header));
        break;
      default:
        header.skip();
    }
  }
}

void AlertsFeed::readEntity(std::string_view body) {
  AlertEntity alert;
  bool isDeleted = false, hasAlert = false;
  std::size_t* other = nullptr;
  auto entity = messageIn<FeedEntityField>(body);
  try {
    while (entity.next()) {
      switch (entity.tag()) {
        case FeedEntityField::id:
          alert.id = takeView(entity);
          break;
        case FeedEntityField::isDeleted:
          isDeleted = takeNumber(entity) != 0;
          break;
        case FeedEntityField::alert:
          alert.body = takeRequiredView(entity);
          hasAlert = true;
          break;
        default:
          other = entity.tag() == FeedEntityField::vehicle      ? &_vehicles
                  : entity.tag() == FeedEntityField::tripUpdate ? &_tripUpdates
                                                                : &_others;
          entity.skip();
      }
    }
  } catch (const protozero::exception&) {
    // What was read of an alert counts, whatever is wrong behind it.
    if (!hasAlert && entity.tag() == FeedEntityField::alert &&
        entity.wire_type() == protozero::pbf_wire_type::length_delimited) {
      alert.body = body.substr(body.size() - entity.length());
      hasAlert = alert.breaksOff = true;
    }
    if (!hasAlert) {
      _skipped.add("entity that is damaged", alert.id);
      _gap = alertBreaksOff(_place);
      return;
    }
  }
  if (hasAlert)
    ++_alertEntities;
  else if (other)
    ++*other;
  if (isDeleted)
    _skipped.add("deleted entity", alert.id);
  else if (!hasAlert)
    _skipped.add(other ? "entity that is no alert" : "entity without content", alert.id);
  else
    _alerts.push_back(alert);
}

std::string AlertsFeed::otherContent() const {
  const std::string what = _vehicles > 0 && _tripUpdates > 0 ? "positions of vehicles and times of trips"
                           : _vehicles > 0                   ? "positions of vehicles"
                           : _tripUpdates > 0                ? "times of trips"
                                                             : "something else";
  return "it tells " + what +
         " and holds no alert. Give the address of the alerts; where it is this one, set \"combined\" for it.";
}

bool AlertsFeed::hasRepeated() const {
  std::vector<std::uint64_t> hashes;
  hashes.reserve(_alerts.size());
  for (const AlertEntity& alert : _alerts)
    if (!alert.id.empty()) hashes.push_back(contentHash(alert.id));
  std::sort(hashes.begin(), hashes.end());
  return std::adjacent_find(hashes.begin(), hashes.end()) != hashes.end();
}

void AlertsFeed::joinLanguages() {
  /// The first alert of an identifier that has come again.
  struct Repeated {
    std::optional<Languages> languages;  // absent: it takes no others
    std::string* joined = nullptr;
  };
  std::unordered_map<std::string_view, std::size_t> places;  // of the first alert of each identifier
  std::unordered_map<std::size_t, Repeated> repeated;        // by that place
  places.reserve(_alerts.size());
  std::size_t count = 0;
  for (AlertEntity alert : _alerts) {  // a copy: those that stay move up in place
    if (alert.id.empty()) {
      _alerts[count++] = alert;
      continue;
    }
    const auto [place, isNew] = places.try_emplace(alert.id, count);
    if (!isNew) {
      AlertEntity& other = _alerts[place->second];
      const auto [found, isSecond] = repeated.try_emplace(place->second);
      Repeated& first = found->second;
      if (isSecond && !other.breaksOff) first.languages = languagesOf(other.body);
      if (auto languages = first.languages && !alert.breaksOff ? languagesOf(alert.body) : std::nullopt;
          languages && areApart(*first.languages, *languages)) {
        // Messages one after the other are one message with the fields of both.
        if (!first.joined) first.joined = &_joined->emplace_back(other.body);
        other.body = first.joined->append(alert.body);
        for (std::size_t i = 0; i < languages->size(); ++i) (*first.languages)[i].merge((*languages)[i]);
        continue;
      }
      alert.isRepeated = true;
    }
    _alerts[count++] = alert;
  }
  _alerts.resize(count);
}

Outcome<AlertsFeed> AlertsFeed::read(std::string bytes, const std::string& place, bool isCombined) {
  AlertsFeed feed;
  feed._place = place;
  feed._bytes = std::make_shared<const std::string>(std::move(bytes));
  if (feed._bytes->empty()) return badAlerts(place, whatElse({}));
  std::size_t entities = 0;
  try {
    for (auto message = messageIn<FeedMessageField>(*feed._bytes); message.next();) {
      switch (message.tag()) {
        case FeedMessageField::header:
          feed.readHeader(takeRequiredView(message));
          break;
        case FeedMessageField::entity: {
          const std::string_view body = takeRequiredView(message);
          if (++entities > kMostEntities)
            return transitLineServiceError(TransitLineServiceError::tooLarge,
                                           "The alerts feed " + place + " holds more than " +
                                               std::to_string(kMostEntities) + " entities. Check the address.",
                                           place);
          feed.readEntity(body);
          break;
        }
        default:
          message.skip();
      }
    }
  } catch (const protozero::exception&) {
    return badAlerts(place, whatElse(*feed._bytes));
  }
  if (feed._version.empty()) return badAlerts(place, whatElse(*feed._bytes));
  if (feed._isDifferential)
    return badAlerts(place,
                     "it tells only what changed (incrementality DIFFERENTIAL). Ask the publisher for a whole feed.");
  if (feed.hasOthers() && feed._alertEntities == 0 && !isCombined)
    return transitLineServiceError(TransitLineServiceError::otherFeed,
                                   "The alerts feed " + place + " is another one: " + feed.otherContent(), place);
  if (feed.hasRepeated()) feed.joinLanguages();
  return feed;
}

}  // namespace nimbo
