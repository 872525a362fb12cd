#pragma once

#include <deque>
#include <functional>
#include <memory>
#include <optional>
#include <string>
#include <utility>

#include "host/WidgetHostProcess.h"

namespace nimbo {

/// Asks the widget process for images of incidents, one after the other: they all come through one place of its memory.
/// Main thread only.
class IncidentImages {
 public:
  /// An image that somebody waits for. When it is let go nobody hears of it, and the process stops fetching.
  class Request;
  /// Hears once: the image, or null where none can be had.
  using Completion = std::function<void(const std::shared_ptr<const WidgetPicture>& image)>;

  /// Both outlive this; `pictures` is the memory of the process that runs.
  IncidentImages(WidgetHostProcess& process, const std::optional<PictureMemory>& pictures)
      : _process(process), _pictures(pictures) {}

  /// `incident` is a number in decimal; an image that is wider than so many pixels is scaled down.
  [[nodiscard]] std::shared_ptr<Request> ask(const std::string& incident, int width, Completion completion);

 private:
  void askNext();
  std::shared_ptr<const WidgetPicture> take(const protocol::Rendered& drawn) const;

  WidgetHostProcess& _process;
  const std::optional<PictureMemory>& _pictures;
  std::deque<std::weak_ptr<Request>> _waiting;
  bool _isAsking = false;  // for one that waits no more
  std::shared_ptr<bool> _alive = std::make_shared<bool>(true);
};

class IncidentImages::Request {
 public:
  ~Request() {
    if (!std::exchange(_question, nullptr) || _alive.expired()) return;
    _images->_isAsking = false;
    _images->askNext();
  }

 private:
  friend class IncidentImages;
  protocol::ImageParams _params;
  Completion _completion;
  IncidentImages* _images = nullptr;
  std::weak_ptr<bool> _alive;                              // of the images
  std::shared_ptr<WidgetHostProcess::Question> _question;  // while it is asked for
};

}  // namespace nimbo
