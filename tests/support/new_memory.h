#pragma once

#include <cstddef>

namespace pelorin::test_support {

/// Watches the blocks that this thread takes from `operator new`, of a size and above, from its
/// making to its end. One at a time.
class NewMemory {
 public:
  explicit NewMemory(std::size_t fewestBytes);
  ~NewMemory();
  NewMemory(const NewMemory&) = delete;
  NewMemory& operator=(const NewMemory&) = delete;

  /// Blocks taken so far.
  int blocks() const;
  /// Whether nothing was written into any of them; none may have been given back.
  bool untouched() const;
};

}  // namespace pelorin::test_support
