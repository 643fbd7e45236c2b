#include "jni/memory_file.h"

#include <sys/syscall.h>
#include <unistd.h>

#include <cerrno>
#include <cstdio>
#include <system_error>

namespace pelorin::quenby {
namespace {

int openInMemory() {
  constexpr unsigned closeOnExec = 1;
  // Older C libraries of devices have no function for it.
  const long descriptor = syscall(SYS_memfd_create, "quenby", closeOnExec);
  if (descriptor < 0) throw std::system_error(errno, std::generic_category(), "a file in memory");
  return static_cast<int>(descriptor);
}

}  // namespace

MemoryFile::MemoryFile() : descriptor_(openInMemory()) {
  snprintf(path_, sizeof(path_), "/proc/self/fd/%d", descriptor_);
}

MemoryFile::~MemoryFile() {
  close(descriptor_);
}

}  // namespace pelorin::quenby
