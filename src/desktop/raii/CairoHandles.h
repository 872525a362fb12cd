#pragma once

#include <memory>

typedef struct _cairo cairo_t;
typedef struct _cairo_surface cairo_surface_t;

namespace nimbo {

struct GObjectDeleter {
  void operator()(void* object) const;
};

/// Adopts one reference of a GObject.
template <class T>
using GObjectHandle = std::unique_ptr<T, GObjectDeleter>;

struct CairoContextDeleter {
  void operator()(cairo_t* context) const;
};
struct CairoSurfaceDeleter {
  void operator()(cairo_surface_t* surface) const;
};

/// Adopts one reference of a drawing context.
using CairoContextHandle = std::unique_ptr<cairo_t, CairoContextDeleter>;

/// Adopts one reference of a surface.
using CairoSurfaceHandle = std::unique_ptr<cairo_surface_t, CairoSurfaceDeleter>;

}  // namespace nimbo
