#include "host/WindowLauncher.h"

#include <glib.h>

#include <memory>

#include "desktop/system/WindowProgram.h"

namespace nimbo {

namespace {

std::string escaped(const std::string& text) {
  const std::unique_ptr<char, decltype(&g_free)> result(g_uri_escape_string(text.c_str(), nullptr, FALSE), &g_free);
  return result.get();
}

std::string urlOfActivity(const protocol::OpenUserActivityParams& activity) {
  std::string url = "nimbo://activity?type=" + escaped(activity.activityType);
  for (const auto& [key, bytes] : activity.userInfo) url += "&" + escaped(key) + "=" + escaped(bytes);
  return url;
}

}  // namespace

bool WindowLauncher::open(const WidgetClient::Opening& opening) const {
  if (const auto* url = std::get_if<protocol::OpenURLParams>(&opening)) return openURL(url->url);
  return openURL(urlOfActivity(std::get<protocol::OpenUserActivityParams>(opening)));
}

bool WindowLauncher::openURL(const std::string& url) const {
  std::vector<std::string> arguments = _folders;
  arguments.insert(arguments.end(), {"--", url});
  const std::string problem = startWindow(arguments);
  if (!problem.empty()) _tell(problem);
  return problem.empty();
}

}  // namespace nimbo
