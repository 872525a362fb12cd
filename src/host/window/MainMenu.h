#pragma once

#include <giomm/menumodel.h>

namespace nimbo {

/// The menu of the window: its actions, and how things look.
Glib::RefPtr<Gio::MenuModel> makeMainMenu();

}  // namespace nimbo
