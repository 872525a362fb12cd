#pragma once

#include <sys/types.h>

#include <filesystem>
#include <functional>
#include <memory>
#include <nlohmann/json.hpp>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

#include "desktop/raii/FileDescriptor.h"
#include "desktop/rpc/JSONRPCConnection.h"
#include "desktop/system/GLibRunLoop.h"

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

/// A widget process of one's own: starts it, speaks its protocol, ends it. Main thread only.
class WidgetClient {
 public:
  /// Hears what a tapped row wants to open (method and parameters as in docs/protocol.md); answers whether it opened.
  using OpenHandler = std::function<bool(std::string_view method, const nlohmann::json& params)>;
  /// Hears what the user must be told.
  using NoticeHandler = std::function<void(const std::string& message)>;

  /// Starts the widget with these arguments. Throws WidgetClientFailure when it cannot be started.
  WidgetClient(GLibRunLoop& runLoop, const std::vector<std::string>& arguments);
  /// Closes the connection and waits for the process; one that does not end within a second is killed.
  ~WidgetClient();
  WidgetClient(const WidgetClient&) = delete;
  WidgetClient& operator=(const WidgetClient&) = delete;

  void setOpenHandler(OpenHandler handler) { _openHandler = std::move(handler); }
  /// Until this is called, notices go to standard error.
  void setNoticeHandler(NoticeHandler handler) { _noticeHandler = std::move(handler); }
  JSONRPCConnection& connection() { return *_connection; }
  bool isRunning() const { return _running; }
  /// Ends a process that is not to be trusted to end by itself.
  void kill();

  /// Asks and waits for the answer, serving the widget's own requests meanwhile. Throws WidgetClientFailure, for an
  /// error answer WidgetRefusal.
  nlohmann::json call(std::string_view method, const nlohmann::json& params = nlohmann::json::object());
  /// Runs the loop until `done` answers true. Throws WidgetClientFailure when the process ends first, or after
  /// `kPatience` seconds without a word from it.
  void waitUntil(const std::function<bool()>& done);

  static constexpr double kPatience = 120;

  /// Where the widget program is: beside the running program, or as built, or NIMBO_TRANSIT_WIDGET.
  static std::filesystem::path widgetProgram();

 private:
  void handleOpening(const char* method);

  GLibRunLoop& _runLoop;
  FileDescriptor _input;   // what the widget writes
  FileDescriptor _output;  // what the widget reads
  pid_t _process = -1;
  bool _running = false;
  std::unique_ptr<JSONRPCConnection> _connection;
  OpenHandler _openHandler;
  NoticeHandler _noticeHandler;
};

}  // namespace nimbo
