// The widget's pictures as a rider sees them: where the ink of texts and shields is, whatever the fonts are.

#include <cairo.h>
#include <gmock/gmock.h>

#include <cctype>

#include "desktop/drawing/Ink.h"
#include "host/Programs.h"
#include "host/ScriptPlayer.h"

namespace nimbo {
namespace {

using nlohmann::json;
using Alerts = std::vector<AlertsBuilder::Alert>;

constexpr double kScale = 2;
constexpr double kReadable = 4.5;  // contrast

/// What shows something in a row, in the picture's pixels.
struct Parts {
  std::vector<PixelBox> texts, shields;
};

void collect(const json& views, double x, double y, Parts& parts) {
  for (const json& view : views) {
    const auto frame = view["frame"].get<std::vector<double>>();
    if (view["hidden"] || frame[2] <= 0 || frame[3] <= 0) continue;
    const auto pixel = [](double points) { return static_cast<int>(points * kScale); };
    const double left = x + frame[0], top = y + frame[1];
    const PixelBox box{pixel(left), pixel(top), pixel(left + frame[2]), pixel(top + frame[3])};
    if (view["class"] == "StyledLabel") parts.texts.push_back(box);
    if (view["class"] == "ArtworkImageView" || view["class"] == "TransitInfoLabelView") parts.shields.push_back(box);
    collect(view["views"], left, top, parts);
  }
}

class Picture {
 public:
  explicit Picture(WidgetPicture drawn)
      : _ink(CairoSurface(CairoSurfaceHandle(cairo_image_surface_create_for_data(
                              drawn.pixels.data(), CAIRO_FORMAT_ARGB32, drawn.layout.width, drawn.layout.height,
                              drawn.layout.stride)),
                          {}, kScale)) {}

  int width() const { return _ink.width(); }
  Ink::Found drawnIn(const PixelBox& box) const {
    return _ink.find(box, [this](std::uint32_t pixel) { return standsOut(pixel); });
  }
  /// Of the pixel that stands out most from the background.
  double contrastIn(const PixelBox& box) const {
    double most = 1;
    _ink.find(box, [&](std::uint32_t pixel) {
      if (standsOut(pixel)) most = std::max(most, contrastRatio(colorOf(pixel), colorOf(_ink.at(0, 0))));
      return false;
    });
    return most;
  }
  /// Whether a line of pixels between the two has nothing on it.
  bool keepsApart(const PixelBox& above, const PixelBox& below) const {
    const Ink::Found first = drawnIn(above);
    for (int y = first.top; y < drawnIn(below).bottom; ++y)
      if (drawnIn({0, y, width(), y + 1}).count == 0) return true;
    return false;
  }

 private:
  bool standsOut(std::uint32_t pixel) const {
    const std::uint32_t background = _ink.at(0, 0);
    for (const int shift : {0, 8, 16})
      if (std::abs(static_cast<int>(pixel >> shift & 0xff) - static_cast<int>(background >> shift & 0xff)) > 20)
        return true;
    return false;
  }
  static Color colorOf(std::uint32_t pixel) {
    const auto part = [pixel](int shift) { return static_cast<double>(pixel >> shift & 0xff) / 255; };
    return {part(16), part(8), part(0), 1};
  }
  Ink _ink;
};

void expectOrder(const json& row, const Picture& picture, bool isMirrored) {
  const auto frame = row["frame"].get<std::vector<double>>();
  Parts parts;
  collect(row["views"], frame[0], frame[1], parts);
  ASSERT_FALSE(parts.texts.empty());
  const auto end = [&](int right, int left) { return isMirrored ? picture.width() - left : right; };
  const auto begin = [&](int right, int left) { return isMirrored ? picture.width() - right : left; };
  const int edge = static_cast<int>(frame[0] * kScale), far = picture.width() - edge;
  for (const PixelBox& text : parts.texts) {
    const Ink::Found ink = picture.drawnIn(text);
    EXPECT_GE(picture.contrastIn(text), kReadable);
    const bool isPrimary = text.top == parts.texts[0].top;
    const std::string words = row[isPrimary ? "primaryText" : "secondaryText"];
    if (isMirrored && std::isalpha(static_cast<unsigned char>(words.at(0))))
      EXPECT_NEAR(ink.left, text.left, 12) << "a text begins on its own side";
    else
      EXPECT_NEAR(begin(ink.right, ink.left), edge, 12) << "texts begin on the leading side";
    EXPECT_GE(ink.top, frame[1] * kScale);
    EXPECT_LE(ink.bottom, (frame[1] + frame[3]) * kScale);
  }
  const bool isSummary = row["class"] == "NBTransitSummaryItem";
  EXPECT_TRUE(!isSummary || picture.keepsApart(parts.texts[0], parts.shields.at(0)));
  for (const PixelBox& shield : parts.shields) {
    const Ink::Found ink = picture.drawnIn(shield);
    ASSERT_GT(ink.count, 0u);
    EXPECT_GE(ink.top, frame[1] * kScale);
    if (isSummary) {
      EXPECT_NEAR(begin(ink.right, ink.left), edge, 2);
      EXPECT_LE(end(ink.right, ink.left), far);
      continue;
    }
    EXPECT_NEAR(end(ink.right, ink.left), far, 16) << "shields end on the trailing side";
    for (const PixelBox& text : parts.texts)
      EXPECT_LT(end(picture.drawnIn(text).right, picture.drawnIn(text).left), begin(ink.right, ink.left));
    const Ink::Found title = picture.drawnIn(parts.texts[0]);
    const bool isOneLine = parts.texts.size() == 1 && title.bottom - title.top < 60;
    if (isOneLine) {
      EXPECT_NEAR(title.top + title.bottom, ink.top + ink.bottom, 12) << "a lone text is level with its shield";
    }
    const double strength = picture.contrastIn(shield) - 1;
    if (row["artwork"]["alpha"] < 1) {
      EXPECT_LT(strength, (picture.contrastIn(parts.texts[0]) - 1) / 2);
    }
  }
}

class RowPictures : public testing::Test {
 protected:
  /// A metro and buses.
  void setUpCity(const Alerts& alerts, const std::string& firstLine = "1", const std::string& secondLine = "2") {
    programs.folder.write(
        "feed/routes.txt",
        "route_id,agency_id,route_short_name,route_long_name,route_type,route_color,route_text_color\n"
        "m1,M," +
            firstLine + ",Harbour Line,1,005599,FFFFFF\nm2,M," + secondLine +
            ",Castle Line,1,CC0000,FFFFFF\nb0,B,B0,Bus,3,,\nb39,B,B39,Bus,3,,\n");
    programs.setUpCity({"m1", "m2", "b0", "b39"}, alerts);
  }

