#include "desktop/drawing/LateDrawing.h"
#include "desktop/system/LatePart.h"
#include "support/TestPlatform.h"

namespace nimbo {
namespace {

TEST(LatePart, HasTheProgramsPlatform) {
  LateDrawing drawing("en");
  for (const std::string name : {"first", "second"}) {
    const TestPlatform platform;
    EXPECT_EQ(drawing.image(name, 1, false), nullptr);
    EXPECT_THAT(platform.log.texts("Images", LogLevel::error), testing::ElementsAre(testing::HasSubstr(name)));
  }
}

}  // namespace
}  // namespace nimbo
