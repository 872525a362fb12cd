#pragma once

#include <glib-unix.h>

#include <functional>
#include <utility>

#include "desktop/system/GLibRunLoop.h"

namespace nimbo {

/// Calls `callback` in the default main context when the signal comes (SIGHUP, SIGINT, SIGTERM, SIGUSR1 or SIGUSR2),
/// instead of what that would do, for as long as the handle lives.
inline GSourceHandle onSignal(int signal, std::function<void()> callback) {
  using Callback = std::function<void()>;
  GSourceHandle source(g_unix_signal_source_new(signal));
  const auto call = [](gpointer data) -> gboolean {
    (*static_cast<Callback*>(data))();
    return G_SOURCE_CONTINUE;
  };
  const auto forget = [](gpointer data) { delete static_cast<Callback*>(data); };
  g_source_set_callback(source.get(), call, new Callback(std::move(callback)), forget);
  g_source_attach(source.get(), nullptr);
  return source;
}

/// Ends the loop when the signal comes, instead of the process, for as long as the handle lives.
inline GSourceHandle quitOnSignal(GLibRunLoop& runLoop, int signal) {
  return onSignal(signal, [&runLoop] { runLoop.quit(); });
}

}  // namespace nimbo
