#include <sys/resource.h>
#include <sys/socket.h>
#include <unistd.h>

#include <algorithm>
#include <stdexcept>

#include "desktop/raii/FileDescriptor.h"
#include "desktop/system/GLibRunLoop.h"
#include "support/TestPlatform.h"

namespace nimbo {
namespace {

/// A real loop with two connected sockets; the platform's log hears of the loop's troubles.
struct GLibRunLoopTest : testing::Test {
  GLibRunLoopTest() {
    std::array<int, 2> ends{};
    EXPECT_EQ(::socketpair(AF_UNIX, SOCK_STREAM, 0, ends.data()), 0);
    reader = FileDescriptor(ends[0]);
    writer = FileDescriptor(ends[1]);
  }

  TestPlatform platform;
  GLibRunLoop loop;
  FileDescriptor reader, writer;
};

TEST_F(GLibRunLoopTest, RunsQueuedWorkInOrderOnTheMainThread) {
  std::vector<int> order;
  loop.dispatchAsync([&] { order.push_back(-1); });
  EXPECT_TRUE(order.empty()) << "never before the call returns";
  std::thread other([&] {
    EXPECT_FALSE(loop.isCurrent());
    for (int i = 0; i < 1000; ++i) loop.dispatchAsync([&, i] { order.push_back(loop.isCurrent() ? i : -2); });
    loop.dispatchAsync([&] { loop.quit(); });
  });
  loop.run();
  other.join();
  EXPECT_EQ(order.size(), 1001u);
  EXPECT_TRUE(std::is_sorted(order.begin(), order.end()));
}

TEST_F(GLibRunLoopTest, LetsTimersAndDescriptorsThroughWorkThatQueuesWork) {
  std::string read;
  bool fired = false;
  GSourceHandle watch = loop.watchReadable(reader.get(), [&] {
    char byte = 0;
    if (::read(reader.get(), &byte, 1) == 1)
      read += byte;
    else
      watch.reset();  // the end of the data
  });
  ASSERT_EQ(::write(writer.get(), "ab", 2), 2);
  writer = FileDescriptor();
  loop.scheduleTimer(0, false, [&](Timer&) { fired = true; });
  std::function<void()> again = [&] { fired && !watch ? loop.quit() : loop.dispatchAsync(again); };
  loop.dispatchAsync(again);
  loop.run();
  EXPECT_EQ(read, "ab");
}

TEST_F(GLibRunLoopTest, FiresTimersUntilTheyEnd) {
  rlimit limit{};
  ASSERT_EQ(::getrlimit(RLIMIT_NOFILE, &limit), 0);
  for (const bool kernelTimers : {true, false}) {
    rlimit lowered = limit;
    if (!kernelTimers) lowered.rlim_cur = 0;  // no descriptor for a timer
    ASSERT_EQ(::setrlimit(RLIMIT_NOFILE, &lowered), 0);
    const auto held = std::make_shared<int>(0);
    std::shared_ptr<Timer> cancelled;
    const std::weak_ptr<Timer> once = loop.scheduleTimer(0, false, [&, held](Timer& timer) {
      EXPECT_FALSE(timer.isValid());
      cancelled->invalidate();
    });
    EXPECT_FALSE(once.expired()) << "the loop keeps it";
    cancelled = loop.scheduleTimer(0, false, [](Timer&) { ADD_FAILURE() << "was invalidated, if due already"; });
    loop.scheduleTimer(0.000001, true, [&, held](Timer& timer) {
      EXPECT_TRUE(timer.isValid());
      if (++*held < 3) return;
      timer.invalidate();
      EXPECT_EQ(*held, 3) << "the callback that runs keeps what it holds";
      loop.quit();
    });
    const auto never = loop.scheduleTimer(1e300, false, [](Timer&) { ADD_FAILURE() << "far future"; });
    loop.scheduleTimer(-1e300, false, [held](Timer&) {});
    ASSERT_EQ(::setrlimit(RLIMIT_NOFILE, &limit), 0);
    loop.run();
    EXPECT_EQ(*held, 3);
    EXPECT_TRUE(once.expired());
    EXPECT_EQ(held.use_count(), 1);
    EXPECT_TRUE(never->isValid());
  }
  EXPECT_THROW(loop.scheduleTimer(0, true, [](Timer&) {}), std::invalid_argument);
}

TEST_F(GLibRunLoopTest, EndsItsTimersWhenItGoes) {
  const auto held = std::make_shared<int>(0);
  std::shared_ptr<Timer> timer;
  {
    GLibRunLoop shortLived;
    timer = shortLived.scheduleTimer(3600, true, [held](Timer&) {});
    shortLived.dispatchAsync([held] {});
  }
  EXPECT_FALSE(timer->isValid());
  timer->setTolerance(360);
  timer->invalidate();
  EXPECT_EQ(held.use_count(), 1);
}

TEST_F(GLibRunLoopTest, LogsWhatCallbacksThrowAndGoesOn) {
  ASSERT_EQ(::write(writer.get(), "x", 1), 1);
  GSourceHandle watch = loop.watchReadable(reader.get(), [&] {
    watch.reset();
    loop.dispatchAsync([] { throw std::runtime_error("work"); });
    loop.dispatchAsync([] { throw 1; });
    loop.dispatchAsync([&] { loop.quit(); });
    throw std::runtime_error("watch");
  });
  VirtualTime time(TestPlatform::startDate());
  GLibRunLoop(&time).scheduleTimer(5, true, [](Timer&) { throw std::runtime_error("timer"); });
  loop.run();
  time.advance(10);
  EXPECT_THAT(
      platform.log.texts("RunLoop", LogLevel::error),
      testing::ElementsAre("A descriptor callback threw: watch", "A piece of work on the main queue threw: work",
                           "A piece of work on the main queue threw: something that is no std::exception",
                           "A timer callback threw: timer", "A timer callback threw: timer"));
}

}  // namespace
}  // namespace nimbo
