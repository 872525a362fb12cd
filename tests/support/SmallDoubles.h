#pragma once

#include <deque>
#include <memory>
#include <string>
#include <vector>

#include "platform/AnalyticsPipeline.h"
#include "platform/Bzip2Compress.h"
#include "platform/DeviceLockState.h"
#include "platform/MemoryPressure.h"
#include "platform/NetworkFailureDiagnosis.h"
#include "platform/RandomSource.h"
#include "platform/Signposts.h"

namespace nimbo {

/// Gives the numbers of its script, then 0.
class ScriptedRandomSource final : public RandomSource {
 public:
  std::uint32_t next() override {
    if (numbers.empty()) return 0;
    const std::uint32_t number = numbers.front();
    numbers.pop_front();
    return number;
  }
  std::deque<std::uint32_t> numbers;
};

/// Keeps the events as "subsystem category name message". The test's thread.
class RecordingSignposts final : public Signposts {
 public:
  void event(const LogFacility& facility, std::string_view name, std::string_view message) override {
    events.push_back(std::string(facility.subsystem) + " " + std::string(facility.category) + " " + std::string(name) +
                     " " + std::string(message));
  }
  std::vector<std::string> events;
};

/// Memory is never short by itself: the test calls the handlers.
class MemoryPressureDouble final : public MemoryPressure {
 public:
  struct Made {
    MemoryPressureKind kind;
    std::string queueLabel;
    std::function<void()> handler;
    bool active = false;
    bool cancelled = false;
  };

  std::unique_ptr<MemoryPressureSource> makeSource(MemoryPressureKind kind, std::shared_ptr<SerialQueue> queue,
                                                   std::function<void()> handler) override {
    made.push_back(std::make_shared<Made>(Made{kind, queue->label(), std::move(handler)}));
    return std::make_unique<Source>(made.back());
  }
  std::vector<std::shared_ptr<Made>> made;

 private:
  class Source final : public MemoryPressureSource {
   public:
    explicit Source(std::shared_ptr<Made> made) : _made(std::move(made)) {}
    void activate() override { _made->active = true; }
    void cancel() override { _made->cancelled = true; }

   private:
    std::shared_ptr<Made> _made;
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
