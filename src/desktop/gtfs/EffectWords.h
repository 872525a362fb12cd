#pragma once

#include <string>
#include <string_view>

#include "desktop/gtfs/RealtimeFields.h"

namespace nimbo {

/// What an effect is called in a language (a BCP 47 tag), in English where the program does not know the language.
/// Empty for effects that say nothing. Source: resources/alerts/effect-words.json. Any thread.
std::string effectWords(AlertEffect effect, std::string_view language);

}  // namespace nimbo
