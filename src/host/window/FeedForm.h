#pragma once

#include <gtkmm/button.h>
#include <gtkmm/checkbutton.h>
#include <gtkmm/entry.h>
#include <gtkmm/filechoosernative.h>
#include <gtkmm/label.h>

#include "host/window/FeedCheckView.h"

namespace nimbo {

/// Sets up a feed: name and addresses, then the feed is read, and kept when it can be used or the user insists.
class FeedForm final : public Gtk::Box {
 public:
  /// Hears of a feed that was kept, and what was found when it was read; null when it was not.
  using Added = std::function<void(const protocol::FeedReport* report)>;

  FeedForm(const PageContext& context, Added added);

 private:
  void addEntry(Gtk::Entry& entry, const char* labelKey, const char* promptKey);
  void addChooser(Gtk::Box& row, Gtk::Entry& entry, Gtk::FileChooser::Action action, const char* icon,
                  const char* nameKey);
  void choose(Gtk::Entry& entry, Gtk::FileChooser::Action action);
  /// What the entries say; absent, and the user is told, when that is no feed.
  std::optional<Feed> feed();
  void check();
  void keep(Feed feed, const protocol::FeedReport* report);
  void showProblem(const std::string& text);
  void setBusy(bool busy);

  const PageContext& _context;
  Added _added;
  Gtk::Entry _name, _static, _alerts;
  Gtk::CheckButton _combined;
  Gtk::Label _problem;
  FeedCheckView _check;
  Gtk::Button _add, _addAnyway;
  Glib::RefPtr<Gtk::FileChooserNative> _chooser;
};

}  // namespace nimbo
