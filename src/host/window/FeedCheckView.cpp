#include "host/window/FeedCheckView.h"

#include <gtkmm/button.h>
#include <gtkmm/expander.h>
#include <gtkmm/label.h>

#include "host/window/DateText.h"
#include "platform/Localization.h"

namespace nimbo {

namespace {

std::string countText(const char* key, std::size_t count) {
  return LocalizedFormat(LocalizedString(key), {std::uint64_t{count}});
}

}  // namespace

FeedCheckView::FeedCheckView(const PageContext& context) : Gtk::Box(Gtk::Orientation::VERTICAL, 4), _context(context) {
  set_visible(false);
}

void FeedCheckView::clear() {
  while (Gtk::Widget* child = get_first_child()) remove(*child);
  _details = nullptr;
}

void FeedCheckView::cancel() {
  _job = nullptr;
  clear();
  set_visible(false);
}

void FeedCheckView::addText(const std::string& text, const char* style) {
  auto* label = Gtk::make_managed<Gtk::Label>(text);
  label->set_wrap();
  label->set_wrap_mode(Pango::WrapMode::WORD_CHAR);
  label->set_xalign(0);
  label->add_css_class(style);
  (_details ? *_details : *this).append(*label);
}

void FeedCheckView::check(const Feed& feed, Done done) {
  clear();
  auto* line = Gtk::make_managed<Gtk::Box>(Gtk::Orientation::HORIZONTAL, 8);
  auto* spinner = Gtk::make_managed<Gtk::Spinner>();
  spinner->start();
  line->append(*spinner);
  auto* label = Gtk::make_managed<Gtk::Label>(LocalizedString("Window_Feed_Reading"));
  label->set_hexpand();
  label->set_xalign(0);
  line->append(*label);
  auto* stop = Gtk::make_managed<Gtk::Button>(LocalizedString("Window_Cancel"));
  stop->signal_clicked().connect([this, done] {
    cancel();
    done(nullptr);
  });
  line->append(*stop);
  append(*line);
  set_visible();
  stop->grab_focus();
  _job = _context.workers.start([this, feed, done, &library = _context.library](const std::stop_token& token) {
    const FeedCheckReport report = checkFeed(feed, library.cache(), token);
    return [this, report, done] {
      show(report);
      done(&report);
    };
  });
}

void FeedCheckView::show(const FeedCheckReport& report) {
  clear();
  set_visible();
  if (const auto& feed = report.staticFeed)
    addText(CommaDelimitedList(
                {countText("Window_Feed_Lines", feed->lines), countText("Window_Feed_Agencies", feed->agencies)}),
            "item-text");
  if (const auto& alerts = report.alerts) {
    addText(CommaDelimitedList({countText("Window_Feed_Incidents", alerts->incidents),
                                countText("Window_Feed_AffectedLines", alerts->affectedLines)}),
            "item-text");
    if (alerts->timestamp)
      addText(LocalizedFormat(LocalizedString("Window_Incident_Updated"),
                              {DateText(_context.preferences.locale()).textOf(*alerts->timestamp)}),
              "item-caption");
    if (alerts->staleness) addText(alerts->staleness->reason(), "failed");
  }
  for (const ErrorRef& error : {report.staticError, report.alertsError})
    if (error) addText(error->reason(), "failed");
  SkipReport skipped;
  if (report.staticFeed) skipped.add(report.staticFeed->skipped);
  if (report.alerts) {
    skipped.add(report.alerts->skipped);
    skipped.add(report.alerts->unfit);
  }
  addSkipped(skipped);
}

void FeedCheckView::addSkipped(const SkipReport& report) {
  std::size_t count = 0;
  for (const SkipReport::Entry& entry : report.entries()) count += entry.count;
  if (count == 0) return;
  auto* expander = Gtk::make_managed<Gtk::Expander>(countText("Window_Feed_Skipped", count));
  _details = Gtk::make_managed<Gtk::Box>(Gtk::Orientation::VERTICAL, 2);
  expander->set_child(*_details);
  append(*expander);
  for (const SkipReport::Entry& entry : report.entries()) {
    std::string text = std::to_string(entry.count) + " × " + entry.reason;
    if (!entry.example.empty()) text += " (" + entry.example + ")";
    addText(text, "item-caption");
  }
}

}  // namespace nimbo
