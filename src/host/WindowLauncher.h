#pragma once

#include <functional>
#include <string>
#include <vector>

#include "host/WidgetClient.h"

namespace nimbo {

/// Opens pages of the window, and there what the widget hands over. Main thread only.
class WindowLauncher {
 public:
  /// `folders` are arguments that give the window the same folders; `tell` hears what the user must be told.
  WindowLauncher(std::vector<std::string> folders, std::function<void(const std::string& message)> tell)
      : _folders(std::move(folders)), _tell(std::move(tell)) {}

  /// Answers whether the window was started for it.
  bool open(const WidgetClient::Opening& opening) const;
  /// The same for an address of the window's scheme: "nimbo://" is its first page, which leads to all others.
  bool openURL(const std::string& url) const;

 private:
  std::vector<std::string> _folders;
  std::function<void(const std::string&)> _tell;
};

}  // namespace nimbo
