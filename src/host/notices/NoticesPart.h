#pragma once

#include <memory>
#include <string>
#include <vector>

#include "host/notices/Notice.h"
#include "host/notices/NoticeError.h"
#include "platform/RunLoop.h"

namespace nimbo {

/// Hands over as `NoticeSender` does, but that the answer may come before the call returns.
class NoticeHandOver {
 public:
  virtual ~NoticeHandOver() = default;
  virtual void post(const std::vector<Notice>& notices, NoticeCompletion completion) = 0;
  virtual void close(const std::vector<std::string>& keys, NoticeCompletion completion) = 0;
};

/// What libnimbo-notices does, the part with libsystemd (desktop/system/LatePart.h). Main thread only.
class NoticesPart {
 public:
  virtual ~NoticesPart() = default;
  /// The run loop outlives the answer.
  virtual std::unique_ptr<NoticeHandOver> makeHandOver(RunLoop& runLoop) = 0;
};

}  // namespace nimbo
