#pragma once

#include <string_view>
#include <vector>

#include "desktop/gtfs/RealtimeFields.h"
#include "desktop/gtfs/Translation.h"

namespace nimbo {

/// The translations of a text of an alert, those without text left out, 1000 at most. `alert` is the Alert message,
/// `field` one that holds a TranslatedString. Throws protozero::exception for damaged bytes.
std::vector<Translation> translationsIn(std::string_view alert, AlertField field);

}  // namespace nimbo
