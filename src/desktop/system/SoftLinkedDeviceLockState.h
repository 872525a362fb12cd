#pragma once

#include <filesystem>
#include <mutex>

#include "platform/SystemServices.h"

namespace nimbo {

/// The lock state from a library that nothing links: libnimbo-lockstate.so is opened for the first question, once, and
/// later questions go straight to its function. Where it cannot be opened the device counts as unlocked.
class SoftLinkedDeviceLockState final : public DeviceLockState {
 public:
  /// Where the library is looked for, in this order.
  struct Paths {
    std::filesystem::path system;
    std::filesystem::path internal;

    /// Where the program installs it, then beside the running program.
    static Paths ofThisProgram();
  };

  explicit SoftLinkedDeviceLockState(Paths paths = Paths::ofThisProgram()) : _paths(std::move(paths)) {}
  int getDeviceLockState() override;

 private:
  using Function = int (*)();
  Function load() const;

  Paths _paths;
  std::once_flag _loaded;
  Function _function = nullptr;
};

}  // namespace nimbo
