#include "desktop/system/SoftLinkedDeviceLockState.h"
#include "support/TemporaryFolder.h"
#include "support/TestPlatform.h"

#ifdef __SANITIZE_THREAD__
// GLib's locks are not visible to the sanitizer: what GLib itself touches is no race of ours.
extern "C" const char* __tsan_default_suppressions() {
  return "called_from_lib:libglib-2.0.so\ncalled_from_lib:libgio-2.0.so\ncalled_from_lib:libgobject-2.0.so\n";
}
#endif

namespace nimbo {
namespace {

TEST(SoftLinkedDeviceLockState, OpensTheFirstLibraryThatThereIs) {
  const TestPlatform platform;
  EXPECT_EQ(SoftLinkedDeviceLockState({FAKE_LOCK_STATE_1, FAKE_LOCK_STATE_2}).getDeviceLockState(), 1);
  EXPECT_EQ(SoftLinkedDeviceLockState({"/missing.so", FAKE_LOCK_STATE_2}).getDeviceLockState(), 2);
  EXPECT_EQ(SoftLinkedDeviceLockState({FAKE_LOCK_STATE_1, "/missing.so"}).getDeviceLockState(), 1);
  EXPECT_TRUE(platform.log.lines().empty());
}

TEST(SoftLinkedDeviceLockState, CountsAsUnlockedWithoutALibraryAndLooksOnce) {
  TestPlatform platform;
  const TemporaryFolder folder;
  const auto library = folder.path() / "late.so";
  folder.write("broken.so", "no library");
  SoftLinkedDeviceLockState state({library, folder.path() / "broken.so"});
  EXPECT_EQ(state.getDeviceLockState(), 0);
  std::filesystem::copy_file(FAKE_LOCK_STATE_1, library);
  EXPECT_EQ(state.getDeviceLockState(), 0);
  EXPECT_THAT(platform.log.texts("TransitWidget", LogLevel::error),
              testing::ElementsAre("### Failed to Soft Linked: " + library.native()));
}

TEST(LockStateLibrary, CountsAsUnlockedWithoutABus) {
  TestPlatform platform;
  ::setenv("DBUS_SYSTEM_BUS_ADDRESS", "unix:path=/nonexistent", 1);
  EXPECT_EQ(SoftLinkedDeviceLockState({LOCK_STATE_LIBRARY, {}}).getDeviceLockState(), 0);
  EXPECT_TRUE(platform.log.lines().empty());
  ::unsetenv("DBUS_SYSTEM_BUS_ADDRESS");
}

}  // namespace
}  // namespace nimbo
