#pragma once

#include <memory>

namespace nimbo {

struct GObjectDeleter {
  void operator()(void* object) const;
};

/// Adopts one reference of a GObject.
template <class T>
using GObjectHandle = std::unique_ptr<T, GObjectDeleter>;

}  // namespace nimbo
