// Part of whatever draws in builds that look for leaks: ends Cairo and Fontconfig with the program. The fonts
// that they keep as long as it runs are found by offsets in place of pointers, and would look lost.
#include <dlfcn.h>

namespace {

// Both are loaded when something is drawn, if at all.
void call(const char* library, const char* function) {
  void* const loaded = ::dlopen(library, RTLD_LAZY | RTLD_NOLOAD);
  if (loaded == nullptr) return;
  if (void* const found = ::dlsym(loaded, function)) reinterpret_cast<void (*)()>(found)();
  ::dlclose(loaded);
}

struct EndDrawing {
  ~EndDrawing() {
    call("libcairo.so.2", "cairo_debug_reset_static_data");
    call("libfontconfig.so.1", "FcFini");
  }
};

const EndDrawing endDrawing;

}  // namespace
