#include "host/window/FeedCheckView.h"

#include <gtkmm/button.h>
#include <gtkmm/expander.h>
#include <gtkmm/label.h>

#include <set>

#include "host/FeedAnswers.h"
#include "host/window/Texts.h"
#include "host/window/WidgetTexts.h"
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
  _question = nullptr;
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

void FeedCheckView::check(const protocol::CheckFeedParams& feed, Done done) {
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
  wrapTexts(*line);
  append(*line);
  set_visible();
  stop->grab_focus();
  _question = _context.process->ask(protocol::kCheckFeed, feed, [this, done](const auto& report) {
    if (report) {
      show(*report);
      return done(&*report);
    }
    clear();
    addText(textOfError(*report.error()), "failed");
    done(nullptr);
  });
  _question->setProgressHandler([label](const protocol::ProgressParams& progress) {
    const std::string received = textOfReceived(progress.received, progress.length);
    label->set_text(LocalizedString("Window_Feed_Reading") + (received.empty() ? "" : "\n" + received));
  });
}

void FeedCheckView::show(const protocol::FeedReport& report) {
  showBesideFaults(report);
  std::set<std::string> faults;  // a key that both halves want is told of once
  for (const protocol::FetchError& fault : report.faults())
    if (const auto [text, isNew] = faults.insert(textOfError(*errorOf(fault))); isNew) addText(*text, "failed");
  addSkipped(report);
}

void FeedCheckView::showBesideFaults(const protocol::FeedReport& report) {
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
  }
}

void FeedCheckView::addSkipped(const protocol::FeedReport& report) {
  std::vector<std::pair<const char*, const std::vector<protocol::Skipped>*>> parts;
  if (report.staticFeed) parts.emplace_back("Window_Feed_SkippedLines", &report.staticFeed->skipped);
  if (report.alerts) {
    parts.emplace_back("Window_Feed_SkippedIncidents", &report.alerts->skipped);
    parts.emplace_back("Window_Feed_Unfit", &report.alerts->unfit);
  }
  std::size_t all = 0;
  std::vector<std::string> texts;
  for (const auto& [key, part] : parts) {
    std::size_t count = 0;
    std::vector<std::string> examples;
    for (const protocol::Skipped& entry : *part) {
      count += entry.count;
      if (!entry.example.empty()) examples.push_back(entry.example);
    }
    if (count == 0) continue;
    all += count;
    texts.push_back(countText(key, count) + (examples.empty() ? "" : " (" + CommaDelimitedList(examples) + ")"));
  }
  if (all == 0) return;
  auto* expander = Gtk::make_managed<Gtk::Expander>(countText("Window_Feed_Skipped", all));
  _details = Gtk::make_managed<Gtk::Box>(Gtk::Orientation::VERTICAL, 2);
  expander->set_child(*_details);
  append(*expander);
  wrapTexts(*expander);
  for (const std::string& text : texts) addText(text, "item-caption");
}

}  // namespace nimbo
