#include "host/ColorSchemePortal.h"

#include <gio/gio.h>

#include <memory>
#include <string_view>

namespace nimbo {

namespace {

constexpr const char* kPortal = "org.freedesktop.portal.Desktop";
constexpr const char* kObject = "/org/freedesktop/portal/desktop";
constexpr const char* kInterface = "org.freedesktop.portal.Settings";
constexpr const char* kNamespace = "org.freedesktop.appearance";
constexpr std::string_view kKey = "color-scheme";
constexpr guint32 kNoPreference = 0, kDark = 1;

struct VariantReleaser {
  void operator()(GVariant* variant) const { g_variant_unref(variant); }
};
using VariantHandle = std::unique_ptr<GVariant, VariantReleaser>;

}  // namespace

ColorSchemePortal::ColorSchemePortal(std::function<void()> changed)
    : _changed(std::move(changed)), _cancellable(g_cancellable_new()) {
  g_bus_get(
      G_BUS_TYPE_SESSION, _cancellable,
      [](GObject*, GAsyncResult* result, gpointer self) {
        GError* failure = nullptr;
        GDBusConnection* bus = g_bus_get_finish(result, &failure);
        // A request that was cancelled has outlived this.
        if (bus) static_cast<ColorSchemePortal*>(self)->connected(bus);
        g_clear_error(&failure);
      },
      this);
}

ColorSchemePortal::~ColorSchemePortal() {
  g_cancellable_cancel(_cancellable);
  g_object_unref(_cancellable);
  if (!_bus) return;
  g_dbus_connection_signal_unsubscribe(_bus, _subscription);
  g_object_unref(_bus);
}

void ColorSchemePortal::connected(GDBusConnection* bus) {
  _bus = bus;
  _subscription = g_dbus_connection_signal_subscribe(
      bus, kPortal, kInterface, "SettingChanged", kObject, kNamespace, G_DBUS_SIGNAL_FLAGS_NONE,
      [](GDBusConnection*, const gchar*, const gchar*, const gchar*, const gchar*, GVariant* change, gpointer self) {
        if (!g_variant_is_of_type(change, G_VARIANT_TYPE("(ssv)"))) return;
        const VariantHandle key(g_variant_get_child_value(change, 1)), value(g_variant_get_child_value(change, 2));
        if (g_variant_get_string(key.get(), nullptr) == kKey) static_cast<ColorSchemePortal*>(self)->take(value.get());
      },
      this, nullptr);
  g_dbus_connection_call(
      bus, kPortal, kObject, kInterface, "Read", g_variant_new("(ss)", kNamespace, kKey.data()), nullptr,
      G_DBUS_CALL_FLAGS_NONE, -1, _cancellable,
      [](GObject* source, GAsyncResult* result, gpointer self) {
        GError* failure = nullptr;
        const VariantHandle answer(
            g_dbus_connection_call_finish(reinterpret_cast<GDBusConnection*>(source), result, &failure));
        if (answer && g_variant_n_children(answer.get()) == 1) {
          const VariantHandle value(g_variant_get_child_value(answer.get(), 0));
          static_cast<ColorSchemePortal*>(self)->take(value.get());
        }
        // No portal, or none that knows of colors.
        g_clear_error(&failure);
      },
      this);
}

void ColorSchemePortal::take(GVariant* value) {
  // "Read" wraps its answer twice.
  if (g_variant_is_of_type(value, G_VARIANT_TYPE_VARIANT)) {
    const VariantHandle inner(g_variant_get_variant(value));
    return take(inner.get());
  }
  if (!g_variant_is_of_type(value, G_VARIANT_TYPE_UINT32)) return;
  const guint32 scheme = g_variant_get_uint32(value);
  _prefersDark = scheme == kNoPreference ? std::nullopt : std::optional(scheme == kDark);
  _changed();
}

}  // namespace nimbo
