#pragma once

#include <gtkmm/box.h>
#include <gtkmm/scrolledwindow.h>
#include <gtkmm/stack.h>
#include <gtkmm/widget.h>

#include <memory>
#include <string>
#include <vector>

namespace nimbo {

/// One column in the middle of its room, not wider than is good to read.
class Column final : public Gtk::Widget {
 public:
  /// The child, which outlives the column, stays in it.
  explicit Column(Gtk::Widget& child);
  ~Column() override;

  /// Points.
  static constexpr int kLargestWidth = 600;

 protected:
  Gtk::SizeRequestMode get_request_mode_vfunc() const override { return Gtk::SizeRequestMode::HEIGHT_FOR_WIDTH; }
  void measure_vfunc(Gtk::Orientation orientation, int forSize, int& minimum, int& natural, int& minimumBaseline,
                     int& naturalBaseline) const override;
  void size_allocate_vfunc(int width, int height, int baseline) override;

 private:
  Gtk::Widget& _child;
};

/// A place in the window: a column of content that scrolls.
class Page : public Gtk::ScrolledWindow {
 public:
  explicit Page(std::string title);

  const std::string& title() const { return _title; }
  /// It has another title.
  sigc::signal<void()>& signalTitleChanged() { return _titleChanged; }

 protected:
  void setTitle(std::string title) {
    if (_title == title) return;
    _title = std::move(title);
    _titleChanged.emit();
  }
  Gtk::Box& content() { return _content; }

 private:
  std::string _title;
  sigc::signal<void()> _titleChanged;
  Gtk::Box _content{Gtk::Orientation::VERTICAL, 12};
  Column _column{_content};
};

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
