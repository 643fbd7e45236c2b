#pragma once

namespace pelorin::quenby {

/// A file in memory, empty at first, that has a path as long as this lives. For what takes only paths.
class MemoryFile {
 public:
  /// @throws std::system_error when the system gives none.
  MemoryFile();
  ~MemoryFile();
  MemoryFile(const MemoryFile&) = delete;
  MemoryFile& operator=(const MemoryFile&) = delete;

  const char* path() const { return path_; }

 private:
  int descriptor_;
  char path_[32];
};

}  // namespace pelorin::quenby
