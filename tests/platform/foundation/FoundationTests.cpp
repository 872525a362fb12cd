#include <algorithm>
#include <future>
#include <limits>
#include <stdexcept>

#include "platform/SerialQueue.h"
#include "platform/VirtualTime.h"
#include "platform/foundation/Boxed.h"
#include "platform/foundation/Date.h"
#include "platform/foundation/Error.h"
#include "platform/foundation/Hash.h"
#include "platform/foundation/Log.h"
#include "support/TestPlatform.h"

namespace nimbo {
namespace {

TEST(Date, ReadsISOTexts) {
  const struct {
    const char* text;
    const char* read;  // null: refused
  } kCases[] = {
      {"2026-01-05", "2026-01-05T00:00:00Z"},
      {"2026-01-05 23:59:59.25+02:00", "2026-01-05T21:59:59.250000Z"},
      {"2024-02-29T12:00:00-01:30", "2024-02-29T13:30:00Z"},
      {"2016-12-31T23:59:60Z", "2017-01-01T00:00:00Z"},
      {"1969-12-31T23:59:59.5Z", "1969-12-31T23:59:59.500000Z"},
      {"9999-12-31T23:59:59.999999Z", "9999-12-31T23:59:59.999999Z"},
      {"", nullptr},
      {"-026-01-05", nullptr},
      {"2023-02-29", nullptr},
      {"2026-01-05T24:00", nullptr},
      {"2026-01-05T10:00+24:00", nullptr},
      {"2026-01-05T10:00Zulu", nullptr},
  };
  for (const auto& test : kCases) {
    const auto date = dateFromISOText(test.text);
    EXPECT_EQ(date ? isoTextOfDate(*date) : "refused", test.read ? test.read : "refused") << test.text;
  }
}

TEST(Date, StaysWithinWhatItCanHold) {
  constexpr double kInfinity = std::numeric_limits<double>::infinity();
  EXPECT_EQ(dateByAdding(Date::max(), 1), Date::max());
  EXPECT_EQ(dateByAdding(Date::min(), -1e-6), Date::min());
  EXPECT_EQ(dateByAdding(Date{}, kInfinity), Date::max());
  EXPECT_EQ(dateFromUnixTime(-kInfinity), Date::min());
  EXPECT_GT(intervalBetween(Date::min(), Date::max()), 1.8e13);
  EXPECT_LT(intervalBetween(Date::max(), Date::min()), -1.8e13);

  const Date late = *dateFromISOText("9999-12-31T23:59:59.999999Z");
  EXPECT_EQ(dateByAdding(dateByAdding(late, -0.000001), 0.000001), late) << "microseconds do not drown in far dates";
  EXPECT_EQ(dateByAdding(Date{}, -0.0000006), Date{} - std::chrono::microseconds(1)) << "rounds to the nearest";
}

TEST(Boxed, EqualsByValueAndHashesAlike) {
  const auto array = [](std::vector<ObjectRef> elements) { return std::make_shared<BoxedArray>(std::move(elements)); };
  const auto dictionary = [](BoxedDictionary::Entries entries) {
    return std::make_shared<BoxedDictionary>(std::move(entries));
  };
  const struct {
    ObjectRef a, b;
    bool equal;
  } kCases[] = {
      {box("a"), box(std::string("a")), true},
      {box("1"), box(1), false},
      {box(5), box(5.0), true},
      {box(5), box(5.5), false},
      {box(std::int64_t{-1}), box(std::uint64_t{18446744073709551615u}), false},
      {box(true), box(1), false},
      {box(Bytes{1, 2}), box(Bytes{1, 2}), true},
      {box(Date{}), box(dateFromUnixTime(0.000001)), false},
      {array({box(1), array({box("x")})}), array({box(1), array({box("x")})}), true},
      {array({box(1), box(2)}), array({box(2), box(1)}), false},
      {dictionary({{"k", box(1)}, {"n", nullptr}}), dictionary({{"n", nullptr}, {"k", box(1)}}), true},
      {dictionary({{"k", nullptr}}), dictionary({{"k", box(1)}}), false},
      {Error::errorWithDomain_code_reason("d", 1, "r"), Error::errorWithDomain_code_reason("d", 1, "r"), true},
      {Error::errorWithDomain_code_reason("d", 1, "r"), Error::errorWithDomain_code_reason("d", 1, "s"), false},
  };
  for (const auto& test : kCases) {
    const std::string both = descriptionOf(test.a) + " and " + descriptionOf(test.b);
    EXPECT_EQ(test.a->isEqual(test.b.get()), test.equal) << both;
    EXPECT_EQ(test.b->isEqual(test.a.get()), test.equal) << both;
    if (test.equal) {
      EXPECT_EQ(test.a->hash(), test.b->hash()) << both;
    }
    EXPECT_FALSE(test.a->isEqual(nullptr)) << both;
  }
}

TEST(Log, FillsFormatsAndHidesPrivateArguments) {
  const ObjectRef none;
  const struct {
    const char* format;
    std::vector<LogArgument> arguments;
    const char* redacted;
    const char* shown;
  } kCases[] = {
      {"%@ of %lu, %.2f s, %i", {"a", 3u, 1800.0, -7}, "a of 3, 1800.00 s, -7", "a of 3, 1800.00 s, -7"},
      {"key %{private}@: %@", {"secret", box("open")}, "key <private>: open", "key secret: open"},
      {"%{private}@%@", {none, none}, "<private>(null)", "(null)(null)"},
      {"50%% of %@ and %@", {"%@"}, "50% of %@ and (missing)", "50% of %@ and (missing)"},
      {"%llu", {std::uint64_t{18446744073709551615u}}, "18446744073709551615", "18446744073709551615"},
      {"100%", {}, "100%", "100%"},
  };
  for (const auto& test : kCases) {
    EXPECT_EQ(formatLogLine(test.format, test.arguments, true), test.redacted);
    EXPECT_EQ(formatLogLine(test.format, test.arguments, false), test.shown);
  }
}

TEST(VirtualTime, FiresInTheOrderOfDatesThenOfScheduling) {
  VirtualTime time(TestPlatform::startDate());
  std::string fired;  // the timers, each with the seconds that had passed
  const auto note = [&](char name) {
    return [&time, &fired, name](Timer&) {
      const double passed = intervalBetween(TestPlatform::startDate(), time.now());
      fired += name + std::to_string(static_cast<int>(passed)) + " ";
    };
  };
  time.scheduleTimer(3, false, note('c'));
  time.scheduleTimer(1, false, note('a'));
  time.scheduleTimer(1, false, note('b'));
  const auto repeating = time.scheduleTimer(2, true, note('r'));
  time.scheduleTimer(-5, false, note('p'));
  time.advance(0);
  EXPECT_EQ(fired, "p0 ");
  time.advance(6);
  EXPECT_EQ(fired, "p0 a1 b1 r2 c3 r4 r6 ");
  EXPECT_EQ(time.pendingTimers(), 1u);
  EXPECT_TRUE(repeating->isValid());
  EXPECT_THROW(time.scheduleTimer(0, true, note('x')), std::invalid_argument);
}

TEST(SerialQueue, RunsWorkInOrderOnOneOtherThreadAndOutlivesExceptions) {
  TestPlatform platform;
  std::vector<int> order;
  std::vector<std::thread::id> threads;
  std::promise<void> done;
  {
    SerialQueue queue("queue.under.test");
    for (int i = 0; i < 100; ++i) {
      queue.dispatchAsync([&, i] {
        order.push_back(i);
        threads.push_back(std::this_thread::get_id());
        if (i == 50) throw std::runtime_error("piece 50");
        if (i == 51) throw i;
        if (i == 99) queue.dispatchAsync([&] { done.set_value(); });
      });
    }
    done.get_future().wait();
  }
  ASSERT_EQ(order.size(), 100u);
  EXPECT_TRUE(std::is_sorted(order.begin(), order.end()));
  EXPECT_NE(threads.front(), std::this_thread::get_id());
  EXPECT_EQ(std::count(threads.begin(), threads.end(), threads.front()), 100);
  EXPECT_TRUE(platform.log.contains("A piece of work on the queue queue.under.test threw: piece 50"));
}

TEST(SerialQueue, FinishesThePieceThatRunsBeforeItGoes) {
  std::promise<void> started, proceed;
  bool finished = false;
  auto queue = std::make_unique<SerialQueue>("busy");
  queue->dispatchAsync([] { throw std::runtime_error("with no platform to log it"); });
  queue->dispatchAsync([&] {
    started.set_value();
    proceed.get_future().wait();
    finished = true;
  });
  started.get_future().wait();
  std::thread releaser([&] { proceed.set_value(); });
  queue.reset();
  EXPECT_TRUE(finished);
  releaser.join();
}

TEST(SerialQueue, MayGoOnItsOwnThreadAndDropsWhatHasNotBegun) {
  std::promise<void> queued;
  auto own = std::make_shared<SerialQueue>("own");
  SerialQueue& queue = *own;
  auto kept = std::make_shared<std::promise<void>>();
  auto outcome = kept->get_future();
  queue.dispatchAsync([&queued, last = std::move(own)]() mutable {
    queued.get_future().wait();
    last.reset();
  });
  queue.dispatchAsync([promise = std::move(kept)] { promise->set_value(); });
  queued.set_value();
  EXPECT_THROW(outcome.get(), std::future_error) << "dropped with its promise unkept";
}

}  // namespace
}  // namespace nimbo
