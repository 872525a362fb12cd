#include "incidents/_NBTransitIncidentFetcherRequest.h"

namespace nimbo {

std::shared_ptr<_NBTransitIncidentFetcherRequest> _NBTransitIncidentFetcherRequest::initWithCompletionHandler(
    NBTransitIncidentFetcherHandler handler) {
  auto request = std::make_shared<_NBTransitIncidentFetcherRequest>();
  if (handler) request->_handlers.push_back(std::move(handler));
  return request;
}

void _NBTransitIncidentFetcherRequest::addHandler(NBTransitIncidentFetcherHandler handler) {
  if (!handler) return;
  std::unique_lock guard(_lock);
  if (!_result) return _handlers.push_back(std::move(handler));
  const ResultRef result = _result;
  guard.unlock();
  handler(result);
}

ResultRef _NBTransitIncidentFetcherRequest::result() const {
  const std::lock_guard guard(_lock);
  return _result;
}

std::vector<NBTransitIncidentFetcherHandler> _NBTransitIncidentFetcherRequest::handlers() const {
  const std::lock_guard guard(_lock);
  return _handlers;
}

void _NBTransitIncidentFetcherRequest::setResultAndInvokeCompletionHandlers(ResultRef result) {
  std::unique_lock guard(_lock);
  _result = result;
  const auto handlers = _handlers;
  guard.unlock();
  for (const auto& handler : handlers) handler(result);
}

}  // namespace nimbo
