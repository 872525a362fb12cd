#include <unistd.h>

#include <cmath>
#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <limits>

#include "desktop/drawing/CairoSurface.h"
#include "desktop/drawing/Ink.h"
#include "desktop/drawing/PangoTextSystem.h"
#include "support/TestPlatform.h"

namespace nimbo {
namespace {

constexpr FontDescriptor kBody{17, false};
constexpr double kUnlimited = std::numeric_limits<double>::infinity();

class PangoText : public testing::Test {
 protected:
  TextLayoutRef layOut(const std::string& text, double width = kUnlimited, std::size_t lines = 0,
                       bool rightToLeft = false) {
    return system.layOut(text, kBody, width, lines, rightToLeft);
  }
  /// Black on white within 200 points, 40 high.
  Ink drawn(const TextLayout& layout, double scale = 1) {
    return Ink(**renderToSurface(
        [&](Painter& painter) {
          painter.drawText(layout, {0, 0}, 200, kBlack);
        },
        {200, 40}, scale, kWhite));
  }
  static Ink::Found dark(const Ink& ink) {
    return ink.find([](std::uint32_t pixel) { return (pixel & 0xff) < 160; });
  }

  TestPlatform platform;
  PangoTextSystem system;
};

TEST_F(PangoText, MeasuresTheCapitalsThatItDraws) {
  const FontMetrics metrics = system.metrics(kBody);
  const auto layout = layOut("HHH");
  EXPECT_NEAR(layout->firstBaseline(), metrics.ascent, 0.01);
  EXPECT_NEAR(layout->size().height, metrics.ascent + metrics.descent, 0.01);
  const auto ink = dark(drawn(*layout, 8));
  EXPECT_NEAR(ink.bottom / 8.0, layout->firstBaseline(), 0.25);
  EXPECT_NEAR((ink.bottom - ink.top) / 8.0, metrics.capHeight, 0.25);
  EXPECT_DOUBLE_EQ(system.metrics({34, false}).capHeight, 2 * metrics.capHeight);
  EXPECT_GT(system.layOut("Hamburg", {17, true}, kUnlimited, 1, false)->size().width, layOut("Hamburg")->size().width);
}

TEST_F(PangoText, BreaksLinesAndCutsTheLastOne) {
  const std::string text = "Trains run every twenty minutes between Mill Street and Harbour";
  const auto all = layOut(text, 150), two = layOut(text, 150, 2), one = layOut(text, 150, 1);
  EXPECT_GT(all->lineCount(), 2u);
  EXPECT_FALSE(all->isTruncated());
  EXPECT_EQ(two->lineCount(), 2u);
  EXPECT_TRUE(two->isTruncated());
  EXPECT_EQ(one->lineCount(), 1u);
  EXPECT_TRUE(one->isTruncated());
  EXPECT_NEAR(layOut(text, one->size().width, 1)->size().width, one->size().width, 0.01);
  for (const auto& layout : {all, two, one}) EXPECT_LE(layout->size().width, 150);
  EXPECT_NEAR(all->lastBaseline() - all->firstBaseline(),
              static_cast<double>(all->lineCount() - 1) * one->size().height, 0.5);
  // A box of exactly the measured width holds the text.
  const auto whole = layOut(text, kUnlimited, 1);
  EXPECT_FALSE(layOut(text, whole->size().width, 1)->isTruncated());
  EXPECT_EQ(layOut("a\nb\r\nc\u2028d", kUnlimited, 1)->lineCount(), 1u);
  EXPECT_EQ(layOut("a\nb\r\nc\u2028d")->lineCount(), 4u);
  EXPECT_EQ(layOut("one word each", 0)->lineCount(), 3u);
  EXPECT_EQ(layOut("", 100, 1)->lineCount(), 1u);
}

TEST_F(PangoText, LeavesNoLetterOrTwoOfAWordForTheNextLine) {
  for (const auto& [word, first] :
       {std::pair{"Retrasos", "Retra-"}, {"Verspätungen", "Verspätun-"}, {"Ааааск", "Ааа-"}}) {
    const auto broken = layOut(word, layOut(word)->size().width - 1);
    EXPECT_EQ(broken->lineCount(), 2u) << word;
    EXPECT_NEAR(broken->size().width, layOut(first)->size().width, 1) << word;
  }
}

TEST_F(PangoText, RunsInTheDirectionOfItsFirstLetter) {
  const int width = 200;
  const std::tuple<std::string, bool, bool> cases[] = {{"abc", true, false},
                                                       {"5, abc", true, false},
                                                       {"12", false, false},
                                                       {"12", true, true},
                                                       {"тест", true, false},
                                                       {"تأخير", false, true},
                                                       {"5 – קו", false, true},
                                                       {"\u2068abc\u2069 و\u2068abc\u2069", false, true},
                                                       {"\u2068\u2067א\u2069א\u2069 and", true, false},
                                                       {"\u2068abc\u2069: \u2068abc\u2069", true, true},
                                                       {"\u2068א\u2069", false, false}};
  for (const auto& [text, isOtherwise, isRightToLeft] : cases)
    for (const std::size_t lines : {0u, 1u}) {
      SCOPED_TRACE(text);
      const auto ink = dark(drawn(*layOut(text, width, lines, isOtherwise)));
      EXPECT_EQ(ink.right > width - 6, isRightToLeft);
      EXPECT_EQ(ink.left < 6, !isRightToLeft);
    }
  // The direction orders the runs of a mixed text: the full stop goes to the end of the paragraph.
  const auto whole = dark(drawn(*layOut("אבג ...", width))), letters = dark(drawn(*layOut("אבג", width)));
  EXPECT_LT(whole.left, letters.left - 4);
}

TEST_F(PangoText, SurvivesAwkwardTexts) {
  std::string marks;
  for (int i = 0; i < 5000; ++i) marks += "\u0301";
  for (const std::string& text :
       {marks, std::string("a\xff\xfe\xc3"), std::string("a\0b", 3), std::string(10000, 'x'),
        std::string("\u202e\u202d\u2067abc"), std::string("a\u05d0b\u0627c"), std::string(300000, '\n')})
    for (const double width : {0.0, 1.0, 10000.0, -1.0, std::nan("")})
      for (const std::size_t lines : {0u, 1u, 3u}) {
        const auto layout = layOut(text, width, lines);
        EXPECT_GE(layout->lineCount(), 1u);
        EXPECT_TRUE(lines == 0 || layout->lineCount() <= lines);
        EXPECT_TRUE(std::isfinite(layout->size().width) && std::isfinite(layout->size().height));
      }
  EXPECT_EQ(layOut("a\xff")->size().width, layOut("a\uFFFD")->size().width);
}

TEST_F(PangoText, CutsWhatNoRowCouldShow) {
  const std::size_t limit = PangoTextSystem::kMaximumCharacters;
  EXPECT_FALSE(layOut(std::string(limit, 'x'))->isTruncated());
  const auto cut = layOut(std::string(limit + 1, 'x'));
  EXPECT_TRUE(cut->isTruncated());
  EXPECT_NEAR(cut->size().width, layOut(std::string(limit, 'x') + "…")->size().width, 0.01);
  // The letter before the cut keeps its accent or goes with it.
  const std::string head(limit - 1, 'x');
  for (const std::string cluster : {"e\u0301", "\U0001F468\u200D\U0001F469"})
    EXPECT_NEAR(layOut(head + cluster + "xyz")->size().width, layOut(head + "…")->size().width, 0.01);
}

TEST_F(PangoText, LogsOnceThatCharactersHaveNoFont) {
  layOut("\U0010FFFD and \U0010FFFC");
  layOut("\U0010FFFD");
  EXPECT_EQ(platform.log.texts("Text", LogLevel::error).size(), 1u);
}

TEST(PangoTextWithoutFonts, StillMeasuresAndLogs) {
  testing::GTEST_FLAG(death_test_style) = "threadsafe";
  const auto run = [] {
    const auto config = std::filesystem::temp_directory_path() / ("nimbo-no-fonts-" + std::to_string(getpid()));
    std::ofstream(config) << "<fontconfig></fontconfig>";
    setenv("FONTCONFIG_FILE", config.c_str(), 1);
    const TestPlatform platform;
    PangoTextSystem system;
    const FontMetrics metrics = system.metrics(kBody);
    const auto layout = system.layOut("Mill Street", kBody, 60, 2, false);
    std::filesystem::remove(config);
    const bool isInOrder = metrics.ascent > 0 && metrics.descent > 0 && metrics.capHeight > 0 &&
                           layout->size().width > 0 && platform.log.texts("Text").size() == 1;
    std::_Exit(isInOrder ? 0 : 1);
  };
  EXPECT_EXIT(run(), testing::ExitedWithCode(0), "");
}

}  // namespace
}  // namespace nimbo
