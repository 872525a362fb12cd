#include <cmath>

#include "desktop/drawing/CairoImage.h"
#include "desktop/drawing/CairoSurface.h"
#include "desktop/drawing/Ink.h"
#include "support/TemporaryFolder.h"
#include "support/TestPlatform.h"

namespace nimbo {
namespace {

constexpr Color kRed{1, 0, 0, 1}, kNone{0, 0, 0, 0};

TEST(Picture, RefusesSizesThatNoMemoryHolds) {
  for (const auto& [size, scale, width] : {std::tuple{Size{0, 1}, 1.0, 1}, {{3, 3}, 0.5, 2}, {{10000, 110}, 1, 10000}})
    EXPECT_EQ((*CairoSurface::make(size, scale))->pixelWidth(), width);
  for (const auto& [size, scale] : {std::pair{Size{10000, 10000}, 4.0},
                                    {{10000, 1}, 4},
                                    {{-1, 1}, 1},
                                    {{1, 1}, 0},
                                    {{std::nan(""), 1}, 1},
                                    {{1, HUGE_VAL}, 1},
                                    {{1, 1}, HUGE_VAL}}) {
    const auto made = CairoSurface::make(size, scale);
    ASSERT_FALSE(made) << size.width << " " << scale;
    EXPECT_EQ(made.error()->code(), kDrawingErrorBadSize);
  }
}

TEST(Picture, ClipsAndMovesUntilRestored) {
  const auto made = renderToSurface(
      [](Painter& painter) {
        painter.save({10, 0}, {0, 0, 10, 20});
        painter.save({5, 5}, {0, 0, 100, 5});
        painter.fillRect({-50, -50, 200, 200}, kRed);
        painter.restore();
        painter.restore();
        painter.fillRect({0, 18, 2, 2}, kBlack);
        EXPECT_THROW(painter.restore(), std::logic_error);
      },
      {40, 20}, 2, kWhite);
  const Ink ink(**made);
  const auto red = ink.ofColor(0xff0000), black = ink.ofColor(0);
  EXPECT_EQ((std::array{red.left, red.top, red.right, red.bottom}), (std::array{30, 10, 40, 20}));
  EXPECT_EQ((std::array{black.left, black.top, black.right, black.bottom}), (std::array{0, 36, 4, 40}));
}

TEST(Picture, FitsImagesAndTintsTheirShape) {
  const TestPlatform platform;
  const auto image = CairoImageResources().image("good-v2", 2, false);
  const auto drawn = [&](double alpha, const Color& tint) {
    return Ink(**renderToSurface(
        [&](Painter& p) {
          p.drawImage(*image, {0, 0, 100, 50}, alpha, tint);
        },
        {100, 50}, 1, kWhite));
  };
  const auto plain = drawn(1, kNone).find([](std::uint32_t p) { return (p & 0xff) < 200; });
  EXPECT_NEAR(plain.right - plain.left, plain.bottom - plain.top, 1);
  EXPECT_NEAR(plain.left, 100 - plain.right, 1);
  const Ink tinted = drawn(1, kRed);
  EXPECT_GT(tinted.ofColor(0xff0000).count, 500u);
  EXPECT_EQ(tinted.at(47, 32), 0xffffffff) << "the check stays open";
  // At its own size an image is as sharp as it was drawn, wherever it stands.
  const auto greys = [&](double x) {
    const auto made = renderToSurface(
        [&](Painter& p) {
          p.save({0.26, 0}, {0, 0, 50, 50});
          p.drawImage(*image, {x, x, 32, 32}, 1, kBlack);
        },
        {40, 40}, 2, kWhite);
    return Ink(**made).find([](auto p) { return (p & 0xff) > 0 && (p & 0xff) < 255; }).count;
  };
  EXPECT_EQ(greys(2.3), greys(1.74));
  const std::uint32_t faint = drawn(0.3, kBlack).at(35, 15) & 0xff;
  EXPECT_NEAR(faint, 255 * 0.7, 2);
}

TEST(NamedImages, AreSharpAtAnyScaleAndReadableInBothAppearances) {
  const TestPlatform platform;
  CairoImageResources images;
  for (const char* name : {"good-v2", "good-alt-v2", "advisories-v2", "WidgetGenericTransit"}) {
    const auto small = Ink(images.image(name, 1, false)).drawn(), large = Ink(images.image(name, 4, false)).drawn();
    EXPECT_EQ(images.image(name, 4, false)->size(), (Size{32, 32}));
    EXPECT_NEAR(large.left, 4 * small.left, 4) << name;
    EXPECT_NEAR(large.right, 4 * small.right, 4) << name;
    EXPECT_NEAR(large.bottom, 4 * small.bottom, 4) << name;
    EXPECT_GT(large.bottom - large.top, 80) << name;
    // Few pixels are neither inside nor outside.
    const auto edge = Ink(images.image(name, 4, false)).find([](auto p) { return p >> 24 > 0 && p >> 24 < 255; });
    EXPECT_LT(edge.count, large.count / 4) << name;
  }
  EXPECT_GT(Ink(images.image("advisories-v2", 2, true)).ofColor(0xffffff).count, 300u);
  EXPECT_EQ(images.image("good-v2", 2, true), images.image("good-v2", 2, true));
  EXPECT_TRUE(platform.log.lines().empty());
}

}  // namespace
}  // namespace nimbo
