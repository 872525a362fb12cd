#include "host/notices/NoticeSender.h"

#include <utility>

#include "desktop/system/LatePart.h"
#include "host/notices/NoticesPart.h"

namespace nimbo {

namespace {

ErrorRef missingPart(const LatePartMissing& failure) {
  return Error::errorWithDomain_code_reason(std::string(kNoticeErrorDomain),
                                            static_cast<std::int64_t>(NoticeError::refused), failure.what());
}

}  // namespace

class NoticeSender::Impl {
 public:
  explicit Impl(RunLoop& runLoop) : _runLoop(runLoop) {}

  /// Throws LatePartMissing.
  NoticeHandOver& handOver() {
    if (!_handOver) _handOver = latePart<NoticesPart>("libnimbo-notices.so", "nimbo_notices").makeHandOver(_runLoop);
    return *_handOver;
  }

  /// What calls the completion later, while this lives.
  NoticeCompletion later(NoticeCompletion completion) {
    return [this, alive = std::weak_ptr(_alive), completion = std::move(completion)](const ErrorRef& error) {
      if (!alive.expired())
        _runLoop.dispatchAsync([alive, completion, error] {
          if (!alive.expired() && completion) completion(error);
        });
    };
  }

 private:
  RunLoop& _runLoop;
  std::unique_ptr<NoticeHandOver> _handOver;
  std::shared_ptr<bool> _alive = std::make_shared<bool>();
};

NoticeSender::NoticeSender(RunLoop& runLoop) : _impl(std::make_unique<Impl>(runLoop)) {}
NoticeSender::~NoticeSender() = default;

void NoticeSender::post(std::vector<Notice> notices, Completion completion) {
  const auto done = _impl->later(std::move(completion));
  try {
    _impl->handOver().post(notices, done);
  } catch (const LatePartMissing& failure) {
    done(missingPart(failure));
  }
}

void NoticeSender::close(std::vector<std::string> keys, Completion completion) {
  const auto done = _impl->later(std::move(completion));
  try {
    _impl->handOver().close(keys, done);
  } catch (const LatePartMissing& failure) {
    done(missingPart(failure));
  }
}

}  // namespace nimbo
