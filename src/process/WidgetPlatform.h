#pragma once

#include "desktop/DesktopPlatform.h"
#include "desktop/gtfs/feeds/GTFSTransitLineService.h"
#include "desktop/store/RefreshSetting.h"

namespace nimbo {

/// The platform of the process that fetches and reads feeds, in force while this lives. Main thread.
class WidgetPlatform final : public DesktopPlatform {
 public:
  /// The options name no line service.
  explicit WidgetPlatform(Options options) : WidgetPlatform(addTransitLines(options), options) {}

  GTFSTransitLineService& transitLines() { return _transitLines; }

 private:
  WidgetPlatform(GTFSTransitLineService& lines, Options& options)
      : DesktopPlatform(std::move(options)), _transitLines(lines) {
    _transitLines.setLanguage(languageTag());
    _transitLines.setSharedAge([settings = sharedSettings().groupStore()] { return refreshSecondsOf(*settings) / 2; });
  }
  static GTFSTransitLineService& addTransitLines(Options& options) {
    auto lines = std::make_unique<GTFSTransitLineService>(options.paths);
    GTFSTransitLineService& added = *lines;
    options.transitLines = std::move(lines);
    return added;
  }

  GTFSTransitLineService& _transitLines;
};

}  // namespace nimbo
