#pragma once

#include <cstddef>
#include <cstdlib>
#include <memory>
#include <new>
#include <type_traits>
#include <utility>

#include "image_processing/core/checked_size.h"

namespace pelorin::image_processing {

/// A growing array of plain values in memory from `malloc`, which `release` hands to a C caller.
template <typename T>
class MallocArray {
  static_assert(std::is_trivially_copyable_v<T>);

 public:
  /// Holds no memory.
  MallocArray() = default;

  /// Holds memory even when `capacity` is 0, and no elements yet.
  /// @throws std::bad_alloc
  explicit MallocArray(std::size_t capacity) { resizeMemory(capacity); }

  std::size_t size() const { return size_; }
  T* data() const { return memory_.get(); }
  T* end() const { return data() + size_; }

  /// Makes room for `count` elements behind `end()`, at least doubling the memory when it grows.
  /// @throws std::bad_alloc and leaves the array as it was.
  void makeRoomFor(std::size_t count) {
    if (count <= capacity_ - size_) return;
    resizeMemory(capacity_ + (count > capacity_ ? count : capacity_));
  }

  /// Takes in `count` elements that were written at `end()`, where there must be room for them.
  void grow(std::size_t count) { size_ += count; }

  void append(const T& value) {
    makeRoomFor(1);
    *end() = value;
    grow(1);
  }

  /// The memory, which the caller now owns and releases with `free`.
  T* release() {
    size_ = capacity_ = 0;
    return memory_.release();
  }

 private:
  struct Free {
    void operator()(T* memory) const { std::free(memory); }
  };

  void resizeMemory(std::size_t capacity) {
    const std::size_t bytes = checkedProduct(capacity, sizeof(T));
    void* const memory = std::realloc(memory_.get(), bytes == 0 ? 1 : bytes);
    if (memory == nullptr) throw std::bad_alloc();
    (void)memory_.release();  // realloc has already taken it
    memory_.reset(static_cast<T*>(memory));
    capacity_ = capacity;
  }

  std::unique_ptr<T, Free> memory_;
  std::size_t size_ = 0;
  std::size_t capacity_ = 0;
};

}  // namespace pelorin::image_processing
