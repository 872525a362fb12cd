#pragma once

#include <span>
#include <string_view>
#include <vector>

#include "desktop/gtfs/alerts/RealtimeFields.h"

namespace nimbo {

/// One language's version of a text.
struct Translation {
  std::string_view text;
  std::string_view language;  ///< BCP 47 tag as published; empty where the publisher gives none
};

/// What the reader wants to read, as BCP 47 tags, empty where not known.
struct LanguagePreference {
  std::string_view user;  ///< "de-AT"
  std::string_view feed;  ///< the language in which the feed is written
};

/// The version to show: in the user's exact language, his language in another region, without a tag, in the feed's
/// language, in English, else the first. Blank versions do not count; versions tagged as markup ("en-html") only when
/// there are no others. Empty when nothing is left. Case and "_" for "-" make no difference in tags.
std::string_view chooseTranslation(std::span<const Translation> translations, const LanguagePreference& preference);

/// Whether two tags name the same language, whatever the region and script.
bool isSameLanguage(std::string_view a, std::string_view b);

/// The translations of a text of an alert, those without text left out, 1000 at most. `alert` is the Alert message,
/// `field` one that holds a TranslatedString. Of a damaged text what was read. Throws protozero::exception for a
/// message that breaks off.
std::vector<Translation> translationsIn(std::string_view alert, AlertField field);

}  // namespace nimbo
