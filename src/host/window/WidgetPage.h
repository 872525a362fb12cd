#pragma once

#include <gtkmm/button.h>
#include <gtkmm/label.h>
#include <gtkmm/listbox.h>
#include <gtkmm/spinner.h>

#include "host/WidgetHostProcess.h"
#include "host/telling/Teller.h"
#include "host/window/LineStates.h"
#include "host/window/Page.h"
#include "host/window/PageContext.h"
#include "host/window/WidgetView.h"

namespace nimbo {

/// The widget screen: the widget as its process draws it, and the ways to what it is made from.
class WidgetPage final : public Page, private WidgetHostProcess::Delegate {
 public:
  explicit WidgetPage(const PageContext& context);
  ~WidgetPage() override;

  /// Fetches now.
  void update() { _process.update(); }
  WidgetHostProcess& process() { return _process; }
  IncidentImages& images() { return _images; }

  /// Gives what is known of the favourite lines: by the last fetch, else once one has ended.
  void withLines(std::function<void(const protocol::Lines&)> completion);

  /// Keeps that the user has seen these incidents; `isAsked`: he hears where that fails.
  void markSeen(const std::vector<std::string>& ids, bool isAsked);
  /// Asks whether he wants to be told of incidents, once he has favorites of his own and until he has answered.
  void showNotifyQuestion();

 private:
  void buildCard();
  void buildLines();
  void buildNotifyQuestion();
  void showLines(const protocol::Lines& lines, std::optional<Date> updated);
  void buildGone();
  void buildPlaces();
  void watchVisibility();
  void updateVisibility();
  void toggleExpanded();
  /// Says how far a static feed is that an update waits for.
  void showDownload();
  void showExpandButton();
  WidgetPresentation presentation() const;

  /// What to do about the failure that is told of.
  void tryAgain();
  /// `detail` is for whoever is told of the failure; may be empty.
  void showFailure(const std::string& text, const std::string& detail);

  const PictureMemory& newPictureMemory() override { return _pictures.emplace(); }
  std::optional<protocol::RenderParams> roomForPicture() override {
    return protocol::RenderParams{.capacity = PictureMemory::kImageOffset};
  }
  bool widgetDrew(const protocol::Rendered& picture) override;
  bool wantsLines() const override { return true; }
  void widgetDidChange(const protocol::Snapshot& snapshot, const protocol::Lines& lines) override;
  void widgetLinesDidChange(const protocol::Lines& lines) override { showLines(lines, lines.updated); }
  void widgetEnded(const std::string& reason) override;
  void widgetDidFail(WidgetHostProcess::Failure failure, const std::string& detail) override;
  void widgetTells(const std::string& message) override;
  void widgetIsUpdating(bool updating) override;
  bool widgetOpens(const WidgetClient::Opening& opening) override;

  const PageContext& _context;
  std::optional<PictureMemory> _pictures;         // of the process that runs
  std::shared_ptr<const WidgetPicture> _picture;  // drawn last
  WidgetHostProcess _process;
  IncidentImages _images{_process, _pictures};
  WidgetContentRef _content;
  bool _wantsExpanded;
  bool _processFailed = false;  // not started again by itself
  double _width = WidgetPresentation::kDefaultWidth;

  Gtk::Box _card{Gtk::Orientation::VERTICAL};
  Gtk::Spinner _updating;
  Gtk::Label _downloadText;
  std::shared_ptr<Timer> _downloadTimer;  // while an update runs
  Gtk::Button _expand;
  WidgetView _view;
  Gtk::Spinner _waiting;
  Gtk::Box _failure{Gtk::Orientation::VERTICAL, 8};
  Gtk::Label _failureReason, _failureDetail;
  Gtk::Box _gone{Gtk::Orientation::VERTICAL, 8};
  Gtk::Label _goneText;
  Gtk::Label _updated, _plannedText;
  Gtk::Button _planned;
  LineStates _lines{_context};
  Gtk::Box _sampleNotice{Gtk::Orientation::VERTICAL, 8};
  Gtk::Box _notifyQuestion{Gtk::Orientation::VERTICAL, 8};
  Teller _teller;
  std::shared_ptr<WidgetHostProcess::Question> _seenQuestion;
  Gtk::ListBox _places;
  std::shared_ptr<WidgetHostProcess::Question> _linesQuestion, _downloadQuestion;
  std::vector<sigc::connection> _connections;
  std::shared_ptr<bool> _alive = std::make_shared<bool>(true);
};

}  // namespace nimbo
