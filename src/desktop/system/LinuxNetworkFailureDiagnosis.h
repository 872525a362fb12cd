#pragma once

#include <filesystem>

#include "platform/SystemServices.h"

namespace nimbo {

/// The network condition as the kernel's files tell it. Sources: Documentation/ABI/stable/sysfs-class-rfkill,
/// Documentation/ABI/testing/sysfs-class-net, proc(5).
///
/// With a default route there is a way out, so that the failure lies elsewhere: unknown. Without one: airplaneMode when
/// there are radios and every one is blocked; cellularDataDisabled when there are mobile broadband devices and they are
/// blocked or none is up; else noInternet. Unknown, too, where the routes cannot be read.
class LinuxNetworkFailureDiagnosis final : public NetworkFailureDiagnosis {
 public:
  /// `root` holds the folders sys and proc.
  explicit LinuxNetworkFailureDiagnosis(std::filesystem::path root = "/") : _root(std::move(root)) {}
  NetworkFailure diagnose() const override;

 private:
  std::filesystem::path _root;
};

}  // namespace nimbo
