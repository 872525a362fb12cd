#include "desktop/system/SoftLinkedDeviceLockState.h"

#include <dlfcn.h>

#include <system_error>

#include "platform/foundation/Log.h"

namespace nimbo {

SoftLinkedDeviceLockState::Paths SoftLinkedDeviceLockState::Paths::ofThisProgram() {
  std::error_code ignored;
  const auto program = std::filesystem::read_symlink("/proc/self/exe", ignored);
  const std::filesystem::path system(NIMBO_LOCKSTATE_PATH);
  return {system, program.parent_path() / system.filename()};
}

int SoftLinkedDeviceLockState::getDeviceLockState() {
  std::call_once(_loaded, [this] { _function = load(); });
  return _function();
}

SoftLinkedDeviceLockState::Function SoftLinkedDeviceLockState::load() const {
  const Function unlocked = [] { return 0; };
  void* library = nullptr;  // stays open
  for (const auto& path : {_paths.system, _paths.internal}) {
    // A name without a folder would be looked for all over the system.
    if (!library && path.is_absolute()) library = ::dlopen(path.c_str(), RTLD_NOW | RTLD_LOCAL);
  }
  if (!library) {
    writeLog(NBTransitWidgetLogFacility, LogLevel::error, "### Failed to Soft Linked: %@", {_paths.system.native()});
    return unlocked;
  }
  const auto function = reinterpret_cast<Function>(::dlsym(library, "nimbo_getDeviceLockState"));
  if (function) return function;
  writeLog(NBTransitWidgetLogFacility, LogLevel::error, "No lock state: %@", {::dlerror()});
  return unlocked;
}

}  // namespace nimbo
