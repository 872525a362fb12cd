#include "desktop/system/LinuxMemoryPressure.h"

#include <fcntl.h>
#include <sys/inotify.h>

#include <cstdint>
#include <fstream>
#include <mutex>
#include <string>
#include <string_view>
#include <utility>
#include <vector>

#include "desktop/raii/FileDescriptor.h"

namespace nimbo {

namespace {

/// Tasks of the machine waited for memory for 150 ms of 2 s, together: reclaim has begun to be felt. A window of 2 s is
/// what the kernel lets processes without privileges ask for.
constexpr std::string_view kWarningTrigger = "some 150000 2000000";
/// All tasks that had work waited at once for as long: the machine does little else.
constexpr std::string_view kCriticalTrigger = "full 150000 2000000";

/// Seconds after which a source listens. The kernel takes 15 ms to take a trigger back, which a process that ends
/// sooner would have to wait for.
constexpr TimeInterval kBegins = 1;

/// A source whose events come from a descriptor that a derived class opens.
class DescriptorSource : public MemoryPressureSource {
 public:
  DescriptorSource(GLibRunLoop& loop, std::shared_ptr<SerialQueue> queue, std::function<void()> handler)
      : _loop(loop), _queue(std::move(queue)), _state(std::make_shared<State>()) {
    _state->handler = std::move(handler);
  }
  ~DescriptorSource() override { DescriptorSource::cancel(); }

  void activate() override {
    if (_state->cancelled || _beginning) return;
    _beginning = _loop.scheduleTimer(kBegins, false, [this](Timer&) {
      _descriptor = open();
      if (_descriptor) _watch = watch(_loop, _descriptor.get());
    });
  }

  void cancel() override {
    if (_beginning) _beginning->invalidate();
    stopWatching();
    const std::lock_guard guard(_state->lock);
    _state->cancelled = true;
  }

 protected:
  virtual FileDescriptor open() = 0;
  virtual GSourceHandle watch(GLibRunLoop& loop, int descriptor) = 0;

  int descriptor() const { return _descriptor.get(); }

  void occurred() {
    _queue->dispatchAsync([state = _state] {
      const std::lock_guard guard(state->lock);
      if (!state->cancelled) state->handler();
    });
  }

  void stopWatching() {
    _watch.reset();
    _descriptor = FileDescriptor();
  }

 private:
  struct State {
    std::recursive_mutex lock;  // held while the handler runs, which may itself cancel
    bool cancelled = false;
    std::function<void()> handler;
  };

  GLibRunLoop& _loop;
  std::shared_ptr<SerialQueue> _queue;
  std::shared_ptr<State> _state;
  std::shared_ptr<Timer> _beginning;  // kept when it has fired
  FileDescriptor _descriptor;
  GSourceHandle _watch;
};

/// A pressure stall trigger.
class StallSource final : public DescriptorSource {
 public:
  StallSource(GLibRunLoop& loop, std::filesystem::path file, std::string_view trigger,
              std::shared_ptr<SerialQueue> queue, std::function<void()> handler)
      : DescriptorSource(loop, std::move(queue), std::move(handler)), _file(std::move(file)), _trigger(trigger) {}

 private:
  FileDescriptor open() override {
    FileDescriptor file(::open(_file.c_str(), O_RDWR | O_NONBLOCK | O_CLOEXEC));
    // The trigger ends with a zero byte and lives as long as the descriptor.
    const std::size_t size = _trigger.size() + 1;
    if (file && ::write(file.get(), _trigger.c_str(), size) != static_cast<ssize_t>(size)) return {};
    return file;
  }

  GSourceHandle watch(GLibRunLoop& loop, int descriptor) override {
    return loop.watchUrgent(descriptor, [this](bool inError) {
      if (inError)
        stopWatching();
      else
        occurred();
    });
  }

  std::filesystem::path _file;
  std::string _trigger;
};

/// Counters of a cgroup's memory.events.
class CounterSource final : public DescriptorSource {
 public:
  CounterSource(GLibRunLoop& loop, std::filesystem::path file, std::vector<std::string> counters,
                std::shared_ptr<SerialQueue> queue, std::function<void()> handler)
      : DescriptorSource(loop, std::move(queue), std::move(handler)),
        _file(std::move(file)),
        _counters(std::move(counters)) {}

 private:
  FileDescriptor open() override {
    if (_file.empty()) return {};
    FileDescriptor notify(::inotify_init1(IN_NONBLOCK | IN_CLOEXEC));
    if (!notify || ::inotify_add_watch(notify.get(), _file.c_str(), IN_MODIFY) < 0) return {};
    _seen = count();
    return notify;
  }

  GSourceHandle watch(GLibRunLoop& loop, int descriptor) override {
    return loop.watchReadable(descriptor, [this] { fileChanged(); });
  }

  void fileChanged() {
    alignas(inotify_event) char events[4096];
    while (::read(descriptor(), events, sizeof events) > 0) {
    }
    const std::uint64_t counted = count();
    if (counted <= _seen) return;
    _seen = counted;
    occurred();
  }

  std::uint64_t count() const {
    std::ifstream stream(_file);
    std::uint64_t sum = 0, value = 0;
    for (std::string name; stream >> name >> value;)
      for (const std::string& counter : _counters)
        if (name == counter) sum += value;
    return sum;
  }

  std::filesystem::path _file;
  std::vector<std::string> _counters;
  std::uint64_t _seen = 0;
};

}  // namespace

LinuxMemoryPressure::Files LinuxMemoryPressure::Files::ofThisProcess(const std::filesystem::path& root) {
  Files files{root / "proc/pressure/memory", {}};
  // The line of version 2: "0::/user.slice/..."; the root cgroup has no events.
  constexpr std::string_view kVersion2 = "0::/";
  std::ifstream stream(root / "proc/self/cgroup");
  for (std::string line; std::getline(stream, line);)
    if (line.starts_with(kVersion2) && line.size() > kVersion2.size())
      files.events = root / "sys/fs/cgroup" / line.substr(kVersion2.size()) / "memory.events";
  return files;
}

LinuxMemoryPressure::LinuxMemoryPressure(GLibRunLoop& loop, Files files) : _loop(loop), _files(std::move(files)) {}

std::unique_ptr<MemoryPressureSource> LinuxMemoryPressure::makeSource(MemoryPressureKind kind,
                                                                      std::shared_ptr<SerialQueue> queue,
                                                                      std::function<void()> handler) {
  switch (kind) {
    case MemoryPressureKind::systemWarning:
      return std::make_unique<StallSource>(_loop, _files.pressure, kWarningTrigger, std::move(queue),
                                           std::move(handler));
    case MemoryPressureKind::systemCritical:
      return std::make_unique<StallSource>(_loop, _files.pressure, kCriticalTrigger, std::move(queue),
                                           std::move(handler));
    case MemoryPressureKind::processWarning:
      return std::make_unique<CounterSource>(_loop, _files.events, std::vector<std::string>{"high"}, std::move(queue),
                                             std::move(handler));
    case MemoryPressureKind::processCritical:
      break;
  }
  return std::make_unique<CounterSource>(_loop, _files.events, std::vector<std::string>{"max", "oom"}, std::move(queue),
                                         std::move(handler));
}

}  // namespace nimbo
