#include "platform/Platform.h"

#include <atomic>
#include <cstdio>
#include <cstdlib>
#include <stdexcept>

#include "platform/ui/Environment.h"

// What the layers below ask of the services in force is declared there and defined here, so that none of them knows of
// this one.
namespace nimbo {

namespace {
std::atomic<Platform*> currentPlatform{nullptr};
}

Platform::Platform(const PlatformServices& services) : _services(services), _previous(currentPlatform.exchange(this)) {}

Platform::~Platform() {
  // Singletons may still use the services while they go.
  _singletons.clear();
  currentPlatform = _previous;
}

Platform& Platform::current() {
  Platform* platform = currentPlatform;
  if (!platform) throw std::logic_error("no platform is installed");
  return *platform;
}

Date currentDate() { return Platform::current().clock().now(); }

TimeInterval intervalFromNow(Date date) { return intervalBetween(currentDate(), date); }

void writeLog(const LogFacility& facility, LogLevel level, std::string_view format,
              std::initializer_list<LogArgument> arguments) {
  Log& log = Platform::current().log();
  if (!log.isEnabled(level)) return;
  log.write(facility, level, format, std::span(arguments.begin(), arguments.size()));
}

Environment& Environment::current() {
  return *Platform::current().singleton<Environment>([] { return std::make_shared<Environment>(); });
}

bool Environment::isRightToLeft() const { return Platform::current().strings().isRightToLeft(); }

TextSystem& TextSystem::current() { return Platform::current().text(); }

ImageResources& ImageResources::current() { return Platform::current().images(); }

void assertMainQueue() {
  if (Platform::current().mainRunLoop().isCurrent()) return;
  std::fputs("this operation belongs to the main thread\n", stderr);
  std::abort();
}

}  // namespace nimbo
