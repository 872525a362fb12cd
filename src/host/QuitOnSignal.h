#pragma once

#include <glib-unix.h>

#include "desktop/system/GLibRunLoop.h"

namespace nimbo {

/// Ends the loop when the signal comes, instead of the process, for as long as the handle lives.
inline GSourceHandle quitOnSignal(GLibRunLoop& runLoop, int signal) {
  GSourceHandle source(g_unix_signal_source_new(signal));
  const auto quit = [](gpointer loop) -> gboolean {
    static_cast<GLibRunLoop*>(loop)->quit();
    return G_SOURCE_CONTINUE;
  };
  g_source_set_callback(source.get(), quit, &runLoop, nullptr);
  g_source_attach(source.get(), nullptr);
  return source;
}

}  // namespace nimbo
