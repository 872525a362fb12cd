#include "platform/Platform.h"

#include <atomic>
#include <cstdio>
#include <cstdlib>
#include <stdexcept>

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

void assertMainQueue() {
  if (Platform::current().mainRunLoop().isCurrent()) return;
  std::fputs("this operation belongs to the main thread\n", stderr);
  std::abort();
}

}  // namespace nimbo
