#pragma once

#include <cstddef>
#include <cstdlib>
#include <cstring>
#include <new>
#include <span>

namespace pelorin::c_api {

/// A copy in memory that `free` takes back, for the arrays that callers own. Null when it is empty.
/// @throws std::bad_alloc.
template <typename T>
T* givenArray(std::span<const T> values) {
  if (values.empty()) return nullptr;
  void* const memory = std::malloc(values.size_bytes());
  if (memory == nullptr) throw std::bad_alloc();
  std::memcpy(memory, values.data(), values.size_bytes());
  return static_cast<T*>(memory);
}

template <typename Array>
void freeArray(Array* array) noexcept {
  if (array == nullptr) return;
  std::free(array->data);
  *array = {};
}

}  // namespace pelorin::c_api
