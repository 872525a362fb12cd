#pragma once

#include <deque>
#include <memory>
#include <optional>
#include <string>
#include <vector>

#include "desktop/system/SystemClock.h"
#include "host/MachineConditions.h"
#include "host/OnScreenWidget.h"
#include "host/RefreshRule.h"
#include "host/WatchedWidget.h"
#include "platform/SystemServices.h"
#include "platform/foundation/Outcome.h"
#include "protocol/Methods.h"

namespace nimbo {

/// Keeps a widget process for a host on screen: started when the widget is first shown, told when it is hidden, ended
/// when it stays hidden, started again after a crash. While the widget can be seen it fetches by the rule of
/// `RefreshRule`. Nothing waits for the process: what it shows comes to the delegate. Main thread only.
class WidgetHostProcess {
 public:
  /// Why there is no process.
  enum class Failure { cannotStart, keepsFailing };

  /// Hears of the process, in calls of its own. Outlives it.
  class Delegate {
   public:
    virtual ~Delegate() = default;
    /// Memory for a process that starts, which no earlier one has a hand on; there until the next call.
    virtual const PictureMemory& newPictureMemory() = 0;
    /// Where in it the next picture goes. Absent: nowhere now; `askForContent` is called when there is room.
    virtual std::optional<protocol::RenderParams> roomForPicture() { return protocol::RenderParams(); }
    /// Takes what the process says it drew there; false when that is no picture.
    virtual bool widgetDrew(const protocol::Rendered& picture) = 0;
    /// Whether it hears of the favorites apart from the rows: those that it hears of are empty otherwise.
    virtual bool wantsLines() const { return false; }
    /// The widget shows the picture that was drawn last, whose rows are in the snapshot; until the next call that is
    /// what to show, whatever becomes of the process.
    virtual void widgetDidChange(const protocol::Snapshot& snapshot, const protocol::Lines& lines) = 0;
    /// A fetch has ended, which may have left the widget as it was. For those who want lines.
    virtual void widgetLinesDidChange(const protocol::Lines&) {}
    /// A process is ended for what is wrong with it; another one follows, or `widgetDidFail`.
    virtual void widgetEnded(const std::string& reason) = 0;
    /// The process is not started again by itself; `detail` says why, for developers. `restart` is the way out.
    virtual void widgetDidFail(Failure failure, const std::string& detail) = 0;
    /// Something that the user must be told.
    virtual void widgetTells(const std::string& message) = 0;
    /// A fetch of the user's has begun or ended.
    virtual void widgetIsUpdating(bool updating) = 0;
    /// Opens what a row opens; answers whether it did.
    virtual bool widgetOpens(const WidgetClient::Opening& opening) = 0;
  };

  /// `arguments` are those of the widget program.
  WidgetHostProcess(GLibRunLoop& runLoop, const Clock& clock, std::vector<std::string> arguments, Delegate& delegate);
  ~WidgetHostProcess();

  /// How the widget is shown: told to the process that runs, which is started anew only for another locale.
  void setPresentation(const WidgetPresentation& presentation);
  /// Starts a process that does not run yet, ahead of `setVisible`; it ends as when the widget is hidden.
  void prepare();
  /// Whether the user can see the widget.
  void setVisible(bool visible);
  /// Whether the user wants a row for each incident; it is so while the widget offers it.
  void setExpanded(bool expanded);

  /// Fetches now, for the user.
  void update();
  /// Has the delegate hear what the widget shows now, changed or not, while it appears.
  void askForContent();
  void highlightRow(std::size_t row, bool highlighted);
  void selectRow(std::size_t row);
  /// A question that somebody waits for. When it is let go nobody hears the answer, and the process stops looking.
  class Question;
  /// Asks the process what needs no row on screen; one that is not running is started for it, and ends as when it is
  /// hidden. `completion` hears once, unless the question is let go: the answer, or why there is none.
  template <class Params, class Result>
  [[nodiscard]] std::shared_ptr<Question> ask(
      const protocol::Method<Params, Result>& method, const std::type_identity_t<Params>& params,
      std::function<void(const Outcome<std::type_identity_t<Result>>& answer)> completion);
  /// Starts anew after `widgetDidFail`.
  void restart();

  bool isRunning() const { return _widget != nullptr; }

  /// Seconds for which a hidden widget's process is kept.
  static constexpr TimeInterval kHiddenPatience = 60;
  /// Seconds in which the process answers anything but an update.
  static constexpr TimeInterval kAnswerPatience = 10;
  /// So many crashes within so many seconds are not the last ones.
  static constexpr std::size_t kCrashLimit = 3;
  static constexpr TimeInterval kCrashWindow = 60;

