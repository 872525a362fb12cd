#include "desktop/gtfs/text/Translation.h"

#include <algorithm>

#include "desktop/gtfs/alerts/RealtimeFields.h"
#include "desktop/gtfs/text/Utf8.h"

namespace nimbo {

namespace {

constexpr std::string_view kMarkupSuffix = "-html";

char folded(char c) {
  if (c == '_') return '-';
  return c >= 'A' && c <= 'Z' ? static_cast<char>(c - 'A' + 'a') : c;
}

bool isSameTag(std::string_view a, std::string_view b) {
  return std::equal(a.begin(), a.end(), b.begin(), b.end(), [](char x, char y) { return folded(x) == folded(y); });
}

bool isMarkup(std::string_view tag) {
  return tag.size() >= kMarkupSuffix.size() && isSameTag(tag.substr(tag.size() - kMarkupSuffix.size()), kMarkupSuffix);
}

std::string_view primaryTag(std::string_view tag) { return tag.substr(0, tag.find_first_of("-_")); }

/// How well a tag fits; 0 is best.
int rankOf(std::string_view tag, const LanguagePreference& preference) {
  if (isMarkup(tag)) tag.remove_suffix(kMarkupSuffix.size());
  if (tag.empty()) return 2;
  if (isSameTag(tag, preference.user)) return 0;
  if (isSameLanguage(tag, preference.user)) return 1;
  if (isSameLanguage(tag, preference.feed)) return 3;
  return isSameLanguage(tag, "en") ? 4 : 5;
}

}  // namespace

bool isSameLanguage(std::string_view a, std::string_view b) {
  return !a.empty() && isSameTag(primaryTag(a), primaryTag(b));
}

std::string_view chooseTranslation(std::span<const Translation> translations, const LanguagePreference& preference) {
  constexpr int kMarkupPenalty = 100;
  const Translation* best = nullptr;
  int bestRank = 0;
  for (const Translation& translation : translations) {
    if (trimmed(translation.text).empty()) continue;
    const std::string_view tag = trimmed(translation.language);
    const int rank = rankOf(tag, preference) + (isMarkup(tag) ? kMarkupPenalty : 0);
    if (best && rank >= bestRank) continue;
    best = &translation;
    bestRank = rank;
  }
  return best ? best->text : std::string_view();
}

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
    try {
      while (result.size() < kMostTranslations && text.next(TranslatedStringField::translation)) {
        const Translation translation = readTranslation(takeView(text));
        if (!translation.text.empty()) result.push_back(translation);
      }
    } catch (const protozero::exception&) {
      continue;
    }
  }
  return result;
}

}  // namespace nimbo
