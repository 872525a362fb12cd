#pragma once

#include <giomm/dbusconnection.h>
#include <giomm/dbusinterfacevtable.h>

#include <functional>
#include <vector>

#include "host/window/LineSearch.h"
#include "host/window/OpenRequest.h"

namespace nimbo {

/// Finds favourite lines for the search of the desktop's overview: org.gnome.Shell.SearchProvider2 on the session bus.
/// Main thread only.
/// Source: https://developer.gnome.org/documentation/tutorials/search-provider.html
class SearchProvider {
 public:
  /// What answers the searches; outlives the provider.
  class Delegate {
   public:
    virtual ~Delegate() = default;
    virtual std::vector<KnownLine> searchedLines() = 0;
    /// `time` is of the user's click, in the display server's milliseconds; 0 where that is not known.
    virtual void openFound(const OpenRequest& request, guint32 time) = 0;
  };

  /// Throws Glib::Error where the object is there already.
  SearchProvider(Glib::RefPtr<Gio::DBus::Connection> bus, const Glib::ustring& object, Delegate& delegate);
  ~SearchProvider();
  SearchProvider(const SearchProvider&) = delete;
  SearchProvider& operator=(const SearchProvider&) = delete;

 private:
  void answer(const Glib::ustring& method, GVariant* parameters, GDBusMethodInvocation* invocation);
  GVariant* found(const std::vector<std::string>& words);
  GVariant* metasOf(const std::vector<std::string>& identifiers);

  Glib::RefPtr<Gio::DBus::Connection> _bus;
  Delegate& _delegate;
  Gio::DBus::InterfaceVTable _methods;
  guint _registration = 0;
};

}  // namespace nimbo
