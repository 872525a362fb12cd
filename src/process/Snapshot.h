#pragma once

#include <map>

#include "platform/foundation/Boxed.h"
#include "protocol/Snapshot.h"
#include "widget/NBTransitIncidentsViewController.h"

namespace nimbo {

/// The artwork's description.
protocol::Shield shieldOf(const TransitArtwork& artwork);

/// The error as hosts hear of it.
protocol::FetchError fetchErrorOf(const Error& error);

/// The table as it stands, but for the lines that are gone. The controller's view is loaded.
protocol::Snapshot snapshotOf(NBTransitIncidentsViewController& controller, bool withRows);

/// A user info as {key: Base64 of the bytes}; texts stand as their UTF-8 bytes. Null gives an empty one.
std::map<std::string, std::string> writtenUserInfo(const BoxedDictionary* userInfo);

}  // namespace nimbo
