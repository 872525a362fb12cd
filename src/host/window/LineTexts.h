#pragma once

#include <string>

#include "platform/transit/TransitLine.h"

namespace nimbo {

/// The name by which riders know a line; its number where it has none.
std::string nameOfLine(const TransitLine& line);

/// Name of the network that a line belongs to; empty where that is not known.
std::string systemNameOfLine(const TransitLine& line);

}  // namespace nimbo
