#include "desktop/gtfs/feeds/FeedConfiguration.h"
#include "desktop/store/Fixture.h"
#include "desktop/store/SQLiteSharedSettings.h"
#include "process/SourceWatch.h"

namespace nimbo {
namespace {

using SourceWatchTest = StoreTest;

TEST_F(SourceWatchTest, HearsOfWhatTheRowsAreMadeFromAlone) {
  const TemporaryFolder home;
  const Paths paths{home.path() / "config", folder(), home.path() / "cache"};
  std::filesystem::create_directories(folder());
  GLibRunLoop loop(&platform.time);
  const auto mine = makeDatabase(), others = makeDatabase();
  const FavoritesEditor favorites(mine, nullptr);
  SQLiteSharedSettings settings(mine), otherSettings(others);
  const auto set = [&](const char* key, const char* value) {
    EXPECT_FALSE(otherSettings.groupStore()->setValue_forKey(std::string(value), key));
  };
  const auto write = [&](const char* name) { return home.write(name, "x").native(); };
  int changes = 0;
  const SourceWatch watch(loop, paths, favorites, settings.groupStore(), [&] { ++changes; });
  const struct {
    const char* name;
    std::function<void()> change;
    int told;
  } steps[] = {
      {"another setting", [&] { set("a", "b"); }, 0},
      {"the setting", [&] { set("refreshSeconds", "90"); }, 1},
      {"the same", [&] { set("refreshSeconds", "90"); }, 0},
      {"a favorite", [&] { EXPECT_FALSE(FavoritesEditor(others, nullptr).add({lineItem(1, "1")})); }, 1},
      {"a feed, and the folder of its configuration",
       [&] {
         EXPECT_FALSE(FeedConfiguration(paths.config)
                          .add({"city", *FeedAddress::parse((home.path() / "feed").native()),
                                *FeedAddress::parse((home.path() / "alerts.pb").native())}));
       },
       1},
      {"its keys", [&] { write("config/keys.json"); }, 1},
      {"its lines", [&] { write("feed/routes.txt"); }, 1},
      {"its lines once more", [&] { write("feed/routes.txt"); }, 1},
      {"its alerts", [&] { write("alerts.pb"); }, 1},
      {"other alerts in their place", [&] { std::filesystem::rename(write("new.pb"), home.path() / "alerts.pb"); }, 1},
      {"alerts that go", [&] { std::filesystem::remove(home.path() / "alerts.pb"); }, 1},
      {"a file beside them", [&] { write("other.pb"); }, 0},
      {"the feed", [&] { EXPECT_FALSE(FeedConfiguration(paths.config).remove("city")); }, 1},
      {"its alerts, which are nobody's", [&] { write("alerts.pb"); }, 0},
  };
  for (const auto& step : steps) {
    const int before = changes;
    step.change();
    bool isRead = false;
    loop.dispatchAsync([&] { isRead = true; });
    while (!isRead) loop.runOnce();
    platform.time.advance(SourceWatch::kSettling);
    EXPECT_EQ(changes - before, step.told) << step.name;
  }
}

}  // namespace
}  // namespace nimbo
