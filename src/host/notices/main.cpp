// nimbo-transit-notices: shows what the other programs tell the user, and opens what he clicks.

#include <sys/prctl.h>

#include <CLI/CLI.hpp>

#include "desktop/system/GLibRunLoop.h"
#include "desktop/system/SmallMemory.h"
#include "desktop/system/StandardDescriptors.h"
#include "desktop/system/SystemLog.h"
#include "host/notices/NoticeService.h"
#include "platform/foundation/Version.h"

int main(int argc, char** argv) {
  nimbo::keepHeapSmall();
  nimbo::prepareStandardDescriptors();
  ::prctl(PR_SET_NO_NEW_PRIVS, 1, 0, 0, 0);
  CLI::App app{
      "Shows the notifications of the transit programs, and opens what is clicked. The session bus starts it."};
  app.set_version_flag("--version", nimbo::kVersion);
  CLI11_PARSE(app, argc, argv);

  const auto log = nimbo::makeLog(nimbo::LogOptions::fromEnvironment());
  bool failed = false;
  const auto tell = [&](const std::string& problem) {
    const nimbo::LogArgument text(problem);
    log->write({nimbo::kDefaultLogSubsystem, "Notices"}, nimbo::LogLevel::error, "%@", std::span(&text, 1));
  };
  try {
    nimbo::GLibRunLoop runLoop;
    const auto bus = nimbo::Bus::open();
    if (!bus) {
      tell(bus.error()->reason());
      return 1;
    }
    (*bus)->onEnd([&] {
      tell("The session bus has gone.");
      failed = true;
      runLoop.quit();
    });
    const nimbo::NoticeService service(runLoop, **bus, {tell, [&] { runLoop.quit(); }});
    runLoop.run();
  } catch (const std::exception& failure) {
    tell(failure.what());
    failed = true;
  }
  return failed ? 1 : 0;
}
