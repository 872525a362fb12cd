#include "desktop/system/LatePart.h"

#include <dlfcn.h>

#include <string>

namespace nimbo {

void* functionOfLatePart(const char* file, const char* function) {
  // Libraries of others are bound as they are called: a start calls a part of them.
  void* const library = ::dlopen(file, RTLD_LAZY | RTLD_LOCAL);
  void* const address = library ? ::dlsym(library, function) : nullptr;
  if (!address)
    throw LatePartMissing(std::string("a part of the program is missing: ") + ::dlerror() +
                          ". Install the program anew");
  return address;
}

}  // namespace nimbo
