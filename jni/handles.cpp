#include "jni/handles.h"

#include <atomic>
#include <cstdint>
#include <random>

namespace pelorin::quenby {
namespace {

/// Every class loader has a copy of this library with a count of its own. Each starts at a point of
/// 2^62, so that a handle of one means nothing to another either.
jlong firstHandle() {
  std::random_device random;
  return static_cast<jlong>((std::uint64_t{random()} << 32 | random()) >> 2) + 1;
}

}  // namespace

jlong nextHandle() {
  static std::atomic<jlong> next = firstHandle();
  return next++;
}

}  // namespace pelorin::quenby
