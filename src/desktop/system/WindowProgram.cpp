#include "desktop/system/WindowProgram.h"

#include <glib.h>
#include <unistd.h>

#include <cstdlib>
#include <filesystem>
#include <memory>

namespace nimbo {

namespace {

constexpr const char* kWindowProgram = "nimbo-transit-desktop";

std::filesystem::path windowProgram() {
  if (const char* named = std::getenv("NIMBO_TRANSIT_DESKTOP"); named && *named) return named;
  const auto folder = std::filesystem::read_symlink("/proc/self/exe").parent_path();
  for (const auto& candidate : {folder / kWindowProgram, folder / ".." / "window" / kWindowProgram})
    if (std::error_code error; std::filesystem::exists(candidate, error)) return candidate;
  return kWindowProgram;
}

}  // namespace

std::string startWindow(const std::vector<std::string>& arguments, const std::string& activationToken) {
  const std::string program = windowProgram();
  std::vector<char*> argv{const_cast<char*>(program.c_str())};
  for (const std::string& argument : arguments) argv.push_back(const_cast<char*>(argument.c_str()));
  argv.push_back(nullptr);
  std::unique_ptr<char*, decltype(&g_strfreev)> environment(g_get_environ(), &g_strfreev);
  // The names on Wayland and on X11.
  for (const char* variable : {"XDG_ACTIVATION_TOKEN", "DESKTOP_STARTUP_ID"})
    if (!activationToken.empty())
      environment.reset(g_environ_setenv(environment.release(), variable, activationToken.c_str(), TRUE));
  // A session of its own: Ctrl+C in the terminal is not for the window, which stays when this host ends.
  const auto setUp = [](gpointer) { setsid(); };
  GError* failure = nullptr;
  if (g_spawn_async(nullptr, argv.data(), environment.get(), G_SPAWN_SEARCH_PATH, setUp, nullptr, nullptr, &failure))
    return {};
  const std::string problem =
      std::string("cannot open the window: ") + failure->message + ". Install nimbo-transit-desktop.";
  g_error_free(failure);
  return problem;
}

}  // namespace nimbo
