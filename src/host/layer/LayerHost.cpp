#include "host/layer/LayerHost.h"

#include <algorithm>
#include <csignal>

#include "host/QuitOnSignal.h"

namespace nimbo {

LayerHost::LayerHost(const CommandContext& context, const LayerArguments& arguments)
    : _context(context),
      _arguments(arguments),
      _launcher(context.widgetArguments, context.tell),
      _widgetContext{.runLoop = context.runLoop,
                     .clock = _clock,
                     .widgetArguments = context.widgetArguments,
                     .arguments = arguments,
                     .launcher = _launcher,
                     .tell = context.tell,
                     .wantsToAppear = [this](OutputWidget& widget) { place(widget); }} {}

LayerHost::~LayerHost() {
  if (_return) _return->invalidate();
  for (OutputWidget& widget : _widgets) widget.leave();
}

void LayerHost::connect() {
  Compositor::Delegate& delegate = *this;
  _compositor = std::make_unique<Compositor>(_context.runLoop, delegate);
}

int LayerHost::run() {
  const GSourceHandle handles[] = {quitOnSignal(_context.runLoop, SIGTERM), quitOnSignal(_context.runLoop, SIGINT),
                                   quitOnSignal(_context.runLoop, SIGHUP)};
  try {
    connect();
  } catch (const CompositorFailure& failure) {
    _context.tell(std::string(failure.what()) + ". nimbo-transit-desktop shows the widget in a window.");
    return kExitFailure;
  }
  if (_arguments.outputs.empty()) _widgets.emplace_back(_widgetContext, "");
  for (const std::string& output : _arguments.outputs)
    if (std::ranges::count(_widgets, output, &OutputWidget::outputName) == 0)
      _widgets.emplace_back(_widgetContext, output);
  _colorScheme.emplace([this] { takeAppearance(); });
  _context.runLoop.run();
  return _status;
}

void LayerHost::end(int status, const std::string& message) {
  _context.tell(message);
  _status = status;
  _context.runLoop.quit();
}

void LayerHost::compositorIsReady() {
  if (!_compositor->layers())
    return end(kExitUnsupported,
               "this compositor offers no wlr-layer-shell, by which programs stand on the desktop itself. "
               "nimbo-transit-desktop shows the widget in a window.");
  if (!_compositor->surfaces() || !_compositor->memory())
    return end(kExitUnsupported, "this compositor shows no pictures from memory (wl_shm).");
  _readySince = _clock.now();
  outputsChanged();
  for (const OutputWidget& widget : _widgets) {
    if (widget.hasSurface()) continue;
    std::string known;
    for (const Compositor::Output& output : _compositor->outputs())
      if (!output.name.empty()) known += (known.empty() ? "" : ", ") + output.name;
    const std::string wanted = widget.outputName().empty() ? "an output" : "the output " + widget.outputName();
    _context.tell("waiting for " + wanted + "; " + (known.empty() ? "none has a name" : "there are: " + known));
  }
}

void LayerHost::outputsChanged() {
  for (OutputWidget& widget : _widgets) {
    const bool isGone =
        widget.outputName().empty() ? _compositor->outputs().empty() : !_compositor->outputNamed(widget.outputName());
    if (isGone)
      widget.leave();
    else if (widget.mayAppear())
      place(widget);
    else
      widget.updateScale();
  }
}

void LayerHost::place(OutputWidget& widget) {
  if (!_compositor || !_compositor->isReady() || _compositor->outputs().empty()) return;
  const Compositor::Output* output = nullptr;
  if (!widget.outputName().empty()) {
    output = _compositor->outputNamed(widget.outputName());
    if (!output) return;
  }
  widget.appear(*_compositor, output);
}

void LayerHost::compositorFailed(const std::string& reason) {
  for (OutputWidget& widget : _widgets) widget.leave();
  _compositor.reset();
  if (!_readySince) return end(kExitFailure, reason);
  // One that holds for a while was a good one.
  if (intervalBetween(*_readySince, _clock.now()) > kReturnPatience) _waited = 0;
  _context.tell(reason + "; looking for another one");
  lookForCompositor(reason);
}

void LayerHost::lookForCompositor(const std::string& reason) {
  if (_waited >= kReturnPatience) return end(kExitFailure, reason + ", and has not come back");
  _waited += kReturnInterval;
  _return = _context.runLoop.scheduleTimer(kReturnInterval, false, [this, reason](Timer&) {
    try {
      connect();
    } catch (const CompositorFailure&) {
      lookForCompositor(reason);
    }
  });
}

void LayerHost::takeAppearance() {
  const auto appearance = _colorScheme->prefersDark().value_or(false) ? Appearance::dark : Appearance::light;
  for (OutputWidget& widget : _widgets) widget.setAppearance(appearance);
}

}  // namespace nimbo
