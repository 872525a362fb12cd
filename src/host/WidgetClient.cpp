#include "host/WidgetClient.h"

#include <fcntl.h>
#include <poll.h>
#include <signal.h>
#include <spawn.h>
#include <sys/syscall.h>
#include <sys/wait.h>
#include <unistd.h>

#include <cstdlib>
#include <cstring>

#include "host/TerminalText.h"

namespace nimbo {

using nlohmann::json;

namespace {

constexpr const char* kProgramName = "nimbo-transit-widget";

/// The first after the standard ones.
constexpr int kPicturesDescriptor = 3;

struct Pipe {
  FileDescriptor reading, writing;
};

Pipe makePipe() {
  int ends[2];
  if (pipe2(ends, O_CLOEXEC) != 0) throw WidgetClientFailure(std::string("no pipe: ") + std::strerror(errno));
  return {FileDescriptor(ends[0]), FileDescriptor(ends[1])};
}

std::string describeEnd(int status) {
  if (WIFSIGNALED(status)) return std::string("was ended by signal ") + strsignal(WTERMSIG(status));
  return "ended with status " + std::to_string(WEXITSTATUS(status));
}

}  // namespace

std::filesystem::path WidgetClient::widgetProgram() {
  if (const char* named = std::getenv("NIMBO_TRANSIT_WIDGET"); named && *named) return named;
  const auto folder = std::filesystem::read_symlink("/proc/self/exe").parent_path();
  // Installed programs stand side by side; built ones each in the folder of its target.
  for (const auto& candidate : {folder / kProgramName, folder / ".." / "process" / kProgramName,
                                folder / ".." / ".." / "process" / kProgramName})
    if (std::error_code error; std::filesystem::exists(candidate, error)) return candidate;
  return folder / kProgramName;
}

WidgetClient::WidgetClient(GLibRunLoop& runLoop, const std::vector<std::string>& arguments,
                           const PictureMemory* pictures)
    : _runLoop(runLoop) {
  Pipe toWidget = makePipe(), fromWidget = makePipe();
  const std::string program = widgetProgram();
  std::vector<char*> argv{const_cast<char*>(kProgramName)};
  for (const std::string& argument : arguments) argv.push_back(const_cast<char*>(argument.c_str()));
  const std::string picturesDescriptor = std::to_string(kPicturesDescriptor);
  if (pictures)
    argv.insert(argv.end(), {const_cast<char*>("--pictures"), const_cast<char*>(picturesDescriptor.c_str())});
  argv.push_back(nullptr);

  posix_spawn_file_actions_t actions;
  posix_spawn_file_actions_init(&actions);
  posix_spawn_file_actions_adddup2(&actions, toWidget.reading.get(), STDIN_FILENO);
  posix_spawn_file_actions_adddup2(&actions, fromWidget.writing.get(), STDOUT_FILENO);
  if (pictures) posix_spawn_file_actions_adddup2(&actions, pictures->descriptor(), kPicturesDescriptor);
  // A group of its own: Ctrl+C in the terminal is for the host, which takes its leave of the widget.
  posix_spawnattr_t attributes;
  posix_spawnattr_init(&attributes);
  posix_spawnattr_setflags(&attributes, POSIX_SPAWN_SETPGROUP);
  const int failure = posix_spawn(&_process, program.c_str(), &actions, &attributes, argv.data(), environ);
  posix_spawnattr_destroy(&attributes);
  posix_spawn_file_actions_destroy(&actions);
  if (failure != 0)
    throw WidgetClientFailure("cannot start " + program + ": " + std::strerror(failure) +
                              ". Install it beside nimbo-transit, or name it in NIMBO_TRANSIT_WIDGET.");

  _running = true;
  _input = std::move(fromWidget.reading);
  _output = std::move(toWidget.writing);
  // A widget that does not read must not stop its host.
  fcntl(_output.get(), F_SETFL, fcntl(_output.get(), F_GETFL) | O_NONBLOCK);
  _connection = std::make_unique<JSONRPCConnection>(_runLoop, _input.get(), _output.get());
  _connection->setClosedHandler([this] { _running = false; });
  handleOpening(protocol::kOpenURL);
  handleOpening(protocol::kOpenUserActivity);
  for (const char* heard :
       {protocol::kPreferredContentSizeDidChange.name, protocol::kLargestAvailableDisplayModeDidChange.name,
        protocol::kUpdated.name, protocol::kChanged.name, protocol::kLog.name})
    _connection->setHandler(heard, [](const json&, const JSONRPCResponder&) {});
  _connection->setHandler(protocol::kNotice.name, [this](const json& params, const JSONRPCResponder&) {
    const std::string message = protocol::read<protocol::NoticeParams>(params).message;
    if (_noticeHandler)
      _noticeHandler(message);
    else
      printMessage(message);
  });
  _connection->setHandler(protocol::kProgress.name, [this](const json& params, const JSONRPCResponder&) {
    const auto progress = protocol::read<protocol::ProgressParams>(params);
    ++_progressCount;
    if (_progressHandler) _progressHandler(progress);
  });
  _connection->start();
}

template <class Params>
void WidgetClient::handleOpening(const protocol::Method<Params, protocol::Opened>& method) {
  _connection->setHandler(method.name, [this](const json& params, const JSONRPCResponder& responder) {
    try {
      const Opening opening = protocol::read<Params>(params);
      responder.answer(protocol::write(protocol::Opened{_openHandler && _openHandler(opening)}));
    } catch (const protocol::Malformed& malformed) {
      if (!_nonsenseHandler) throw;
      _nonsenseHandler(malformed.what());
    }
  });
}

void WidgetClient::setNonsenseHandler(std::function<void(const std::string&)> handler) {
  _connection->setMalformedHandler(handler);
  _nonsenseHandler = std::move(handler);
}

void WidgetClient::kill() {
  if (_process > 0) ::kill(_process, SIGKILL);
}

WidgetClient::~WidgetClient() {
  _connection.reset();
  _output = FileDescriptor();
  _input = FileDescriptor();
  if (_process <= 0) return;
  // The process ends when its input closes; a pidfd tells when, without a signal handler of ours.
  constexpr int kGraceMilliseconds = 1000;
  const FileDescriptor process(static_cast<int>(syscall(SYS_pidfd_open, _process, 0)));
  pollfd ended{process.get(), POLLIN, 0};
  if (process.get() < 0 || poll(&ended, 1, kGraceMilliseconds) != 1) kill();
  waitpid(_process, nullptr, 0);
}

json WidgetClient::call(std::string_view method, const json& params) {
  std::optional<json> answer;
  std::optional<JSONRPCError> failure;
  _connection->call(method, params, [&](const json& result, const std::optional<JSONRPCError>& error) {
    answer = result;
    failure = error;
  });
  waitUntil([&] { return answer.has_value(); });
  if (failure && _running) throw WidgetRefusal(method, *failure);
  if (failure) waitUntil([] { return false; });  // says how the process ended
  return *answer;
}

void WidgetClient::waitUntil(const std::function<bool()>& done) {
  bool tired = false;
  std::size_t progressCount = _progressCount;
  const auto patience = _runLoop.scheduleTimer(
      kPatience, true, [&](Timer&) { tired = std::exchange(progressCount, _progressCount) == _progressCount; });
  while (!done() && _running && !tired) _runLoop.runOnce();
  patience->invalidate();
  if (done()) return;
  if (tired)
    throw WidgetClientFailure("the widget process has not answered for " + std::to_string(static_cast<int>(kPatience)) +
                              " seconds");
  int status = 0;
  waitpid(_process, &status, 0);
  _process = -1;
  throw WidgetClientFailure("the widget process " + describeEnd(status) + " before it answered");
}

}  // namespace nimbo
