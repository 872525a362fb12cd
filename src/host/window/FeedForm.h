#pragma once

#include <gtkmm/button.h>
#include <gtkmm/checkbutton.h>
#include <gtkmm/entry.h>
#include <gtkmm/filechoosernative.h>
#include <gtkmm/label.h>

#include <array>

#include "host/window/FeedCheckView.h"
#include "host/window/Texts.h"

namespace nimbo {

/// Sets up a feed by its addresses, or changes one: the feed is read, and kept when it can be used or the user insists.
class FeedForm final : public Gtk::Box {
 public:
  /// Hears of a feed that was kept, and what was found when it was read; null when it was not.
  using Kept = std::function<void(const Feed& feed, const protocol::FeedReport* report)>;

  /// `edited` is the feed to change; absent for a new one.
  FeedForm(const PageContext& context, std::optional<Feed> edited, Kept kept);

 private:
  /// A text to enter, with what is wrong with it below.
  struct Field {
    Gtk::Entry entry;
    Gtk::Label problem;
  };
  std::array<Field*, 6> fields() { return {&_name, &_static, &_alerts, &_mirror, &_maximumAge, &_key}; }
  void addField(Field& field, const char* labelKey, const char* promptKey);
  void addChooser(Gtk::Box& row, Gtk::Entry& entry, Gtk::FileChooser::Action action, const char* icon,
                  const char* nameKey);
  void choose(Gtk::Entry& entry, Gtk::FileChooser::Action action);
  /// What the fields say; absent, and the user is told, when that is no feed.
  std::optional<Feed> feed();
  /// The address in a field: with the key that there was where the field says the same.
  std::optional<FeedAddress> addressIn(Field& field, const std::optional<FeedAddress>& before);
  // Of the settings of a feed that is edited; false where they cannot be, and the user is told.
  bool takeMirror(Feed& feed);
  bool takeMaximumAge(Feed& feed);
  /// Puts the key where the servers are known to want it, else into the header that was written.
  bool takeKey(Feed& feed);
  void check();
  void showFaults(const protocol::FeedReport& report);
  void keep(Feed feed, const protocol::FeedReport* report);
  void showProblem(Field& field, const ErrorRef& problem) { showProblem(field, textOfError(*problem)); }
  void showProblem(Field& field, const std::string& problem);
  static void clear(Field& field);
  void setBusy(bool busy);

  const PageContext& _context;
  std::optional<Feed> _edited;
  Kept _kept;
  Field _name, _static, _alerts, _mirror, _maximumAge, _key;
  Gtk::CheckButton _removeKeys, _minorAlerts, _combined;
  FeedCheckView _check;
  Gtk::Button _keep, _keepAnyway;
  Glib::RefPtr<Gtk::FileChooserNative> _chooser;
};

}  // namespace nimbo
