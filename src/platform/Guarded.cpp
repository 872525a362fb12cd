#include "platform/Guarded.h"

#include <exception>

#include "platform/foundation/Log.h"

namespace nimbo {

namespace {

void logException(std::string_view what, std::string_view text) noexcept {
  try {
    writeLog({kDefaultLogSubsystem, "RunLoop"}, LogLevel::error, "A %@ threw: %@", {what, text});
  } catch (...) {  // no platform is in force, or no memory for the line: there is nobody left to tell
  }
}

}  // namespace

void runGuarded(std::string_view what, const std::function<void()>& work) noexcept {
  try {
    work();
  } catch (const std::exception& exception) {
    logException(what, exception.what());
  } catch (...) {
    logException(what, "something that is no std::exception");
  }
}

}  // namespace nimbo
