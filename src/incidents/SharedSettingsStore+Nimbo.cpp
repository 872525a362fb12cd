#include "incidents/SharedSettingsStore+Nimbo.h"
#include "platform/Platform.h"

namespace nimbo {

std::shared_ptr<SharedSettingsStore> __nimbo_groupUserDefaults() {
  return Platform::current().sharedSettings().groupStore();
}

}  // namespace nimbo
