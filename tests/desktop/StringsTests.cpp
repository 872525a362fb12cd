#include <gmock/gmock.h>

#include <nlohmann/json.hpp>
#include <regex>
#include <set>

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
      ASSERT_TRUE(table.contains(key));
      const std::string& text = table.at(key);
      EXPECT_FALSE(text.empty());
      EXPECT_EQ(argumentsOf(text), argumentsOf(pattern));
      EXPECT_EQ(text.find('\''), std::string::npos) << "an apostrophe quotes in patterns: write ’";
      // Counts, that being harder, for every argument: whatever is left of the pattern's own signs was not understood.
      EXPECT_EQ(fill(tables, key, {std::uint64_t{5}, std::uint64_t{6}, std::uint64_t{7}}).find_first_of("{}#"),
                std::string::npos);
    }
    EXPECT_EQ(table.size(), english.size()) << language;
    EXPECT_TRUE(platform.log.lines().empty());
  }
}

TEST(StringTables, CountByTheRulesOfTheLanguage) {
  const std::map<std::string, std::vector<std::string>> texts{
      // for                 0             1                2            3            11           100
      {"en", {"0 Advisories", "1 Advisory", "2 Advisories", "3 Advisories", "11 Advisories", "100 Advisories"}},
      {"de", {"0 Meldungen", "1 Meldung", "2 Meldungen", "3 Meldungen", "11 Meldungen", "100 Meldungen"}},
      {"fr", {"0 alerte", "1 alerte", "2 alertes", "3 alertes", "11 alertes", "100 alertes"}},
      {"es", {"0 avisos", "1 aviso", "2 avisos", "3 avisos", "11 avisos", "100 avisos"}},
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

TEST(StringTables, FallBackToTheLanguageAndThenToEnglish) {
  for (const auto& [locale, title] : std::map<std::string, std::string>{{"de-AT", "Keine Favoriten"},
                                                                        {"de_CH.UTF-8", "Keine Favoriten"},
                                                                        {"de_DE@euro", "Keine Favoriten"},
                                                                        {"DE-Latn-AT", "Keine Favoriten"},
                                                                        {"pl_PL.UTF-8", "No Favorite Lines"},
                                                                        {"C", "No Favorite Lines"},
                                                                        {"", "No Favorite Lines"},
                                                                        {"../en", "No Favorite Lines"}})
    EXPECT_EQ(ICUStringTables(locale).stringForKey("TransitWidget_NoFavoriteTransitLines_Title"), title) << locale;
  // Hebrew has a dual and runs from right to left; the English texts do neither.
  const ICUStringTables hebrew("he");
  EXPECT_EQ(fill(hebrew, "TransitWidget_Summary_advisory_count", {std::uint64_t{2}}), "2 Advisories");
  EXPECT_FALSE(hebrew.isRightToLeft());
  EXPECT_EQ(hebrew.stringForKey("no such key"), std::nullopt);
}

}  // namespace nimbo
