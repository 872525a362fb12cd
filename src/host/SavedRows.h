#pragma once

#include "host/Commands.h"
#include "host/OnScreenWidget.h"

namespace nimbo {

/// The rows of the last time, without a fetch; as `params` wants them. Throws CommandFailure where none are kept, and
/// WidgetClientFailure.
protocol::Snapshot savedSnapshot(const CommandContext& context, const WidgetPresentation& presentation,
                                 WidgetDisplayMode mode, const protocol::SnapshotParams& params);

}  // namespace nimbo
