#pragma once

#include <giomm/cancellable.h>
#include <giomm/dbusproxy.h>
#include <sigc++/sigc++.h>

#include <optional>

namespace nimbo {

/// Whether the user wants dark applications, as the desktop's settings portal says. Silent where there is no session
/// bus or no portal. Main thread only.
/// Source: https://flatpak.github.io/xdg-desktop-portal/docs/doc-org.freedesktop.portal.Settings.html
class ColorSchemePortal : public sigc::trackable {
 public:
  ColorSchemePortal();
  ~ColorSchemePortal() { _cancellable->cancel(); }

  /// Absent until the portal has answered, and where it has no opinion.
  std::optional<bool> prefersDark() const { return _prefersDark; }
  sigc::signal<void()>& signalChanged() { return _changed; }

 private:
  void connected(const Glib::RefPtr<Gio::AsyncResult>& result);
  void answered(const Glib::RefPtr<Gio::AsyncResult>& result);
  void settingChanged(const Glib::ustring& sender, const Glib::ustring& signal,
                      const Glib::VariantContainerBase& parameters);
  void take(const Glib::VariantBase& value);

  Glib::RefPtr<Gio::Cancellable> _cancellable = Gio::Cancellable::create();
  Glib::RefPtr<Gio::DBus::Proxy> _portal;
  std::optional<bool> _prefersDark;
  sigc::signal<void()> _changed;
};

}  // namespace nimbo
