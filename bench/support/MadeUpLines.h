#pragma once

#include <cstddef>

#include "desktop/DesktopPlatform.h"
#include "platform/transit/TransitLine.h"

namespace nimbo {

/// `count` lines of `incidentsEach` incidents with texts as publishers write them. `shared`: each incident is on two
/// neighbouring lines. Every call makes objects of its own, as every fetch does.
TransitLineItems madeUpLines(std::size_t count, std::size_t incidentsEach, bool shared);

/// The platform on Linux over an empty folder of its own, in force while it lives.
class BenchPlatform final : private ActivityLauncher {
 public:
  BenchPlatform();
  ~BenchPlatform() override;

  const std::filesystem::path& folder() const { return _folder; }

 private:
  std::shared_ptr<UserActivity> createUserActivity(const std::string&) override { return nullptr; }
  BundleRecordRef bundleRecordOfCurrentProcess() override { return nullptr; }
  void openUserActivity(const std::shared_ptr<const UserActivity>&, const ApplicationRecordRef&, bool,
                        Completion) override {}

  std::filesystem::path _folder;
  GLibRunLoop _runLoop{nullptr};
  DesktopPlatform _platform;
};

}  // namespace nimbo
