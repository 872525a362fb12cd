#include "desktop/raii/CairoHandles.h"

#include <cairo.h>
#include <glib-object.h>

namespace nimbo {

void GObjectDeleter::operator()(void* object) const { g_object_unref(object); }

void CairoContextDeleter::operator()(cairo_t* context) const { cairo_destroy(context); }

void CairoSurfaceDeleter::operator()(cairo_surface_t* surface) const { cairo_surface_destroy(surface); }

}  // namespace nimbo
