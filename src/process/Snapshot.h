#pragma once

#include <nlohmann/json.hpp>

#include "platform/foundation/Boxed.h"
#include "widget/NBTransitIncidentsViewController.h"

namespace nimbo {

/// The table as it stands, in the form of docs/protocol.md. The controller's view is loaded.
nlohmann::json snapshotJSON(NBTransitIncidentsViewController& controller);

/// A user info as {key: base64 of the bytes}; texts stand as their UTF-8 bytes. Null gives an empty object.
nlohmann::json userInfoJSON(const BoxedDictionary* userInfo);

}  // namespace nimbo
