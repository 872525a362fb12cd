#pragma once

#include <memory>

typedef struct _GMainContext GMainContext;
typedef struct _GMainLoop GMainLoop;
typedef struct _GSource GSource;

namespace nimbo {

struct GMainContextDeleter {
  void operator()(GMainContext* context) const;
};
struct GMainLoopDeleter {
  void operator()(GMainLoop* loop) const;
};
struct GSourceDeleter {
  void operator()(GSource* source) const;
};

/// Adopts one reference of a context.
using GMainContextHandle = std::unique_ptr<GMainContext, GMainContextDeleter>;

/// Adopts one reference of a loop.
using GMainLoopHandle = std::unique_ptr<GMainLoop, GMainLoopDeleter>;

/// Adopts one reference of a source and takes the source off its context when it goes; its callback is not called any
/// more after that, and may itself let the handle go.
using GSourceHandle = std::unique_ptr<GSource, GSourceDeleter>;

}  // namespace nimbo
