#include <thread>

#include "desktop/store/FavoritesSeal.h"
#include "desktop/store/Fixture.h"
#include "desktop/store/GuardedFavorites.h"
#include "platform/wire/StoredTransitLineItem.h"

namespace nimbo {

using testing::ElementsAre;
using testing::IsEmpty;
using Names = std::vector<std::string>;

class FavoritesTest : public StoreTest {
 protected:
  FavoritesEditor makeEditor() {
    return {makeDatabase(), [this] { return firstFavorites; }};
  }
  Favorites read() {
    return GuardedFavorites(makeEditor(), platform.transitLines).remotePersister()->readFavorites().value();
  }

  /// Names of lines and kinds of other favourites in their order.
  Names names() {
    Names names;
    for (const FavoriteRef& favorite : read()) {
      const auto* line = dynamic_cast<const FavoriteTransitLine*>(favorite.get());
      if (!line)
        names.push_back(favorite->kind());
      else
        names.push_back(line->transitLine() ? *line->transitLine()->name() : "no line");
    }
    return names;
  }

  /// Changes the database behind the editor's back, and seals it.
  void change(const char* statements) {
    SQLiteConnection connection = connect();
    connection.execute(statements);
    sealFavorites(connection);
  }

  std::vector<TransitLineRef> firstFavorites;
};

TEST_F(FavoritesTest, BeginWithTheFirstOnesUntilTheUserChangesThem) {
  firstFavorites = {lineItem(1, "A"), lineItem(2, "B")};
  FavoritesEditor editor = makeEditor();
  EXPECT_THAT(names(), ElementsAre("A", "B"));
  EXPECT_NE(editor.remove({7}), nullptr);
  firstFavorites.pop_back();
  EXPECT_THAT(names(), ElementsAre("A")) << "a refused change keeps nothing";
  EXPECT_EQ(editor.add({lineItem(3, "C")}), nullptr);
  firstFavorites = {lineItem(9, "Z")};
  EXPECT_THAT(names(), ElementsAre("A", "C"));
  EXPECT_EQ(editor.remove({3, 1}), nullptr);
  EXPECT_THAT(names(), IsEmpty()) << "an emptied list stays empty";
}

TEST_F(FavoritesTest, ChangeLinesAndLeaveOtherKindsInTheirPlaces) {
  FavoritesEditor editor = makeEditor();
  ASSERT_EQ(editor.add({lineItem(1, "A")}), nullptr);
  change("INSERT INTO favorites(position, kind, content) VALUES (1, 'place', x'00ff'), (4, 'guide', 12)");
  ASSERT_EQ(editor.add({lineItem(2, "B"), lineItem(3, "C")}), nullptr);
  EXPECT_EQ(editor.move(1, 2), nullptr);
  EXPECT_THAT(names(), ElementsAre("B", "place", "guide", "C", "A"));
  EXPECT_EQ(editor.move(3, 0), nullptr);
  EXPECT_EQ(editor.move(2, 1), nullptr) << "where it is";
  for (const auto& [error, code] : {std::pair{editor.move(2, 3), FavoritesError::position},
                                    {editor.move(9, 0), FavoritesError::unknown},
                                    {editor.remove({1, 9}), FavoritesError::unknown},
                                    {editor.add({lineItem(4, "D"), lineItem(2, "B")}), FavoritesError::duplicate},
                                    {editor.add({lineItem(4, "D"), lineItem(4, "D")}), FavoritesError::duplicate}})
    EXPECT_EQ(error ? std::optional(FavoritesError{error->code()}) : std::nullopt, code);
  EXPECT_THAT(names(), ElementsAre("C", "place", "guide", "B", "A"));
  EXPECT_EQ(editor.remove({3}), nullptr);
  EXPECT_THAT(names(), ElementsAre("place", "guide", "B", "A"));
  EXPECT_EQ(connect().integer("SELECT count(*) FROM favorites WHERE (kind, content) IN"
                              " (VALUES ('place', x'00ff'), ('guide', 12))"),
            2);
}

TEST_F(FavoritesTest, KeepWholeLines) {
  BasicTransitLineItem::Fields fields;
  TransitLineLocator locator{"city", "agency \xff", "U1", "1", TransitMode::tram};
  fields.identifier = std::make_shared<const MapItemIdentifier>(0xfedcba9876543210, locator);
  fields.name = "Zürich \"1\"";
  fields.lineColorString = "#336699";
  fields.isBus = true;
  fields.system = std::make_shared<const TransitSystem>(1u << 31, "System", modeArtwork(TransitMode::ferry));
  fields.modeArtwork = modeArtwork(TransitMode::bus);
  TransitArtwork::Fields shield = shieldArtwork("1")->fields();
  shield.iconFallbackShieldDataSource = TransitShield{2, {}, "#000000", "#ffffff"};
  fields.alternateArtwork = std::make_shared<const TransitArtwork>(shield);
  ASSERT_EQ(makeEditor().add({std::make_shared<const BasicTransitLineItem>(fields)}), nullptr);

  locator.agencyID = "agency \uFFFD";
  fields.identifier = std::make_shared<const MapItemIdentifier>(fields.identifier->muid(), locator);
  const auto snapshot = [](const TransitLineRef& line) {
    return StoredTransitLineItem::initWithLineItem(std::dynamic_pointer_cast<const TransitLineItem>(line));
  };
  const auto kept = snapshot(dynamic_cast<const FavoriteTransitLine&>(*read().at(0)).transitLine());
  ASSERT_TRUE(kept);
  EXPECT_TRUE(kept->isEqual(snapshot(std::make_shared<const BasicTransitLineItem>(fields)).get()))
      << kept->description();
}

TEST_F(FavoritesTest, KeepTheContentOfALineThatCannotBeRead) {
  FavoritesEditor editor = makeEditor();
  ASSERT_EQ(editor.add({lineItem(1, "A"), lineItem(2, "B"), lineItem(3, "C"), lineItem(4, "D")}), nullptr);
  change(
      "UPDATE favorites SET content = CASE muid WHEN 1 THEN '{\"isBus\": 7}' WHEN 2 THEN '[' END"
      " WHERE muid < 4");
  EXPECT_THAT(names(), ElementsAre("no line", "no line", "no line", "D"));
  EXPECT_EQ(editor.move(1, 3), nullptr);
  EXPECT_THAT(names(), ElementsAre("no line", "no line", "D", "no line"));
  EXPECT_EQ(connect().integer("SELECT count(*) FROM favorites WHERE content = '['"), 1);
}

TEST_F(FavoritesTest, FailTheLookupRatherThanSeemToBeNone) {
  ASSERT_EQ(makeEditor().add({lineItem(1, "A")}), nullptr);
  GuardedFavorites favorites(makeEditor(), platform.transitLines);
  const auto persister = favorites.remotePersister();
  const auto lookUp = [&](const std::optional<Favorites>& unread = std::nullopt) {
    std::vector<MapItemIdentifierRef> identifiers;
    const Favorites read = unread ? *unread : persister->readFavorites().value();
    for (const FavoriteRef& favorite : read)
      identifiers.push_back(dynamic_cast<const FavoriteTransitLine&>(*favorite).transitLine()->identifier());
    std::optional<std::string> reason;
    favorites.lookup(identifiers, [&](const TransitLineItems&, const ErrorRef& error) {
      reason = error ? error->reason() : std::string();
    });
    EXPECT_EQ(reason, std::nullopt) << "never before the lookup has returned";
    if (platform.transitLines.pending() > 0) platform.transitLines.answer({});
    platform.loop.runUntilIdle();
    return reason.value();
  };
  EXPECT_EQ(lookUp(), "");
  const auto unread = persister->favoritesUnread(Error::errorWithDomain_code_reason("Store", 0, "no thread"));
  EXPECT_EQ(lookUp(unread), "no thread");
  EXPECT_EQ(lookUp(), "");
  EXPECT_THAT(lookUp(unread), testing::HasSubstr("too late")) << "they can be read by now";
  std::filesystem::remove_all(folder());
  std::filesystem::create_directories(file());
  EXPECT_THAT(lookUp(), testing::HasSubstr("Cannot read " + file().native()));
  std::filesystem::remove(file());
  EXPECT_EQ(makeEditor().add({lineItem(2, "B")}), nullptr);
  EXPECT_EQ(lookUp(), "");
  // Damage that takes favourites is no emptied list either, until the user has seen to it.
  ruinTable("favorites");
  for (int i = 0; i < 3; ++i) EXPECT_THAT(lookUp(), testing::HasSubstr(".broken-2026-01-05T12-00-00"));
  EXPECT_EQ(notices.size(), 1u);
  EXPECT_EQ(makeEditor().add({lineItem(3, "C")}), nullptr);
  EXPECT_EQ(lookUp(), "");
  EXPECT_EQ(platform.transitLines.lookups(), (std::vector<std::vector<std::uint64_t>>{{1}, {1}, {2}, {3}}));
}

TEST_F(FavoritesTest, AreNeverFewerWithoutAWordWhateverRots) {
  const Names all{"A", "B", "C", "D", "E", "F", "G", "H", "I", "J", "K", "L"};  // more than a page holds
  std::uint64_t muid = 0;
  for (const std::string& name : all) ASSERT_EQ(makeEditor().add({lineItem(++muid, name)}), nullptr);
  const std::string whole = contentOf(file());
  EXPECT_FALSE(std::filesystem::exists(file().string() + "-wal")) << "the log is written back";
  int words = 0;
  const auto open = [&](const char* rot, std::size_t at, const std::string& bytes) {
    SCOPED_TRACE(rot + std::to_string(at));
    std::filesystem::remove_all(folder());
    std::filesystem::create_directory(folder());
    std::ofstream(file(), std::ios::binary) << bytes;
    for (int i = 0; i < 2; ++i) {  // the second time of what the first has left
      const auto listed = makeEditor().list();
      words += !listed;
      if (listed) {
        EXPECT_EQ(names(), all);
      }
    }
  };
  for (std::size_t i = 0; i < whole.size(); i += 131)
    open("bit of byte ", i, std::string(whole).replace(i, 1, 1, static_cast<char>(whole[i] ^ 1 << i % 8)));
  for (std::size_t i = 0; i < whole.size(); i += 512)
    open("sector at ", i, std::string(whole).replace(i, 512, 512, '\0'));
  for (const std::size_t end : {0, 1, 99, 512, 4096, 4196, 8192, static_cast<int>(whole.size()) - 4096})
    open("end at ", end, whole.substr(0, end));
  EXPECT_GT(words, 100);
}

TEST_F(FavoritesTest, CanBeChangedByWhatIsLeftOfThem) {
  ASSERT_EQ(makeEditor().add({lineItem(1, "A"), lineItem(2, "B"), lineItem(3, "C")}), nullptr);
  connect().execute("UPDATE favorites SET content = replace(content, '\"B\"', '\"P\"')");
  const auto listed = makeEditor().list();
  ASSERT_FALSE(listed);
  EXPECT_THAT(listed.error()->reason(), testing::HasSubstr("2 of them are left (1, 3)"));
  EXPECT_EQ(makeEditor().left()->size(), 2u);
  EXPECT_EQ(makeEditor().remove({1}), nullptr);
  EXPECT_EQ(makeEditor().add({lineItem(2, "B")}), nullptr);
  EXPECT_THAT(names(), ElementsAre("C", "B"));
  // Also when the change is what finds the damage.
  connect().execute("UPDATE favorites_seal SET count = 3");
  EXPECT_EQ(makeEditor().remove({3}), nullptr);
  EXPECT_THAT(names(), ElementsAre("B"));
  EXPECT_EQ(notices.size(), 2u);
  connect().execute("UPDATE favorites_seal SET wereSet = 0");
  EXPECT_FALSE(makeEditor().list()) << "rows that are whole each, and as many, under a seal that is not";
}

TEST_F(FavoritesTest, LoseNothingWhenHostsChangeThemAtOnce) {
  constexpr std::uint64_t kHosts = 4, kLines = 8;
  std::vector<std::thread> threads;
  for (std::uint64_t host = 0; host < kHosts; ++host)
    threads.emplace_back([editor = makeEditor(), host]() mutable {
      for (std::uint64_t i = 0; i < kLines; ++i) {
        const std::uint64_t muid = host * kLines + i;
        EXPECT_EQ(editor.add({lineItem(muid, "L")}), nullptr);
        EXPECT_EQ(editor.move(muid, 0), nullptr);
      }
    });
  for (std::thread& thread : threads) thread.join();
  EXPECT_EQ(names().size(), kHosts * kLines);
  EXPECT_EQ(connect().integer("SELECT count(DISTINCT muid) + count(DISTINCT position) FROM favorites"),
            2 * kHosts * kLines);
}

}  // namespace nimbo
