#include <dlfcn.h>
#include <gio/gio.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <stdlib.h>

#include <atomic>
#include <filesystem>
#include <memory>
#include <string>
#include <string_view>
#include <thread>

#include "desktop/system/GLibRunLoop.h"
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

using testing::ElementsAre;

TEST(SoftLinkedDeviceLockState, OpensTheFirstLibraryThatThereIs) {
  TestPlatform platform;
  const TemporaryFolder folder;
  const auto missing = folder.path() / "missing.so";
  const struct {
    std::filesystem::path system, internal;
    int answer;
  } kCases[] = {
      {FAKE_LOCK_STATE_1, FAKE_LOCK_STATE_2, 1}, {missing, FAKE_LOCK_STATE_2, 2}, {FAKE_LOCK_STATE_1, missing, 1}};
  for (const auto& test : kCases) {
    SoftLinkedDeviceLockState state({test.system, test.internal});
    EXPECT_EQ(state.getDeviceLockState(), test.answer) << test.system << test.internal;
    EXPECT_EQ(state.getDeviceLockState(), test.answer) << "later calls";
  }
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
              ElementsAre("### Failed to Soft Linked: " + library.native()));

  platform.log.clear();
  Dl_info foreignLibrary{};
  ASSERT_NE(::dladdr(::dlsym(RTLD_DEFAULT, "getenv"), &foreignLibrary), 0);
  std::filesystem::remove(library);
  SoftLinkedDeviceLockState foreign({library, foreignLibrary.dli_fname});
  EXPECT_EQ(foreign.getDeviceLockState(), 0);
  EXPECT_TRUE(platform.log.contains("No lock state: "));
  EXPECT_TRUE(platform.log.contains("nimbo_getDeviceLockState"));
}

/// A system bus with nothing on it but a login manager.
class FakeLoginManager {
 public:
  explicit FakeLoginManager(const std::filesystem::path& socket) {
    char* const guid = g_dbus_generate_guid();
    _server = g_dbus_server_new_sync(("unix:path=" + socket.native()).c_str(), G_DBUS_SERVER_FLAGS_NONE, guid, nullptr,
                                     nullptr, nullptr);
    g_free(guid);
    g_signal_connect(_server, "new-connection", G_CALLBACK(newConnection), this);
    g_dbus_server_start(_server);
  }
  ~FakeLoginManager() {
    if (_connection) g_object_unref(_connection);
    g_dbus_server_stop(_server);
    g_object_unref(_server);
  }

  /// What it answers, on GLib's thread; null: an error.
  static inline std::atomic<GVariant* (*)()> lockedHint = nullptr;

 private:
  static gboolean newConnection(GDBusServer*, GDBusConnection* connection, gpointer self) {
    auto& manager = *static_cast<FakeLoginManager*>(self);
    if (manager._connection) g_object_unref(manager._connection);
    manager._connection = static_cast<GDBusConnection*>(g_object_ref(connection));
    g_dbus_connection_add_filter(connection, answer, nullptr, nullptr);
    return TRUE;
  }

  static GDBusMessage* answer(GDBusConnection* connection, GDBusMessage* message, gboolean incoming, gpointer) {
    if (!incoming || g_dbus_message_get_message_type(message) != G_DBUS_MESSAGE_TYPE_METHOD_CALL) return message;
    GDBusMessage* reply = nullptr;
    const auto hint = lockedHint.load();
    if (std::string_view(g_dbus_message_get_member(message)) == "Hello") {
      reply = g_dbus_message_new_method_reply(message);
      g_dbus_message_set_body(reply, g_variant_new("(s)", ":1.1"));
    } else if (hint && asksForLockedHint(message)) {
      reply = g_dbus_message_new_method_reply(message);
      g_dbus_message_set_body(reply, g_variant_new("(v)", hint()));
    } else {
      reply = g_dbus_message_new_method_error_literal(message, "org.freedesktop.DBus.Error.ServiceUnknown", "none");
    }
    g_dbus_connection_send_message(connection, reply, G_DBUS_SEND_MESSAGE_FLAGS_NONE, nullptr, nullptr);
    g_object_unref(reply);
    g_object_unref(message);
    return nullptr;
  }

  static bool asksForLockedHint(GDBusMessage* message) {
    char* const arguments = g_variant_print(g_dbus_message_get_body(message), FALSE);
    const std::string question =
        std::string(g_dbus_message_get_destination(message)) + " " + g_dbus_message_get_path(message) + " " + arguments;
    g_free(arguments);
    return question ==
               "org.freedesktop.login1 /org/freedesktop/login1/session/auto "
               "('org.freedesktop.login1.Session', 'LockedHint')" &&
           (g_dbus_message_get_flags(message) & G_DBUS_MESSAGE_FLAGS_NO_AUTO_START);
  }

  GDBusServer* _server;
  GDBusConnection* _connection = nullptr;
};

TEST(LockStateLibrary, AsksTheLoginManager) {
  TestPlatform platform;
  GLibRunLoop loop;
  const TemporaryFolder folder;
  const auto socket = folder.path() / "bus";
  ::setenv("DBUS_SYSTEM_BUS_ADDRESS", ("unix:path=" + socket.native()).c_str(), 1);
  SoftLinkedDeviceLockState state({LOCK_STATE_LIBRARY, {}});
  const auto ask = [&] {
    int answer = -1;
    std::thread asker([&] {
      answer = state.getDeviceLockState();
      loop.dispatchAsync([&] { loop.quit(); });
    });
    loop.run();
    asker.join();
    return answer;
  };
  EXPECT_EQ(ask(), 0) << "no bus";
  {
    FakeLoginManager manager(socket);
    EXPECT_EQ(ask(), 0) << "no session";
    manager.lockedHint = [] { return g_variant_new_boolean(TRUE); };
    EXPECT_EQ(ask(), 1);
    manager.lockedHint = [] { return g_variant_new_boolean(FALSE); };
    EXPECT_EQ(ask(), 0);
    manager.lockedHint = [] { return g_variant_new_string("yes"); };
    EXPECT_EQ(ask(), 0) << "an answer of another type";
  }
  EXPECT_TRUE(platform.log.lines().empty());
  ::unsetenv("DBUS_SYSTEM_BUS_ADDRESS");
}

}  // namespace
}  // namespace nimbo
