#include "host/layer/WindowLauncher.h"

#include <glib.h>
#include <unistd.h>

#include <cstdlib>
#include <memory>

namespace nimbo {

namespace {

constexpr const char* kProgramName = "nimbo-transit-desktop";

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

std::filesystem::path WindowLauncher::windowProgram() {
  if (const char* named = std::getenv("NIMBO_TRANSIT_DESKTOP"); named && *named) return named;
  const auto folder = std::filesystem::read_symlink("/proc/self/exe").parent_path();
  for (const auto& candidate : {folder / kProgramName, folder / ".." / "window" / kProgramName})
    if (std::error_code error; std::filesystem::exists(candidate, error)) return candidate;
  return kProgramName;
}

bool WindowLauncher::open(const WidgetClient::Opening& opening) const {
  if (const auto* url = std::get_if<protocol::OpenURLParams>(&opening)) return openURL(url->url);
  return openURL(urlOfActivity(std::get<protocol::OpenUserActivityParams>(opening)));
}

bool WindowLauncher::openURL(const std::string& url) const {
  const std::string program = windowProgram();
  std::vector<char*> argv{const_cast<char*>(program.c_str())};
  for (const std::string& folder : _folders) argv.push_back(const_cast<char*>(folder.c_str()));
  argv.insert(argv.end(), {const_cast<char*>("--"), const_cast<char*>(url.c_str()), nullptr});
  // A session of its own: Ctrl+C in the terminal is not for the window, which stays when this host ends.
  const auto setUp = [](gpointer) { setsid(); };
  GError* failure = nullptr;
  if (g_spawn_async(nullptr, argv.data(), nullptr, G_SPAWN_SEARCH_PATH, setUp, nullptr, nullptr, &failure)) return true;
  _tell(std::string("cannot open the window: ") + failure->message + ". Install nimbo-transit-desktop.");
  g_error_free(failure);
  return false;
}

}  // namespace nimbo
