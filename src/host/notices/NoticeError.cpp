#include "host/notices/NoticeError.h"

#include <memory>
#include <utility>

namespace nimbo {

namespace {

std::string reasonOf(NoticeError code) {
  switch (code) {
    case NoticeError::noBus:
      return "Nothing can be notified: there is no session bus. Log in on a desktop";
    case NoticeError::noService:
      return "Nothing can be notified: no notification service runs on the desktop. Install one, such as dunst or mako";
    case NoticeError::noAnswer:
      return "The desktop's notification service does not answer";
    case NoticeError::refused:
      return "The desktop does not take the notification";
    case NoticeError::unfit:
      break;
  }
  return "This is no notification that can be shown";
}

/// Repeats, since the other kind of timer waits longer when the clock is set back; the first time ends it.
class AnswerLimit {
 public:
  AnswerLimit(RunLoop& runLoop, TimeInterval limit, NoticeCompletion completion)
      : _completion(std::move(completion)),
        _timer(runLoop.scheduleTimer(limit, true, [this](Timer&) { answer(noticeError(NoticeError::noAnswer)); })) {}
  ~AnswerLimit() { _timer->invalidate(); }

  void answer(const ErrorRef& error) {
    _timer->invalidate();
    if (const auto completion = std::exchange(_completion, nullptr)) completion(error);
  }

 private:
  NoticeCompletion _completion;
  std::shared_ptr<Timer> _timer;
};

}  // namespace

ErrorRef noticeError(NoticeError code, const std::string& detail) {
  return Error::errorWithDomain_code_reason(std::string(kNoticeErrorDomain), static_cast<std::int64_t>(code),
                                            reasonOf(code) + (detail.empty() ? "" : ": " + detail) + ".");
}

NoticeCompletion answeredWithin(RunLoop& runLoop, TimeInterval limit, NoticeCompletion completion) {
  return [state = std::make_shared<AnswerLimit>(runLoop, limit, std::move(completion))](const ErrorRef& error) {
    std::shared_ptr(state)->answer(error);  // which may be the last that holds this function
  };
}

}  // namespace nimbo
