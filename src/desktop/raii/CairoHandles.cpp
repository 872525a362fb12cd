#include "desktop/raii/CairoHandles.h"

#include <cairo.h>

namespace nimbo {

void CairoContextDeleter::operator()(cairo_t* context) const { cairo_destroy(context); }

void CairoSurfaceDeleter::operator()(cairo_surface_t* surface) const { cairo_surface_destroy(surface); }

}  // namespace nimbo
