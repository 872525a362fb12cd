#include <unicode/locid.h>
#include <unicode/msgfmt.h>
#include <unicode/plurrule.h>

#include <filesystem>
#include <fstream>
#include <nlohmann/json.hpp>
#include <regex>
#include <set>

#include "desktop/DesktopPlatform.h"
#include "desktop/resources/Resources.h"
#include "desktop/strings/ICUStringTables.h"
#include "support/TestPlatform.h"

namespace nimbo {

namespace {

constexpr const char* kLanguages[] = {"en", "de", "fr", "es", "ja", "ar"};

std::map<std::string, std::string> tableOf(const std::string& language) {
  return nlohmann::json::parse(resourceNamed("strings/" + language + ".json").value());
}

/// The numbers of the arguments that a pattern asks for.
std::set<std::string> argumentsOf(const std::string& pattern) {
  static const std::regex argument("\\{(\\d)[,}]");
  std::set<std::string> numbers;
  for (std::sregex_iterator match(pattern.begin(), pattern.end(), argument), end; match != end; ++match)
    numbers.insert((*match)[1]);
  return numbers;
}

/// The keys that the program's sources name.
std::set<std::string> keysInSources() {
  static const std::regex key("\"((?:TransitWidget|Transit_|Window_|Notice_)\\w+)\"");
  std::set<std::string> keys;
  for (const auto& entry : std::filesystem::recursive_directory_iterator(NIMBO_SOURCES)) {
    if (entry.path().extension() != ".cpp" && entry.path().extension() != ".h") continue;
    std::ifstream file(entry.path());
    const std::string text(std::istreambuf_iterator<char>(file), {});
    for (std::sregex_iterator match(text.begin(), text.end(), key), end; match != end; ++match)
      keys.insert((*match)[1]);
  }
  return keys;
}

std::string utf8(const icu::UnicodeString& string) {
  std::string text;
  return string.toUTF8String(text);
}

/// The categories ("one", "other") that whole numbers have in a language.
std::set<std::string> categoriesOf(const std::string& language) {
  UErrorCode status = U_ZERO_ERROR;
  const std::unique_ptr<icu::PluralRules> rules(icu::PluralRules::forLocale(icu::Locale(language.c_str()), status));
  std::set<std::string> categories;
  for (int count = 0; count < 1000; ++count) categories.insert(utf8(rules->select(count)));
  return categories;
}

std::ptrdiff_t count(const std::string& text, const std::string& pattern) {
  const std::regex regex(pattern);
  return std::distance(std::sregex_iterator(text.begin(), text.end(), regex), {});
}

std::string fill(const ICUStringTables& tables, std::string_view key, std::initializer_list<FormatArgument> arguments) {
  return tables.format(tables.stringForKey(key).value_or("no text"), std::span(arguments.begin(), arguments.size()));
}

}  // namespace

TEST(StringTables, SayTheSameInEveryLanguage) {
  const auto english = tableOf("en");
  for (const std::string language : kLanguages) {
    const TestPlatform platform;
    const ICUStringTables tables(language);
    const auto table = tableOf(language);
    for (const auto& [key, pattern] : english) {
      SCOPED_TRACE(language + " " + key);
      const std::string& text = table.at(key);
      EXPECT_FALSE(text.empty());
      EXPECT_EQ(argumentsOf(text), argumentsOf(pattern));
      EXPECT_EQ(text.find('\''), std::string::npos) << "an apostrophe quotes in patterns: write ’";
      // Counts, that being harder, for every argument: whatever is left of the pattern's own signs was not understood.
      EXPECT_EQ(fill(tables, key, {std::uint64_t{5}, std::uint64_t{6}, std::uint64_t{7}}).find_first_of("{}#"),
                std::string::npos);
    }
    EXPECT_TRUE(platform.log.lines().empty());
  }
}

TEST(StringTables, HaveTheKeysOfTheProgramAndTheirLanguagesPlurals) {
  const std::set<std::string> keys = keysInSources();
  for (const std::string language : kLanguages) {
    const std::set<std::string> categories = categoriesOf(language);
    std::set<std::string> present;
    for (const auto& [key, pattern] : tableOf(language)) {
      present.insert(key);
      for (const std::string category : {"zero", "one", "two", "few", "many", "other"})
        EXPECT_EQ(count(pattern, category + " ?\\{"), categories.contains(category) ? count(pattern, ", ?plural,") : 0)
            << language << " " << key;
    }
    EXPECT_EQ(present, keys) << language;
  }
}

TEST(StringTables, CountByTheRulesOfTheLanguage) {
  const std::map<std::string, std::vector<std::string>> texts{
      // for                 0             1                2            3            11           100
      {"en", {"0 Advisories", "1 Advisory", "2 Advisories", "3 Advisories", "11 Advisories", "100 Advisories"}},
      {"de", {"0 Hinweise", "1 Hinweis", "2 Hinweise", "3 Hinweise", "11 Hinweise", "100 Hinweise"}},
      {"ja", {"運行情報0件", "運行情報1件", "運行情報2件", "運行情報3件", "運行情報11件", "運行情報100件"}},
      {"ar", {"لا تنبيهات", "تنبيه واحد", "تنبيهان", "٣ تنبيهات", "١١ تنبيهًا", "١٠٠ تنبيه"}},
      {"ar-AE", {"لا تنبيهات", "تنبيه واحد", "تنبيهان", "3 تنبيهات", "11 تنبيهًا", "100 تنبيه"}},
  };
  for (const auto& [language, forms] : texts) {
    const ICUStringTables tables(language);
    std::size_t i = 0;
    for (const std::uint64_t count : {0, 1, 2, 3, 11, 100})
      EXPECT_EQ(fill(tables, "TransitWidget_Summary_advisory_count", {count}), forms[i++]);
  }
  EXPECT_EQ(fill(ICUStringTables("de"), "Transit_Incident_Not_Displayed_Incidents", {UINT64_MAX}),
            "+18.446.744.073.709.551.615 weitere");
}

TEST(StringTables, CountAsICUDoes) {
  for (const std::string locale :
       {"en", "en-IN", "de", "de-CH", "de-u-nu-arab", "fr", "fr-CA", "es", "es-MX", "ja", "ar", "ar-AE"}) {
    const ICUStringTables tables(locale);
    const auto icu = stringsPart().makePatternFormat(locale);
    auto patterns = tableOf(locale.substr(0, 2));
    patterns["own"] = "{0} # {1, plural, one{=1 #} =2 {two {0}} other  {# {0, plural, =7 {#} other {{1} #}}}}";
    for (const auto& [key, pattern] : patterns)
      for (const std::uint64_t count : {0, 1, 2, 3, 7, 11, 21, 100, 999, 1000, 1000000}) {
        const FormatArgument counts[] = {count, count, count};
        EXPECT_EQ(tables.format(pattern, counts), icu->fill(pattern, counts)) << locale << " " << key;
      }
  }
}

TEST(StringTables, AnswerPatternsThatCannotBeFilled) {
  const ICUStringTables english("en");
  const std::vector<FormatArgument> arguments{std::string("A"), std::uint64_t{2}};
  EXPECT_EQ(english.format("{1, plural, one {# in {0}} other {# in {0}}}", arguments), "2 in A");
  // What is not given stays; what ICU quotes, it quotes.
  EXPECT_EQ(english.format("it's {1} '{0}' {0} {2}", std::span(arguments).first(1)), "it's {1} {0} A {2}");
  for (const std::string pattern :
       {"{", "{0", "{0, plural, other {#}}", "{1, plural}", "{1, plural, one {#}}", "{1, plural, other {#}"}) {
    const TestPlatform platform;
    EXPECT_EQ(english.format(pattern, arguments), pattern);
    EXPECT_EQ(platform.log.lines().size(), 1u) << pattern;
  }
}

TEST(StringTables, JoinNamesByTheLanguagesComma) {
  const std::map<std::string, std::string> texts{
      {"en", "A, B, C, and D: {0} 'x'"},
      {"de", "A, B, C und D: {0} 'x'"},
      {"fr", "A, B, C et D\u00a0: {0} 'x'"},
      {"es", "A, B, C y D: {0} 'x'"},
      {"ja", "A、B、C、D：{0} 'x'"},
      {"ar", "\u2068A\u2069، \u2068B\u2069، \u2068C\u2069 و\u2068D\u2069: \u2068{0} 'x'\u2069"},
  };
  for (const auto& [language, text] : texts) {
    const ICUStringTables tables(language);
    const std::string list = tables.commaDelimitedList({"A", "B", "C"});
    EXPECT_EQ(fill(tables, "TransitWidget_N_Lines_Prepended_Incident_Text", {list, "D", "{0} 'x'"}), text);
    EXPECT_EQ(tables.commaDelimitedList({}), "");
    EXPECT_EQ(tables.isRightToLeft(), language == "ar");
  }
}

TEST(StringTables, SayTheSpanishAndByTheSoundAfterIt) {
  const ICUStringTables spanish("es");
  const std::map<std::string, std::vector<std::string>> names{{"e", {"Interurbano", "iris", "Íñigo", "hilo", "I"}},
                                                              {"y", {"Hierro", "Ionia", "Yo", "Hotel", "3", ""}}};
  for (const auto& [word, all] : names)
    for (const std::string& name : all)
      for (const std::string kind : {"2_Lines", "N_Lines_Names"})
        EXPECT_EQ(fill(spanish, "TransitWidget_" + kind + "_Concatenated", {"Línea 2", name}),
                  "Línea 2 " + word + " " + name);
  EXPECT_EQ(fill(spanish, "TransitWidget_2_Lines_Prepended_Incident_Text", {"A", "Iris", "B y Iris"}),
            "A e Iris: B y Iris");
  EXPECT_EQ(fill(spanish, "Window_Incident_OtherLines", {std::uint64_t{1}}), "y 1 más");
}

TEST(StringTables, KeepNamesFromRightToLeftInOrder) {
  const char* const both = "TransitWidget_2_Lines_Concatenated";
  const ICUStringTables english("en"), german("de"), arabic("ar");
  const std::string five = "קו 5", six = "קו 6", isolatedFive = "\u2068קו 5\u2069", isolatedSix = "\u2068קו 6\u2069";
  EXPECT_EQ(fill(english, both, {five, six}), isolatedFive + " and " + isolatedSix);
  EXPECT_EQ(fill(german, both, {"S 5", six}), "S 5 und " + isolatedSix);
  EXPECT_EQ(fill(arabic, both, {five, "S 6"}), isolatedFive + " و\u2068S 6\u2069");
  EXPECT_EQ(fill(english, "Window_Favorites_Up", {"خط 1"}), "Move \u2068خط 1\u2069 up");
  // A list is isolated name by name, in the order of the language.
  const std::string list = english.commaDelimitedList({five, "Żółta", six});
  EXPECT_EQ(list, isolatedFive + ", Żółta, " + isolatedSix);
  EXPECT_EQ(fill(english, "TransitWidget_N_Lines_Prepended_Incident_Text", {list, "7", "עיכובים"}),
            list + ", and 7: \u2068עיכובים\u2069");
  // Of every script that runs from right to left, and of none that does not.
  for (const std::string text : {"ا", "ܐ", "ނ", "ߊ", "ﬡ", "ﷲ", "ﻻ", "\U00010800", "\U0001E900"})
    EXPECT_EQ(english.commaDelimitedList({text}), "\u2068" + text + "\u2069");
  for (const std::string text : {"é", "Ж", "Ա", "अ", "京", "ﬀ", "Ａ", "€", "\U0001F687", "\u061C"})
    EXPECT_EQ(english.commaDelimitedList({text}), text);
}

TEST(SearchKey, IsOneForTextsThatARiderTakesForTheSame) {
  const char* const alike[][2] = {{"Zürich", "ZURICH"},       {"ВИТОША", "витоша"}, {"Łódź", "lodz"},
                                  {"Straße", "STRASSE"},      {"Αθήνα", "ΑΘΗΝΑ"},   {"İzmir", "izmir"},
                                  {"København", "kobenhavn"}, {"ＪＲ線", "jr線"},   {"Hà Nội", "ha noi"},
                                  {"مُحَمَّد", "محمد"},           {"e\u0301", "é"}};
  for (const auto& [text, other] : alike)
    EXPECT_EQ(stringsPart().searchKey(text), stringsPart().searchKey(other)) << text;
  const char* const different[][2] = {{"か", "が"}, {"दिन", "दन"}, {"A", "B"}, {"U1", "U10"}};
  for (const auto& [text, other] : different) EXPECT_NE(stringsPart().searchKey(text), stringsPart().searchKey(other));
  EXPECT_EQ(stringsPart().searchKey("A\xFF"), "a\uFFFD");
}

TEST(StringTables, FallBackToTheLanguageAndThenToEnglish) {
  const std::map<std::string, std::vector<std::string>> locales{
      {"Keine Favoriten", {"de-AT", "de_CH.UTF-8", "de_DE@euro", "DE-Latn-AT"}},
      {"No Favorite Lines", {"pl_PL.UTF-8", "C", "", "../en"}}};
  for (const auto& [title, all] : locales)
    for (const std::string& locale : all)
      EXPECT_EQ(ICUStringTables(locale).stringForKey("TransitWidget_NoFavoriteTransitLines_Title"), title) << locale;
  // Hebrew has a dual and runs from right to left; the English texts do neither.
  const ICUStringTables hebrew("he");
  EXPECT_EQ(fill(hebrew, "TransitWidget_Summary_advisory_count", {std::uint64_t{2}}), "2 Advisories");
  EXPECT_FALSE(hebrew.isRightToLeft());
  EXPECT_EQ(hebrew.stringForKey("no such key"), std::nullopt);
}

TEST(Locale, IsTheFirstOfLanguageThatHasTextsUnlessTheLocaleIsPlain) {
  const char* const cases[][5] = {
      {"", "", "", "", "en"},
      {"", "", "de_AT.UTF-8", "", "de_AT"},
      {"", "fr_FR", "de_DE", "", "fr_FR"},
      {"es_ES@euro", "fr_FR", "de_DE", "", "es_ES"},
      {"es_ES", "fr_FR", "de_DE", "ja", "ja"},
      {"", "", "de_DE", "pl:fr_CA.UTF-8:es", "fr_CA"},
      {"", "", "de_DE", ":fr", "fr"},
      {"", "", "de_DE", "pl:C:fr", "en"},
      {"", "", "de_DE", ":", "de_DE"},
      {"", "", "", "fr", "en"},
      {"C.UTF-8", "", "de_DE", "fr", "en"},
      {"", "POSIX", "de_DE", "fr", "en"},
  };
  std::map<const char*, std::optional<std::string>> before;
  for (const char* name : {"LC_ALL", "LC_MESSAGES", "LANG", "LANGUAGE"})
    before[name] = std::getenv(name) ? std::optional<std::string>(std::getenv(name)) : std::nullopt;
  for (const auto& [all, messages, lang, language, locale] : cases) {
    setenv("LC_ALL", all, 1);
    setenv("LC_MESSAGES", messages, 1);
    setenv("LANG", lang, 1);
    setenv("LANGUAGE", language, 1);
    EXPECT_EQ(DesktopPlatform::localeOfEnvironment(), locale) << lang << " " << language;
  }
  for (const auto& [name, value] : before) value ? setenv(name, value->c_str(), 1) : unsetenv(name);
}

}  // namespace nimbo
