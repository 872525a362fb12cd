#pragma once

#include <giomm/menumodel.h>
#include <gtkmm/applicationwindow.h>
#include <gtkmm/button.h>
#include <gtkmm/headerbar.h>
#include <gtkmm/infobar.h>
#include <gtkmm/label.h>
#include <gtkmm/menubutton.h>

#include "host/window/Page.h"
#include "host/window/PageContext.h"
#include "host/window/WidgetPage.h"

namespace nimbo {

/// The menu of the window: its actions, and how things look.
Glib::RefPtr<Gio::MenuModel> makeMainMenu();

/// The application's window: the widget screen, and in front of it the page that was opened last.
class MainWindow final : public Gtk::ApplicationWindow, public Navigator {
 public:
  /// What is given outlives the window.
  MainWindow(const CommandContext& command, HostPlatform& platform, DesktopPreferences& preferences);

  void open(const OpenRequest& request) override;
  void tell(const std::string& message) override;
  void tell(const std::string& message, std::function<void()> undo) override;
  void markSeen(const std::vector<std::string>& ids, bool isAsked) override;

 private:
  void buildHeader();
  void buildMessageBar();
  void addActions();
  void showFront();
  void showTitle() { set_title(_pages.front().title()); }
  void addNotifyAction();
  void push(std::unique_ptr<Page> page);
  void openLine(const ShowFavoriteLine& show, const protocol::Lines& lines);
  void openIncident(const ShowIncident& show, const protocol::Lines& lines);

  std::map<std::string, Date> _asOf;
  protocol::Lines _lines;
  std::shared_ptr<WidgetHostProcess::Question> _lineLookup;
  PageContext _context;
  Gtk::HeaderBar _header;
  Gtk::Button _back;
  Gtk::Button _update;
  Gtk::MenuButton _menu;
  Gtk::Box _body{Gtk::Orientation::VERTICAL};
  Gtk::InfoBar _messageBar;
  Gtk::Label _message;
  Gtk::Button _undoButton;
  std::function<void()> _undo;  // of what is told; null without
  WidgetPage* _widgetPage;      // the first page of the stack
  PageStack _pages;
  std::shared_ptr<WidgetHostProcess::Question> _decoding;  // what was handed over last
};

}  // namespace nimbo
