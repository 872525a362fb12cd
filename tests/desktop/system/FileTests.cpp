#include <fcntl.h>
#include <gtest/gtest.h>
#include <signal.h>
#include <sys/file.h>
#include <sys/resource.h>
#include <sys/stat.h>

#include <cerrno>
#include <iterator>

#include "desktop/raii/FileDescriptor.h"
#include "desktop/system/AtomicFile.h"
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
  rlimit limit{};
  ::getrlimit(RLIMIT_FSIZE, &limit);
  rlimit tight = limit;
  tight.rlim_cur = 100;
  ::signal(SIGXFSZ, SIG_IGN);
  ::setrlimit(RLIMIT_FSIZE, &tight);
  const ErrorRef error = writeFileAtomically(file, std::string(5000, 'x'));
  ::setrlimit(RLIMIT_FSIZE, &limit);
  ::signal(SIGXFSZ, SIG_DFL);
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
  fs::create_symlink("/dev/zero", folder.path() / "device");
  ASSERT_EQ(::mkfifo((folder.path() / "pipe").c_str(), 0600), 0);
  const struct {
    fs::path path;
    int code;
    std::string start;
  } kCases[] = {
      {folder.path() / "file/below", EEXIST, "Cannot make the folder " + (folder.path() / "file").native() + ": "},
      {folder.path() / "folder", EISDIR, "Cannot write " + (folder.path() / "folder").native() + ": "},
      {folder.path() / "link", ELOOP, "Cannot write " + (folder.path() / "link").native() + ": "},
      {folder.path() / "device", ELOOP, "Cannot write "},
      {folder.path() / "pipe", EEXIST, "Cannot write "},
      {"/proc/none/file", ENOENT, "Cannot make the folder /proc/none: "},
  };
  for (const auto& test : kCases) {
    const ErrorRef error = writeFileAtomically(test.path, "bytes");
    ASSERT_NE(error, nullptr) << test.path;
    EXPECT_EQ(error->code(), test.code) << test.path;
    EXPECT_EQ(error->reason().rfind(test.start, 0), 0u) << error->reason();
    EXPECT_FALSE(error->subject().empty());
  }
  EXPECT_TRUE(fs::is_symlink(folder.path() / "link"));
  EXPECT_EQ(entriesIn(folder.path()), 5u);
}

}  // namespace
}  // namespace nimbo
