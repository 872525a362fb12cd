#include "host/SavedRows.h"

#include "host/HostPlatform.h"

namespace nimbo {

protocol::Snapshot savedSnapshot(const CommandContext& context, const WidgetPresentation& presentation,
                                 WidgetDisplayMode mode, const protocol::SnapshotParams& params) {
  if (!HostPlatform(context)->sharedSettings().groupStore()->valueForKey("Nimbo.TransitWidget.savedUIData"))
    throw CommandFailure("no rows are kept yet. \"status\" and \"update\" keep them.");
  std::vector<std::string> arguments = context.widgetArguments;
  if (presentation.virtualTime) arguments.insert(arguments.end(), {"--virtual-time", *presentation.virtualTime});
  WidgetClient client(context.runLoop, arguments);
  client.setNoticeHandler(context.tell);
  protocol::InitializeParams initialization = initializationOf(presentation);
  initialization.activeDisplayMode = mode;
  client.call(protocol::kInitialize, initialization);
  client.call(protocol::kLoadView);
  return client.call(protocol::kSnapshot, params);
}

}  // namespace nimbo
