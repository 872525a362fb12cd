// A status bar's widget when something fails, in virtual time.

#include <gmock/gmock.h>

#include <csignal>

#include "host/Programs.h"
#include "host/StatusWatch.h"

namespace nimbo {
namespace {

TEST(StatusWatch, TriesAgainWhatFails) {
  std::signal(SIGPIPE, SIG_IGN);
  const Programs programs;
  programs.setUpCity({"m1"}, {});
  programs.publishBytes("no feed");
  VirtualTime time(Programs::now());
  GLibRunLoop loop(&time);
  const CommandContext context{loop,
                               {},
                               {"--config", programs.folder.path() / "config", "--state",
                                programs.folder.path() / "state", "--virtual-time", isoTextOfDate(Programs::now())}};
  BarContent shown;
  const auto show = [&](const BarContent& content) { shown = content; };
  const auto waitFor = [&](const std::string& state) {
    while (shown.state != state) loop.runOnce();
  };
  {
    // A fetch that failed: the widget itself, whose time stands still, does nothing more.
    setenv("NIMBO_TRANSIT_WIDGET", NIMBO_TRANSIT_WIDGET, 1);
    const StatusWatch watch(context, time, {}, show);
    waitFor("error");
    programs.publish({});
    time.advance(2 * RefreshRule::kFirstRetry);
    waitFor("good");
  }
  const std::string talker =
      programs.folder.write("talker", "#!/bin/sh\nexec yes '{\"jsonrpc\":\"2.0\",\"method\":\"log\",\"params\":{}}'\n");
  std::filesystem::permissions(talker, std::filesystem::perms::owner_all);
  for (const std::string& program : {std::string("/bin/false"), std::string("/nonexistent"), talker}) {
    setenv("NIMBO_TRANSIT_WIDGET", program.c_str(), 1);
    const StatusWatch watch(context, time, {}, show);
    waitFor("error");
    setenv("NIMBO_TRANSIT_WIDGET", NIMBO_TRANSIT_WIDGET, 1);
    time.advance(StatusWatch::kFirstRestart);
    waitFor("good");
  }
}

}  // namespace
}  // namespace nimbo
