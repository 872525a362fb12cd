#pragma once

#include <functional>
#include <memory>
#include <optional>
#include <string>
#include <vector>

#include "host/WidgetHostProcess.h"
#include "host/WindowLauncher.h"
#include "host/layer/LayerArguments.h"
#include "host/layer/LayerSurface.h"
#include "host/layer/PicturePool.h"

namespace nimbo {

/// The widget on one output: its process, and its surface while the output is there. Main thread only.
class OutputWidget final : private WidgetHostProcess::Delegate, private LayerSurface::Delegate {
 public:
  /// What all widgets of the program have; outlives them.
  struct Context {
    GLibRunLoop& runLoop;
    const Clock& clock;
    std::vector<std::string> widgetArguments;
    const LayerArguments& arguments;
    const WindowLauncher& launcher;
    std::function<void(const std::string& message)> tell;
    /// A surface that was closed is wanted again: `appear` where that can be.
    std::function<void(OutputWidget&)> wantsToAppear;
  };

  /// Starts the widget's process. `outputName` is empty where the compositor chooses.
  OutputWidget(const Context& context, std::string outputName);
  ~OutputWidget() override;

  const std::string& outputName() const { return _outputName; }
  bool hasSurface() const { return _surface != nullptr; }
  /// Whether it is to have a surface by now: not while one that was closed is let rest.
  bool mayAppear() const { return !_surface && !_rest; }
  /// Makes its surface on the output, or where the compositor chooses when that is null.
  void appear(Compositor& compositor, const Compositor::Output* output);
  /// Takes the surface away, as that of a compositor or output that is gone.
  void leave();
  void updateScale();
  void setAppearance(Appearance appearance);

  /// Seconds before a surface that was closed is made again.
  static constexpr TimeInterval kFirstRest = 1, kLongestRest = 300;
  /// Seconds before the process is tried again after it failed again and again.
  static constexpr TimeInterval kFirstRestart = 60, kLongestRestart = 1800;

 private:
  struct Row {
    double y = 0, height = 0;  // points
    bool sumsUp = false;       // stands for more than one incident, or none
  };

  // Of the process.
  const PictureMemory& newPictureMemory() override;
  std::optional<protocol::RenderParams> roomForPicture() override;
  bool widgetDrew(const protocol::Rendered& picture) override;
  void widgetDidChange(const protocol::Snapshot& snapshot, const protocol::Lines& lines) override;
  void widgetEnded(const std::string& reason) override;
  void widgetDidFail(WidgetHostProcess::Failure failure, const std::string& detail) override;
  void widgetTells(const std::string& message) override { _context.tell(message); }
  void widgetIsUpdating(bool) override {}
  bool widgetOpens(const WidgetClient::Opening& opening) override { return _context.launcher.open(opening); }

  // Of the surface.
  void surfaceMayBeDrawn() override;
  void surfaceIsSeen(bool isSeen) override;
  void surfaceScaleChanged() override;
  void surfaceWidthGiven(std::int32_t width) override;
  void surfaceClosed() override;
  void pressed(LayerSurface::Button button, Point place) override;
  void released(LayerSurface::Button button, Point place) override;
  void handMoved(Point place) override;
  void handLeft() override;
  void keyPressed(std::uint32_t code, bool isShifted) override;
  void keyboardLeft() override;

  std::optional<std::size_t> rowAt(Point place) const;
  /// What a click on a row does.
  void choose(std::size_t row);
  void setExpanded(bool expanded);
  void light(std::optional<std::size_t>& lit, std::optional<std::size_t> row);
  void moveFocus(int step);

  const Context& _context;
  const std::string _outputName;
  WidgetPresentation _presentation;
  bool _isExpanded = false, _canExpand = false;  // as shown
  std::vector<Row> _rows;
  std::optional<std::size_t> _pressed, _focused;  // rows that are lit

  std::optional<PictureMemory> _pictures;
  wl_shm* _shm = nullptr;  // of the compositor, while there is a surface
  std::unique_ptr<LayerSurface> _surface;
  std::unique_ptr<PicturePool> _pool;
  std::unique_ptr<PicturePool> _oldPool;  // of the process before, which has drawn what is still shown
  wl_buffer* _drawn = nullptr;            // by the process, to be shown with its rows
  protocol::Rendered _drawnPicture;
  bool _mayDraw = false;
  Backoff _rests{kFirstRest, kLongestRest};
  std::shared_ptr<Timer> _rest;  // while a closed surface is let rest
  Backoff _restarts{kFirstRestart, kLongestRestart};
  std::shared_ptr<Timer> _restart;
  WidgetHostProcess _process;
};

}  // namespace nimbo
