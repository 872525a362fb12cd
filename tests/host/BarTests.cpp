// What status bars are given, and what they send.

#include <fcntl.h>
#include <gmock/gmock.h>
#include <unistd.h>

#include <nlohmann/json.hpp>

#include "desktop/raii/FileDescriptor.h"
#include "host/BarClicks.h"
#include "host/BarFormats.h"
#include "host/BarOutput.h"
#include "host/TerminalText.h"
#include "support/TestPlatform.h"

namespace nimbo {
namespace {

using nlohmann::json;
using protocol::FetchResult;
using protocol::LineState;
using testing::ElementsAre;

const Date kBarTime = *dateFromISOText("2026-01-05T12:00:00Z");

protocol::Snapshot snapshotOf(std::optional<FetchResult> result, bool isAffected, TimeInterval age = 60) {
  protocol::TransitItem row{.primaryText = isAffected ? "Works" : "Good service", .artwork = protocol::Artwork()};
  row.openable.emplace();
  if (!isAffected) row.openable->url = "nimbo://";
  return {.result = result, .listItem = {.summaryItem = row}, .updated = dateByAdding(kBarTime, -age)};
}

protocol::Lines linesOf(const std::vector<LineState>& states, bool isNew = true) {
  protocol::Lines lines;
  for (const LineState state : states) {
    lines.lines.push_back({.state = state});
    if (state == LineState::affected) lines.lines.back().incidents.push_back({.id = "1", .isNew = isNew});
  }
  return lines;
}

/// What Waybar is told, but for the tooltip, and whether an i3bar block is urgent.
std::string toldOf(const protocol::Snapshot& snapshot, const protocol::Lines& lines) {
  const auto content = barContentOf(snapshot, lines, kBarTime);
  if (!content) return "nothing";
  json line = json::parse(barFormatNamed("waybar")->write(*content));
  const json block = json::parse(barFormatNamed("i3bar")->write(*content).substr(1))[0];
  EXPECT_EQ(line["class"][0], line["alt"]);
  return line["text"].get<std::string>() + " " + line["class"].dump() + " " + line.value("percentage", json()).dump() +
         (block["urgent"] ? "!" : "");
}

TEST(Bars, TellNewFromSeenAndOldFromFresh) {
  constexpr auto kGood = LineState::good, kAffected = LineState::affected, kUnknown = LineState::unknown;
  constexpr auto kSuccess = FetchResult::success;
  EXPECT_EQ(toldOf(snapshotOf(kSuccess, false), linesOf({kGood, kGood})), R"(Good service ["good"] 100)");
  EXPECT_EQ(toldOf(snapshotOf(kSuccess, true), linesOf({kGood, kGood, kAffected})),
            R"(● Works ["advisories","new"] 66!)");
  EXPECT_EQ(toldOf(snapshotOf(kSuccess, true), linesOf({kAffected}, false)), R"(Works ["advisories"] 0)");
  EXPECT_EQ(toldOf(snapshotOf(kSuccess, true, 901), linesOf({kUnknown, kAffected})),
            R"(● Works (old) ["advisories","new","stale"] null!)");
  EXPECT_EQ(toldOf(snapshotOf(kSuccess, true, 899), linesOf({}, false)), R"(Works ["advisories"] null)");
  EXPECT_EQ(toldOf(snapshotOf(FetchResult::error, true, 901), linesOf({kUnknown, kGood})), R"(Works ["error"] null)");
  EXPECT_EQ(toldOf(snapshotOf(std::nullopt, true), {}), R"(Works (old) ["old","stale"] null)");
  protocol::Snapshot gone = snapshotOf(kSuccess, false);
  gone.goneLines = {"city:m1"};
  EXPECT_EQ(toldOf(gone, linesOf({kGood, kUnknown})), R"(Good service · 1 line gone ["gone"] null)");
  gone.result.reset();
  EXPECT_EQ(toldOf(gone, {}), R"(Good service (old) · 1 line gone ["old","gone","stale"] null)");
  gone.listItem.summaryItem = protocol::TransitItem();
  EXPECT_EQ(toldOf(gone, {}), "nothing");
}

TEST(Bars, TakeNoTextForAnOrder) {
  const BarContent content{.text = "%{A1:rm:}50% <txtclick>#(ls)#{x} #5\n&\x1b]2;\u202e\xff", .state = "good"};
  EXPECT_EQ(barFormatNamed("line")->write(content), "% {A1:rm:}50% ‹txtclick›# (ls)# {x} #5 & ]2;\ufffd");
  EXPECT_EQ(json::parse(barFormatNamed("waybar")->write(content))["text"],
            "%{A1:rm:}50% &lt;txtclick&gt;#(ls)#{x} #5\n&amp; ]2;\ufffd");
  const json block = json::parse(barFormatNamed("i3bar")->write(content).substr(1))[0];
  EXPECT_THAT(block["full_text"].get<std::string>() + block["markup"].get<std::string>(),
              testing::EndsWith("#(ls)#{x} #5\n& ]2;\ufffdnone"));
  EXPECT_EQ(shortenedText("Überall\n\u4e2d\u4e2d", 10), "Überall …");
  EXPECT_EQ(shortenedText("Überall\n\u4e2d", 10), "Überall \u4e2d");
}

struct Pipe {
  Pipe() {
    std::array<int, 2> ends{};
    EXPECT_EQ(pipe2(ends.data(), O_NONBLOCK), 0);
    reader = FileDescriptor(ends[0]);
    writer = FileDescriptor(ends[1]);
  }
  FileDescriptor reader, writer;
};

/// Does what there is to do, without waiting for more.
void turn(GLibRunLoop& loop) {
  bool isDone = false;
  for (loop.dispatchAsync([&] { isDone = true; }); !isDone;) loop.runOnce();
}

TEST(Bars, SendClicksAndWhateverElse) {
  VirtualTime time(kBarTime);
  GLibRunLoop loop(&time);
  Pipe pipe;
  std::vector<int> buttons;
  const BarClicks clicks(loop, pipe.reader.get(), [&](int button) { buttons.push_back(button); });
  const std::string left = R"({"name":"nimbo-transit","button":1})", right = R"(,{"button":3,"name":"nimbo-transit"})";
  std::string sent = "[\n" + left + "\n" + right + "\n";
  for (const char* broken : {"", "{", "}{", "[[[", "null", R"({"name":"nimbo-transit"})", R"({"name":7,"button":1})",
                             R"({"name":"clock","button":1})", R"({"name":"nimbo-transit","button":1e99})", "\xff{}"})
    sent += std::string(broken) + "\n";
  sent += std::string(3 << 20, '{') + left + "\n" + std::string(100000, '\n') + "," + left + ",\n" + right + "\n";
  sent.insert(sent.size() - right.size() - 1, std::string(1 << 16, ' ') + "\n");
  for (std::size_t at = 0; at < sent.size(); time.advance(1)) {
    const ssize_t count = ::write(pipe.writer.get(), sent.data() + at, sent.size() - at);
    if (count > 0) at += static_cast<std::size_t>(count);
    turn(loop);
  }
  pipe.writer = FileDescriptor();
  for (int i = 0; i < 3; ++i, time.advance(1)) turn(loop);
  EXPECT_THAT(buttons, ElementsAre(1, 1, 3)) << "one click of those that come at once";
}

TEST(Bars, ThatDoNotReadAreNotWaitedFor) {
  GLibRunLoop loop;
  Pipe pipe;
  int failure = -1;
  BarOutput output(loop, pipe.writer.get(), [&](int number) { failure = number; });
  output.begin("begin\n");
  std::string read;
  for (int i = 0; i < 100; ++i, turn(loop)) output.show(std::string(10000, 'a') + std::to_string(i));
  for (std::array<char, 5000> bytes{};; turn(loop)) {
    const ssize_t count = ::read(pipe.reader.get(), bytes.data(), bytes.size());
    if (count <= 0) break;
    read.append(bytes.data(), static_cast<std::size_t>(count));
  }
  EXPECT_TRUE(read.starts_with("begin\naaaa"));
  EXPECT_TRUE(read.ends_with("a99\n"));
  EXPECT_LT(read.size(), 100000u) << "of the lines that wait the last one alone is kept";
  pipe.reader = FileDescriptor();
  while (failure < 0) loop.runOnce();
  EXPECT_EQ(failure, 0);
}

}  // namespace
}  // namespace nimbo
