#include "host/telling/TellingRule.h"

#include <algorithm>
#include <charconv>
#include <map>
#include <set>

#include "desktop/gtfs/feeds/FeedConfiguration.h"
#include "desktop/gtfs/text/Utf8.h"
#include "platform/foundation/Hash.h"

namespace nimbo {

namespace {

using protocol::Concern;
using protocol::LineIncident;
using protocol::LineReport;
using protocol::LineState;
using protocol::Severity;

/// One that begins again within this time goes on, as far as its riders care.
constexpr std::chrono::hours kRest{24};
constexpr std::size_t kLongestKeptTitle = 200;  // characters, more than a notice shows

std::uint64_t digestOf(std::initializer_list<std::string> parts) {
  std::uint64_t digest = hashOfBytes("told");
  for (const std::string& part : parts) digest = hashOfBytes({"\0", 1}, hashOfBytes(part, digest));
  return digest;
}

std::uint64_t digestOfTexts(const LineIncident& incident) {
  return digestOf({incident.title, incident.text.value_or("")});
}

std::uint64_t digestOfShown(const LineIncident& incident) {
  return digestOf({incident.title, incident.text.value_or(""), incident.effect, incident.cause,
                   std::to_string(static_cast<int>(incident.severity)),
                   incident.until ? isoTextOfDate(*incident.until) : ""});
}

/// Whether an incident is told at all.
bool counts(const LineIncident& incident, bool onlySevere) {
  if (incident.severity == Severity::severe) return incident.concern > Concern::additionalService;
  if (incident.severity == Severity::info || incident.concern <= Concern::additionalService) return false;
  const bool isGraveWithoutSaying = incident.severity == Severity::unknown && incident.concern == Concern::noService;
  return !onlySevere || isGraveWithoutSaying;
}

/// Whether the favorites are those of the made-up city.
bool isMadeUp(const protocol::Lines& lines) {
  return std::any_of(lines.lines.begin(), lines.lines.end(),
                     [](const LineReport& line) { return line.id.starts_with(std::string(kSampleFeedName) + ":"); });
}

bool isWorse(const LineIncident& incident, const ToldIncident& told) {
  return static_cast<int>(incident.severity) > told.severity || static_cast<int>(incident.concern) > told.concern;
}

std::string keyOf(const char* kind, std::uint64_t muid) { return kind + std::to_string(muid); }

template <class Container>
bool has(const Container& container, const typename Container::value_type& value) {
  return std::find(container.begin(), container.end(), value) != container.end();
}

/// Decides on one answer.
class Decision {
 public:
  Decision(ToldState& state, const protocol::Lines& lines, Date now, TellingLimits limits, const NoticeTexts& texts)
      : _state(state), _answer(lines), _now(now), _limits(limits), _texts(texts) {}

  Telling decide() {
    takeLines();
    takePresent();
    takeRenumbered();
    for (ToldIncident& told : _state.incidents) judge(told);
    for (const auto& [muid, present] : _present)
      if (present.isInForce && !_isRecorded.contains(muid)) judgeUnknown(muid, present);
    std::erase_if(_state.incidents, [this](const ToldIncident& told) { return _gone.contains(told.muid); });
    tellBegun();
    tellEnded();
    followTexts();
    return std::move(_telling);
  }

 private:
  /// An incident of the answer.
  struct Present {
    const LineIncident* incident = nullptr;  // in force, else the next one planned
    bool isInForce = false;
    std::vector<const LineReport*> lines;
  };

  void takeLines() {
    std::vector<std::uint64_t> known;
    for (const LineReport& line : _answer.lines) {
      _reports[line.muid] = &line;
      const bool wasKnown = has(_state.lines, line.muid);
      if (wasKnown) _familiar.insert(line.muid);
      if (wasKnown || line.state != LineState::unknown) known.push_back(line.muid);
    }
    std::sort(known.begin(), known.end());
    _state.lines = std::move(known);
  }

  void takePresent() {
    for (const LineReport& line : _answer.lines)
      for (const auto* list : {&line.incidents, &line.planned})
        for (const LineIncident& incident : *list) {
          std::uint64_t muid = 0;
          std::from_chars(incident.id.data(), incident.id.data() + incident.id.size(), muid);
          Present& present = _present[muid];
          const bool isInForce = list == &line.incidents;
          if (!present.incident || (isInForce && !present.isInForce)) present.incident = &incident;
          present.isInForce = present.isInForce || isInForce;
          if (present.lines.empty() || present.lines.back() != &line) present.lines.push_back(&line);
        }
  }

