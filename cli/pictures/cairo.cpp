#include "cli/pictures/cairo.h"

#include <dlfcn.h>

#include <string>

#include "cli/frame/errors.h"

namespace pelorin::cli {

void* cairoFunction(const char* name) {
  static void* const library = ::dlopen("libcairo.so.2", RTLD_NOW | RTLD_LOCAL);
  void* const function = library == nullptr ? nullptr : ::dlsym(library, name);
  if (function != nullptr) return function;
  const char* const reason = ::dlerror();
  throw FileError("nothing can be drawn without libcairo.so.2" +
                  (reason == nullptr ? std::string() : ": " + std::string(reason)));
}

}  // namespace pelorin::cli
