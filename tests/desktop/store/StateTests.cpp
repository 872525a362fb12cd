#include <unistd.h>

#include "desktop/raii/SQLite.h"
#include "desktop/store/FavoritesEditor.h"
#include "desktop/store/Fixture.h"
#include "desktop/store/SQLiteAnalyticsPipeline.h"
#include "desktop/store/SQLiteSharedSettings.h"
#include "desktop/store/SeenIncidents.h"
#include "desktop/store/StateDatabaseFile.h"
#include "support/FullDisk.h"

namespace nimbo {

namespace fs = std::filesystem;
using testing::ElementsAre;
using testing::HasSubstr;
using Value = SharedSettingsStore::Value;

class StateDatabaseTest : public StoreTest {
 protected:
  std::shared_ptr<SharedSettingsStore> makeSettings() { return SQLiteSharedSettings(makeDatabase()).groupStore(); }
  fs::path setAside() const { return fs::path(file()).concat(".broken-2026-01-05T12-00-00"); }
};

TEST_F(StateDatabaseTest, SharesValuesOfEveryKindBetweenProcesses) {
  const auto host = makeSettings(), widget = makeSettings();
  EXPECT_EQ(widget->valueForKey("key"), std::nullopt);
  EXPECT_FALSE(fs::exists(folder())) << "before the first write";
  for (const Value& value :
       {Value(true), Value(false), Value(""), Value("Zür\0ich"), Value(Bytes()), Value(Bytes{0, 255, 0})}) {
    EXPECT_EQ(host->setValue_forKey(value, "key"), nullptr);
    EXPECT_EQ(widget->valueForKey("key"), value);
  }
  EXPECT_EQ(fs::status(folder()).permissions(), fs::perms::owner_all);
  for (const char* log : {"", "-wal", "-shm"})
    EXPECT_EQ(fs::status(file().concat(log)).permissions(), fs::perms::owner_read | fs::perms::owner_write) << log;
  EXPECT_EQ(widget->removeValueForKey("key"), nullptr);
  EXPECT_EQ(host->valueForKey("key"), std::nullopt);
  EXPECT_EQ(host->removeValueForKey("key"), nullptr);
}

TEST_F(StateDatabaseTest, KeepsWhatCanBeReadOfADamagedFileInEveryProcess) {
  const auto host = makeSettings(), widget = makeSettings();
  ASSERT_EQ(host->setValue_forKey("kept", "first"), nullptr);
  ASSERT_EQ(host->setValue_forKey(Bytes(20000, 'x'), "large"), nullptr);
  ASSERT_EQ(widget->stringForKey("first"), "kept");
  ruinTable("analytics");
  const std::string damaged = contentOf(file());
  SQLiteAnalyticsPipeline analytics(makeDatabase());
  const ErrorRef error = analytics.list().error();
  ASSERT_NE(error, nullptr);
  EXPECT_THAT(notices, ElementsAre(error->reason()));
  EXPECT_THAT(error->reason(), testing::AllOf(HasSubstr(setAside().native()), HasSubstr("0 favorites and 2 settings")));
  EXPECT_EQ(error->subject(), setAside().native());
  EXPECT_TRUE(contentOf(setAside()) == damaged);
  EXPECT_TRUE(analytics.list());
  // Those that had the damaged file open go over to the new one.
  EXPECT_EQ(host->setValue_forKey("since", "second"), nullptr);
  EXPECT_EQ(widget->stringForKey("second"), "since");
  EXPECT_EQ(widget->stringForKey("first"), "kept");
  EXPECT_EQ(notices.size(), 1u);
}

TEST_F(StateDatabaseTest, EndsAReplacementThatWasCutShort) {
  ASSERT_EQ(makeSettings()->setValue_forKey("kept", "key"), nullptr);
  // Half made beside the damaged one, or made and the damaged one set aside.
  std::ofstream(file().string() + ".new") << "half";
  EXPECT_EQ(makeSettings()->stringForKey("key"), "kept");
  EXPECT_FALSE(fs::exists(file().string() + ".new"));
  fs::rename(file(), file().string() + ".new");
  std::ofstream(file().string() + "-wal") << "the damaged one's";
  EXPECT_EQ(makeSettings()->stringForKey("key"), "kept");
  EXPECT_EQ(contentOf(setAside().string() + "-wal"), "the damaged one's");
  EXPECT_FALSE(fs::exists(file().string() + ".new"));
}

TEST_F(StateDatabaseTest, LeavesDatabasesOfOthersAsTheyAre) {
  fs::create_directory(folder());
  for (const char* statements : {"CREATE TABLE t(x); PRAGMA user_version = 99", "CREATE TABLE favorites(name)"}) {
    std::ofstream(file(), std::ios::trunc).close();
    connect().execute(statements);
    const std::string before = contentOf(file());
    const ErrorRef error = makeSettings()->setValue_forKey(true, "key");
    ASSERT_NE(error, nullptr);
    EXPECT_THAT(error->reason(), HasSubstr(file().native()));
    EXPECT_EQ(error->subject(), file().native());
    EXPECT_EQ(makeSettings()->valueForKey("key"), std::nullopt);
    EXPECT_TRUE(platform.log.contains(error->reason()));
    EXPECT_EQ(contentOf(file()), before);
    EXPECT_EQ(std::distance(fs::directory_iterator(folder()), {}), 1);
  }
}

TEST_F(StateDatabaseTest, ShowsWhatIsStoredOnAFullDiskInEitherForm) {
  ASSERT_EQ(FavoritesEditor(makeDatabase(), nullptr).add({lineItem(1, "A")}), nullptr);
  const auto count = [&] {
    const auto favorites = FavoritesEditor(makeDatabase(), nullptr).list();
    EXPECT_TRUE(favorites) << favorites.error()->reason();
    return favorites ? favorites->size() : 0;
  };
  for (const int version : {3, 2, 1}) {
    SCOPED_TRACE(version);
    if (version == 2) makeVersion2();
    if (version == 1) makeVersion1();
    const std::string before = contentOf(file());
    {
      const FullDisk full(1024);
      EXPECT_EQ(count(), 1u);
    }
    EXPECT_EQ(contentOf(file()), before);
  }
  EXPECT_EQ(count(), 1u);
  EXPECT_EQ(connect().integer("PRAGMA user_version"), kStateSchemaVersion);
  EXPECT_EQ(connect().integer("SELECT count(*) FROM settings"), 0);
  EXPECT_TRUE(SeenIncidents(makeDatabase()).list());
  EXPECT_EQ(FavoritesEditor(makeDatabase(), nullptr).remove({1}), nullptr);
  makeVersion2();
  makeVersion1();
  const auto first = [] { return std::vector<TransitLineRef>{lineItem(2, "B")}; };
  EXPECT_TRUE(FavoritesEditor(makeDatabase(), first).list()->empty()) << "an emptied list stays empty";
  EXPECT_TRUE(notices.empty());
}

TEST_F(StateDatabaseTest, KnowsWhatWasSeenUntilItChanges) {
  const auto at = [this](int hours) { return std::optional(platform.time.now() + std::chrono::hours(hours)); };
  const IncidentForm seen{1, 7, {10, 11}, {{at(-1), at(2)}, {at(24), at(26)}}};
  IncidentForm nightly{4, 9, {10}, {}};  // as many as are told of those to come
  for (int day = 1; day <= 16; ++day) nightly.periods.emplace_back(at(24 * day), at(24 * day + 5));
  const SeenIncidents incidents(makeDatabase());
  ASSERT_EQ(incidents.keep({seen, nightly}, platform.time.now()), nullptr);
  const std::tuple<IncidentForm, bool, const char*> cases[] = {
      {seen, true, "the same"},
      {{1, 8, {10}, seen.periods}, false, "other texts"},
      {{1, 7, {10}, {{at(-1), at(3)}}}, false, "a later end"},
      {{1, 7, {10}, {{at(0), at(2)}}}, true, "a beginning that moves with the clock"},
      {{1, 7, {10}, {{at(24), at(26)}}}, true, "one of its periods"},
      {{1, 7, {10}, {{at(48), at(50)}}}, false, "another period"},
      {{2, 7, {11, 12}, seen.periods}, true, "renumbered, on a common line"},
      {{2, 7, {12}, seen.periods}, false, "the same words on another line"},
      {{4, 9, {10}, {{at(24 * 17), at(24 * 17 + 5)}}}, true, "a period beyond those that were told"},
      {{4, 9, {10}, {{at(24 * 3 + 8), at(24 * 3 + 9)}}}, false, "a period between them"},
  };
  const auto kept = SeenIncidents(makeDatabase()).list();
  ASSERT_TRUE(kept);
  for (const auto& [form, isSeen, what] : cases) EXPECT_EQ(kept->have(form, platform.time.now()), isSeen) << what;
  ASSERT_EQ(incidents.keep({{3, 3, {}, {}}}, platform.time.now() + std::chrono::days(91)), nullptr);
  EXPECT_FALSE(incidents.list()->have(seen, platform.time.now())) << "old rows go";
}

TEST_F(StateDatabaseTest, IsReachedThroughLinkedFoldersOnly) {
  ASSERT_EQ(makeSettings()->setValue_forKey("kept", "key"), nullptr);
  const fs::path real = folder().string() + "-real";
  fs::rename(folder(), real);
  fs::create_directory_symlink(real, folder());
  EXPECT_EQ(makeSettings()->stringForKey("key"), "kept");
  fs::rename(file(), real / "other");
  for (const fs::path& target : {real / "other", real / "none", fs::path("/dev/zero")}) {
    SCOPED_TRACE(target);
    fs::create_symlink(target, file());
    EXPECT_EQ(makeSettings()->valueForKey("key"), std::nullopt);
    const ErrorRef error = makeSettings()->setValue_forKey("new", "key");
    ASSERT_NE(error, nullptr);
    EXPECT_THAT(error->reason(), HasSubstr("Cannot read " + file().native() + ": it is a link. Move it away"));
    EXPECT_TRUE(fs::is_symlink(file()));
    fs::remove(file());
  }
  EXPECT_TRUE(notices.empty());
  EXPECT_FALSE(fs::exists(real / "none"));
  // A link that comes between the look and the opening.
  fs::create_symlink(real / "other", real / "late");
  EXPECT_THROW(SQLiteConnection(real / "late", SQLiteConnection::Access::readWrite, 1000), SQLiteFailure);
}

TEST_F(StateDatabaseTest, KeepsTheOldValueWhenAWriteFails) {
  const auto settings = makeSettings();
  ASSERT_EQ(settings->setValue_forKey("old", "key"), nullptr);
  const ErrorRef full = [&] {
    const FullDisk disk(64 * 1024);
    return settings->setValue_forKey(Bytes(1 << 20), "key");
  }();
  ASSERT_NE(full, nullptr);
  EXPECT_THAT(full->reason(), HasSubstr("Cannot write " + file().native()));
  EXPECT_EQ(settings->valueForKey("key"), Value("old"));
  EXPECT_EQ(settings->setValue_forKey("new", "key"), nullptr);
}

TEST_F(StateDatabaseTest, ReadsAFolderThatLetsNothingBeWritten) {
  ASSERT_EQ(makeSettings()->setValue_forKey("old", "key"), nullptr);
  // Rights do not bind the superuser: another user tries then.
  const uid_t user = ::geteuid() == 0 ? 65534 : ::geteuid();
  for (const fs::path& path : {folder().parent_path(), folder(), file()})
    ASSERT_EQ(::chown(path.c_str(), user, ::getegid()), 0);
  fs::permissions(folder(), fs::perms::owner_read | fs::perms::owner_exec);
  ASSERT_EQ(::setreuid(static_cast<uid_t>(-1), user), 0);
  const auto settings = makeSettings();
  const auto value = settings->valueForKey("key");
  const ErrorRef error = settings->setValue_forKey("new", "key");
  const auto later = settings->valueForKey("key");
  ASSERT_EQ(::setreuid(static_cast<uid_t>(-1), ::getuid()), 0);
  fs::permissions(folder(), fs::perms::owner_all);
  EXPECT_EQ(value, Value("old"));
  ASSERT_NE(error, nullptr);
  EXPECT_THAT(error->reason(), HasSubstr("Check that you may read and write"));
  EXPECT_EQ(later, Value("old"));
}

TEST_F(StateDatabaseTest, RefusesValuesThatAreTooLarge) {
  const auto settings = makeSettings();
  EXPECT_NE(settings->setValue_forKey(Bytes(kMaximumStateValueBytes + 1u), "key"), nullptr);
  ASSERT_EQ(settings->setValue_forKey(true, "key"), nullptr);
  connect().execute("UPDATE settings SET value = zeroblob(106000000)");
  EXPECT_EQ(settings->valueForKey("key"), std::nullopt);
  EXPECT_TRUE(platform.log.contains("100 MiB"));
  EXPECT_FALSE(platform.log.lines().back().redacted.find("key") != std::string::npos);
}

TEST_F(StateDatabaseTest, KeepsTheNewestAnalyticsUnlessTurnedOff) {
  const auto database = makeDatabase();
  SQLiteAnalyticsPipeline analytics(database);
  analytics.captureUserAction(9001, 706, std::nullopt);
  for (int i = 1; i < SQLiteAnalyticsPipeline::kMaximumEntries; ++i) analytics.captureUserAction(i, 706, "v");
  TransitWidgetAnalyticsRecord record{true, true, 3, {{"18446744073709551615", "Title \xff"}}, 2};
  const Date start = *dateFromISOText("2026-01-05T11:59:30.5Z");
  analytics.captureWidgetInteraction(2, 1, record, true, start, 29.5);
  const auto settings = SQLiteSharedSettings(database).groupStore();
  settings->setValue_forKey(true, kAnalyticsDisabledKey);
  analytics.captureUserAction(10, 706, std::nullopt);
  connect().execute("INSERT INTO analytics(content) VALUES ('{\"date\": \"tomorrow\"}'), ('[]'), ('')");

  const auto listed = analytics.list();
  ASSERT_TRUE(listed);
  const std::vector<AnalyticsEntry>& entries = *listed;
  ASSERT_EQ(entries.size(), 1000u);
  EXPECT_EQ(std::get<AnalyticsUserAction>(entries.front().content).action, 1);
  EXPECT_EQ(std::get<AnalyticsUserAction>(entries.front().content).value, "v");
  EXPECT_EQ(entries.back().date, platform.time.now());
  EXPECT_EQ(jsonOfAnalyticsEntry(entries.back()),
            R"({"date":"2026-01-05T12:00:00Z","widgetType":2,"endState":1,"wasLocked":true,)"
            R"("startDate":"2026-01-05T11:59:30.500000Z","duration":29.5,"initiallyExpanded":true,)"
            R"("everExpanded":true,"transitMessageType":3,"tappedItemIndex":2,"incidentItems":[{"transitLineMuid":)"
            "\"18446744073709551615\",\"transitIncidentTitle\":\"Title \uFFFD\",\"count\":1}]}");
}

}  // namespace nimbo
