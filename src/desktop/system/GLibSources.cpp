#include "desktop/system/GLibSources.h"

#include <glib-unix.h>
#include <glib.h>

#include <utility>

#include "platform/Guarded.h"

namespace nimbo {

namespace {

using DescriptorCallback = std::function<void(bool)>;
using WakeCallback = std::function<void()>;

template <class Callback>
void deleteCallback(gpointer data) {
  delete static_cast<Callback*>(data);
}

gboolean descriptorIsReady(gint, GIOCondition condition, gpointer data) {
  const bool inError = condition & (G_IO_ERR | G_IO_NVAL);
  runGuarded("descriptor callback", [&] { (*static_cast<DescriptorCallback*>(data))(inError); });
  return G_SOURCE_CONTINUE;
}

gboolean wakeUp(gpointer data) {
  runGuarded("run loop callback", *static_cast<WakeCallback*>(data));
  return G_SOURCE_CONTINUE;
}

gboolean dispatchWakeable(GSource* source, GSourceFunc callback, gpointer data) {
  // Back to sleep first: the callback may set the next time.
  g_source_set_ready_time(source, -1);
  return callback(data);
}

}  // namespace

GSourceHandle attachDescriptorSource(GMainContext* context, int fd, Readiness readiness, DescriptorCallback callback) {
  const int condition = (readiness == Readiness::readable ? G_IO_IN : G_IO_PRI) | G_IO_ERR | G_IO_HUP;
  GSourceHandle source(g_unix_fd_source_new(fd, static_cast<GIOCondition>(condition)));
  g_source_set_callback(source.get(), G_SOURCE_FUNC(descriptorIsReady), new DescriptorCallback(std::move(callback)),
                        deleteCallback<DescriptorCallback>);
  g_source_attach(source.get(), context);
  return source;
}

GSourceHandle attachWakeableSource(GMainContext* context, WakeCallback callback) {
  static GSourceFuncs functions{nullptr, nullptr, dispatchWakeable, nullptr, nullptr, nullptr};
  GSourceHandle source(g_source_new(&functions, sizeof(GSource)));
  g_source_set_callback(source.get(), wakeUp, new WakeCallback(std::move(callback)), deleteCallback<WakeCallback>);
  g_source_attach(source.get(), context);
  return source;
}

void wakeSourceIn(GSource* source, long long microseconds) {
  g_source_set_ready_time(source, microseconds > 0 ? g_get_monotonic_time() + microseconds : 0);
}

}  // namespace nimbo
