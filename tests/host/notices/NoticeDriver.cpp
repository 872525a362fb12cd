// Hands notices over, or takes them, as lines of JSON on the standard input say, in time that they move:
// {"post": [...]}, {"close": [...]}, {"advance": SECONDS}. Prints an answer to each of the first two, as a line.

#include <unistd.h>

#include <iostream>
#include <nlohmann/json.hpp>

#include "desktop/system/GLibRunLoop.h"
#include "host/notices/NoticeSender.h"
#include "host/notices/NoticeService.h"

namespace nimbo {

namespace {

using nlohmann::json;

void say(const json& line) { std::cout << line << std::endl; }

NoticeCompletion answerTo(const json& number) {
  return [number](const ErrorRef& error) {
    say({{"answer", number}, {"error", error ? error->code() : 0}, {"reason", error ? error->reason() : ""}});
  };
}

/// JSON holds no text that is no UTF-8: one that "isBroken" is made so.
std::vector<Notice> noticesOf(const json& list) {
  std::vector<Notice> notices;
  for (const json& notice : list)
    notices.push_back({notice.at("key"),
                       notice.at("title").get<std::string>() + (notice.value("isBroken", false) ? "\xff" : ""),
                       notice.value("body", ""), static_cast<Notice::Urgency>(notice.value("urgency", 1)),
                       notice.value("silent", false), notice.value("opens", "")});
  return notices;
}

int drive(bool serves) {
  VirtualTime time{Date()};
  GLibRunLoop runLoop(&time);
  NoticeSender sender(runLoop);
  std::unique_ptr<Bus> bus;
  std::unique_ptr<NoticeService> service;
  if (serves) {
    bus = std::move(*Bus::open());
    const auto tellProblem = [](const std::string& problem) { say({{"problem", problem}}); };
    const auto tellEnd = [] { say({{"ended", true}}); };
    service = std::make_unique<NoticeService>(runLoop, *bus, NoticeService::Events{tellProblem, tellEnd});
  }
  std::string input;
  const auto watching = runLoop.watchReadable(STDIN_FILENO, [&] {
    char bytes[65536];
    const auto size = ::read(STDIN_FILENO, bytes, sizeof bytes);
    if (size <= 0) return runLoop.quit();
    input.append(bytes, static_cast<std::size_t>(size));
    for (std::size_t end = 0; (end = input.find('\n')) != std::string::npos; input.erase(0, end + 1)) {
      const json line = json::parse(input.substr(0, end));
      if (line.contains("advance")) time.advance(line["advance"]);
      if (line.contains("post")) sender.post(noticesOf(line["post"]), answerTo(line["number"]));
      if (line.contains("close")) sender.close(line["close"], answerTo(line["number"]));
    }
  });
  runLoop.run();
  return 0;
}

}  // namespace

}  // namespace nimbo

int main(int, char** argv) { return nimbo::drive(argv[1] == std::string_view("serve")); }
