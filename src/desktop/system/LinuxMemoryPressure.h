#pragma once

#include <filesystem>

#include "desktop/system/GLibRunLoop.h"
#include "platform/MemoryPressure.h"

namespace nimbo {

/// Memory pressure as the kernel reports it: the machine's from pressure stall triggers, the process's from the events
/// of its cgroup. Events are waited for on the main run loop; no thread of its own, no wake-up without an event.
/// Sources are activated and cancelled on the main thread, listen from a second after that, and stay quiet where a file
/// is missing or not permitted. Sources: Documentation/accounting/psi.rst, Documentation/admin-guide/cgroup-v2.rst.
class LinuxMemoryPressure final : public MemoryPressure {
 public:
  struct Files {
    std::filesystem::path pressure;  ///< takes the triggers
    std::filesystem::path events;    ///< memory.events of the process's cgroup; empty when that has none

    /// The files of the running process; `root` holds the folders sys and proc.
    static Files ofThisProcess(const std::filesystem::path& root = "/");
  };

  /// `loop` outlives this and its sources.
  explicit LinuxMemoryPressure(GLibRunLoop& loop, Files files = Files::ofThisProcess());

  std::unique_ptr<MemoryPressureSource> makeSource(MemoryPressureKind kind, std::shared_ptr<SerialQueue> queue,
                                                   std::function<void()> handler) override;

 private:
  GLibRunLoop& _loop;
  Files _files;
};

}  // namespace nimbo
