#pragma once

#include <memory>
#include <string>

#include "platform/foundation/Object.h"
#include "platform/ui/View.h"
#include "platform/ui/WidgetHost.h"

namespace nimbo {

/// What accompanies a change of size. Nothing of it is used so far.
class TransitionCoordinator;

/// Owns a view and hears of its life on screen. Held by shared pointer; main thread only. Overrides call the base.
class ViewController : public Object {
 public:
  /// The host may be null (no host); it outlives the controller. The names are kept for the controller's use.
  ViewController(std::string nibName, std::string bundle, WidgetHost* widgetHost);
  ~ViewController() override;

  /// Null when the controller runs outside a host.
  WidgetHost* widgetHost() const { return _widgetHost; }

  /// The controller's view, made on first use, which calls `viewDidLoad`.
  const std::shared_ptr<View>& view();
  bool isViewLoaded() const { return _view != nullptr; }

  virtual void viewDidLoad() {}
  /// Before each layout of the view.
  virtual void viewWillLayoutSubviews() {}
  virtual void viewWillAppear(bool /*animated*/) {}
  virtual void viewDidAppear(bool /*animated*/) {}
  virtual void viewWillDisappear(bool /*animated*/) {}
  virtual void viewDidDisappear(bool /*animated*/) {}
  virtual void didReceiveMemoryWarning() {}
  virtual void viewWillTransitionToSize_withTransitionCoordinator(Size /*size*/,
                                                                  TransitionCoordinator* /*coordinator*/) {}

  /// Points. Setting another size tells the host.
  Size preferredContentSize() const { return _preferredContentSize; }
  void setPreferredContentSize(Size size);

 private:
  std::string _nibName;
  std::string _bundle;
  WidgetHost* _widgetHost;
  std::shared_ptr<View> _view;
  Size _preferredContentSize;
};

}  // namespace nimbo
