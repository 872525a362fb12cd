#include "host/window/SearchProvider.h"

#include <giomm/dbusintrospection.h>
#include <giomm/dbusmethodinvocation.h>

#include <algorithm>

namespace nimbo {

namespace {

constexpr const char* kInterface = R"(<node>
  <interface name="org.gnome.Shell.SearchProvider2">
    <method name="GetInitialResultSet">
      <arg type="as" direction="in"/>
      <arg type="as" direction="out"/>
    </method>
    <method name="GetSubsearchResultSet">
      <arg type="as" direction="in"/>
      <arg type="as" direction="in"/>
      <arg type="as" direction="out"/>
    </method>
    <method name="GetResultMetas">
      <arg type="as" direction="in"/>
      <arg type="aa{sv}" direction="out"/>
    </method>
    <method name="ActivateResult">
      <arg type="s" direction="in"/>
      <arg type="as" direction="in"/>
      <arg type="u" direction="in"/>
    </method>
    <method name="LaunchSearch">
      <arg type="as" direction="in"/>
      <arg type="u" direction="in"/>
    </method>
  </interface>
</node>)";

/// The parameter of this index, a list of texts.
std::vector<std::string> textsOf(GVariant* parameters, gsize index) {
  GVariantIter* texts = nullptr;
  g_variant_get_child(parameters, index, "as", &texts);
  std::vector<std::string> result;
  for (const char* text = nullptr; g_variant_iter_next(texts, "&s", &text);) result.emplace_back(text);
  g_variant_iter_free(texts);
  return result;
}

std::string joined(const std::vector<std::string>& words) {
  std::string text;
  for (const std::string& word : words) text += (text.empty() ? "" : " ") + word;
  return text;
}

}  // namespace

SearchProvider::SearchProvider(Glib::RefPtr<Gio::DBus::Connection> bus, const Glib::ustring& object, Delegate& delegate)
    : _bus(std::move(bus)),
      _delegate(delegate),
      _methods([this](const auto&, const auto&, const auto&, const auto&, const Glib::ustring& method,
                      const Glib::VariantContainerBase& parameters, const auto& invocation) {
        answer(method, const_cast<GVariant*>(parameters.gobj()), invocation->gobj());
      }) {
  const auto interface = Gio::DBus::NodeInfo::create_for_xml(kInterface)->lookup_interface();
  _registration = _bus->register_object(object, interface, _methods);
}

SearchProvider::~SearchProvider() { _bus->unregister_object(_registration); }

void SearchProvider::answer(const Glib::ustring& method, GVariant* parameters, GDBusMethodInvocation* invocation) {
  GVariant* result = nullptr;  // nothing
  if (method == "GetInitialResultSet") {
    result = found(textsOf(parameters, 0));
  } else if (method == "GetSubsearchResultSet") {
    result = found(textsOf(parameters, 1));
  } else if (method == "GetResultMetas") {
    result = metasOf(textsOf(parameters, 0));
  } else if (method == "ActivateResult") {
    const char* identifier = nullptr;
    guint32 time = 0;
    g_variant_get_child(parameters, 0, "&s", &identifier);
    g_variant_get_child(parameters, 2, "u", &time);
    _delegate.openFound(ShowFavoriteLine{identifier}, time);
  } else {
    guint32 time = 0;
    g_variant_get_child(parameters, 1, "u", &time);
    _delegate.openFound(ShowFavorites{joined(textsOf(parameters, 0))}, time);
  }
  // Takes the invocation.
  g_dbus_method_invocation_return_value(G_DBUS_METHOD_INVOCATION(g_object_ref(invocation)), result);
}

GVariant* SearchProvider::found(const std::vector<std::string>& words) {
  GVariantBuilder identifiers;
  g_variant_builder_init(&identifiers, G_VARIANT_TYPE("as"));
  for (const KnownLine& line : _delegate.searchedLines())
    if (hasWords(line, words)) g_variant_builder_add(&identifiers, "s", line.id.c_str());
  return g_variant_new("(as)", &identifiers);
}

GVariant* SearchProvider::metasOf(const std::vector<std::string>& identifiers) {
  const std::vector<KnownLine> lines = _delegate.searchedLines();
  GVariantBuilder metas;
  g_variant_builder_init(&metas, G_VARIANT_TYPE("aa{sv}"));
  for (const std::string& identifier : identifiers) {
    const auto line =
        std::find_if(lines.begin(), lines.end(), [&](const KnownLine& known) { return known.id == identifier; });
    if (line == lines.end()) continue;
    const std::string description = line->agency.empty() ? line->state : line->agency + " · " + line->state;
    g_variant_builder_open(&metas, G_VARIANT_TYPE("a{sv}"));
    for (const auto& [key, text] : {std::pair<const char*, const char*>{"id", line->id.c_str()},
                                    {"name", line->name.c_str()},
                                    {"description", description.c_str()},
                                    {"gicon", "org.nimbo.Transit"}})
      g_variant_builder_add(&metas, "{sv}", key, g_variant_new_string(text));
    g_variant_builder_close(&metas);
  }
  return g_variant_new("(aa{sv})", &metas);
}

}  // namespace nimbo
