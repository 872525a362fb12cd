#include "host/window/WindowApplication.h"

#include "desktop/system/SmallMemory.h"
#include "host/window/Texts.h"
#include "platform/Localization.h"

namespace nimbo {

namespace {

/// Milliseconds for which the bus's application without a window waits for the next search.
constexpr guint kPatience = 10'000;

}  // namespace

Glib::RefPtr<WindowApplication> WindowApplication::create(const CommandContext& context) {
  return Glib::make_refptr_for_instance(new WindowApplication(context));
}

WindowApplication::WindowApplication(const CommandContext& context)
    : Gtk::Application(kIdentifier, context.widgetArguments.empty()
                                        ? Gio::Application::Flags::HANDLES_OPEN
                                        : Gio::Application::Flags::HANDLES_OPEN | Gio::Application::Flags::NON_UNIQUE),
      _context(context) {}

std::unique_ptr<HostPlatform> WindowApplication::makePlatform(const std::string& locale) {
  // On the main thread, and once there is a window.
  return std::make_unique<HostPlatform>(_context, locale, [this](const ErrorRef& notice) {
    _context.runLoop.dispatchAsync([this, notice] {
      if (_window) _window->tell(textOfError(*notice));
    });
  });
}

void WindowApplication::on_startup() {
  Gtk::Application::on_startup();
  if (g_application_get_flags(Gio::Application::gobj()) & G_APPLICATION_IS_SERVICE) set_inactivity_timeout(kPatience);
  // The choice of a language stands in the settings that the platform reads.
  _platform = makePlatform({});
  _preferences = std::make_unique<DesktopPreferences>();
  if (!_preferences->locale().empty()) changeLocale();
  _preferences->signalLocaleChanged().connect([this] {
    // Not from within the menu of the window that goes.
    _context.runLoop.dispatchAsync([this] { changeLocale(); });
  });
  add_action("quit", [this] { quit(); });
  set_accel_for_action("app.quit", "<Primary>q");
  set_accel_for_action("win.update", "F5");
  set_accel_for_action("win.close-window", "<Primary>w");
  set_accels_for_action("win.shortcuts", {"<Primary>question", "<Primary><Shift>slash", "F1"});
  set_accel_for_action("win.back", "<Alt>Left");
  set_accels_for_action("win.text-larger", {"<Primary>plus", "<Primary>equal", "<Primary>KP_Add"});
  set_accels_for_action("win.text-smaller", {"<Primary>minus", "<Primary>KP_Subtract"});
  set_accels_for_action("win.text-normal", {"<Primary>0", "<Primary>KP_0"});
}

void WindowApplication::makeWindow() {
  Gtk::Widget::set_default_direction(Platform::current().strings().isRightToLeft() ? Gtk::TextDirection::RTL
                                                                                   : Gtk::TextDirection::LTR);
  _window = std::make_unique<MainWindow>(_context, *_platform, *_preferences);
  _window->signal_close_request().connect(
      [this] {
        keepSize();
        _closed = std::move(_window);
        _context.runLoop.dispatchAsync([this] { _closed.reset(); });
        return false;
      },
      false);
  add_window(*_window);
}

void WindowApplication::keepSize() {
  int width = 0, height = 0;
  _window->get_default_size(width, height);
  _preferences->keepWindowSize(width, height);
}

void WindowApplication::changeLocale() {
  const bool hadWindow = _window != nullptr;
  hold();
  int width = 0, height = 0;
  if (hadWindow) _window->get_default_size(width, height);
  _window.reset();
  // One platform at a time is in force.
  _platform.reset();
  _platform = makePlatform(_preferences->locale());
  if (hadWindow) {
    makeWindow();
    _window->set_default_size(width, height);
    _window->present();
  }
  release();
}

void WindowApplication::present(guint32 time) {
  if (!_window) makeWindow();
  giveBackStack();
  _window->present(time);
}

void WindowApplication::on_activate() { present(GDK_CURRENT_TIME); }

bool WindowApplication::dbus_register_vfunc(const Glib::RefPtr<Gio::DBus::Connection>& connection,
                                            const Glib::ustring& object_path) {
  if (!Gtk::Application::dbus_register_vfunc(connection, object_path)) return false;
  // Before the name is taken, at which the first search may come.
  SearchProvider::Delegate& delegate = *this;
  _search = std::make_unique<SearchProvider>(connection, object_path + "/SearchProvider", delegate);
  return true;
}

void WindowApplication::dbus_unregister_vfunc(const Glib::RefPtr<Gio::DBus::Connection>& connection,
                                              const Glib::ustring& object_path) {
  _search.reset();
  Gtk::Application::dbus_unregister_vfunc(connection, object_path);
}

std::vector<KnownLine> WindowApplication::searchedLines() {
  // Begins the wait for the next search anew.
  hold();
  release();
  return knownFavorites(*_platform, _preferences->locale());
}

void WindowApplication::openFound(const OpenRequest& request, guint32 time) {
  present(time);
  _window->open(ShowWidget());
  _window->open(request);
}

void WindowApplication::on_open(const type_vec_files& files, const Glib::ustring&) {
  on_activate();
  for (const auto& file : files) {
    const auto request = openRequestOfURL(file->get_uri());
    if (!request) {
      _window->tell(request.error()->reason());
      continue;
    }
    _window->open(ShowWidget());
    _window->open(*request);
  }
}

void WindowApplication::on_shutdown() {
  if (_window) keepSize();
  _window.reset();
  _closed.reset();
  _preferences.reset();
  _platform.reset();
  Gtk::Application::on_shutdown();
}

}  // namespace nimbo
