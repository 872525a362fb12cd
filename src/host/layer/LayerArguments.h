#pragma once

#include <cstdint>
#include <filesystem>
#include <optional>
#include <string>
#include <vector>

#include "host/layer/LayerSurface.h"

namespace CLI {
class App;
}

namespace nimbo {

/// What nimbo-transit-layer is started with.
struct LayerArguments {
  LayerPlacement placement{.margins = {kMargin, kMargin, kMargin, kMargin}};
  std::vector<std::string> outputs;  ///< names, a widget for each; none: one where the compositor chooses
  std::int32_t width = 359;          ///< points
  bool expanded = false;
  std::optional<std::filesystem::path> config, state;

  /// Points.
  static constexpr std::int32_t kMargin = 16, kLeastWidth = 200, kMostWidth = 2000;

  /// Has the program's words read into this, which outlives their parsing.
  void addTo(CLI::App& app);
};

}  // namespace nimbo
