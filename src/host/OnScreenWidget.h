#pragma once

#include <optional>
#include <string>

#include "host/Commands.h"
#include "host/WidgetClient.h"
#include "platform/foundation/Presentation.h"

namespace nimbo {

/// How a host shows the widget.
struct WidgetPresentation {
  double width = kDefaultWidth;                   ///< points
  double compactHeight = kDefaultRowHeight;       ///< points
  double expandedHeight = 4 * kDefaultRowHeight;  ///< points: room for four rows
  double scale = 1;
  ContentSizeCategory textSize = ContentSizeCategory::large;
  Appearance appearance = Appearance::light;
  std::optional<std::string> locale;       ///< absent: of the environment
  std::optional<std::string> virtualTime;  ///< ISO date at which the widget's time stands still

  static constexpr double kDefaultWidth = 359;
  static constexpr double kDefaultRowHeight = 110;
  /// Points; never less than the default. Rows grow with large texts, which then have room for as many words.
  static double rowHeightForTextSize(ContentSizeCategory category);

  bool operator==(const WidgetPresentation&) const = default;
};

/// The room that it gives each mode.
protocol::DisplayModes displayModesOf(const WidgetPresentation& presentation);

/// What presents the widget so, in the compact mode.
protocol::InitializeParams initializationOf(const WidgetPresentation& presentation);

/// The `maxAge` of an update that shares what other processes got, by the user's setting.
TimeInterval sharedAge(const CommandContext& context);

/// Has the widget fetch, with this `maxAge`, again while a static feed that has never been here is still coming. Absent
/// when it succeeded, else why it failed.
std::optional<std::string> failureOfUpdate(WidgetClient& client, std::optional<TimeInterval> maxAge);

/// A widget process that is on the screen as long as this lives: it appears on construction, disappears, and so saves
/// its rows, on `close`. Operations throw WidgetClientFailure.
class OnScreenWidget {
 public:
  /// `pictures` is for `render`.
  OnScreenWidget(const CommandContext& context, const WidgetPresentation& presentation,
                 const PictureMemory* pictures = nullptr);

  /// Waits for the fetch that runs; also for a static feed that has never been here, since a process that ends throws
  /// away what has come of it. `maxAge` and the answer are those of `failureOfUpdate`.
  std::optional<std::string> update(std::optional<TimeInterval> maxAge = std::nullopt);
  /// Switches to the expanded mode where the widget offers it; else the compact row says it all.
  void expand();
  protocol::Lines lines(const protocol::LinesParams& params = {}) { return _client.call(protocol::kLines, params); }
  protocol::Snapshot snapshot(const protocol::SnapshotParams& params = {}) {
    return _client.call(protocol::kSnapshot, params);
  }
  protocol::Rendered render() { return _client.call(protocol::kRender); }
  void close();

 private:
  WidgetClient _client;
};

}  // namespace nimbo
