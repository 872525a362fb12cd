#include "desktop/gtfs/TranslatedText.h"

#include "desktop/gtfs/RealtimeReading.h"

namespace nimbo {

namespace {

constexpr std::size_t kMostTranslations = 1000;  // no text is in more languages

Translation readTranslation(std::string_view body) {
  Translation result;
  for (auto translation = messageIn<TranslationField>(body); translation.next();) {
    switch (translation.tag()) {
      case TranslationField::text:
        result.text = takeView(translation);
        break;
      case TranslationField::language:
        result.language = takeView(translation);
        break;
      default:
        translation.skip();
    }
  }
  return result;
}

}  // namespace

std::vector<Translation> translationsIn(std::string_view alert, AlertField field) {
  std::vector<Translation> result;
  auto message = messageIn<AlertField>(alert);
  while (result.size() < kMostTranslations && message.next(field)) {
    auto text = messageIn<TranslatedStringField>(takeView(message));
    while (result.size() < kMostTranslations && text.next(TranslatedStringField::translation)) {
      const Translation translation = readTranslation(takeView(text));
      if (!translation.text.empty()) result.push_back(translation);
    }
  }
  return result;
}

}  // namespace nimbo
