#pragma once

#include <fstream>
#include <iterator>

#include "desktop/store/StateDatabase.h"
#include "support/TemporaryFolder.h"
#include "support/TestPlatform.h"

namespace nimbo {

/// A state folder of the test's own, which does not exist yet, and databases over it.
class StoreTest : public testing::Test {
 protected:
  /// Another process's view, as far as the database can tell.
  std::shared_ptr<StateDatabase> makeDatabase() {
    return std::make_shared<StateDatabase>(folder(), platform.time,
                                           [this](const ErrorRef& notice) { notices.push_back(notice->reason()); });
  }
  /// A connection that knows no rules.
  SQLiteConnection connect() { return {file(), SQLiteConnection::Access::readWrite, 2 * kMaximumStateValueBytes}; }

  std::filesystem::path folder() const { return _parent.path() / "state"; }
  std::filesystem::path file() const { return folder() / "state.sqlite"; }

  void makeVersion2() {
    connect().execute("DROP TABLE seen; DROP TABLE told; DROP TABLE telling; PRAGMA user_version = 2");
  }
  /// Gives the database, one of version 2, the form of version 1, with what that keeps elsewhere among the settings.
  void makeVersion1() {
    connect().execute(
        "INSERT INTO settings SELECT 'Nimbo.Favorites.wereSet', wereSet FROM favorites_seal;"
        "DROP TABLE favorites_seal;"
        "ALTER TABLE favorites DROP COLUMN checksum;"
        "PRAGMA user_version = 1");
  }

  static std::string contentOf(const std::filesystem::path& path) {
    std::ifstream stream(path, std::ios::binary);
    return {std::istreambuf_iterator<char>(stream), {}};
  }
  /// Makes the table's page one of no known kind.
  void ruinTable(const std::string& name) {
    SQLiteConnection connection = connect();
    connection.prepare("PRAGMA wal_checkpoint(TRUNCATE)").step();
    const auto page = connection.integer("SELECT rootpage FROM sqlite_schema WHERE name = '" + name + "'");
    std::fstream stream(file(), std::ios::binary | std::ios::in | std::ios::out);
    stream.seekp((page - 1) * 4096) << std::string(4096, '\xee');
  }

  TestPlatform platform;
  std::vector<std::string> notices;

 private:
  TemporaryFolder _parent;
};

}  // namespace nimbo
