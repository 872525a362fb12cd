#pragma once

#include <functional>

#include "desktop/raii/GLibHandles.h"

namespace nimbo {

/// What a watched descriptor has to be ready with.
enum class Readiness {
  readable,  ///< data, or the end of it
  urgent     ///< exceptional data (POLLPRI), as kernel files announce events
};

/// Attaches a source to `context` that calls `callback` for as long as `fd` is ready or in error, and says whether it
/// is in error. Kernel files tell each event to the first who polls: the callback must not poll again. The descriptor
/// stays the caller's and outlives the source.
GSourceHandle attachDescriptorSource(GMainContext* context, int fd, Readiness readiness,
                                     std::function<void(bool inError)> callback);

/// Attaches a source to `context` that calls `callback` once for each time it was woken; it sleeps at first.
GSourceHandle attachWakeableSource(GMainContext* context, std::function<void()> callback);

/// Wakes a source of `attachWakeableSource` in `microseconds` from now, instead of when it was to wake before. Any
/// thread.
void wakeSourceIn(GSource* source, long long microseconds);

}  // namespace nimbo
