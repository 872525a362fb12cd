#pragma once

namespace nimbo {

/// Whether the device is locked.
class DeviceLockState {
 public:
  virtual ~DeviceLockState() = default;
  /// 1 and 2 mean locked; 0 unlocked, also when it cannot be asked. Main thread only.
  virtual int getDeviceLockState() = 0;
};

}  // namespace nimbo
