#include "host/window/IncidentImages.h"

#include "platform/foundation/Log.h"

namespace nimbo {

std::shared_ptr<IncidentImages::Request> IncidentImages::ask(const std::string& incident, int width,
                                                             Completion completion) {
  auto request = std::make_shared<Request>();
  request->_params = {.incident = incident,
                      .width = static_cast<std::uint32_t>(width),
                      .offset = PictureMemory::kImageOffset,
                      .capacity = PictureMemory::kSize - PictureMemory::kImageOffset};
  request->_completion = std::move(completion);
  request->_images = this;
  request->_alive = _alive;
  _waiting.push_back(request);
  askNext();
  return request;
}

void IncidentImages::askNext() {
  while (!_isAsking && !_waiting.empty()) {
    const auto next = _waiting.front().lock();
    _waiting.pop_front();
    if (!next) continue;
    _isAsking = true;
    next->_question = _process.ask(
        protocol::kImage, next->_params,
        [this, alive = std::weak_ptr(_alive), asked = std::weak_ptr(next)](const Outcome<protocol::Rendered>& drawn) {
          const auto request = asked.lock();
          if (alive.expired() || !request) return;
          request->_question = nullptr;
          _isAsking = false;
          if (!drawn)
            writeLog({kDefaultLogSubsystem, "Window"}, LogLevel::info, "No image: %{private}@",
                     {drawn.error()->reason()});
          request->_completion(drawn ? take(*drawn) : nullptr);
          askNext();
        });
  }
}

std::shared_ptr<const WidgetPicture> IncidentImages::take(const protocol::Rendered& drawn) const {
  auto picture = _pictures->take(drawn, PictureMemory::kImageOffset);
  _pictures->drop(PictureMemory::kImageOffset);
  return picture ? std::make_shared<const WidgetPicture>(*std::move(picture)) : nullptr;
}

}  // namespace nimbo
