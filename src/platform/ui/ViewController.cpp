#include "platform/ui/ViewController.h"

namespace nimbo {

namespace {

/// The root of a controller's views. The controller owns it, and so outlives every layout it is asked for.
class ControllerView final : public View {
 public:
  explicit ControllerView(ViewController& controller) : _controller(&controller) {}
  void detach() { _controller = nullptr; }

  void layoutSubviews() override {
    if (_controller) _controller->viewWillLayoutSubviews();
    View::layoutSubviews();
  }

 private:
  ViewController* _controller;
};

}  // namespace

ViewController::ViewController(std::string nibName, std::string bundle, WidgetHost* widgetHost)
    : _nibName(std::move(nibName)), _bundle(std::move(bundle)), _widgetHost(widgetHost) {}

ViewController::~ViewController() {
  if (_view) static_cast<ControllerView&>(*_view).detach();
}

const std::shared_ptr<View>& ViewController::view() {
  if (!_view) {
    _view = std::make_shared<ControllerView>(*this);
    viewDidLoad();
  }
  return _view;
}

void ViewController::setPreferredContentSize(Size size) {
  if (size == _preferredContentSize) return;
  _preferredContentSize = size;
  if (_widgetHost) _widgetHost->preferredContentSizeDidChange(size);
}

}  // namespace nimbo
