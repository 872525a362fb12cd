#include "desktop/system/LatePart.h"

#include <dlfcn.h>

#include <string>

namespace nimbo {

void* functionOfLatePart(const char* file, const char* function) {
  void* const library = ::dlopen(file, RTLD_NOW | RTLD_LOCAL);
  void* const address = library ? ::dlsym(library, function) : nullptr;
  if (!address)
    throw LatePartMissing(std::string("a part of the program is missing: ") + ::dlerror() +
                          ". Install the program anew");
  return address;
}

}  // namespace nimbo
