#pragma once

#include <span>
#include <string>
#include <string_view>

#include "platform/Localization.h"

namespace nimbo {

/// A Spanish pattern as it stands before these arguments: the "y" before one that begins with the sound of "i" is an
/// "e" ("Línea 2 e Interurbano"); before a diphthong it stays ("Línea 2 y Hierro").
/// Source: Real Academia Española, Diccionario panhispánico de dudas, "y".
std::string withSpanishAnd(std::string pattern, std::span<const FormatArgument> arguments);

}  // namespace nimbo
