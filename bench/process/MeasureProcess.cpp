// Measures a program from its start to its first sign of success:
//
//   nimbo-bench-process [--input FILE] (--until TEXT | --frame) -- PROGRAM [ARGUMENT...]
//
// The program gets FILE on its standard input, which stays open. The measurement ends with the first line of its output
// that holds TEXT, or, with --frame, when a window's worth of pixels has changed on the X display. "@PICTURE@" in
// arguments becomes the path of shared memory to draw into, which is also descriptor 3. Prints one line of JSON:
// seconds, and at that moment the resident and private dirty memory, and the peak of resident memory until the end, in
// KiB.

#include <X11/Xlib.h>
#include <X11/extensions/Xdamage.h>
#include <fcntl.h>
#include <spawn.h>
#include <sys/mman.h>
#include <sys/resource.h>
#include <sys/wait.h>
#include <unistd.h>

#include <chrono>
#include <csignal>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <fstream>
#include <sstream>
#include <string>
#include <vector>

namespace {

constexpr int kPatience = 120;          // seconds
constexpr int kWindowPixels = 100'000;  // fewer are a cursor or a tooltip
constexpr int kPictureDescriptor = 3;
constexpr off_t kPictureBytes = 256'000'000;

[[noreturn]] void fail(const std::string& what) {
  std::fprintf(stderr, "nimbo-bench-process: %s\n", what.c_str());
  std::exit(1);
}

std::string withPicture(std::string text, const std::string& path) {
  constexpr std::string_view kPlaceholder = "@PICTURE@";
  for (std::size_t at; (at = text.find(kPlaceholder)) != std::string::npos;)
    text.replace(at, kPlaceholder.size(), path);
  return text;
}

/// A value of /proc/PID/smaps_rollup, in KiB.
long memoryOf(pid_t process, const std::string& key) {
  std::ifstream file("/proc/" + std::to_string(process) + "/smaps_rollup");
  for (std::string line; std::getline(file, line);)
    if (line.starts_with(key + ":")) return std::strtol(line.c_str() + key.size() + 1, nullptr, 10);
  fail("no memory figures: the program has ended");
}

void waitForLine(int output, const std::string& wanted) {
  std::string line;
  char piece[65536];
  for (ssize_t count; (count = read(output, piece, sizeof piece)) > 0;) {
    line.append(piece, static_cast<std::size_t>(count));
    for (std::size_t end; (end = line.find('\n')) != std::string::npos; line.erase(0, end + 1))
      if (line.find(wanted) < end) return;
  }
  fail("the program ended without saying \"" + wanted + "\"");
}

void waitForFrame(Display* display, int damageEvents) {
  for (;;) {
    XEvent event;
    XNextEvent(display, &event);
    if (event.type != damageEvents + XDamageNotify) continue;
    const XRectangle area = reinterpret_cast<const XDamageNotifyEvent&>(event).area;
    if (area.width * area.height >= kWindowPixels) return;
  }
}

}  // namespace

int main(int argc, char** argv) {
  std::string input, until;
  bool untilFrame = false;
  const int memory = memfd_create("picture", MFD_CLOEXEC);
  if (memory < 0 || ftruncate(memory, kPictureBytes) != 0) fail(std::strerror(errno));
  const std::string picture = "/proc/" + std::to_string(getpid()) + "/fd/" + std::to_string(memory);
  int index = 1;
  for (; index < argc && std::strcmp(argv[index], "--") != 0; ++index) {
    const std::string option = argv[index];
    if (option == "--frame")
      untilFrame = true;
    else if (index + 1 < argc && option == "--until")
      until = argv[++index];
    else if (index + 1 < argc && option == "--input")
      input = argv[++index];
    else
      fail("unknown option " + option);
  }
  std::vector<std::string> words;
  for (++index; index < argc; ++index) words.push_back(withPicture(argv[index], picture));
  if (words.empty() || until.empty() != untilFrame) fail("give --until TEXT or --frame, and a program after --");
  std::ostringstream text;
  if (!input.empty()) text << std::ifstream(input).rdbuf();
  const std::string requests = text.str();

  Display* display = nullptr;
  int damageEvents = 0, damageErrors = 0;
  if (untilFrame) {
    display = XOpenDisplay(nullptr);
    if (!display || !XDamageQueryExtension(display, &damageEvents, &damageErrors)) fail("no X display with damage");
    XDamageCreate(display, DefaultRootWindow(display), XDamageReportRawRectangles);
    XSync(display, True);
  }

  int toProgram[2], fromProgram[2];
  if (pipe2(toProgram, O_CLOEXEC) != 0 || pipe2(fromProgram, O_CLOEXEC) != 0) fail(std::strerror(errno));
  posix_spawn_file_actions_t actions;
  posix_spawn_file_actions_init(&actions);
  posix_spawn_file_actions_adddup2(&actions, toProgram[0], STDIN_FILENO);
  posix_spawn_file_actions_adddup2(&actions, fromProgram[1], STDOUT_FILENO);
  posix_spawn_file_actions_adddup2(&actions, memory, kPictureDescriptor);
  std::vector<char*> arguments;
  arguments.reserve(words.size() + 1);
  for (std::string& word : words) arguments.push_back(word.data());
  arguments.push_back(nullptr);

  std::signal(SIGPIPE, SIG_IGN);
  alarm(kPatience);
  pid_t process = 0;
  const auto begin = std::chrono::steady_clock::now();
  if (const int error = posix_spawn(&process, arguments[0], &actions, nullptr, arguments.data(), environ); error != 0)
    fail(words[0] + ": " + std::strerror(error));
  close(toProgram[0]);
  close(fromProgram[1]);
  if (write(toProgram[1], requests.data(), requests.size()) != static_cast<ssize_t>(requests.size()))
    fail("the program does not take its input");
  if (untilFrame)
    waitForFrame(display, damageEvents);
  else
    waitForLine(fromProgram[0], until);
  const std::chrono::duration<double> seconds = std::chrono::steady_clock::now() - begin;
  const long resident = memoryOf(process, "Rss"), dirty = memoryOf(process, "Private_Dirty");
  close(toProgram[1]);
  if (untilFrame) kill(process, SIGTERM);
  close(fromProgram[0]);
  rusage usage{};
  int status = 0;
  wait4(process, &status, 0, &usage);
  std::printf("{\"seconds\": %.6f, \"residentKiB\": %ld, \"privateDirtyKiB\": %ld, \"peakKiB\": %ld}\n",
              seconds.count(), resident, dirty, usage.ru_maxrss);
}
