#include <gmock/gmock.h>

#include "desktop/drawing/LateDrawing.h"
#include "desktop/system/LatePart.h"
#include "support/TestPlatform.h"

namespace nimbo {
namespace {

TEST(LatePart, NamesTheFileThatIsMissing) {
  const auto failure = [](const char* file) -> std::string {
    try {
      functionOfLatePart(file, "nimbo_other");
    } catch (const LatePartMissing& missing) {
      return missing.what();
    }
    return "it is there";
  };
  for (const char* file : {"libnimbo-other.so", "libnimbo-feeds.so"})
    EXPECT_THAT(failure(file), testing::HasSubstr(file));
}

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