  /// An incident that is gone, and one that says the same under a new number on one of its lines, are one.
  void takeRenumbered() {
    std::multimap<std::uint64_t, ToldIncident*> missing;
    for (ToldIncident& told : _state.incidents) {
      if (_present.contains(told.muid))
        _isRecorded.insert(told.muid);
      else
        missing.emplace(told.texts, &told);
    }
    for (const auto& [muid, present] : _present) {
      if (_isRecorded.contains(muid)) continue;
      const auto [begin, end] = missing.equal_range(digestOfTexts(*present.incident));
      const auto same = std::find_if(begin, end, [&lines = present.lines](const auto& entry) {
        return std::any_of(lines.begin(), lines.end(),
                           [&entry](const LineReport* line) { return has(entry.second->lines, line->muid); });
      });
      if (same == end) continue;
      same->second->muid = muid;
      _isRecorded.insert(muid);
      missing.erase(same);
    }
  }

  bool isUnknown(std::uint64_t line) const {
    const auto report = _reports.find(line);
    return report != _reports.end() && report->second->state == LineState::unknown;
  }

  void judge(ToldIncident& told) {
    std::erase_if(told.lines, [this](std::uint64_t line) { return !_reports.contains(line); });
    const auto found = _present.find(told.muid);
    if (found == _present.end()) return judgeMissing(told);
    const Present& present = found->second;
    const LineIncident& incident = *present.incident;
    std::erase_if(told.lines, [this](std::uint64_t line) { return !isUnknown(line); });
    for (const LineReport* line : present.lines) told.lines.push_back(line->muid);
    std::sort(told.lines.begin(), told.lines.end());
    if (!present.isInForce) {
      if (!told.restsSince) told.restsSince = _now;
      return leaveNotice(told);
    }
    const bool beginsAgain = told.restsSince && _now >= *told.restsSince + kRest;
    const bool isDue =
        (beginsAgain || isWorse(incident, told)) && incident.isNew && counts(incident, _limits.onlySevere);
    if (isDue && _limits.isQuiet) return;
    told.restsSince = std::nullopt;
    if (isDue) _begun.push_back({told.muid, !beginsAgain && told.wasTold});
    if (!incident.isNew) leaveNotice(told);
    note(told, incident);
  }

  /// One that is in no list any more.
  void judgeMissing(ToldIncident& told) {
    if (!told.lines.empty() && (_answer.isCut || std::any_of(told.lines.begin(), told.lines.end(),
                                                             [this](std::uint64_t line) { return isUnknown(line); })))
      return;
    _gone.insert(told.muid);
    if (!told.lines.empty() && told.wasTold && !told.restsSince && !_limits.isQuiet) _ended.push_back(told);
    leaveNotice(told);
  }

  void judgeUnknown(std::uint64_t muid, const Present& present) {
    const LineIncident& incident = *present.incident;
    const bool isFamiliar = std::any_of(present.lines.begin(), present.lines.end(),
                                        [this](const LineReport* line) { return _familiar.contains(line->muid); });
    const bool countsAsTold = !isFamiliar || !incident.isNew;
    if (!counts(incident, _limits.onlySevere) || (_limits.isQuiet && !countsAsTold)) return;
    ToldIncident told{.muid = muid};
    for (const LineReport* line : present.lines) told.lines.push_back(line->muid);
    std::sort(told.lines.begin(), told.lines.end());
    note(told, incident);
    _state.incidents.push_back(std::move(told));
    if (!countsAsTold) _begun.push_back({muid, false});
  }

  void note(ToldIncident& told, const LineIncident& incident) {
    const std::uint64_t shown = digestOfShown(incident);
    if (told.shown != shown && !told.key.empty()) _changedKeys.insert(told.key);
    told.texts = digestOfTexts(incident);
    told.shown = shown;
    told.title = firstCharacters(incident.title, kLongestKeptTitle);
    told.severity = std::max(told.severity, static_cast<int>(incident.severity));
    told.concern = std::max(told.concern, static_cast<int>(incident.concern));
  }

  void leaveNotice(ToldIncident& told) {
    if (told.key.empty()) return;
    _changedKeys.insert(told.key);
    told.key.clear();
  }

  IncidentOnLines asTold(const ToldIncident& told) const {
    IncidentOnLines result{.title = told.title};
    for (const LineReport& line : _answer.lines)  // in the order that the user gave them
      if (has(told.lines, line.muid)) result.lines.push_back(&line);
    if (const auto present = _present.find(told.muid); present != _present.end())
      result.incident = present->second.incident;
    return result;
  }

