#pragma once

#include <functional>
#include <memory>

#include "platform/SerialQueue.h"

namespace nimbo {

enum class MemoryPressureKind { systemWarning, systemCritical, processWarning, processCritical };

/// Calls its handler each time its kind of pressure occurs, once activated and until cancelled or destroyed.
class MemoryPressureSource {
 public:
  virtual ~MemoryPressureSource() = default;
  virtual void activate() = 0;
  /// No handler starts after this returns. Harmless when repeated.
  virtual void cancel() = 0;
};

class MemoryPressure {
 public:
  virtual ~MemoryPressure() = default;
  /// A source whose handler runs on `queue`. Never null; where the system reports no such events it stays quiet.
  virtual std::unique_ptr<MemoryPressureSource> makeSource(MemoryPressureKind kind, std::shared_ptr<SerialQueue> queue,
                                                           std::function<void()> handler) = 0;
};

}  // namespace nimbo
