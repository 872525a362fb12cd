#include "desktop/system/WindowProgram.h"

#include <fcntl.h>
#include <glib.h>
#include <spawn.h>
#include <unistd.h>

#include <cstdlib>
#include <cstring>
#include <filesystem>
#include <memory>

namespace nimbo {

namespace {

constexpr const char* kWindowProgram = "nimbo-transit-desktop";

std::filesystem::path windowProgram() {
  if (const char* named = std::getenv("NIMBO_TRANSIT_DESKTOP"); named && *named) return named;
  const auto folder = std::filesystem::read_symlink("/proc/self/exe").parent_path();
  for (const auto& candidate :
       {folder / kWindowProgram, folder / "window" / kWindowProgram, folder / ".." / "window" / kWindowProgram})
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
  // A session of its own: Ctrl+C in the terminal is not for the window, which stays when this host ends. Nor does it
  // hold the output of this host, whose end a bar may wait for.
  posix_spawn_file_actions_t actions;
  posix_spawn_file_actions_init(&actions);
  posix_spawn_file_actions_addopen(&actions, STDIN_FILENO, "/dev/null", O_RDONLY, 0);
  posix_spawn_file_actions_addopen(&actions, STDOUT_FILENO, "/dev/null", O_WRONLY, 0);
  posix_spawn_file_actions_addclosefrom_np(&actions, STDERR_FILENO + 1);
  posix_spawnattr_t attributes;
  posix_spawnattr_init(&attributes);
  posix_spawnattr_setflags(&attributes, POSIX_SPAWN_SETSID);
  pid_t process = 0;
  const int failure = posix_spawnp(&process, program.c_str(), &actions, &attributes, argv.data(), environment.get());
  posix_spawnattr_destroy(&attributes);
  posix_spawn_file_actions_destroy(&actions);
  if (failure != 0)
    return "cannot open the window: " + program + ": " + std::strerror(failure) + ". Install nimbo-transit-desktop.";
  const auto ended = [](GPid, gint, gpointer) {};  // nothing is left of it
  g_child_watch_add(process, ended, nullptr);
  return {};
}

}  // namespace nimbo
