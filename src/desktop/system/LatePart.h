#pragma once

#include <stdexcept>

namespace nimbo {

/// A part of the program could not be opened; the message names its file.
class LatePartMissing final : public std::runtime_error {
 public:
  using std::runtime_error::runtime_error;
};

/// The address of a function in one of the program's own shared objects ("libnimbo-feeds.so"), which is opened with the
/// first call and stays open. It is looked for where the program was linked to look; all else of the project that it
/// needs it finds in the program, which so has one copy of everything. Any thread. Throws LatePartMissing.
void* functionOfLatePart(const char* file, const char* function);

/// What a part does: the part's library is opened with the first call. Parts stand apart from the program because the
/// libraries below them take more time and memory than most starts have a use for. `function` answers a pointer to the
/// `Interface`, which lives as long as the program. Any thread. Throws LatePartMissing, the next time too.
template <class Interface>
Interface& latePart(const char* file, const char* function) {
  static Interface& part = *reinterpret_cast<Interface* (*)()>(functionOfLatePart(file, function))();
  return part;
}

}  // namespace nimbo
