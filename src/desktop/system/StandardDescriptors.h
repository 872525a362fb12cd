#pragma once

#include <fcntl.h>

#include <csignal>

namespace nimbo {

/// For the beginning of a host's `main`: a standard descriptor that was closed becomes one whose use fails, so that no
/// file or pipe of the program is taken for it; writing to a pipe that nobody reads, or to a file at its limit, is an
/// error of the writer, and no end.
inline void prepareStandardDescriptors() {
  constexpr int kWrongModes[] = {O_WRONLY, O_RDONLY, O_RDONLY};
  for (int descriptor = 0; descriptor < 3; ++descriptor)
    // The lowest that is free is taken.
    if (fcntl(descriptor, F_GETFD) < 0 && open("/dev/null", kWrongModes[descriptor]) < 0) return;
  for (const int signal : {SIGPIPE, SIGXFSZ}) std::signal(signal, SIG_IGN);
}

}  // namespace nimbo
