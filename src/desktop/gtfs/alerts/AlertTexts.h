#pragma once

#include <optional>
#include <string>
#include <string_view>

#include "desktop/gtfs/alerts/RealtimeFields.h"
#include "desktop/gtfs/text/Translation.h"

namespace nimbo {

/// What an effect is called in a language (a BCP 47 tag), in English where the program does not know the language.
/// Empty for effects that say nothing. Source: resources/alerts/effect-words.json. Any thread.
std::string effectWords(AlertEffect effect, std::string_view language);

/// What an alert says, as plain text.
struct AlertTexts {
  std::string title;                       ///< one line, not empty, 500 characters at most
  std::optional<std::string> summary;      ///< what the description says first beyond the title
  std::optional<std::string> description;  ///< 10,000 characters at most; absent when it says no more than the title
  std::optional<std::string> linkURL;      ///< an http or https address

  bool operator==(const AlertTexts&) const = default;
};

/// The image of an alert. Either may be absent.
struct AlertImage {
  std::optional<std::string> address;  ///< http or https, of a PNG or JPEG file as its publisher says
  std::optional<std::string> text;     ///< plain; says the same, also where the image is of another kind

  bool operator==(const AlertImage&) const = default;
};

/// The image of an Alert message and its text, each in the best of its languages. Throws protozero::exception for
/// damaged bytes.
AlertImage alertImageIn(std::string_view alert, const LanguagePreference& preference);

/// The texts of an Alert message in the best of its languages. The title is its header, else the first line of its
/// description, else the detail of its effect, else the words of its effect. Absent when it says nothing at all.
/// Throws protozero::exception for damaged bytes.
std::optional<AlertTexts> alertTextsIn(std::string_view alert, AlertEffect effect,
                                       const LanguagePreference& preference);

/// The first sentence or paragraph of a text, to be shown in a line or two.
std::string summaryOfText(std::string_view text);

}  // namespace nimbo
