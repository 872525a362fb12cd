#include "process/LineReports.h"

#include <algorithm>
#include <set>
#include <unordered_map>

#include "desktop/gtfs/alerts/IncidentReader.h"
#include "desktop/gtfs/feeds/TransitLineServiceError.h"
#include "desktop/gtfs/static/LineItems.h"
#include "platform/SystemServices.h"
#include "platform/foundation/Hash.h"
#include "process/FeedMessages.h"
#include "process/Snapshot.h"

namespace nimbo {

namespace {

using LineVerdict = GTFSTransitLineService::LineVerdict;

constexpr TimeInterval kPlannedAhead = 7 * 86400;
/// Bytes; an answer has 4 MiB, and a text in JSON may take twice its room.
constexpr std::size_t kRoomForIncidents = 3 << 19;

// Of the reference, by their numbers.
constexpr const char* kEffects[] = {"unknown_effect", "no_service",         "reduced_service",  "significant_delays",
                                    "detour",         "additional_service", "modified_service", "other_effect",
                                    "unknown_effect", "stop_moved",         "no_effect",        "accessibility_issue"};
constexpr const char* kCauses[] = {
    "unknown_cause", "unknown_cause",   "other_cause",       "technical_problem", "strike",
    "demonstration", "accident",        "holiday",           "weather",           "maintenance",
    "construction",  "police_activity", "medical_emergency", "special_event"};

template <std::size_t Count>
std::string wordOf(const char* const (&words)[Count], std::int32_t number) {
  return words[number > 0 && number < static_cast<std::int32_t>(Count) ? number : 0];
}

/// Without its texts unless these are wanted.
protocol::LineIncident lineIncidentOf(const TransitIncident& incident, bool texts) {
  protocol::LineIncident result{.id = std::to_string(incident.muid()),
                                .from = incident.startDate(),
                                .until = incident.endDate(),
                                .effect = wordOf(kEffects, 0),
                                .cause = wordOf(kCauses, 0)};
  if (texts) {
    result.title = incident.title().value_or("");
    result.text = incident.fullDescription() ? incident.fullDescription() : incident.summary();
    result.url = incident.linkURL();
  }
  if (const auto* alert = dynamic_cast<const AlertIncident*>(&incident)) {
    const AlertIncident::Fields& fields = alert->fields();
    result.severity = static_cast<protocol::Severity>(fields.severity - kUnknownSeverity);
    result.effect = wordOf(kEffects, static_cast<std::int32_t>(fields.effect));
    result.cause = wordOf(kCauses, fields.cause);
    result.concern = static_cast<protocol::Concern>(fields.concern);
    result.hasImage = fields.image.address.has_value();
    if (texts) result.imageText = fields.image.text;
  } else if (incident.isBlockingIncident()) {
    result.concern = protocol::Concern::noService;
  }
  return result;
}

std::uint64_t digestOf(const protocol::LineIncident& incident) {
  std::uint64_t digest = hashOfBytes("incident");
  for (const std::string& part :
       {incident.title, incident.text.value_or(""), incident.effect,
        std::to_string(static_cast<int>(incident.severity)), std::to_string(static_cast<int>(incident.concern))})
    digest = hashOfBytes({"\0", 1}, hashOfBytes(part, digest));
  return digest;
}

/// Makes the reports of one answer.
class Reports {
 public:
  /// `unseen` has the numbers of those that are new; absent: all are.
  Reports(std::optional<std::set<std::uint64_t>> unseen, bool texts) : _unseen(std::move(unseen)), _texts(texts) {}
  bool isCut() const { return _isCut; }

  void addVerdict(protocol::LineReport& report, const LineVerdict& verdict) {
    if (verdict.unknownReason) {
      report.reason = fetchErrorOf(*verdict.unknownReason);
      return;
    }
    report.state = protocol::LineState::good;
    for (const TransitIncidentRef& incident : verdict.item->incidents()) {
      const auto start = incident->startDate(), end = incident->endDate();
      if (end && *end < _now) continue;
      if (!start || *start <= _now) {
        report.state = protocol::LineState::affected;
        add(report.incidents, *incident);
      } else if (intervalBetween(_now, *start) <= kPlannedAhead) {
        add(report.planned, *incident);
      }
    }
    std::stable_sort(report.incidents.begin(), report.incidents.end(),
                     [](const auto& a, const auto& b) { return a.severity > b.severity; });
    std::stable_sort(report.planned.begin(), report.planned.end(),
                     [](const auto& a, const auto& b) { return a.from < b.from; });
  }

