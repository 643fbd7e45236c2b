#include "tests/support/new_memory.h"

#include <algorithm>
#include <array>
#include <cstdlib>
#include <cstring>
#include <new>

namespace pelorin::test_support {
namespace {

constexpr unsigned char asNew = 0xA5;

struct Block {
  unsigned char* first;
  std::size_t size;
};

struct Watch {
  std::size_t fewestBytes;  ///< 0: nothing is watched.
  int count;
  std::array<Block, 16> blocks;  // a list of its own would take memory
};
thread_local constinit Watch watch{};

void* watched(void* block, std::size_t size) {
  if (watch.fewestBytes == 0 || size < watch.fewestBytes) return block;
  std::memset(block, asNew, size);
  if (watch.count == static_cast<int>(watch.blocks.size())) std::abort();
  watch.blocks[watch.count++] = {static_cast<unsigned char*>(block), size};
  return block;
}

}  // namespace

NewMemory::NewMemory(std::size_t fewestBytes) {
  watch.count = 0;
  watch.fewestBytes = fewestBytes;
}

NewMemory::~NewMemory() {
  watch.fewestBytes = 0;
}

int NewMemory::blocks() const {
  return watch.count;
}

bool NewMemory::untouched() const {
  return std::all_of(watch.blocks.begin(), watch.blocks.begin() + watch.count, [](const Block& b) {
    return std::all_of(b.first, b.first + b.size, [](unsigned char byte) { return byte == asNew; });
  });
}

}  // namespace pelorin::test_support

void* operator new(std::size_t size) {
  void* const block = std::malloc(size);
  if (block == nullptr) throw std::bad_alloc();
  return pelorin::test_support::watched(block, size);
}
void* operator new[](std::size_t size) {
  return operator new(size);
}
// std::stable_sort takes its memory so; the blocks are freed below all the same.
void* operator new(std::size_t size, const std::nothrow_t&) noexcept {
  void* const block = std::malloc(size);
  return block == nullptr ? nullptr : pelorin::test_support::watched(block, size);
}
void* operator new[](std::size_t size, const std::nothrow_t& never) noexcept {
  return operator new(size, never);
}
void operator delete(void* block) noexcept {
  std::free(block);
}
void operator delete[](void* block) noexcept {
  operator delete(block);
}
// Which clang hides when it is told to hide all that it does not declare itself.
__attribute__((visibility("default"))) void operator delete(void* block, std::size_t) noexcept {
  operator delete(block);
}
__attribute__((visibility("default"))) void operator delete[](void* block, std::size_t) noexcept {
  operator delete(block);
}
