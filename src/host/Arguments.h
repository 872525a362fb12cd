#pragma once

#include <CLI/App.hpp>
#include <optional>
#include <string>

#include "platform/foundation/Geometry.h"

namespace nimbo {

// Checks of a word of the command line, in the form that options take: what is wrong with it, empty when nothing is.

std::string checkDate(const std::string& text);
/// `sizeOfArgument` reads it.
std::string checkSize(const std::string& text);
/// Device pixels for each point, as docs/protocol.md bounds them.
std::string checkScale(const std::string& text);
std::string checkTextSize(const std::string& text);
/// The file of a picture to be written: named like a PNG file, or without an ending.
std::string checkPicture(const std::string& text);
/// `positionOfArgument` reads it.
std::string checkPosition(const std::string& text);
/// A line to be looked for: FEED:ROUTE_ID.
std::string checkLineName(const std::string& text);
std::string checkFeedName(const std::string& text);
std::string checkFeedAddress(const std::string& text);
std::string checkFolder(const std::string& text);

/// "359x110" in points. Absent for anything else, and beyond 1 to 100,000 points.
std::optional<Size> sizeOfArgument(const std::string& text);
/// A place in an order, 1 being the first. Absent for anything else.
std::optional<int> positionOfArgument(const std::string& text);

/// What is wrong with arguments that `app` has refused, as a sentence or two: for a misspelt command or option with the
/// nearest one that there is.
std::string problemOfArguments(const CLI::App& app, const CLI::ParseError& refusal);

}  // namespace nimbo
