#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <sys/resource.h>
#include <sys/socket.h>
#include <unistd.h>

#include <algorithm>
#include <array>
#include <chrono>
#include <cmath>
#include <functional>
#include <memory>
#include <stdexcept>
#include <string>
#include <thread>
#include <vector>

#include "desktop/raii/FileDescriptor.h"
#include "desktop/system/GLibRunLoop.h"
#include "support/TestPlatform.h"

namespace nimbo {
namespace {

using testing::ElementsAre;

/// A real loop; the platform's log hears of its troubles.
struct RealLoop : testing::Test {
  TestPlatform platform;
  GLibRunLoop loop;

  struct Pipe {
    FileDescriptor reader, writer;
  };
  static Pipe makePipe() {
    std::array<int, 2> ends{};
    EXPECT_EQ(::pipe(ends.data()), 0);
    return {FileDescriptor(ends[0]), FileDescriptor(ends[1])};
  }
  void quitWhenIdle() {
    loop.dispatchAsync([this] { loop.quit(); });
  }
};
using GLibRunLoopTest = RealLoop;

TEST_F(GLibRunLoopTest, RunsQueuedWorkInOrderOnTheMainThread) {
  std::vector<int> order;
  bool onMain = true;
  loop.dispatchAsync([&] { order.push_back(-1); });
  EXPECT_TRUE(order.empty()) << "never before the call returns";
  std::thread other([&] {
    EXPECT_FALSE(loop.isCurrent());
    for (int i = 0; i < 1000; ++i) {
      loop.dispatchAsync([&, i] {
        order.push_back(i);
        onMain = onMain && loop.isCurrent();
      });
    }
    loop.quit();  // before the run or during it: the work below ends it for certain
    loop.dispatchAsync([&] { loop.quit(); });
  });
  while (order.size() < 1001) loop.run();
  other.join();
  EXPECT_TRUE(onMain);
  EXPECT_TRUE(std::is_sorted(order.begin(), order.end()));
}

TEST_F(GLibRunLoopTest, LetsTimersAndDescriptorsThroughWorkThatQueuesWork) {
  const Pipe pipe = makePipe();
  int missing = 2;
  std::function<void()> again = [&] {
    if (missing == 0)
      loop.quit();
    else
      loop.dispatchAsync(again);
  };
  loop.dispatchAsync(again);
  loop.scheduleTimer(0, false, [&](Timer&) { --missing; });
  GSourceHandle watch = loop.watchReadable(pipe.reader.get(), [&] {
    --missing;
    watch.reset();
  });
  ASSERT_EQ(::write(pipe.writer.get(), "x", 1), 1);
  loop.run();
  EXPECT_EQ(missing, 0);
}

TEST_F(GLibRunLoopTest, FiresTimersUntilTheyEnd) {
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
  loop.scheduleTimer(1e300, false, [](Timer&) { ADD_FAILURE() << "far future"; });
  loop.scheduleTimer(-1e300, false, [held](Timer&) {});
  loop.run();
  EXPECT_EQ(*held, 3);
  EXPECT_TRUE(once.expired());
  EXPECT_EQ(held.use_count(), 1);
  EXPECT_THROW(loop.scheduleTimer(0, true, [](Timer&) {}), std::invalid_argument);
}

TEST_F(GLibRunLoopTest, EndsItsTimersWhenItGoes) {
  const auto held = std::make_shared<int>(0);
  std::shared_ptr<Timer> timer;
  {
    GLibRunLoop shortLived;
    timer = shortLived.scheduleTimer(3600, true, [held](Timer&) {});
    timer->setTolerance(360);
    shortLived.dispatchAsync([held] {});
  }
  EXPECT_FALSE(timer->isValid());
  timer->setTolerance(1);
  timer->invalidate();
  EXPECT_EQ(held.use_count(), 1);
}

TEST_F(GLibRunLoopTest, FiresTimersWithoutKernelTimers) {
  rlimit limit{};
  ASSERT_EQ(::getrlimit(RLIMIT_NOFILE, &limit), 0);
  rlimit none = limit;
  none.rlim_cur = 0;
  ASSERT_EQ(::setrlimit(RLIMIT_NOFILE, &none), 0);
  int fired = 0;
  loop.scheduleTimer(0, false, [&](Timer&) { ++fired; });
  loop.scheduleTimer(0.000001, true, [&](Timer& timer) {
    if (++fired < 4) return;
    timer.invalidate();
    loop.quit();
  });
  ASSERT_EQ(::setrlimit(RLIMIT_NOFILE, &limit), 0);
  loop.run();
  EXPECT_EQ(fired, 4);
}

TEST_F(GLibRunLoopTest, LogsWhatCallbacksThrowAndGoesOn) {
  const Pipe pipe = makePipe();
  ASSERT_EQ(::write(pipe.writer.get(), "x", 1), 1);
  GSourceHandle watch = loop.watchReadable(pipe.reader.get(), [&] {
    watch.reset();
    loop.dispatchAsync([] { throw std::runtime_error("work"); });
    loop.dispatchAsync([] { throw 1; });
    quitWhenIdle();
    throw std::runtime_error("watch");
  });
  loop.scheduleTimer(0, false, [](Timer&) { throw std::runtime_error("timer"); });
  loop.run();
  EXPECT_THAT(platform.log.texts("RunLoop", LogLevel::error),
              testing::UnorderedElementsAre("A descriptor callback threw: watch", "A timer callback threw: timer",
                                            "A piece of work on the main queue threw: work",
                                            "A piece of work on the main queue threw: something that is no "
                                            "std::exception"));
}

TEST_F(GLibRunLoopTest, TellsOfDataAndOfItsEnd) {
  Pipe pipe = makePipe();
  std::vector<std::string> read;
  GSourceHandle watch = loop.watchReadable(pipe.reader.get(), [&] {
    char byte = 0;
    const ssize_t count = ::read(pipe.reader.get(), &byte, 1);
    read.push_back(count == 1 ? std::string(1, byte) : "end");
    if (count == 1) return;
    watch.reset();
    loop.quit();
  });
  ASSERT_EQ(::write(pipe.writer.get(), "ab", 2), 2);
  pipe.writer = FileDescriptor();
  loop.run();
  EXPECT_THAT(read, ElementsAre("a", "b", "end"));
}

TEST_F(GLibRunLoopTest, TellsUrgentConditionsFromPlainData) {
  std::array<int, 2> ends{};
  ASSERT_EQ(::socketpair(AF_UNIX, SOCK_STREAM, 0, ends.data()), 0);
  const FileDescriptor reader(ends[0]), writer(ends[1]);
  ASSERT_EQ(::send(writer.get(), "a", 1, 0), 1);
  int calls = 0;
  GSourceHandle watch = loop.watchUrgent(reader.get(), [&](bool inError) {
    EXPECT_FALSE(inError);
    ++calls;
    watch.reset();
  });
  const auto runOnce = [&] {
    loop.scheduleTimer(0, false, [&](Timer&) { quitWhenIdle(); });
    loop.run();
  };
  runOnce();
  EXPECT_EQ(calls, 0);
  if (::send(writer.get(), "b", 1, MSG_OOB) != 1) GTEST_SKIP() << "no urgent data on local sockets of this kernel";
  runOnce();
  EXPECT_EQ(calls, 1);
}

TEST(VirtualRunLoop, MovesItsTimersOnlyWithVirtualTime) {
  TestPlatform platform;
  VirtualTime time(TestPlatform::startDate());
  GLibRunLoop loop(&time);
  int fired = 0;
  loop.scheduleTimer(0, false, [&](Timer&) {
    ++fired;
    throw std::runtime_error("must not stop the time");
  });
  loop.scheduleTimer(1800, true, [&](Timer&) { ++fired; });
  loop.dispatchAsync([&] { loop.quit(); });
  loop.run();
  EXPECT_EQ(fired, 0);
  time.advance(3600);
  EXPECT_EQ(fired, 3);
  EXPECT_TRUE(platform.log.contains("A timer callback threw: must not stop the time"));
}

TEST(KernelTimer, SharesWakeUpsWithinItsTolerance) {
  using std::chrono::microseconds;
  const struct {
    double due, tolerance, fires;  // seconds
  } kCases[] = {
      {1861.3, 180, 1920},   {1920, 180, 1920},   {1861.3, 9, 1870},   {1861.3, 2, 1862}, {1861.3, 0.25, 1861.5},
      {1861.3, 0.1, 1861.3}, {1861.3, 0, 1861.3}, {1919.9, 0.2, 1920},  // a whole minute that happens to be near
  };
  const auto micros = [](double seconds) { return microseconds(std::llround(seconds * 1e6)); };
  for (const auto& test : kCases)
    EXPECT_EQ(coalescedTime(micros(test.due), micros(test.tolerance)), micros(test.fires))
        << test.due << " +" << test.tolerance;
  EXPECT_EQ(coalescedTime(microseconds::max(), microseconds::max()), microseconds::max());
}

}  // namespace
}  // namespace nimbo
