#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include "desktop/raii/FileDescriptor.h"
#include "desktop/system/LinuxMemoryPressure.h"
#include "support/TemporaryFolder.h"
#include "support/TestPlatform.h"

namespace nimbo {
namespace {

struct LinuxMemoryPressureTest : testing::Test {
  TestPlatform platform;
  TemporaryFolder root;
  VirtualTime time{Date()};
  GLibRunLoop loop{&time};
  std::shared_ptr<SerialQueue> queue = std::make_shared<SerialQueue>("pressure");
  std::string heard;  // written on the queue, read after `settle`

  std::unique_ptr<MemoryPressureSource> listen(LinuxMemoryPressure& pressure, MemoryPressureKind kind, char name) {
    auto source = pressure.makeSource(kind, queue, [this, name] { heard += name; });
    source->activate();
    time.advance(2);
    return source;
  }

  /// Lets events that have happened reach their handlers: once round the loop, once through the queue.
  void settle() {
    loop.dispatchAsync([this] {
      loop.dispatchAsync([this] { queue->dispatchAsync([this] { loop.dispatchAsync([this] { loop.quit(); }); }); });
    });
    loop.run();
  }
};
TEST_F(LinuxMemoryPressureTest, FollowsTheCountersOfTheCgroup) {
  root.write("proc/self/cgroup", "4:memory:/other\n0::/user.slice/app.scope\n");
  const auto heardAfter = [&](const char* events) {
    root.write("sys/fs/cgroup/user.slice/app.scope/memory.events", events);
    settle();
    return heard;
  };
  heardAfter("low 0\nhigh 7\nmax 3\noom 0\noom_kill 0\n");
  LinuxMemoryPressure pressure(loop, LinuxMemoryPressure::Files::ofThisProcess(root.path()));
  const auto warning = listen(pressure, MemoryPressureKind::processWarning, 'w');
  const auto critical = listen(pressure, MemoryPressureKind::processCritical, 'c');
  EXPECT_EQ(heardAfter("low 5\nhigh 7\nmax 3\noom 0\noom_kill 0\n"), "") << "what happened before";
  EXPECT_EQ(heardAfter("low 5\nhigh 8\nmax 3\noom 0\noom_kill 0\n"), "w");
  EXPECT_EQ(heardAfter("low 5\nhigh 8\nmax 3\noom 1\noom_kill 1\n"), "wc");
  warning->cancel();
  warning->activate();
  EXPECT_EQ(heardAfter("low 5\nhigh 9\nmax 9\noom 1\noom_kill 1\n"), "wcc") << "cancelled for good";
}

TEST_F(LinuxMemoryPressureTest, AsksTheKernelForStallTriggers) {
  const auto fifo = root.path() / "memory";
  ASSERT_EQ(::mkfifo(fifo.c_str(), 0600), 0);
  const FileDescriptor kernel(::open(fifo.c_str(), O_RDWR | O_NONBLOCK));
  LinuxMemoryPressure pressure(loop, {fifo, {}});
  const auto triggerOf = [&](MemoryPressureKind kind) {
    const auto source = listen(pressure, kind, 's');
    char text[64];
    const ssize_t size = ::read(kernel.get(), text, sizeof text);
    return std::string(text, size > 0 ? static_cast<std::size_t>(size) : 0);
  };
  using std::string_literals::operator""s;
  EXPECT_EQ(triggerOf(MemoryPressureKind::systemWarning), "some 150000 2000000\0"s);
  EXPECT_EQ(triggerOf(MemoryPressureKind::systemCritical), "full 150000 2000000\0"s);
  settle();
  EXPECT_EQ(heard, "");
}

TEST_F(LinuxMemoryPressureTest, IsQuietWhereTheKernelOffersNothing) {
  for (const char* cgroup : {"", "0::/\n", "4:memory:/other\n", "0::/gone\n"}) {
    root.write("proc/self/cgroup", cgroup);
    LinuxMemoryPressure pressure(loop, LinuxMemoryPressure::Files::ofThisProcess(root.path()));
    for (const auto kind : {MemoryPressureKind::systemWarning, MemoryPressureKind::systemCritical,
                            MemoryPressureKind::processWarning, MemoryPressureKind::processCritical})
      listen(pressure, kind, '?')->cancel();
  }
  settle();
  EXPECT_EQ(heard, "");
  EXPECT_TRUE(platform.log.lines().empty());
}

}  // namespace
}  // namespace nimbo
