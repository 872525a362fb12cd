#pragma once

#include "desktop/gtfs/FeedLibrary.h"
#include "host/Command.h"
#include "host/HostPlatform.h"
#include "host/window/DesktopPreferences.h"
#include "host/window/Navigator.h"
#include "host/window/Workers.h"

namespace nimbo {

/// What every page has at hand; all of it outlives the pages.
struct PageContext {
  const CommandContext& command;
  HostPlatform& platform;
  const FeedLibrary& library;
  DesktopPreferences& preferences;
  Workers& workers;
  Navigator& navigator;
};

}  // namespace nimbo
