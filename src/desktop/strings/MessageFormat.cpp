#include "desktop/strings/MessageFormat.h"

#include <optional>
#include <stdexcept>

#include "desktop/raii/ICUHandles.h"

namespace nimbo {

/// The plural rules and digits of a language.
struct MessageFormat::Counting {
  ICUPluralRules rules;
  ICUNumberFormat numbers;

  explicit Counting(const std::string& languageTag) {
    const ICU& icu = ICU::library();
    const std::string locale = localeOfICU([&](char* text, std::int32_t size, UErrorCode* status) {
      return icu.loc_forLanguageTag(languageTag.c_str(), text, size, nullptr, status);
    });
    UErrorCode status = U_ZERO_ERROR;
    rules.reset(icu.plrules_open(locale.c_str(), &status));
    numbers.reset(icu.num_open(UNUM_DECIMAL, nullptr, 0, locale.c_str(), nullptr, &status));
    checkICU(status);
  }

  /// "one", "few", "other"...; beyond 2^53, that of a number nearby.
  std::string formOf(std::uint64_t count) const {
    return textOfICU([&](UChar* text, std::int32_t size, UErrorCode* status) {
      return ICU::library().plrules_select(rules.get(), static_cast<double>(count), text, size, status);
    });
  }

  std::string textOf(std::uint64_t count) const {
    const std::string digits = std::to_string(count);
    return textOfICU([&](UChar* text, std::int32_t size, UErrorCode* status) {
      return ICU::library().num_formatDecimal(numbers.get(), digits.data(), static_cast<std::int32_t>(digits.size()),
                                              text, size, nullptr, status);
    });
  }
};

/// One pattern being read and filled.
class MessageFormat::Filling {
 public:
  Filling(const MessageFormat& format, std::string_view pattern, std::span<const FormatArgument> arguments)
      : _format(format), _rest(pattern), _arguments(arguments) {}

  std::string whole() {
    std::string text;
    appendMessage(text, nullptr);
    if (!_rest.empty()) throw std::runtime_error("a brace is closed that is not open");
    return text;
  }

 private:
  /// Up to a "}" that belongs to whoever asks, or the end. `count` is what "#" stands for, if anything.
  void appendMessage(std::string& text, const std::uint64_t* count) {
    while (!_rest.empty() && _rest.front() != '}') {
      if (take("{"))
        appendArgument(text);
      else if (count && take("#"))
        text += _format.counting().textOf(*count);
      else if (_rest.front() == '\'')
        throw std::runtime_error("an apostrophe would quote");
      else
        text += takeCharacter();
    }
  }

  /// What stands in braces, of which the first is taken.
  void appendArgument(std::string& text) {
    const auto index = static_cast<std::size_t>(takeCharacter() - '0');
    if (index >= _arguments.size()) throw std::runtime_error("an argument is missing");
    const auto* count = std::get_if<std::uint64_t>(&_arguments[index]);
    const bool isPlural = !take("}");
    if (isPlural && !take(", plural,")) throw std::runtime_error("neither an argument nor plural forms");
    if (isPlural && !count) throw std::runtime_error("the plural of a text");
    if (!count)
      text += std::get<std::string>(_arguments[index]);
    else
      text += isPlural ? pluralForm(*count) : _format.counting().textOf(*count);
  }

  std::string pluralForm(std::uint64_t count) {
    const std::string exactly = "=" + std::to_string(count), form = _format.counting().formOf(count);
    std::optional<std::string> exact, byRule, other;
    for (skipBlanks(); !take("}"); skipBlanks()) {
      const std::string_view selector = _rest.substr(0, _rest.find_first_of(" {}"));
      _rest.remove_prefix(selector.size());
      skipBlanks();
      if (!take("{")) throw std::runtime_error("a plural form has no text");
      std::string text;
      appendMessage(text, &count);
      if (!take("}")) throw std::runtime_error("a brace is not closed");
      if (selector == exactly)
        exact = std::move(text);
      else if (selector == form)
        byRule = std::move(text);
      else if (selector == "other")
        other = std::move(text);
    }
    for (auto* text : {&exact, &byRule, &other})
      if (*text) return std::move(**text);
    throw std::runtime_error("the plural form \"other\" is missing");
  }

  bool take(std::string_view text) {
    if (!_rest.starts_with(text)) return false;
    _rest.remove_prefix(text.size());
    return true;
  }

  char takeCharacter() {
    if (_rest.empty()) throw std::runtime_error("a brace is not closed");
    const char character = _rest.front();
    _rest.remove_prefix(1);
    return character;
  }

  void skipBlanks() {
    while (take(" ")) {
    }
  }

  const MessageFormat& _format;
  std::string_view _rest;
  std::span<const FormatArgument> _arguments;
};

MessageFormat::MessageFormat(std::string languageTag) : _languageTag(std::move(languageTag)) {}

MessageFormat::~MessageFormat() = default;

const MessageFormat::Counting& MessageFormat::counting() const {
  if (!_counting) _counting = std::make_unique<const Counting>(_languageTag);
  return *_counting;
}

std::string MessageFormat::fill(std::string_view pattern, std::span<const FormatArgument> arguments) const {
  return Filling(*this, pattern, arguments).whole();
}

}  // namespace nimbo
