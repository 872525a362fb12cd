#include "host/SavedRows.h"

#include "host/HostPlatform.h"

namespace nimbo {

protocol::Snapshot savedSnapshot(const CommandContext& context, const WidgetPresentation& presentation,
                                 WidgetDisplayMode mode, const protocol::SnapshotParams& params) {
  std::vector<std::string> arguments = context.widgetArguments;
  if (presentation.virtualTime) arguments.insert(arguments.end(), {"--virtual-time", *presentation.virtualTime});
  WidgetClient client(context.runLoop, arguments);
  client.setNoticeHandler(context.tell);
  protocol::InitializeParams initialization = initializationOf(presentation);
  initialization.activeDisplayMode = mode;
  const auto tell = [&client](const auto& method, const auto& itsParams) {
    client.connection().call(method.name, protocol::write(itsParams), [](const auto&, const auto&) {});
  };
  tell(protocol::kInitialize, initialization);
  tell(protocol::kLoadView, protocol::Nothing());
  // While the process starts.
  if (!HostPlatform(context)->sharedSettings().groupStore()->valueForKey("Nimbo.TransitWidget.savedUIData"))
    throw CommandFailure("no rows are kept yet. \"status\" and \"update\" keep them.");
  return client.call(protocol::kSnapshot, params);
}

}  // namespace nimbo
