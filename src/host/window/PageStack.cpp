#include "host/window/PageStack.h"

#include "host/window/Accessible.h"
#include "host/window/Wrapping.h"

namespace nimbo {

PageStack::PageStack(std::unique_ptr<Page> first) {
  set_vexpand();
  property_transition_running().signal_changed().connect([this] { dropLeft(); });
  push(std::move(first));
}

void PageStack::push(std::unique_ptr<Page> page) {
  wrapTexts(*page);
  add(*page);
  _pages.push_back(std::move(page));
  show(Gtk::StackTransitionType::SLIDE_LEFT);
}

void PageStack::pop() {
  if (_pages.size() < 2) return;
  _left.push_back(std::move(_pages.back()));
  _pages.pop_back();
  show(Gtk::StackTransitionType::SLIDE_RIGHT);
}

void PageStack::popToFirst() {
  for (; _pages.size() > 2; _pages.pop_back()) remove(*_pages.back());
  pop();
}

void PageStack::show(Gtk::StackTransitionType transition) {
  set_transition_type(transition);
  set_visible_child(front());
  for (const auto& page : _pages) hideFromAccessibility(*page, page.get() != &front());
  for (const auto& page : _left) hideFromAccessibility(*page);
  _frontChanged.emit();
  dropLeft();
}

void PageStack::dropLeft() {
  if (get_transition_running()) return;
  for (const auto& page : _left) remove(*page);
  _left.clear();
}

}  // namespace nimbo
