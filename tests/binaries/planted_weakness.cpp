// Compiled and linked without what protects the others.
#include <cstring>

extern "C" __attribute__((visibility("default"))) void plantedWeakness(const char* name,
                                                                       void* out) {
  char copy[16];
  std::strcpy(copy, name);
  std::memcpy(out, copy, sizeof copy);
}