  /// The gravest first.
  std::vector<IncidentOnLines> asTold(std::vector<const ToldIncident*> told) const {
    std::stable_sort(told.begin(), told.end(), [](const ToldIncident* one, const ToldIncident* other) {
      return std::pair(one->severity, one->concern) > std::pair(other->severity, other->concern);
    });
    std::vector<IncidentOnLines> result;
    result.reserve(told.size());
    for (const ToldIncident* one : told) result.push_back(asTold(*one));
    return result;
  }

  void tellBegun() {
    if (_begun.empty()) return;
    const auto least = std::min_element(_begun.begin(), _begun.end(),
                                        [](const Begun& one, const Begun& other) { return one.muid < other.muid; });
    const std::string key = keyOf(_begun.size() == 1 ? "incident-" : "incidents-", least->muid);
    std::set<std::uint64_t> muids;
    for (const Begun& begun : _begun) muids.insert(begun.muid);
    std::vector<const ToldIncident*> members;
    for (ToldIncident& told : _state.incidents) {
      if (muids.contains(told.muid)) {
        leaveNotice(told);
        told.key = key;
        told.wasTold = true;
      }
      if (told.key == key) members.push_back(&told);
    }
    Notice notice = members.size() == 1 ? _texts.noticeOf(asTold(*members.front()), _begun.front().isWorse, _now)
                                        : _texts.noticeOfAll(asTold(members));
    post(std::move(notice), key);
  }

  void tellEnded() {
    if (_ended.empty()) return;
    std::vector<const ToldIncident*> ended;
    std::uint64_t least = _ended.front().muid;
    for (const ToldIncident& told : _ended) {
      ended.push_back(&told);
      least = std::min(least, told.muid);
    }
    post(_texts.noticeOfEnded(asTold(ended)), keyOf(ended.size() == 1 ? "incident-" : "ended-", least));
  }

  void post(Notice notice, const std::string& key) {
    notice.key = key;
    _changedKeys.erase(key);
    _telling.notices.push_back(std::move(notice));
  }

  /// Brings the notices that stand up to date.
  void followTexts() {
    std::map<std::string, std::vector<const ToldIncident*>> members;
    for (const ToldIncident& told : _state.incidents)
      if (_changedKeys.contains(told.key)) members[told.key].push_back(&told);
    for (const std::string& key : _changedKeys) {
      const auto those = members.find(key);
      if (those == members.end()) {
        _telling.closed.push_back(key);
        continue;
      }
      const std::vector<IncidentOnLines> told = asTold(those->second);
      // Of one whose line is unknown the notice stays as it is.
      const bool isAlone = told.size() == 1;
      if (isAlone && !told.front().incident) continue;
      Notice notice = isAlone ? _texts.noticeOf(told.front(), false, _now) : _texts.noticeOfAll(told);
      notice.key = key;
      notice.silent = true;
      _telling.notices.push_back(std::move(notice));
    }
  }

  struct Begun {
    std::uint64_t muid;
    bool isWorse;
  };

  ToldState& _state;
  const protocol::Lines& _answer;
  const Date _now;
  const TellingLimits _limits;
  const NoticeTexts& _texts;
  std::map<std::uint64_t, const LineReport*> _reports;  // of all favorites
  std::set<std::uint64_t> _familiar;                    // lines that were known before this answer
  std::map<std::uint64_t, Present> _present;
  std::set<std::uint64_t> _isRecorded;  // numbers of the answer that the state has
  std::set<std::uint64_t> _gone;
  std::vector<Begun> _begun;  // or worse
  std::vector<ToldIncident> _ended;
  std::set<std::string> _changedKeys;  // of notices that stand and say something else now
  Telling _telling;
};

}  // namespace

Telling tellChanges(ToldState& state, const protocol::Lines& lines, Date now, TellingLimits limits,
                    const NoticeTexts& texts) {
  // Of a clock that was set back the later date says nothing.
  const bool isOld = lines.asked && state.asked && *lines.asked < *state.asked && *state.asked <= now;
  if (!lines.asked || lines.error || isOld || isMadeUp(lines)) return {};
  const ToldState before = state;
  Telling telling = Decision(state, lines, now, limits, texts).decide();
  std::sort(state.incidents.begin(), state.incidents.end(),
            [](const ToldIncident& one, const ToldIncident& other) { return one.muid < other.muid; });
  if (!(state == before)) state.asked = lines.asked;
  return telling;
}

void forgetTold(ToldState& state, const std::vector<std::string>& keys) {
  std::erase_if(state.incidents, [&](const ToldIncident& told) { return has(keys, told.key); });
}

}  // namespace nimbo