 private:
  void add(std::vector<protocol::LineIncident>& list, const TransitIncident& incident) {
    protocol::LineIncident written = lineIncidentOf(incident, _texts);
    constexpr std::size_t kFrame = 300;  // keys and dates
    const std::size_t size = kFrame + written.title.size() + written.text.value_or("").size() +
                             written.url.value_or("").size() + written.imageText.value_or("").size();
    if (size > _room) {
      _isCut = true;
      return;
    }
    _room -= size;
    written.isNew = !_unseen || _unseen->contains(incident.muid());
    list.push_back(std::move(written));
  }

  const Date _now = currentDate();
  const std::optional<std::set<std::uint64_t>> _unseen;
  const bool _texts;
  std::size_t _room = kRoomForIncidents;
  bool _isCut = false;
};

/// Absent where nothing was seen.
std::optional<std::set<std::uint64_t>> unseenOf(const GTFSTransitLineService& service, const SeenForms& seen) {
  if (seen.isEmpty()) return std::nullopt;
  std::set<std::uint64_t> unseen;
  for (const auto& [muid, form] : incidentForms(service))
    if (!seen.have(form, currentDate())) unseen.insert(muid);
  return unseen;
}

}  // namespace

std::map<std::uint64_t, IncidentForm> incidentForms(const GTFSTransitLineService& service) {
  std::map<std::uint64_t, IncidentForm> forms;
  for (const LineVerdict& verdict : service.verdicts()) {
    if (verdict.unknownReason) continue;
    for (const TransitIncidentRef& incident : verdict.item->incidents()) {
      IncidentForm& form = forms[incident->muid()];
      if (form.lines.empty()) {
        form.muid = incident->muid();
        form.digest = digestOf(lineIncidentOf(*incident, true));
      }
      const std::uint64_t line = verdict.identifier->muid();
      if (form.lines.empty() || form.lines.back() != line) form.lines.push_back(line);
      const IncidentForm::Period period(incident->startDate(), incident->endDate());
      if (std::find(form.periods.begin(), form.periods.end(), period) == form.periods.end())
        form.periods.push_back(period);
    }
  }
  return forms;
}

protocol::Lines lineReports(const FavoritesEditor& editor, const GTFSTransitLineService& service, const SeenForms& seen,
                            bool texts) {
  protocol::Lines result{.updated = service.updatedAt(), .asked = service.askedAt()};
  const auto favorites = editor.left();
  const ErrorRef damage = favorites ? editor.list().error() : favorites.error();
  if (damage) result.error = fetchErrorOf(*damage);
  if (!favorites) return result;
  std::unordered_map<std::uint64_t, LineVerdict> verdicts;
  for (LineVerdict& verdict : service.verdicts())
    verdicts.emplace(verdict.identifier->muid(), damage ? LineVerdict{verdict.identifier, nullptr, damage} : verdict);
  const ErrorRef notAsked = damage ? damage
                                   : transitLineServiceError(TransitLineServiceError::notAsked,
                                                             "The line has not been looked up yet. Update to see it.");
  Reports reports(unseenOf(service, seen), texts);
  for (const FavoriteRef& favorite : *favorites) {
    const auto* kept = dynamic_cast<const FavoriteTransitLine*>(favorite.get());
    if (!kept || !kept->transitLine()) continue;
    const TransitLine& line = *kept->transitLine();
    const auto found = verdicts.find(line.muid());
    const LineVerdict verdict =
        found == verdicts.end() ? LineVerdict{line.identifier(), nullptr, notAsked} : found->second;
    const TransitLine& shown = verdict.item ? *verdict.item : line;
    protocol::LineReport& report = result.lines.emplace_back();
    report.id = writtenNameOfLine(*line.identifier());
    report.muid = line.muid();
    report.name = shown.artwork() ? shown.artwork()->accessibilityText().value_or("") : "";
    if (report.name.empty()) report.name = shown.name().value_or(report.id);
    report.name = shortened(report.name);
    if (shown.system() && shown.system()->name()) report.agency = shortened(*shown.system()->name());
    if (shown.artwork()) {
      report.shield = shieldOf(*shown.artwork());
      report.shield->accessibilityText = report.name;
    }
    reports.addVerdict(report, verdict);
  }
  result.isCut = reports.isCut();
  return result;
}

}  // namespace nimbo
