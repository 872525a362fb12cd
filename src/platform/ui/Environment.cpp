#include "platform/ui/Environment.h"

#include <algorithm>
#include <stdexcept>

namespace nimbo {

void Environment::setContentSizeCategory(ContentSizeCategory category) {
  if (category == _contentSizeCategory) return;
  _contentSizeCategory = category;
  // A copy: observers may come and go while they are called. One that was removed has lost its operation.
  for (const auto observations = _observations; const auto& observation : observations) {
    const auto alive = observation->observer.lock();
    if (alive && observation->operation) observation->operation();
  }
}

void Environment::setScreenScale(double scale) {
  if (!(scale > 0)) throw std::invalid_argument("a screen scale is greater than 0");
  _screenScale = scale;
}

void Environment::observeContentSizeCategory(const std::shared_ptr<const void>& observer,
                                             std::function<void()> operation) {
  std::erase_if(_observations, [](const auto& observation) { return observation->observer.expired(); });
  _observations.push_back(std::make_shared<Observation>(Observation{observer, observer.get(), std::move(operation)}));
}

void Environment::removeObserver(const void* observer) {
  std::erase_if(_observations, [observer](const auto& observation) {
    if (observation->identity != observer) return false;
    observation->operation = nullptr;
    return true;
  });
}

}  // namespace nimbo
