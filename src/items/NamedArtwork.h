#pragma once

#include <string>

#include "items/NBConfiguredArtwork.h"

namespace nimbo {

/// One of the widget's own images at an opacity: one object for each while the platform is in force, so that rows which
/// show it are found equal at a glance. Main thread only.
NBConfiguredArtworkRef artworkOfImageNamed(const std::string& name, double alpha);

}  // namespace nimbo
