#pragma once

#include <gtkmm/box.h>
#include <gtkmm/spinner.h>

#include "host/window/PageContext.h"

namespace nimbo {

/// Reads a feed and shows how far that is, then what the feed holds or why it cannot be used. What runs is dropped with
/// the view.
class FeedCheckView final : public Gtk::Box {
 public:
  explicit FeedCheckView(const PageContext& context);

  /// Hears what was found; null when the user did not want to wait.
  using Done = std::function<void(const protocol::FeedReport* report)>;

  /// Has the feed read anew.
  void check(const protocol::CheckFeedParams& feed, Done done);
  void show(const protocol::FeedReport& report);
  /// The same without the faults, which are shown elsewhere.
  void showBesideFaults(const protocol::FeedReport& report);
  /// Drops what runs and what is shown.
  void cancel();

 private:
  void addText(const std::string& text, const char* style);
  /// How much was left out of which part, and an example for each reason, whose words "feed check" has.
  void addSkipped(const protocol::FeedReport& report);
  void clear();

  const PageContext& _context;
  Gtk::Box* _details = nullptr;
  std::shared_ptr<WidgetHostProcess::Question> _question;
};

}  // namespace nimbo
