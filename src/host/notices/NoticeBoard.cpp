#include "host/notices/NoticeBoard.h"

#include <algorithm>
#include <set>
#include <string_view>
#include <utility>

namespace nimbo {

namespace {

constexpr std::size_t kLongestKey = 200, kLongestTitle = 4000, kLongestBody = 50'000, kLongestAddress = 2000;
constexpr std::string_view kScheme = "nimbo:";

bool isText(const std::string& text, std::size_t longest) {
  return text.size() <= longest && g_utf8_validate(text.data(), static_cast<gssize>(text.size()), nullptr);
}

/// Empty where nothing is wrong.
std::string problemOfNotice(const Notice& notice) {
  if (notice.key.empty() || !isText(notice.key, kLongestKey)) return "its key is empty or too long";
  if (notice.title.empty() || !isText(notice.title, kLongestTitle)) return "its title is empty or too long";
  if (!isText(notice.body, kLongestBody)) return "its text is too long";
  // What a click opens is a page of this program, whoever posts.
  if (!notice.opens.empty() && (!notice.opens.starts_with(kScheme) || !isText(notice.opens, kLongestAddress)))
    return "it opens another address than this program's";
  return {};
}

}  // namespace

ErrorRef NoticeBoard::problemOf(const std::vector<Notice>& notices) {
  if (notices.size() > kMostPosted) return noticeError(NoticeError::unfit, "more than 50 at once");
  std::set<std::string_view> keys;
  for (const Notice& notice : notices) {
    std::string problem = problemOfNotice(notice);
    if (!keys.insert(notice.key).second) problem = "its key is there twice";
    if (!problem.empty()) return noticeError(NoticeError::unfit, problem);
  }
  return nullptr;
}

ErrorRef NoticeBoard::problemOfKeys(const std::vector<std::string>& keys) {
  if (keys.size() <= kMostClosed && std::ranges::all_of(keys, [](const auto& key) { return isText(key, kLongestKey); }))
    return nullptr;
  return noticeError(NoticeError::unfit, "more than 10,000 keys, or one that is too long");
}

NoticeBoard::NoticeBoard(RunLoop& runLoop, Bus& bus, Events events)
    : _runLoop(runLoop),
      _events(std::move(events)),
      _desktop(bus, {[this](const Reference& closed) {
                       forget([&](const Reference& standing) { return standing == closed; });
                     },
                     [this](const Reference& clicked, const std::string& token) {
                       const Entry* entry = entryOf(clicked);
                       if (entry && _events.open && !entry->told->opens.empty())
                         _events.open(entry->told->opens, token);
                     },
                     [this](const std::string& service) {
                       forget([&](const Reference& standing) { return standing.service == service; });
                     }}) {}

/// A completion to be called so many times that answers `completion` once, with the first error, and in time.
NoticeCompletion NoticeBoard::shared(std::size_t answers, NoticeCompletion completion) {
  struct State {
    std::size_t missing;
    ErrorRef error;
    NoticeCompletion completion;
  };
  auto state =
      std::make_shared<State>(State{answers, nullptr, answeredWithin(_runLoop, kPatience, std::move(completion))});
  return [state](const ErrorRef& error) {
    if (!state->error) state->error = error;
    if (--state->missing == 0) state->completion(state->error);
  };
}

void NoticeBoard::post(const std::vector<Notice>& notices, NoticeCompletion completion) {
  ErrorRef problem = problemOf(notices);
  if (problem || notices.empty()) return completion(problem);
  const auto answered = shared(notices.size(), std::move(completion));
  for (const Notice& notice : notices) {
    if (!_entries.contains(notice.key) && !makeRoom()) {
      answered(noticeError(NoticeError::unfit, "200 stand already"));
      continue;
    }
    _entries[notice.key].age = ++_posts;
    want(notice.key, notice, answered);
  }
}

void NoticeBoard::close(const std::vector<std::string>& keys, NoticeCompletion completion) {
  ErrorRef problem = problemOfKeys(keys);
  if (problem || keys.empty()) return completion(problem);
  const auto answered = shared(keys.size(), std::move(completion));
  for (const std::string& key : keys) {
    if (_entries.contains(key))
      want(key, std::nullopt, answered);
    else
      answered(nullptr);
  }
}

void NoticeBoard::want(const std::string& key, std::optional<Notice> notice, const NoticeCompletion& answered) {
  Entry& entry = _entries.find(key)->second;
  if (entry.waiting.size() >= kMostWaiting) return answered(noticeError(NoticeError::noAnswer));
  entry.wanted = std::move(notice);
  entry.waiting.push_back(answered);
  settle(key);
}

bool NoticeBoard::makeRoom() {
  if (_entries.size() < kMostKept) return true;
  auto oldest = _entries.end();
  for (auto entry = _entries.begin(); entry != _entries.end(); ++entry)
    if (entry->second.standing.id == 0 && !entry->second.isAsked &&
        (oldest == _entries.end() || entry->second.age < oldest->second.age))
      oldest = entry;
  if (oldest == _entries.end()) return false;
  _entries.erase(oldest);
  return true;
}

/// Makes what stands into what is wanted, one question to the service after the other.
void NoticeBoard::settle(const std::string& key) {
  Entry& entry = _entries.find(key)->second;
  if (entry.isAsked) return;
  if (!entry.wanted) {
    if (entry.standing.id == 0) return answer(key, nullptr);
    entry.isAsked = true;
    return _desktop.close(entry.standing, [this, key] {
      Entry& closed = _entries.find(key)->second;
      closed.isAsked = false;
      closed.standing = {};
      closed.told.reset();
      settle(key);
    });
  }
  if (entry.told && entry.told->tellsTheSame(*entry.wanted)) return answer(key, nullptr);
  if (entry.wanted->silent && entry.standing.id == 0) {
    if (entry.told) entry.told = entry.wanted;
    return answer(key, nullptr);
  }
  show(key, entry);
}

void NoticeBoard::show(const std::string& key, Entry& entry) {
  entry.isAsked = true;
  const Notice asked = *entry.wanted;
  const bool takesClicks = _events.open && !asked.opens.empty();
  _desktop.show(asked, takesClicks, entry.standing, [this, key, asked](const Outcome<Reference>& shown) {
    Entry& answered = _entries.find(key)->second;
    answered.isAsked = false;
    if (!shown) return answer(key, shown.error());
    // A service that gives a number again has put this in the other one's place.
    if (Entry* other = entryOf(*shown)) other->standing = {};
    answered.standing = *shown;
    answered.told = asked;
    settle(key);
  });
}

void NoticeBoard::answer(const std::string& key, const ErrorRef& error) {
  const auto found = _entries.find(key);
  const auto waiting = std::exchange(found->second.waiting, {});
  if (found->second.standing.id == 0 && !(found->second.wanted && found->second.told)) _entries.erase(found);
  for (const auto& completion : waiting) completion(error);
  if (_events.changed) _events.changed();
}

NoticeBoard::Entry* NoticeBoard::entryOf(const Reference& reference) {
  for (auto& [key, entry] : _entries)
    if (entry.standing.id != 0 && entry.standing == reference) return &entry;
  return nullptr;
}

void NoticeBoard::forget(const std::function<bool(const Reference&)>& which) {
  for (auto& [key, entry] : _entries)
    if (entry.standing.id != 0 && which(entry.standing)) entry.standing = {};
  if (_events.changed) _events.changed();
}

bool NoticeBoard::isIdle() const {
  return std::ranges::all_of(_entries,
                             [](const auto& entry) { return entry.second.standing.id == 0 && !entry.second.isAsked; });
}

}  // namespace nimbo
