#pragma once

#include <optional>
#include <string>

#include "host/Command.h"
#include "platform/foundation/Geometry.h"

namespace nimbo {

struct StatusOptions {
  bool expanded = false;
  bool json = false;               ///< the snapshot of docs/protocol.md instead of text
  std::optional<std::string> now;  ///< ISO date by which incidents are judged
};

/// Prints how the favourite lines run. Fails, after printing the error row, when the update failed.
int runStatus(const CommandContext& context, const StatusOptions& options);

/// Fetches and saves the rows for the next start of the widget. A failed fetch fails, and leaves the rows of the last
/// time.
int runUpdate(const CommandContext& context);

struct RenderOptions {
  bool expanded = false;
  std::optional<Size> size;  ///< the most room in points; absent: as `status` has it
  double scale = 2;
  std::string textSize = "large";
  bool dark = false;
  std::optional<std::string> locale;
  std::optional<std::string> now;
  std::string output;  ///< path of the PNG file
};

/// Draws the rows into a PNG file.
int runRender(const CommandContext& context, const RenderOptions& options);

/// Plays a file of host events to a widget process; "-" is the standard input. The widget's time stands still at
/// `virtualTime` when that is given.
int runScript(const CommandContext& context, const std::string& file, const std::optional<std::string>& virtualTime);

}  // namespace nimbo
