#include "host/window/Page.h"

#include <algorithm>

#include "host/window/WidgetTexts.h"

namespace nimbo {

Column::Column(Gtk::Widget& child) : _child(child) { _child.set_parent(*this); }

Column::~Column() { _child.unparent(); }

void Column::measure_vfunc(Gtk::Orientation orientation, int forSize, int& minimum, int& natural, int& minimumBaseline,
                           int& naturalBaseline) const {
  const bool isHeight = orientation == Gtk::Orientation::VERTICAL;
  _child.measure(orientation, isHeight && forSize > 0 ? std::min(forSize, kLargestWidth) : -1, minimum, natural,
                 minimumBaseline, naturalBaseline);
}

void Column::size_allocate_vfunc(int width, int height, int baseline) {
  const int column = std::min(width, kLargestWidth);
  _child.size_allocate({(width - column) / 2, 0, column, height}, baseline);
}

Page::Page(std::string title) : _title(std::move(title)) {
  set_policy(Gtk::PolicyType::NEVER, Gtk::PolicyType::AUTOMATIC);
  set_vexpand();
  _content.add_css_class("page");
  set_child(_column);
}

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
