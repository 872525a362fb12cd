#pragma once

#include <list>
#include <memory>

#include "desktop/system/SystemClock.h"
#include "host/ColorSchemePortal.h"
#include "host/Commands.h"
#include "host/WindowLauncher.h"
#include "host/layer/Compositor.h"
#include "host/layer/LayerArguments.h"
#include "host/layer/OutputWidget.h"

namespace nimbo {

/// The program: the widget on the outputs that were asked for, as they come and go with a compositor that may be
/// started again. Main thread only.
class LayerHost final : private Compositor::Delegate {
 public:
  /// `context` and `arguments` outlive this.
  LayerHost(const CommandContext& context, const LayerArguments& arguments);
  ~LayerHost() override;

  /// Shows the widget until the program is ended. Answers its exit status; what went wrong was told.
  int run();

  /// Exit status where the compositor has no layers for programs, as no later start would find.
  static constexpr int kExitUnsupported = 3;
  /// Seconds from one look for a compositor that is gone to the next, and for all of them.
  static constexpr TimeInterval kReturnInterval = 1, kReturnPatience = 30;

 private:
  void compositorIsReady() override;
  void outputsChanged() override;
  void compositorFailed(const std::string& reason) override;

  /// Throws CompositorFailure.
  void connect();
  void place(OutputWidget& widget);
  void lookForCompositor(const std::string& reason);
  void end(int status, const std::string& message);
  void takeAppearance();

  const CommandContext& _context;
  const LayerArguments& _arguments;
  SystemClock _clock;
  WindowLauncher _launcher;
  OutputWidget::Context _widgetContext;
  std::optional<ColorSchemePortal> _colorScheme;  // once the widgets' processes are started
  std::unique_ptr<Compositor> _compositor;
  std::list<OutputWidget> _widgets;
  std::optional<Date> _readySince;  // of the last compositor; absent before the first
  std::shared_ptr<Timer> _return;
  TimeInterval _waited = 0;  // for the compositor to return
  int _status = kExitSuccess;
};

}  // namespace nimbo
