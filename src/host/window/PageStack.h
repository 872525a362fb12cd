#pragma once

#include <gtkmm/stack.h>

#include <memory>
#include <vector>

#include "host/window/Page.h"

namespace nimbo {

/// The pages from the first one to the one in front. A page that is left goes once it has moved off the screen.
class PageStack final : public Gtk::Stack {
 public:
  explicit PageStack(std::unique_ptr<Page> first);

  void push(std::unique_ptr<Page> page);
  /// Leaves the page in front; nothing happens on the first one.
  void pop();
  void popToFirst();

  Page& front() const { return *_pages.back(); }
  std::size_t depth() const { return _pages.size(); }
  /// Another page is in front.
  sigc::signal<void()>& signalFrontChanged() { return _frontChanged; }

 private:
  void show(Gtk::StackTransitionType transition);
  void dropLeft();

  std::vector<std::unique_ptr<Page>> _pages;
  std::vector<std::unique_ptr<Page>> _left;  // still moving off the screen
  sigc::signal<void()> _frontChanged;
};

}  // namespace nimbo
