#include "desktop/raii/LazyLibrary.h"

#include <dlfcn.h>

#include <stdexcept>
#include <string>

namespace nimbo {

LazyLibrary::LazyLibrary(const char* name) : _handle(::dlopen(name, RTLD_NOW | RTLD_LOCAL)) {
  if (!_handle) throw std::runtime_error(std::string("a library is missing (") + ::dlerror() + ")");
}

LazyLibrary::Symbol LazyLibrary::operator[](const char* function) const {
  void* address = ::dlsym(_handle, function);
  if (!address) throw std::runtime_error(std::string("a library is of another version (") + ::dlerror() + ")");
  return Symbol(address);
}

}  // namespace nimbo
