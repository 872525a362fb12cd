#pragma once

#include <algorithm>
#include <deque>
#include <future>
#include <map>
#include <memory>
#include <mutex>
#include <optional>
#include <string>
#include <utility>
#include <vector>

#include "platform/AnalyticsPipeline.h"
#include "platform/FavoritesStore.h"
#include "platform/Localization.h"
#include "platform/MemoryPressure.h"
#include "platform/RunLoop.h"
#include "platform/SharedSettingsStore.h"
#include "platform/SystemServices.h"
#include "platform/TransitLineService.h"
#include "platform/UserActivity.h"
#include "platform/foundation/Log.h"
#include "support/TestRunLoop.h"

namespace nimbo {

/// Gives the numbers of its script, then 0.
class ScriptedRandomSource final : public RandomSource {
 public:
  std::uint32_t next() override {
    if (isBroken) throw std::runtime_error("no random numbers");
    if (numbers.empty()) return 0;
    const std::uint32_t number = numbers.front();
    numbers.pop_front();
    return number;
  }
  std::deque<std::uint32_t> numbers;
  bool isBroken = false;
};

/// Keeps the events. The test's thread.
class RecordingSignposts final : public Signposts {
 public:
  void event(const LogFacility& facility, std::string_view name, std::string_view message) override {
    const auto log = std::string(facility.subsystem) + " " + std::string(facility.category) + " ";
    events.push_back(log + std::string(name) + std::string(message));
  }
  std::vector<std::string> events;
};

/// Keeps the calls of sources, and their handlers for the test to call.
class MemoryPressureDouble final : public MemoryPressure {
 public:
  std::unique_ptr<MemoryPressureSource> makeSource(MemoryPressureKind kind, std::shared_ptr<SerialQueue> queue,
                                                   std::function<void()> handler) override {
    handlers.emplace_back(kind, std::move(handler));
    queueLabel = queue->label();
    return std::make_unique<Source>(calls);
  }
  std::vector<std::pair<MemoryPressureKind, std::function<void()>>> handlers;
  std::string queueLabel;  ///< of the newest source
  std::vector<std::string> calls;

 private:
  struct Source final : MemoryPressureSource {
    explicit Source(std::vector<std::string>& calls) : _calls(calls) {}
    void activate() override { _calls.push_back("activate"); }
    void cancel() override { _calls.push_back("cancel"); }
    std::vector<std::string>& _calls;
  };
};

class NetworkFailureDiagnosisDouble final : public NetworkFailureDiagnosis {
 public:
  NetworkFailure diagnose() const override { return failure; }
  NetworkFailure failure = NetworkFailure::unknown;
};

/// Gives its states one after the other; the last one stays.
class DeviceLockStateDouble final : public DeviceLockState {
 public:
  int getDeviceLockState() override {
    const int state = states.at(0);
    if (states.size() > 1) states.pop_front();
    return state;
  }
  std::deque<int> states{0};
};

class RecordingAnalyticsPipeline final : public AnalyticsPipeline {
 public:
  struct Action {
    int action;
    int target;
    std::optional<std::string> value;
    bool operator==(const Action&) const = default;
  };
  struct Interaction {
    int widgetType;
    int endState;
    TransitWidgetAnalyticsRecord record;
    bool wasLocked;
    Date startDate;
    TimeInterval duration;
  };

  void captureUserAction(int action, int target, const std::optional<std::string>& value) override {
    actions.push_back({action, target, value});
  }
  void captureWidgetInteraction(int widgetType, int endState, const TransitWidgetAnalyticsRecord& record,
                                bool wasLocked, Date startDate, TimeInterval duration) override {
    interactions.push_back({widgetType, endState, record, wasLocked, startDate, duration});
  }

  std::vector<Action> actions;
  std::vector<Interaction> interactions;
};

/// Gives the bytes behind a 'B', or fails.
class CompressorDouble final : public Compressor {
 public:
  std::optional<Bytes> Bzip2Compress(std::span<const std::uint8_t> bytes) override {
    if (fails) return std::nullopt;
    Bytes marked{'B'};
    marked.insert(marked.end(), bytes.begin(), bytes.end());
    return marked;
  }
  bool fails = false;
};

/// Records what is opened and answers as the test sets. Main thread.
class ActivityLauncherDouble final : public ActivityLauncher {
 public:
  struct Opened {
    std::shared_ptr<const UserActivity> activity;
    ApplicationRecordRef application;
    bool requireUnlockPrompt;
  };

