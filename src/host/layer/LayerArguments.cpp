#include "host/layer/LayerArguments.h"

#include <wlr-layer-shell-unstable-v1-client-protocol.h>

#include <CLI/CLI.hpp>
#include <algorithm>

namespace nimbo {

namespace {

constexpr std::uint32_t kTop = ZWLR_LAYER_SURFACE_V1_ANCHOR_TOP, kBottom = ZWLR_LAYER_SURFACE_V1_ANCHOR_BOTTOM,
                        kLeft = ZWLR_LAYER_SURFACE_V1_ANCHOR_LEFT, kRight = ZWLR_LAYER_SURFACE_V1_ANCHOR_RIGHT;

using Names = std::vector<std::pair<std::string, std::uint32_t>>;
const Names kLayers{{"background", ZWLR_LAYER_SHELL_V1_LAYER_BACKGROUND},
                    {"bottom", ZWLR_LAYER_SHELL_V1_LAYER_BOTTOM},
                    {"top", ZWLR_LAYER_SHELL_V1_LAYER_TOP},
                    {"overlay", ZWLR_LAYER_SHELL_V1_LAYER_OVERLAY}};
const Names kAnchors{{"top-left", kTop | kLeft},
                     {"top", kTop},
                     {"top-right", kTop | kRight},
                     {"left", kLeft},
                     {"center", 0},
                     {"right", kRight},
                     {"bottom-left", kBottom | kLeft},
                     {"bottom", kBottom},
                     {"bottom-right", kBottom | kRight}};

constexpr std::int32_t kMostMargin = 10000;

std::string checkMargins(const std::vector<std::int32_t>& margins) {
  return margins.size() == 1 || margins.size() == 4 ? std::string()
                                                    : "give one margin for all edges, or four: top,right,bottom,left";
}

/// The value of a name, which CLI11 has checked.
CLI::Validator oneOf(const Names& names) {
  std::vector<std::string> known;
  for (const auto& [name, value] : names) known.push_back(name);
  return CLI::IsMember(known);
}

std::uint32_t valueOf(const Names& names, const std::string& name) {
  return std::ranges::find(names, name, &Names::value_type::first)->second;
}

}  // namespace

void LayerArguments::addTo(CLI::App& app) {
  app.add_option_function<std::string>(
         "--layer", [this](const std::string& name) { placement.layer = valueOf(kLayers, name); },
         "What it lies on: windows are between bottom (the default) and top")
      ->check(oneOf(kLayers));
  app.add_option_function<std::string>(
         "--anchor", [this](const std::string& name) { placement.anchor = valueOf(kAnchors, name); },
         "Where on the output (default: top-right)")
      ->check(oneOf(kAnchors));
  app.add_option_function<std::vector<std::int32_t>>(
         "--margin",
         [this](const std::vector<std::int32_t>& given) {
           if (const std::string problem = checkMargins(given); !problem.empty())
             throw CLI::ValidationError("--margin", problem);
           placement.margins = given.size() == 1 ? LayerPlacement::Margins{given[0], given[0], given[0], given[0]}
                                                 : LayerPlacement::Margins{given[0], given[1], given[2], given[3]};
         },
         "Points from the edges: one for all, or top,right,bottom,left (default: 16)")
      ->delimiter(',')
      ->check(CLI::Range(0, kMostMargin));
  app.add_option("--output", outputs, "Name of an output, such as DP-1; may be repeated (default: one, as it comes)")
      ->allow_extra_args(false);
  app.add_option("--width", width, "Points")->capture_default_str()->check(CLI::Range(kLeastWidth, kMostWidth));
  app.add_flag("--expanded", expanded, "Begin with one row for each incident instead of one for all");
  app.add_option("--config", config, "Folder of feeds.json (default: $XDG_CONFIG_HOME/nimbo-transit)");
  app.add_option("--state", state, "Folder of favorites and last rows (default: $XDG_STATE_HOME/nimbo-transit)");
}

}  // namespace nimbo
