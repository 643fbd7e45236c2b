#pragma once

namespace pelorin::test_support {

/// Makes allocations of this thread fail: `malloc` and its kin, and so `operator new`, in the
/// program and every library it uses. With a sanitizer, which brings its own `malloc`, only
/// `operator new` is reached.
class AllocationFaults {
 public:
  enum class Later { succeed, fail };

  /// Starts counting this thread's allocations; the one of number `failing` (from 1) fails, and
  /// later ones as `later` says. 0: none fails.
  explicit AllocationFaults(long failing, Later later = Later::succeed);
  /// Ends it.
  ~AllocationFaults();
  AllocationFaults(const AllocationFaults&) = delete;
  AllocationFaults& operator=(const AllocationFaults&) = delete;

  /// Allocations asked for so far.
  long count() const;
};

/// Blocks that the process has allocated and not freed.
long blocksInUse();

}  // namespace pelorin::test_support