  explicit ActivityLauncherDouble(RunLoop& loop) : _loop(loop) {}

  std::shared_ptr<UserActivity> createUserActivity(const std::string& activityType) override {
    return refusesToCreate ? nullptr : std::make_shared<UserActivity>(activityType);
  }
  BundleRecordRef bundleRecordOfCurrentProcess() override { return bundleRecord; }
  void openUserActivity(const std::shared_ptr<const UserActivity>& activity, const ApplicationRecordRef& application,
                        bool requireUnlockPrompt, Completion completion) override {
    opened.push_back({activity, application, requireUnlockPrompt});
    if (completion) _loop.dispatchAsync([this, completion] { completion(!error, error); });
  }

  bool refusesToCreate = false;
  BundleRecordRef bundleRecord;
  ErrorRef error;  ///< what opening fails with; null: it succeeds
  std::vector<Opened> opened;

 private:
  RunLoop& _loop;
};

/// Favourites that a test sets. Any thread.
class FavoritesDouble final : public FavoritesPersisters, public FavoritesPersister {
 public:
  std::shared_ptr<FavoritesPersister> remotePersister() override { return {std::shared_ptr<void>(), this}; }
  std::optional<Favorites> readFavorites() override {
    std::unique_lock guard(_lock);
    if (auto proceed = std::move(_proceed); proceed.valid()) {
      guard.unlock();
      proceed.wait();
      guard.lock();
    }
    return _favorites;
  }
  std::optional<Favorites> favoritesUnread(const ErrorRef& reason) override {
    const std::lock_guard guard(_lock);
    _unreadReason = reason->reason();
    return _unread;
  }

  /// What the store gives for favourites that were not read, and why they were not, once they were not.
  void setUnread(std::optional<Favorites> favorites) {
    const std::lock_guard guard(_lock);
    _unread = std::move(favorites);
  }
  std::string unreadReason() const {
    const std::lock_guard guard(_lock);
    return _unreadReason;
  }

  /// Absent: they cannot be read. Empty until set.
  void setFavorites(std::optional<Favorites> favorites) {
    const std::lock_guard guard(_lock);
    _favorites = std::move(favorites);
  }
  /// The next reading takes until `proceed` is ready.
  void setFavorites(Favorites favorites, std::future<void> proceed) {
    setFavorites(std::move(favorites));
    const std::lock_guard guard(_lock);
    _proceed = std::move(proceed);
  }

 private:
  mutable std::mutex _lock;
  std::optional<Favorites> _favorites = Favorites(), _unread;
  std::string _unreadReason;
  std::future<void> _proceed;
};

/// Shared settings in memory, with one store. Any thread.
class MemorySettings final : public SharedSettings, public SharedSettingsStore {
 public:
  std::shared_ptr<SharedSettingsStore> groupStore() override { return {std::shared_ptr<void>(), this}; }
  std::optional<Value> valueForKey(std::string_view key) const override {
    const std::lock_guard guard(_lock);
    const auto found = _values.find(key);
    return found == _values.end() ? std::nullopt : std::optional(found->second);
  }
  ErrorRef setValue_forKey(const Value& value, std::string_view key) override {
    if (writesFail) return Error::errorWithDomain_code_reason("MemorySettings", 1, "the disk is full");
    const std::lock_guard guard(_lock);
    _values.insert_or_assign(std::string(key), value);
    return nullptr;
  }
  ErrorRef removeValueForKey(std::string_view key) override {
    const std::lock_guard guard(_lock);
    _values.erase(std::string(key));
    return nullptr;
  }

  bool writesFail = false;

