#include "desktop/gtfs/alerts/AlertTexts.h"

#include <nlohmann/json.hpp>

#include "desktop/gtfs/text/PlainText.h"
#include "desktop/gtfs/text/Translation.h"
#include "desktop/gtfs/text/Utf8.h"
#include "desktop/resources/Resources.h"

namespace nimbo {

namespace {

/// Name in the published enumeration; empty for effects without words.
std::string_view nameOf(AlertEffect effect) {
  switch (effect) {
    case AlertEffect::noService:
      return "NO_SERVICE";
    case AlertEffect::reducedService:
      return "REDUCED_SERVICE";
    case AlertEffect::significantDelays:
      return "SIGNIFICANT_DELAYS";
    case AlertEffect::detour:
      return "DETOUR";
    case AlertEffect::additionalService:
      return "ADDITIONAL_SERVICE";
    case AlertEffect::modifiedService:
      return "MODIFIED_SERVICE";
    case AlertEffect::otherEffect:
      return "OTHER_EFFECT";
    case AlertEffect::stopMoved:
      return "STOP_MOVED";
    case AlertEffect::accessibilityIssue:
      return "ACCESSIBILITY_ISSUE";
    case AlertEffect::noEffect:
    case AlertEffect::unknownEffect:
      break;
  }
  return {};
}

}  // namespace

std::string effectWords(AlertEffect effect, std::string_view language) {
  const std::string_view name = nameOf(effect);
  if (name.empty()) return {};
  static const nlohmann::json words = nlohmann::json::parse(resourceNamed("alerts/effect-words.json").value());
  std::string key = "en";
  for (const auto& [tag, ignored] : words.items())
    if (isSameLanguage(tag, language)) key = tag;
  return words.at(key).at(name).get<std::string>();
}

namespace {

// In characters. Publishers have been seen to write titles of 255 and descriptions of 3591.
constexpr std::size_t kLongestTitle = 500;
constexpr std::size_t kLongestDescription = 10'000;
constexpr std::size_t kLongestAddress = 2000;
constexpr std::size_t kLongestParagraph = 200;  // that a row's second text can sensibly show

std::string textIn(std::string_view alert, AlertField field, const LanguagePreference& preference, std::size_t limit) {
  const auto translations = translationsIn(alert, field);
  return plainText(chooseTranslation(translations, preference), limit);
}

/// The text on one line.
std::string onOneLine(std::string_view text) {
  std::string result;
  for (const char c : text)
    if (c != '\n')
      result += c;
    else if (!result.empty() && result.back() != ' ')
      result += ' ';
  return result;
}

std::string_view firstLine(std::string_view text) { return text.substr(0, text.find('\n')); }

/// What a text says after its title, when it begins with it as a heading or sentence of its own; else all of it: "Line
/// 1" is not repeated in "Line 1 is closed until Friday." or "Line 1.5 km".
std::string_view afterTitle(std::string_view text, std::string_view title) {
  constexpr std::string_view kMarks = " .:;,!?\n";
  title = title.substr(0, title.find_last_not_of(kMarks) + 1);
  std::size_t position = 0;
  for (const char c : title) {
    // Lines of the text are parted by blanks in the title.
    const std::size_t next = c == ' ' ? text.find_first_not_of(" \n", position) : position + 1;
    const bool isSame = position < text.size() && (text[position] == c || (c == ' ' && text[position] == '\n'));
    if (!isSame || next == std::string_view::npos) return text;
    position = next;
  }
  const std::string_view rest = text.substr(position);
  const std::size_t begin = rest.find_first_not_of(kMarks);
  if (begin == std::string_view::npos) return {};
  const std::string_view between = rest.substr(0, begin);
  const bool endsLine = between.find('\n') != std::string_view::npos;
  const bool endsSentence = between.find_first_of(".:!?") != std::string_view::npos && between.ends_with(' ');
  return endsLine || endsSentence ? rest.substr(begin) : text;
}

/// Whether a sentence ends with the character before `position`.
bool endsSentence(std::string_view text, std::size_t position, char32_t last) {
  if (last == U'\u3002' || last == U'\uFF01' || last == U'\uFF1F') return true;
  if (last != '.' && last != '!' && last != '?' && last != U'\u061F' && last != U'\u06D4') return false;
  return position == text.size() || text[position] == ' ';
}

/// The longest run of whole sentences within the limit, else the first sentence, however long.
std::string_view leadingSentences(std::string_view paragraph) {
  std::size_t end = 0, count = 0;
  for (std::size_t position = 0; position < paragraph.size();) {
    const char32_t character = takeCharacter(paragraph, position);
    ++count;
    if (count > kLongestParagraph && end > 0) break;
    if (endsSentence(paragraph, position, character)) end = position;
  }
  return paragraph.substr(0, end > 0 ? end : paragraph.size());
}

/// A line that only announces the next one: "What's happening?", "Affected stops:", "Reason".
bool isHeading(std::string_view line) {
  constexpr std::size_t kLongestHeading = 40, kLongestWord = 12;
  return line.size() <= kLongestHeading &&
         (line.ends_with(':') || line.ends_with('?') || (line.size() <= kLongestWord && !line.ends_with('.')));
}

bool isWebAddress(std::string_view text) {
  const std::string lower = asciiLowerCase(text.substr(0, 8));
  return (lower.starts_with("http://") || lower.starts_with("https://")) &&
         text.find_first_of(" \n\"<>") == std::string_view::npos && !text.ends_with("…");  // cut, it leads elsewhere
}

/// A localized image as a translation whose text is its address; empty for one of another kind than are shown.
Translation readLocalizedImage(std::string_view body) {
  Translation result;
  std::string kind;
  for (auto image = messageIn<LocalizedImageField>(body); image.next();) {
    switch (image.tag()) {
      case LocalizedImageField::url:
        result.text = trimmed(takeView(image));
        break;
      case LocalizedImageField::mediaType:
        kind = asciiLowerCase(trimmed(takeView(image)));
        break;
      case LocalizedImageField::language:
        result.language = takeView(image);
        break;
      default:
        image.skip();
    }
  }
  const bool isShown = kind == "image/png" || kind == "image/jpeg" || kind == "image/jpg";
  return isShown && result.text.size() <= kLongestAddress && isWebAddress(result.text) ? result : Translation();
}

std::vector<Translation> imagesIn(std::string_view alert) {
  constexpr std::size_t kMostImages = 1000;
  std::vector<Translation> images;
  auto message = messageIn<AlertField>(alert);
  while (images.size() < kMostImages && message.next(AlertField::image)) {
    auto all = messageIn<TranslatedImageField>(takeView(message));
    try {
      while (images.size() < kMostImages && all.next(TranslatedImageField::localizedImage))
        images.push_back(readLocalizedImage(takeView(all)));
    } catch (const protozero::exception&) {
      continue;
    }
  }
  return images;
}

}  // namespace

AlertImage alertImageIn(std::string_view alert, const LanguagePreference& preference) {
  AlertImage image;
  if (const std::string_view address = chooseTranslation(imagesIn(alert), preference); !address.empty())
    image.address = address;
  if (std::string text = textIn(alert, AlertField::imageAlternativeText, preference, kLongestTitle); !text.empty())
    image.text = std::move(text);
  return image;
}

std::string summaryOfText(std::string_view text) {
  std::string paragraph(firstLine(text));
  for (std::string_view rest = text; isHeading(paragraph) && rest.find('\n') != std::string_view::npos;) {
    rest.remove_prefix(rest.find('\n') + 1);
    if (firstLine(rest).empty()) continue;
    paragraph.append(paragraph.ends_with(':') || paragraph.ends_with('?') ? " " : ": ").append(firstLine(rest));
  }
  return std::string(firstCharacters(paragraph, kLongestParagraph) == paragraph ? paragraph
                                                                                : leadingSentences(paragraph));
}

std::optional<AlertTexts> alertTextsIn(std::string_view alert, AlertEffect effect,
                                       const LanguagePreference& preference) {
  AlertTexts texts;
  const auto titleIn = [&](AlertField field) { return textIn(alert, field, preference, kLongestTitle); };
  std::string description = textIn(alert, AlertField::descriptionText, preference, kLongestDescription);
  texts.title = onOneLine(titleIn(AlertField::headerText));
  if (texts.title.empty()) texts.title = firstLine(titleIn(AlertField::descriptionText));
  if (texts.title.empty()) texts.title = onOneLine(titleIn(AlertField::effectDetail));
  if (texts.title.empty()) texts.title = effectWords(effect, preference.user);
  if (texts.title.empty()) return std::nullopt;
  if (const std::string_view rest = afterTitle(description, texts.title); !rest.empty()) {
    texts.summary = summaryOfText(rest);
    texts.description = std::move(description);
  }
  if (std::string url = textIn(alert, AlertField::url, preference, kLongestAddress); isWebAddress(url))
    texts.linkURL = std::move(url);
  return texts;
}

}  // namespace nimbo
