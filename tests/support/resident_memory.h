#pragma once

#include <unistd.h>

#include <fstream>

namespace pelorin::test_support {

/// Bytes of this process that are in memory and no file's. Sanitizers keep what was freed and emulators what
/// they translated, so only a build that is not `slowBuild` tells what the program itself takes.
inline long residentMemory() {
  long size = 0, resident = 0, shared = 0;
  std::ifstream("/proc/self/statm") >> size >> resident >> shared;
  return (resident - shared) * sysconf(_SC_PAGESIZE);
}

}  // namespace pelorin::test_support
