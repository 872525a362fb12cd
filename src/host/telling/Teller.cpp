#include "host/telling/Teller.h"

#include <algorithm>
#include <iterator>

#include "host/telling/TellingSettings.h"
#include "platform/Platform.h"
#include "platform/SystemServices.h"
#include "platform/foundation/Log.h"

namespace nimbo {

namespace {

/// As many as are taken at once.
constexpr std::size_t kMostNotices = 50;

}  // namespace

ErrorRef setNotify(DesktopPlatform& platform, const std::string& value) {
  const auto settings = platform.sharedSettings().groupStore();
  const bool wasOn = TellingSettings::read(*settings).isOn;
  if (ErrorRef failure = settings->setValue_forKey(value, kNotifyKey)) return failure;
  return wasOn || !TellingSettings::read(*settings).isOn ? nullptr : ToldIncidents(platform.database()).beginAnew();
}

Teller::Teller(GLibRunLoop& runLoop, DesktopPlatform& platform, Options options)
    : _runLoop(runLoop),
      _options(std::move(options)),
      _settings(platform.sharedSettings().groupStore()),
      _told(platform.database()) {}

Teller::~Teller() {
  if (!_underWay.empty()) forget({_underWay.begin(), _underWay.end()});
}

void Teller::forget(const std::vector<std::string>& keys) {
  if (const ErrorRef error = decide([&keys](ToldState& state) { forgetTold(state, keys); }))
    writeLog({kDefaultLogSubsystem, "Teller"}, LogLevel::error, "What was not shown counts as told: %@",
             {error->reason()});
}

bool Teller::isOn() const { return _options.isAsked || TellingSettings::read(*_settings).isOn; }

void Teller::take(const protocol::Lines& lines, const Completion& completion) {
  const TellingSettings settings = TellingSettings::read(*_settings);
  if (!settings.isOn && !_options.isAsked) return completion(nullptr);
  if (!_texts) _texts.emplace(_options.locale);
  const Date now = currentDate();
  Telling telling;
  const ErrorRef error = decide([&](ToldState& state) {
    telling = tellChanges(state, lines, now, {settings.onlySevere, settings.areQuietAt(now)}, *_texts);
  });
  if (error) return completion(error);
  post(std::move(telling), completion);
}

ErrorRef Teller::decide(const ToldIncidents::Change& change) {
  if (!_remembered) {
    const ErrorRef error = _told.change(change);
    if (!error || _options.needsState) return error;
    writeLog({kDefaultLogSubsystem, "Teller"}, LogLevel::error, "What is told is remembered only: %@",
             {error->reason()});
    const auto kept = _told.state();
    _remembered = kept ? *kept : ToldState();
  }
  change(*_remembered);
  return nullptr;
}

void Teller::post(Telling telling, const Completion& completion) {
  if (telling.notices.empty() && telling.closed.empty()) return completion(nullptr);
  if (!_sender) _sender = std::make_unique<NoticeSender>(_runLoop);
  const std::size_t parts = (telling.notices.size() + kMostNotices - 1) / kMostNotices;
  const auto posting =
      std::make_shared<Posting>(Posting{completion, parts + (telling.closed.empty() ? 0 : 1), nullptr});
  if (!telling.closed.empty())
    _sender->close(std::move(telling.closed), [posting](const ErrorRef& error) { posting->take(error); });
  for (auto first = telling.notices.begin(); first != telling.notices.end();) {
    const auto end = first + std::min<std::ptrdiff_t>(kMostNotices, telling.notices.end() - first);
    std::vector<std::string> aloud;
    for (auto notice = first; notice != end; ++notice)
      if (!notice->silent) aloud.push_back(notice->key);
    _underWay.insert(aloud.begin(), aloud.end());
    std::vector<Notice> part(std::make_move_iterator(first), std::make_move_iterator(end));
    _sender->post(std::move(part), [this, posting, aloud](const ErrorRef& error) {
      for (const std::string& key : aloud) _underWay.erase(_underWay.find(key));
      if (error && !aloud.empty()) forget(aloud);
      posting->take(error);
    });
    first = end;
  }
}

}  // namespace nimbo
