#pragma once

#include <gtkmm/application.h>

#include <memory>
#include <optional>

#include "host/Commands.h"
#include "host/HostPlatform.h"
#include "host/window/DesktopPreferences.h"
#include "host/window/MainWindow.h"
#include "host/window/SearchProvider.h"

namespace nimbo {

/// The application as the desktop sees it: one for each user where there is a session bus; opens URLs of its scheme,
/// and answers the desktop's search, for both of which the bus starts it.
class WindowApplication final : public Gtk::Application, private SearchProvider::Delegate {
 public:
  /// With folders of its own it is an application of its own. The context outlives it.
  static Glib::RefPtr<WindowApplication> create(const CommandContext& context);

  /// Identifier of the application on the bus, in its .desktop file and for its icon.
  static constexpr const char* kIdentifier = "org.nimbo.Transit";

 protected:
  explicit WindowApplication(const CommandContext& context);
  void on_startup() override;
  void on_activate() override;
  void on_open(const type_vec_files& files, const Glib::ustring& hint) override;
  void on_shutdown() override;
  bool dbus_register_vfunc(const Glib::RefPtr<Gio::DBus::Connection>& connection,
                           const Glib::ustring& object_path) override;
  void dbus_unregister_vfunc(const Glib::RefPtr<Gio::DBus::Connection>& connection,
                             const Glib::ustring& object_path) override;

 private:
  std::vector<KnownLine> searchedLines() override;
  void openFound(const OpenRequest& request, guint32 time) override;
  void present(guint32 time);
  void makeWindow();
  void keepSize();
  std::unique_ptr<HostPlatform> makePlatform(const std::string& locale);
  /// The texts are another language's: everything that shows them is made anew.
  void changeLocale();

  CommandContext _context;
  std::unique_ptr<HostPlatform> _platform;
  std::unique_ptr<DesktopPreferences> _preferences;
  std::unique_ptr<MainWindow> _window;  // null until there is something to show, and once it is closed
  std::unique_ptr<MainWindow> _closed;  // until what closed it is over
  std::unique_ptr<SearchProvider> _search;
};

}  // namespace nimbo
