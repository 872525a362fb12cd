#pragma once

#include <memory>

#include "platform/SharedSettingsStore.h"

namespace nimbo {

/// A new view of the settings that the widget shares with the host application. Never null. Any thread.
std::shared_ptr<SharedSettingsStore> __nimbo_groupUserDefaults();

}  // namespace nimbo
