#include "tests/support/allocation_faults.h"

#include <atomic>
#include <cerrno>
#include <cstddef>
#include <cstdlib>
#include <new>

#include "tests/support/slow_build.h"

namespace pelorin::test_support {
namespace {

struct Plan {
  bool active;
  bool laterFail;
  long failing;
  long count;
};
thread_local constinit Plan plan{};
std::atomic<long> blocks = 0;

bool mayAllocate() {
  if (!plan.active) return true;
  ++plan.count;
  if (plan.failing == 0 || plan.count < plan.failing) return true;
  return plan.count > plan.failing && !plan.laterFail;
}

[[maybe_unused]] void* counted(void* block) {
  if (block != nullptr) blocks.fetch_add(1, std::memory_order_relaxed);
  return block;
}

[[maybe_unused]] void uncount(void* block) {
  if (block != nullptr) blocks.fetch_sub(1, std::memory_order_relaxed);
}

}  // namespace

AllocationFaults::AllocationFaults(long failing, Later later) {
  plan = {.active = true, .laterFail = later == Later::fail, .failing = failing, .count = 0};
}

AllocationFaults::~AllocationFaults() {
  plan.active = false;
}

long AllocationFaults::count() const {
  return plan.count;
}

long blocksInUse() {
  return blocks;
}

}  // namespace pelorin::test_support

using pelorin::test_support::counted;
using pelorin::test_support::mayAllocate;
using pelorin::test_support::uncount;

#pragma GCC visibility push(default)  // what is hidden takes nobody's place
#if defined(PELORIN_SANITIZED)

void* operator new(std::size_t size) {
  void* const block = mayAllocate() ? counted(std::malloc(size)) : nullptr;
  if (block == nullptr) throw std::bad_alloc();
  return block;
}
void* operator new[](std::size_t size) {
  return operator new(size);
}
void* operator new(std::size_t size, const std::nothrow_t&) noexcept {
  return mayAllocate() ? counted(std::malloc(size)) : nullptr;
}
void* operator new[](std::size_t size, const std::nothrow_t& never) noexcept {
  return operator new(size, never);
}
void operator delete(void* block) noexcept {
  uncount(block);
  std::free(block);
}
void operator delete[](void* block) noexcept {
  operator delete(block);
}
void operator delete(void* block, std::size_t) noexcept {
  operator delete(block);
}
void operator delete[](void* block, std::size_t) noexcept {
  operator delete(block);
}

#else

extern "C" {
void* __libc_malloc(std::size_t size);
void* __libc_calloc(std::size_t count, std::size_t size);
void* __libc_realloc(void* block, std::size_t size);
void* __libc_memalign(std::size_t alignment, std::size_t size);
void __libc_free(void* block);

void* malloc(std::size_t size) {
  if (mayAllocate()) return counted(__libc_malloc(size));
  errno = ENOMEM;
  return nullptr;
}

void* calloc(std::size_t count, std::size_t size) {
  if (mayAllocate()) return counted(__libc_calloc(count, size));
  errno = ENOMEM;
  return nullptr;
}

void* realloc(void* block, std::size_t size) {
  if (!mayAllocate()) {
    errno = ENOMEM;
    return nullptr;
  }
  uncount(block);
  void* const grown = counted(__libc_realloc(block, size));
  if (grown == nullptr && size != 0 && block != nullptr) counted(block);
  return grown;
}

void* memalign(std::size_t alignment, std::size_t size) {
  if (mayAllocate()) return counted(__libc_memalign(alignment, size));
  errno = ENOMEM;
  return nullptr;
}

void* aligned_alloc(std::size_t alignment, std::size_t size) {
  return memalign(alignment, size);
}

int posix_memalign(void** block, std::size_t alignment, std::size_t size) {
  *block = memalign(alignment, size);
  return *block == nullptr ? ENOMEM : 0;
}

void free(void* block) {
  uncount(block);
  __libc_free(block);
}
}

#endif
#pragma GCC visibility pop
