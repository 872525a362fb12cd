// The widget process under whatever lines a host sends it.

#include <fcntl.h>
#include <sys/mman.h>
#include <unistd.h>

#include <filesystem>
#include <nlohmann/json.hpp>
#include <sstream>

#include "Fuzz.h"
#include "process/WidgetProcess.h"
#include "support/TemporaryFolder.h"

namespace nimbo {

namespace {

using nlohmann::json;

/// The line, but for what would take days.
std::string harmless(const std::string& line) {
  json message = json::parse(line, nullptr, false);
  if (!message.is_object() || !message.contains("params") || !message["params"].is_object()) return line;
  json& params = message["params"];
  if (params.contains("seconds") && params["seconds"] > 4000) params["seconds"] = 4000;
  return message.dump(-1, ' ', false, json::error_handler_t::replace);
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  std::istringstream input{std::string(textOf(data, std::min<std::size_t>(size, 16384)))};
  std::string lines;
  for (std::string line; std::getline(input, line);) lines += harmless(line) + "\n";
  lines += R"({"jsonrpc":"2.0","id":"the last","method":"shutdown"})"
           "\n";

  const TemporaryFolder folder;
  folder.write("input", lines);
  const FileDescriptor reading(::open((folder.path() / "input").c_str(), O_RDONLY | O_CLOEXEC));
  const FileDescriptor memory(::memfd_create("pictures", MFD_CLOEXEC));
  if (::ftruncate(memory.get(), 1 << 24) != 0) return 0;
  const FileDescriptor writing(::open((folder.path() / "output").c_str(), O_WRONLY | O_CREAT | O_CLOEXEC, 0600));
  WidgetProcess::Options options{Paths::resolve(folder.path() / "config", folder.path() / "state"),
                                 Date(std::chrono::seconds(1'750'000'000)), memory.get()};
  WidgetProcess(std::move(options), reading.get(), writing.get()).run();

  std::istringstream output(folder.read("output"));
  bool isLastAnswered = false;
  for (std::string line; std::getline(output, line);) {
    const json message = json::parse(line, nullptr, false);
    require(message.is_object() && message.value("jsonrpc", "") == "2.0", "each line is a message");
    const int kinds = message.contains("method") + message.contains("result") + message.contains("error");
    require(kinds == 1, "a message is a request, a result or an error");
    isLastAnswered = isLastAnswered || (message.contains("result") && message["id"] == "the last");
  }
  require(isLastAnswered || lines.find("shutdown") + 40 < lines.size(), "the process outlives every line");
  return 0;
}

}  // namespace nimbo
