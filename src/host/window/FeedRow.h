#pragma once

#include <gtkmm/button.h>
#include <gtkmm/listboxrow.h>

#include "host/window/FeedCheckView.h"

namespace nimbo {

/// A feed that is set up: what it is made of, how it fares, and what can be done with it.
class FeedRow final : public Gtk::ListBoxRow {
 public:
  /// `remove` hears that the user wants it gone.
  FeedRow(const PageContext& context, const Feed& feed, std::function<void()> remove);

  /// Shows what was found when the feed was read.
  void show(const FeedCheckReport& report) { _check.show(report); }

 private:
  void check();

  Feed _feed;
  FeedCheckView _check;
  Gtk::Button _checkButton;
};

}  // namespace nimbo