  /// The rows as drawn with these parameters of `initialize` over the ordinary ones.
  std::pair<json, Picture> draw(const json& parameters, bool isExpanded) {
    std::vector<json> events = appearing();
    json& all = events[0]["params"];
    all["scale"] = kScale;
    all.update(parameters);
    events.push_back(request("performUpdate"));
    if (isExpanded) events.push_back(request("setActiveDisplayMode", {{"mode", "expanded"}}));
    events.push_back(request("snapshot"));
    events.push_back(request("render"));
    std::stringstream script, output;
    for (const json& event : events) script << event << "\n";
    GLibRunLoop runLoop;
    const PictureMemory memory;
    ::setenv("NIMBO_TRANSIT_WIDGET", NIMBO_TRANSIT_WIDGET, 1);
    WidgetClient client(runLoop,
                        {"--config", programs.folder.path() / "config", "--state", programs.folder.path() / "state",
                         "--virtual-time", isoTextOfDate(Programs::now())},
                        &memory);
    ScriptPlayer(client, output).play(script);
    std::vector<json> lines;
    for (std::string line; std::getline(output, line);) lines.push_back(json::parse(line));
    const auto drawn = protocol::read<protocol::Rendered>(lines.back()["result"]);
    return {snapshots(lines).at(0), Picture(memory.take(drawn).value())};
  }

  void expectRows(const json& parameters, bool isExpanded) {
    SCOPED_TRACE(parameters.dump() + (isExpanded ? " expanded" : " compact"));
    const auto [snapshot, picture] = draw(parameters, isExpanded);
    ASSERT_EQ(snapshot["rows"].size(), isExpanded ? 4u : 1u);
    for (const json& row : snapshot["rows"]) expectOrder(row, picture, parameters.value("locale", "") == "ar");
  }

  Programs programs;
};

TEST_F(RowPictures, AreInOrderInEverySizeLanguageAndAppearance) {
  setUpCity({{"x", {"m1", "m2"}, "Signal failure at the castle", "Trains run every ten minutes."},
             {"y", {"m1", "b0"}, "Marathon", "Streets are closed and stops have moved until the evening."},
             {"z", {"b0"}, "Works", ""}});
  const json tall = {{"compact", {359, 343}}, {"expanded", {359, 1372}}};
  const json cases[] = {{{"locale", "en"}},
                        {{"appearance", "dark"}},
                        {{"locale", "de"}},
                        {{"locale", "ja"}},
                        {{"locale", "ar"}},
                        {{"locale", "ar"}, {"appearance", "dark"}, {"textSize", "extraExtraExtraLarge"}},
                        {{"textSize", "extraSmall"}},
                        {{"textSize", "extraExtraExtraLarge"}},
                        {{"textSize", "accessibilityLarge"}},
                        {{"textSize", "accessibilityExtraExtraExtraLarge"}, {"displayModes", tall}}};
  for (const json& parameters : cases)
    for (const bool isExpanded : {false, true}) expectRows(parameters, isExpanded);
}

TEST_F(RowPictures, KeepShieldsOffTheTextsHoweverNarrowTheyAre) {
  // Of equal shields only one would be made smaller: all of them have to be narrow enough.
  setUpCity({{"x", {"m1"}, "Signal failure at the castle", "Trains run every ten minutes until the evening."},
             {"y", {"m1"}, "Elevatoroutofservicebeyondthecastle", ""},
             {"z", {"m2"}, "Marathon", "Streets are closed."}},
            "Hudson-Bergen Light Rail", "WWWWWWWWWW");
  for (const int width : {240, 300, 348, 359})
    for (const auto& [textSize, height] : {std::pair("large", 110), {"accessibilityExtraExtraExtraLarge", 343}})
      for (const char* locale : {"en", "ar"})
        for (const bool isExpanded : {false, true}) {
          const json sizes = {{"compact", {width, height}}, {"expanded", {width, 4 * height}}};
          expectRows({{"displayModes", sizes}, {"textSize", textSize}, {"locale", locale}}, isExpanded);
        }
}

}  // namespace
}  // namespace nimbo
