#include "desktop/raii/GLibHandles.h"

#include <glib.h>

namespace nimbo {

void GMainContextDeleter::operator()(GMainContext* context) const { g_main_context_unref(context); }

void GMainLoopDeleter::operator()(GMainLoop* loop) const { g_main_loop_unref(loop); }

void GSourceDeleter::operator()(GSource* source) const {
  g_source_destroy(source);
  g_source_unref(source);
}

}  // namespace nimbo