 private:
  mutable std::mutex _lock;
  std::map<std::string, Value, std::less<>> _values;
};

/// Texts that name their keys: a key's text is the key, filled it is "key(argument, argument)".
class StringTablesDouble final : public StringTables {
 public:
  std::optional<std::string> stringForKey(std::string_view key) const override {
    const auto found = texts.find(key);
    return found == texts.end() ? std::optional(std::string(key)) : found->second;
  }

  std::string format(const std::string& pattern, std::span<const FormatArgument> arguments) const override {
    std::vector<std::string> filled;
    for (const FormatArgument& argument : arguments) {
      const auto* text = std::get_if<std::string>(&argument);
      filled.push_back(text ? *text : std::to_string(std::get<std::uint64_t>(argument)));
    }
    return pattern + "(" + commaDelimitedList(filled) + ")";
  }

  std::string commaDelimitedList(const std::vector<std::string>& list) const override {
    std::string joined;
    for (const std::string& text : list) joined += (&text == list.data() ? "" : ", ") + text;
    return joined;
  }

  bool isRightToLeft() const override { return rightToLeft; }

  std::map<std::string, std::optional<std::string>, std::less<>> texts;  ///< instead of the key; nullopt: not found
  bool rightToLeft = false;
};

/// Records lookups, which wait for the test's answer. Lookups come from any thread; the rest is the test's.
class TransitLineServiceDouble final : public TransitLineService {
 public:
  explicit TransitLineServiceDouble(TestRunLoop& loop) : _loop(loop) {}

  void lookup(const std::vector<MapItemIdentifierRef>& identifiers, Handler handler) override {
    {
      const std::lock_guard guard(_lock);
      std::vector<std::uint64_t>& muids = _lookups.emplace_back();
      for (const auto& identifier : identifiers) muids.push_back(identifier->muid());
      _handlers.push_back(std::move(handler));
    }
    _loop.wake();
  }

  /// The numbers of the identifiers of each lookup so far.
  std::vector<std::vector<std::uint64_t>> lookups() const {
    const std::lock_guard guard(_lock);
    return _lookups;
  }

  /// Lookups without an answer.
  std::size_t pending() const {
    const std::lock_guard guard(_lock);
    return _handlers.size();
  }

  /// Queues the answer to the oldest lookup that has none; there is one.
  void answer(TransitLineItems items, ErrorRef error = nullptr) {
    const std::lock_guard guard(_lock);
    _loop.dispatchAsync([handler = std::move(_handlers.at(0)), items, error] { handler(items, error); });
    _handlers.pop_front();
  }

 private:
  TestRunLoop& _loop;
  mutable std::mutex _lock;
  std::vector<std::vector<std::uint64_t>> _lookups;
  std::deque<Handler> _handlers;
};

/// Keeps every log line. Any thread.
class RecordingLog final : public Log {
 public:
  struct Line {
    std::string subsystem;
    std::string category;
    LogLevel level;
    std::string text;      ///< private arguments shown
    std::string redacted;  ///< private arguments left out
  };

  bool isEnabled(LogLevel) const override { return true; }
  void write(const LogFacility& facility, LogLevel level, std::string_view format,
             std::span<const LogArgument> arguments) override {
    Line line{std::string(facility.subsystem), std::string(facility.category), level,
              formatLogLine(format, arguments, false), formatLogLine(format, arguments, true)};
    const std::lock_guard guard(_lock);
    _lines.push_back(std::move(line));
  }

  std::vector<Line> lines() const {
    const std::lock_guard guard(_lock);
    return _lines;
  }
  /// Texts of the lines of a category, of one level where that is given.
  std::vector<std::string> texts(std::string_view category, std::optional<LogLevel> level = {}) const {
    std::vector<std::string> texts;
    for (const Line& line : lines())
      if (line.category == category && (!level || line.level == *level)) texts.push_back(line.text);
    return texts;
  }
  /// Whether a line's text contains `part`.
  bool contains(std::string_view part) const {
    const auto all = lines();
    return std::ranges::any_of(all, [&](const Line& line) { return line.text.find(part) != std::string::npos; });
  }
  void clear() {
    const std::lock_guard guard(_lock);
    _lines.clear();
  }

 private:
  mutable std::mutex _lock;
  std::vector<Line> _lines;
};

}  // namespace nimbo
