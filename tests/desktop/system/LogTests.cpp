#include <fcntl.h>
#include <gmock/gmock.h>
#include <sys/stat.h>

#include <stdexcept>

#include "desktop/raii/FileDescriptor.h"
#include "desktop/system/LogSink.h"
#include "desktop/system/SystemLog.h"
#include "support/TemporaryFolder.h"

namespace nimbo {
namespace {

using testing::ElementsAre;

constexpr LogFacility kFacility{"org.example.Sub", "Cat"};

struct Thrower final : Object {
  std::string_view className() const override { return "Thrower"; }
  std::string description() const override { throw std::runtime_error("no description"); }
};

/// What a log of these options writes to a file in place of standard error.
template <class Write>
std::string written(const LogOptions& options, const Write& write) {
  const TemporaryFolder folder;
  const FileDescriptor file(::open((folder.path() / "log").c_str(), O_CREAT | O_WRONLY, 0600));
  SystemLog log(options, std::make_unique<StandardErrorSink>(file.get()));
  write(log);
  return folder.read("log");
}

TEST(SystemLog, WritesOneLineWithLevelAndFacility) {
  const auto write = [](SystemLog& log) {
    const LogArgument argument("Line 7\nERROR fake\x1b[2J é\xC2\x9B\u202E\u2066ق");
    log.write(kFacility, LogLevel::error, "%{private}@", {&argument, 1});
    log.write(kFacility, LogLevel::info, "%@", {&argument, 1});
    log.write(kFacility, LogLevel::debug, "done", {});
    log.event(kFacility, "Pressure", " enable=YES ");
    const LogArgument thrower(std::make_shared<const Thrower>());
    log.write(kFacility, LogLevel::error, "%@", {&thrower, 1});
  };
  EXPECT_EQ(written({}, write), "ERROR org.example.Sub Cat: <private>\n");
  EXPECT_EQ(written({LogLevel::debug, true, false, ""}, write),
            "ERROR org.example.Sub Cat: Line 7\\nERROR fake\\x1b[2J é\\xc2\\x9b\\xe2\\x80\\xae\\xe2\\x81\\xa6ق\n"
            "INFO org.example.Sub Cat: Line 7\\nERROR fake\\x1b[2J é\\xc2\\x9b\\xe2\\x80\\xae\\xe2\\x81\\xa6ق\n"
            "DEBUG org.example.Sub Cat: done\n"
            "SIGNPOST org.example.Sub Cat: Pressure:  enable=YES \n");
  EXPECT_EQ(written({LogLevel::error, false, false, "loud"}, [](SystemLog&) {}),
            "ERROR org.nimbo.TransitWidget Log: NIMBO_LOG is \"loud\", which is no level; errors only are kept. Use "
            "debug, info or error.\n");
}

TEST(SystemLog, GivesTheJournalItsFields) {
  std::vector<std::vector<std::string>> entries;
  bool works = true;
  LogOptions options;
  options.level = LogLevel::info;
  options.toJournal = true;
  SystemLog log(options, std::make_unique<JournalSink>([&](std::span<const std::string> fields) {
                  entries.emplace_back(fields.begin(), fields.end());
                  return works;
                }));
  log.write(kFacility, LogLevel::error, "a=b\nc", {});
  log.write(kFacility, LogLevel::info, "fine", {});
  log.write(kFacility, LogLevel::debug, "dropped", {});
  log.event(kFacility, "Pressure", "on");
  EXPECT_THAT(entries,
              ElementsAre(ElementsAre("MESSAGE=a=b\nc", "PRIORITY=3", "SUBSYSTEM=org.example.Sub", "CATEGORY=Cat"),
                          ElementsAre("MESSAGE=fine", "PRIORITY=6", "SUBSYSTEM=org.example.Sub", "CATEGORY=Cat"),
                          ElementsAre("MESSAGE=Pressure: on", "PRIORITY=7", "SUBSYSTEM=org.example.Sub", "CATEGORY=Cat",
                                      "SIGNPOST=Pressure")));
  works = false;
  testing::internal::CaptureStderr();
  log.write(kFacility, LogLevel::error, "still heard", {});
  EXPECT_EQ(testing::internal::GetCapturedStderr(), "ERROR org.example.Sub Cat: still heard\n");
}

TEST(SystemLog, KnowsTheJournalsStream) {
  const TemporaryFolder folder;
  const FileDescriptor file(::open(folder.path().c_str(), O_RDONLY));
  struct stat status {};
  ASSERT_EQ(::fstat(file.get(), &status), 0);
  const std::string device = std::to_string(status.st_dev), inode = std::to_string(status.st_ino);
  EXPECT_TRUE(isJournalStream(file.get(), (device + ":" + inode).c_str()));
  EXPECT_FALSE(isJournalStream(file.get(), (device + ":" + inode + "1").c_str()));
  EXPECT_FALSE(isJournalStream(file.get(), nullptr));
}

TEST(SystemLog, TakesItsOptionsFromTheEnvironment) {
  const auto optionsOf = [](const char* level, const char* showsPrivate) {
    ::setenv("NIMBO_LOG", level, 1);
    ::setenv("NIMBO_LOG_PRIVATE", showsPrivate, 1);
    const LogOptions options = LogOptions::fromEnvironment();
    ::unsetenv("NIMBO_LOG");
    ::unsetenv("NIMBO_LOG_PRIVATE");
    return std::tuple(options.level, options.showsPrivate, options.unknownLevel);
  };
  EXPECT_EQ(optionsOf("debug", "1"), std::tuple(LogLevel::debug, true, ""));
  EXPECT_EQ(optionsOf("info", "0"), std::tuple(LogLevel::info, false, ""));
  EXPECT_EQ(optionsOf("", "yes"), std::tuple(LogLevel::error, false, ""));
  EXPECT_EQ(optionsOf("DEBUG", ""), std::tuple(LogLevel::error, false, "DEBUG"));
}

}  // namespace
}  // namespace nimbo
