#include "host/window/ColorSchemePortal.h"

namespace nimbo {

namespace {

constexpr const char* kNamespace = "org.freedesktop.appearance";
constexpr const char* kKey = "color-scheme";
constexpr guint32 kNoPreference = 0, kDark = 1;

}  // namespace

ColorSchemePortal::ColorSchemePortal() {
  Gio::DBus::Proxy::create_for_bus(Gio::DBus::BusType::SESSION, "org.freedesktop.portal.Desktop",
                                   "/org/freedesktop/portal/desktop", "org.freedesktop.portal.Settings",
                                   sigc::mem_fun(*this, &ColorSchemePortal::connected), _cancellable);
}

void ColorSchemePortal::connected(const Glib::RefPtr<Gio::AsyncResult>& result) {
  try {
    _portal = Gio::DBus::Proxy::create_for_bus_finish(result);
  } catch (const Glib::Error&) {
    return;
  }
  _portal->signal_signal().connect(sigc::mem_fun(*this, &ColorSchemePortal::settingChanged));
  const auto name = [](const char* text) { return Glib::Variant<Glib::ustring>::create(text); };
  _portal->call("Read", sigc::mem_fun(*this, &ColorSchemePortal::answered), _cancellable,
                Glib::VariantContainerBase::create_tuple({name(kNamespace), name(kKey)}));
}

void ColorSchemePortal::answered(const Glib::RefPtr<Gio::AsyncResult>& result) {
  try {
    take(_portal->call_finish(result).get_child(0));
  } catch (const Glib::Error&) {
    // No portal, or none that knows of colours.
  }
}

void ColorSchemePortal::settingChanged(const Glib::ustring&, const Glib::ustring& signal,
                                       const Glib::VariantContainerBase& parameters) {
  if (signal != "SettingChanged" || !parameters.is_of_type(Glib::VariantType("(ssv)"))) return;
  Glib::Variant<Glib::ustring> area, key;
  Glib::VariantContainerBase change(parameters);
  change.get_child(area, 0);
  change.get_child(key, 1);
  if (area.get() == kNamespace && key.get() == kKey) take(change.get_child(2));
}

void ColorSchemePortal::take(const Glib::VariantBase& value) {
  // "Read" wraps its answer twice.
  if (value.is_of_type(Glib::VARIANT_TYPE_VARIANT)) {
    Glib::VariantBase inner;
    Glib::VariantBase::cast_dynamic<Glib::Variant<Glib::VariantBase>>(value).get(inner);
    return take(inner);
  }
  if (!value.is_of_type(Glib::VARIANT_TYPE_UINT32)) return;
  const guint32 scheme = Glib::VariantBase::cast_dynamic<Glib::Variant<guint32>>(value).get();
  _prefersDark = scheme == kNoPreference ? std::nullopt : std::optional(scheme == kDark);
  _changed.emit();
}

}  // namespace nimbo
