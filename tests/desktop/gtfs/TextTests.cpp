#include <gtest/gtest.h>

#include <cstdio>
#include <memory>

#include "desktop/gtfs/alerts/AlertTexts.h"
#include "desktop/gtfs/text/Html.h"
#include "desktop/gtfs/text/PlainText.h"
#include "desktop/gtfs/text/Translation.h"

namespace nimbo {
namespace {

TEST(PlainText, IsWhatARiderReads) {
  const std::tuple<const char*, std::string, std::string> cases[] = {
      {"plain lines", "  Bus 5\r\n\r\n\r\n detour \t here ", "Bus 5\n\ndetour here"},
      {"paragraphs and breaks, whose line ends in the source are spaces",
       "<p>One<br />\ntwo</p>\n<ul><li>three\nfour</li></ul>", "One\ntwo\nthree four"},
      {"inline tags", "No <b class=\"x>y\">service</b> on <a href='/l'>Line 1</a>", "No service on Line 1"},
      {"no-break space, folded", "A&nbsp;&#160;B", "A B"},
      {"entities, decoded once", "Fish &amp; Chips &lt;b&gt; &amp;lt; &#8217;&#x2019; &eacute; &#150;",
       "Fish & Chips <b> &lt; ’’ é –"},
      {"entities of Greek and Czech, and of two characters", "&Alpha;&theta;&#42; z&ecaron; &fjlig;", "Αθ* zě fj"},
      {"what is no entity", "AT&T &unknown; &#xZZ; & &; ?a=1&copy=2", "AT&T &unknown; &#xZZ; & &; ?a=1&copy=2"},
      {"what is no tag", "<5 min, the <F> train, a < b, <a or b", "<5 min, the <F> train, a < b, <a or b"},
      {"a tag cut off", "Trains stop. <a href=\"https://exa", "Trains stop."},
      {"a quotation mark that never closes", "<span style=\"x>Shuttle</span> bus", "Shuttle bus"},
      {"script, style, comment", "<style>p{}</style>A<!-- b --><script>if (a<b) c()</script>D", "AD"},
      {"icon words", "[A] trains <strong>[shuttle bus icon]</strong>", "[A] trains [shuttle bus icon]"},
      {"invisible characters", "[R]\u200C and \u200Bm\u00ADore\uFEFF", "[R] and more"},
      {"joiners that matter", "می\u200Cشود \U0001F468\u200D\U0001F469", "می\u200Cشود \U0001F468\u200D\U0001F469"},
      {"stray direction marks", "\u200ELine\u202E 5\u2069", "Line 5"},
      {"direction marks of a right-to-left text", "خط A\u200F.", "خط A\u200F."},
      {"controls", std::string("a\0b\x07\x7F", 5) + "c", "abc"},
      {"bytes that are no UTF-8",
       "Stra\xDF"
       "e \x96 5\x80",
       "Straße – 5€"},
      {"nothing", "<p> &nbsp;</p>\u200F", ""},
  };
  for (const auto& [what, raw, plain] : cases) EXPECT_EQ(plainText(raw), plain) << what;
}

TEST(HtmlEntities, AreThoseThatPythonKnows) {
  constexpr const char* kList =
      "python3 -c 'from html.entities import html5\n"
      "for k in html5: print(k, *(\"%x\" % ord(c) for c in (html5[k] + chr(0))[:2]))'";
  const std::unique_ptr<FILE, decltype(&pclose)> list(popen(kList, "r"), &pclose);
  char name[64];
  unsigned first = 0, second = 0;
  std::size_t found = 0;
  while (std::fscanf(list.get(), "%63s %x %x", name, &first, &second) == 3) {
    const std::string reference = "&" + std::string(name);
    const auto entity = htmlEntityAt(reference + "x;");
    ASSERT_EQ(entity.has_value(), reference.ends_with(';')) << reference;
    if (!entity) continue;
    ++found;
    EXPECT_EQ(entity->character, first) << reference;
    EXPECT_EQ(entity->second, second) << reference;
    EXPECT_EQ(entity->length, reference.size());
  }
  EXPECT_EQ(found, 2125u);
}

TEST(PlainText, IsCutBetweenWhatARiderTakesForCharacters) {
  const std::tuple<const char*, std::string, std::size_t, std::string> cases[] = {
      {"a text that fits", "<b>Straße</b> ", 6, "Straße"},
      {"a letter too many", "<b>Straßen</b>", 6, "Straß…"},
      {"an end of a paragraph", "<p>A<p>é", 2, "A…"},
      {"a letter and its marks", "Vie\u0302\u0323t Nam", 5, "Vi…"},
      {"a mark too many", "Caf\u00e9e\u0301", 5, "Café…"},
      {"a family", "A\U0001F468\u200D\U0001F469\u200D\U0001F467 B", 4, "A…"},
      {"flags", "\U0001F1E9\U0001F1EA\U0001F1EB\U0001F1F7\U0001F1EA\U0001F1F8", 4, "\U0001F1E9\U0001F1EA…"},
      {"a syllable of letters", "\u1112\u1161\u11ab\u1100\u1173\u11af!", 6, "\u1112\u1161\u11ab…"},
      {"vowel signs", "\u0928\u092e\u0938\u094d\u0924\u0947 !", 4, "\u0928\u092e…"},
      {"one character, longer than the text may be", "e" + std::string("\u0301\u0301\u0301\u0301"), 3, "e\u0301…"},
  };
  for (const auto& [what, text, limit, cut] : cases) EXPECT_EQ(plainText(text, limit), cut) << what;
}

TEST(PlainText, TakesLinearTimeForHostileMarkup) {
  for (const char* unit : {"<a ", "<a =\"", "<!--", "&#", "<style>", "<p", "\u200D"}) {
    std::string text;
    while (text.size() < 1'000'000) text += unit;
    plainText(text);  // minutes, were it quadratic
  }
}

TEST(Translation, ComesInTheBestLanguageThereIs) {
  const std::tuple<const char*, std::vector<Translation>, const char*, const char*> cases[] = {
      {"exact tag, whatever the case and separator", {{"de", "de"}, {"at", "DE_at"}}, "de-AT", "at"},
      {"same language", {{"en", "en"}, {"br", "pt-BR"}}, "pt", "br"},
      {"untagged before the feed's", {{"bg", "bg"}, {"none", ""}}, "ja", "none"},
      {"the feed's before English", {{"en", "en"}, {"bg", "bg"}}, "ja", "bg"},
      {"English before any", {{"fr", "fr"}, {"en", "en-GB"}}, "ja", "en"},
      {"any", {{" \n", "ja"}, {"fr", "fr"}, {"it", "it"}}, "ja", "fr"},
      {"markup only without anything else", {{"<b>", "en-html"}, {"en", "en"}}, "en", "en"},
      {"markup of another language after plain text", {{"<b>", "de-html"}, {"en", "en"}}, "de", "en"},
      {"markup alone", {{"<i>", "fr-html"}, {"<b>", "en-html"}}, "en", "<b>"},
      {"nothing", {{"", "en"}, {" ", ""}}, "en", ""},
  };
  for (const auto& [what, translations, user, chosen] : cases)
    EXPECT_EQ(chooseTranslation(translations, {user, "bg"}), chosen) << what;
}

TEST(SummaryOfText, EndsWithASentenceOrParagraph) {
  const std::string sentence = std::string(120, 'x') + ". ";
  const std::pair<std::string, std::string> cases[] = {
      {"Buses turn at A.\nStops B and C are closed.", "Buses turn at A."},
      {"What's happening?\nTrack works", "What's happening? Track works"},
      {"Affected stops:\n\nA\nB", "Affected stops: A"},
      {"Reason\n\nStrike of the drivers.", "Reason: Strike of the drivers."},
      {sentence + "It is v. 2.5 now. " + sentence, sentence + "It is v. 2.5 now."},
      {std::string(300, 'y') + " end", std::string(300, 'y') + " end"},
  };
  for (const auto& [text, summary] : cases) EXPECT_EQ(summaryOfText(text), summary);
}

}  // namespace
}  // namespace nimbo