 private:
  /// What the process answers of a moment.
  struct Content {
    std::optional<protocol::Rendered> picture;  // absent: there is none
    protocol::Snapshot snapshot;
    protocol::Lines lines;
  };

  void start();
  void appear();
  void disappear();
  void stop();
  /// Stops a hidden process when it stays so.
  void stopLater();
  /// Starts another process after one that failed, or gives up.
  void replace(const std::string& reason);
  void giveUp(Failure failure, const std::string& detail);
  void setUpConnection();
  static ErrorRef failure(std::string reason);
  /// Starts a process where there is none, and keeps it for the question. False when there is none to be had, which the
  /// question then hears.
  bool prepareFor(const std::shared_ptr<Question>& question);
  /// Tells all that wait that no answer comes.
  void endQuestions(const std::string& reason);
  /// A request about a row, which may be gone by now.
  template <class Params, class Result>
  void askOfRow(const protocol::Method<Params, Result>& method, const Params& params);
  /// Tells the process what it does not know of the presentation.
  void tellPresentation();
  /// Gives what is known of the favorites, and nothing where they are too many to tell.
  void askForLines(std::function<void(const protocol::Lines&)> completion);
  void show(const Content& content);
  void setExpandedMode(bool expanded);
  void setUpdating(bool updating);
  /// Has the process fetch; `completion` hears when that has ended.
  void fetch(std::optional<TimeInterval> maxAge,
             std::function<void(const protocol::UpdateResult&)> completion = nullptr);

  GLibRunLoop& _runLoop;
  const Clock& _clock;
  std::vector<std::string> _arguments;
  Delegate& _delegate;

  WidgetPresentation _presentation;
  bool _visible = false;
  bool _wantsExpanded = false;
  bool _gaveUp = false;
  std::deque<Date> _crashes;
  std::shared_ptr<Timer> _hiddenTimer;
  SystemRandom _random;
  MachineConditions _conditions{[this] { _refresh.networkReturned(); }};
  RefreshRule _refresh;

  // Of the process that runs.
  std::unique_ptr<WatchedWidget> _widget;
  std::vector<std::weak_ptr<Question>> _questions;  // that were asked
  std::shared_ptr<bool> _processMark;               // while it runs
  bool _appeared = false;
  bool _isExpanded = false;  // as last told or shown
  bool _awaitsContent = false;
  bool _contentIsStale = false;
  bool _isUpdating = false;
  WidgetPresentation _told;   // what the process knows of _presentation
  double _contentHeight = 0;  // points; 0 until it has drawn
};

class WidgetHostProcess::Question {
 public:
  /// Hears every second how far an answer is that takes longer.
  void setProgressHandler(WidgetClient::ProgressHandler handler) { _progress = std::move(handler); }
  ~Question() {
    if (_cancel) _cancel();
  }

 private:
  friend class WidgetHostProcess;
  std::function<void(const ErrorRef& failure)> _fail;  // null once answered
  std::function<void()> _cancel;                       // null where nothing is to be told
  std::int64_t _request = 0;                           // its identifier
  WidgetClient::ProgressHandler _progress;             // null: nobody hears
};

template <class Params, class Result>
std::shared_ptr<WidgetHostProcess::Question> WidgetHostProcess::ask(
    const protocol::Method<Params, Result>& method, const std::type_identity_t<Params>& params,
    std::function<void(const Outcome<std::type_identity_t<Result>>& answer)> completion) {
  const auto question = std::make_shared<Question>();
  question->_fail = [completion](const ErrorRef& failure) { completion(failure); };
  if (!prepareFor(question)) return question;
  const auto waiting = std::weak_ptr(question);
  const std::int64_t request = _widget->call(
      method, params, [waiting, completion](const std::optional<Result>& answer, const JSONRPCError& error) {
        const auto asked = waiting.lock();
        if (!asked || !std::exchange(asked->_fail, nullptr)) return;
        asked->_cancel = nullptr;
        answer ? completion(*answer) : completion(failure(error.message));
      });
  question->_request = request;
  if (method.waitsForFeeds && question->_fail)
    question->_cancel = [this, request, process = std::weak_ptr(_processMark)] {
      if (!process.expired()) _widget->call(protocol::kCancel, {request}, [](const auto&, const auto&) {});
    };
  return question;
}

}  // namespace nimbo
