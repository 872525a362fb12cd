#pragma once

#include <functional>
#include <optional>

typedef struct _GCancellable GCancellable;
typedef struct _GDBusConnection GDBusConnection;
typedef struct _GVariant GVariant;

namespace nimbo {

/// Whether the user wants dark applications, as the desktop's settings portal says. Silent where there is no session
/// bus or no portal. Main thread only.
/// Source: https://flatpak.github.io/xdg-desktop-portal/docs/doc-org.freedesktop.portal.Settings.html
class ColorSchemePortal {
 public:
  /// `changed` hears of each answer of the portal, in calls of its own.
  explicit ColorSchemePortal(std::function<void()> changed);
  ~ColorSchemePortal();
  ColorSchemePortal(const ColorSchemePortal&) = delete;
  ColorSchemePortal& operator=(const ColorSchemePortal&) = delete;

  /// Absent until the portal has answered, and where it has no opinion.
  std::optional<bool> prefersDark() const { return _prefersDark; }

 private:
  void connected(GDBusConnection* bus);
  void take(GVariant* value);

  std::function<void()> _changed;
  GCancellable* _cancellable;
  GDBusConnection* _bus = nullptr;  // until it answers, and without a session bus
  unsigned _subscription = 0;
  std::optional<bool> _prefersDark;
};

}  // namespace nimbo
