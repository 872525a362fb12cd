#pragma once

#include <sys/types.h>

#include <filesystem>
#include <functional>
#include <memory>
#include <nlohmann/json.hpp>
#include <optional>
#include <string>
#include <string_view>
#include <variant>
#include <vector>

#include "desktop/raii/FileDescriptor.h"
#include "desktop/rpc/JSONRPCConnection.h"
#include "desktop/system/GLibRunLoop.h"
#include "host/PictureMemory.h"
#include "protocol/Coding.h"
#include "protocol/Methods.h"

namespace nimbo {

/// What goes wrong between a host and the widget process: the process is missing, ends early, does not answer, or
/// answers with an error. The message says which.
struct WidgetClientFailure : std::runtime_error {
  using std::runtime_error::runtime_error;
};

/// An error answer of the widget process.
struct WidgetRefusal : WidgetClientFailure {
  WidgetRefusal(std::string_view method, const JSONRPCError& answer)
      : WidgetClientFailure(std::string(method) + ": " + answer.message), error(answer) {}
  JSONRPCError error;
};

/// What to say of an answer that is none.
inline std::string nonsense(std::string_view method, const protocol::Malformed& malformed) {
  return "it answers \"" + std::string(method) + "\" with nonsense: " + malformed.what();
}

/// A widget process of one's own: starts it, speaks its protocol, ends it. Main thread only.
class WidgetClient {
 public:
  /// What a tapped row wants to open.
  using Opening = std::variant<protocol::OpenURLParams, protocol::OpenUserActivityParams>;
  /// Hears of one; answers whether it opened.
  using OpenHandler = std::function<bool(const Opening& opening)>;
  /// Hears how far a request is.
  using ProgressHandler = std::function<void(const protocol::ProgressParams& progress)>;
  /// Hears what the user must be told.
  using NoticeHandler = std::function<void(const std::string& message)>;

  /// Starts the widget with these arguments, and with memory to draw into when it is to draw. Throws
  /// WidgetClientFailure when it cannot be started.
  WidgetClient(GLibRunLoop& runLoop, const std::vector<std::string>& arguments,
               const PictureMemory* pictures = nullptr);
  /// Closes the connection and waits for the process; one that does not end within a second is killed.
  ~WidgetClient();
  WidgetClient(const WidgetClient&) = delete;
  WidgetClient& operator=(const WidgetClient&) = delete;

  void setOpenHandler(OpenHandler handler) { _openHandler = std::move(handler); }
  /// Until this is called, notices go to standard error.
  void setNoticeHandler(NoticeHandler handler) { _noticeHandler = std::move(handler); }
  void setProgressHandler(ProgressHandler handler) { _progressHandler = std::move(handler); }
  /// Hears of what is no message, or no such one as it says, in place of the widget, which else gets an error.
  void setNonsenseHandler(std::function<void(const std::string& problem)> handler);
  JSONRPCConnection& connection() { return *_connection; }
  GLibRunLoop& runLoop() const { return _runLoop; }
  bool isRunning() const { return _running; }
  /// Ends a process that is not to be trusted to end by itself.
  void kill();

  /// Asks and waits for the answer, serving the widget's own requests meanwhile. Throws WidgetClientFailure, for an
  /// error answer WidgetRefusal.
  template <class Params, class Result>
  Result call(const protocol::Method<Params, Result>& method, const Params& params = {}) {
    const nlohmann::json answer = call(method.name, protocol::write(params));
    try {
      return protocol::read<Result>(answer);
    } catch (const protocol::Malformed& malformed) {
      throw WidgetClientFailure(nonsense(method.name, malformed));
    }
  }
  /// Runs the loop until `done` answers true. Throws WidgetClientFailure when the process ends first, or after
  /// `kPatience` seconds without a word of progress from it.
  void waitUntil(const std::function<bool()>& done);

  static constexpr double kPatience = 120;

  /// Where the widget program is: beside the running program, or as built, or NIMBO_TRANSIT_WIDGET.
  static std::filesystem::path widgetProgram();

 private:
  nlohmann::json call(std::string_view method, const nlohmann::json& params);
  template <class Params>
  void handleOpening(const protocol::Method<Params, protocol::Opened>& method);

  GLibRunLoop& _runLoop;
  FileDescriptor _input;   // what the widget writes
  FileDescriptor _output;  // what the widget reads
  pid_t _process = -1;
  bool _running = false;
  std::unique_ptr<JSONRPCConnection> _connection;
  OpenHandler _openHandler;
  NoticeHandler _noticeHandler;
  ProgressHandler _progressHandler;
  std::size_t _progressCount = 0;  // how often it told of progress
  std::function<void(const std::string&)> _nonsenseHandler;
};

}  // namespace nimbo
