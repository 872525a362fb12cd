#pragma once

#include <string>
#include <vector>

#include "host/telling/DateText.h"
#include "platform/foundation/Error.h"
#include "platform/transit/TransitIncident.h"
#include "platform/transit/TransitLine.h"
#include "protocol/Lines.h"

namespace nimbo {

/// The name by which riders know a line; its number where it has none.
std::string nameOfLine(const TransitLine& line);

/// The same for a place beside the line's shield, which says the short name already: "Ring Line" of "3, Ring Line".
std::string nameBesideShield(const TransitLine& line);

/// Name of the network that a line belongs to; empty where that is not known.
std::string systemNameOfLine(const TransitLine& line);

/// What a card says of an incident below its title, nothing twice: the description, with the summary before it where
/// the description does not say that too.
std::vector<std::string> textsBelowTitle(const TransitIncident& incident);

/// How many bytes have come, of how many where that is known; empty below a MiB.
std::string textOfReceived(std::uint64_t received, std::optional<std::uint64_t> length);

/// What failed and what to do about it, in the user's language; the error's own reason, which tells developers more, is
/// logged. Main thread.
std::string textOfError(const Error& error);

/// The error's own reason where that says more than `textOfError`, which has no words for it; else empty.
std::string detailOfError(const Error& error);

/// How a line runs, in the user's language: good service, how many incidents, or why nobody knows. Main thread.
std::string textOfState(const protocol::LineReport& line);

}  // namespace nimbo
