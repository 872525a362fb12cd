#pragma once

#include <deque>
#include <memory>
#include <sstream>
#include <string>
#include <utility>
#include <vector>

#include "platform/AnalyticsPipeline.h"
#include "platform/MemoryPressure.h"
#include "platform/SystemServices.h"

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
    std::ostringstream event;
    event << facility.subsystem << " " << facility.category << " " << name << message;
    events.push_back(event.str());
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

}  // namespace nimbo
