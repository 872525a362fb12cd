#include <fcntl.h>
#include <gtest/gtest.h>
#include <sys/file.h>
#include <sys/stat.h>

#include <cerrno>
#include <iterator>

#include "desktop/raii/FileDescriptor.h"
#include "desktop/system/AtomicFile.h"
#include "support/FullDisk.h"
#include "support/TemporaryFolder.h"

namespace nimbo {
namespace {

namespace fs = std::filesystem;

std::size_t entriesIn(const fs::path& folder) {
  return static_cast<std::size_t>(std::distance(fs::directory_iterator(folder), fs::directory_iterator()));
}

TEST(AtomicFile, ReplacesFilesAndMakesFoldersForTheirOwnerOnly) {
  const TemporaryFolder folder;
  const fs::path file = folder.path() / "a/b/c";
  const std::string zeros("\0\n\0", 3);
  EXPECT_EQ(writeFileAtomically(file, "first, the longer one"), nullptr);
  EXPECT_EQ(writeFileAtomically(file, zeros), nullptr);
  EXPECT_EQ(folder.read("a/b/c"), zeros);
  EXPECT_EQ(fs::status(file).permissions(), fs::perms::owner_read | fs::perms::owner_write);
  EXPECT_EQ(fs::status(folder.path() / "a").permissions(), fs::perms::owner_all);
  EXPECT_EQ(entriesIn(file.parent_path()), 1u);

  fs::create_symlink("a", folder.path() / "link");
  EXPECT_EQ(writeFileAtomically(folder.path() / "link/b/c", "through"), nullptr);
  EXPECT_EQ(folder.read("a/b/c"), "through");
}

TEST(AtomicFile, ClearsWhatKilledProcessesLeftAndNothingElse) {
  const TemporaryFolder folder;
  folder.write("file.kil1ed.nimbo-part", "half");
  folder.write("file.backup", "");
  folder.write("other.kil1ed.nimbo-part", "");
  const FileDescriptor running(
      ::open((folder.path() / "file.abc123.nimbo-part").c_str(), O_CREAT | O_RDWR | O_CLOEXEC, 0600));
  ASSERT_EQ(::flock(running.get(), LOCK_EX), 0);
  EXPECT_EQ(writeFileAtomically(folder.path() / "file", "whole"), nullptr);
  EXPECT_FALSE(fs::exists(folder.path() / "file.kil1ed.nimbo-part"));
  EXPECT_TRUE(fs::exists(folder.path() / "file.abc123.nimbo-part"));
  EXPECT_EQ(entriesIn(folder.path()), 4u);
}

TEST(AtomicFile, KeepsTheOldBytesWhenTheNewOnesDoNotFit) {
  const TemporaryFolder folder;
  const fs::path file = folder.path() / "kept";
  ASSERT_EQ(writeFileAtomically(file, "old"), nullptr);
  const ErrorRef error = [&] {
    const FullDisk full(100);
    return writeFileAtomically(file, std::string(5000, 'x'));
  }();
  ASSERT_NE(error, nullptr);
  EXPECT_EQ(error->code(), EFBIG);
  EXPECT_EQ(error->reason().rfind("Cannot write " + file.native() + ": File too large. ", 0), 0u) << error->reason();
  EXPECT_EQ(folder.read("kept"), "old");
  EXPECT_EQ(entriesIn(folder.path()), 1u) << "nothing half written stays";
}

TEST(AtomicFile, SaysWhatStandsInTheWay) {
  const TemporaryFolder folder;
  folder.write("file", "");
  folder.write("folder/inside", "");
  fs::create_symlink("file", folder.path() / "link");
  ASSERT_EQ(::mkfifo((folder.path() / "pipe").c_str(), 0600), 0);
  const std::tuple<const char*, int, std::string> cases[] = {
      {"file/below", EEXIST, "Cannot make the folder " + (folder.path() / "file").native() + ": "},
      {"folder", EISDIR, "Cannot write " + (folder.path() / "folder").native() + ": "},
      {"link", ELOOP, "Cannot write " + (folder.path() / "link").native() + ": "},
      {"pipe", EEXIST, "Cannot write "},
      {"/proc/none/file", ENOENT, "Cannot make the folder /proc/none: "},
  };
  for (const auto& [path, code, start] : cases) {
    const ErrorRef error = writeFileAtomically(folder.path() / path, "bytes");
    ASSERT_NE(error, nullptr) << path;
    EXPECT_EQ(error->code(), code) << path;
    EXPECT_EQ(error->reason().rfind(start, 0), 0u) << error->reason();
    EXPECT_FALSE(error->subject().empty());
  }
  EXPECT_TRUE(fs::is_symlink(folder.path() / "link"));
  EXPECT_EQ(entriesIn(folder.path()), 4u);
}

}  // namespace
}  // namespace nimbo
