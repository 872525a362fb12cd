#pragma once

#include <functional>
#include <string>
#include <string_view>

#include "platform/RunLoop.h"
#include "platform/foundation/Error.h"

namespace nimbo {

/// Domain of errors in telling the user something.
inline constexpr std::string_view kNoticeErrorDomain = "org.nimbo.Notices";

enum class NoticeError {
  noBus = 1,  ///< there is no session bus, or it went away
  noService,  ///< the desktop has no notification service
  noAnswer,   ///< somebody on the bus did not answer in time
  refused,    ///< somebody on the bus answered with an error, or with nonsense
  unfit       ///< too many notices, too long or no UTF-8, or another address: nothing was shown
};

/// An error of the domain; `detail` ends its reason, where there is more to say.
ErrorRef noticeError(NoticeError code, const std::string& detail = {});

/// How it went: null when all went well, which includes that there was nothing to do; else what went wrong first.
using NoticeCompletion = std::function<void(const ErrorRef& error)>;

/// `completion`, to be called with the first answer alone: the one that is given to what this returns, or `noAnswer`
/// when `limit` seconds are over on the run loop, which outlives it. Never once all copies of what this returns have
/// gone. Main thread only.
NoticeCompletion answeredWithin(RunLoop& runLoop, TimeInterval limit, NoticeCompletion completion);

}  // namespace nimbo
