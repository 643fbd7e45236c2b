#pragma once

#include <algorithm>
#include <cstddef>
#include <cstdint>
#include <cstring>

/// Takes an input apart from its beginning on; noughts when there are no more bytes.
class Bytes {
 public:
  Bytes(const std::uint8_t* data, std::size_t size) : data_(data), left_(size) {}
  bool empty() const { return left_ == 0; }

  template <typename T = std::uint8_t>
  T next() {
    T value{};
    const std::size_t count = std::min(left_, sizeof(T));
    std::memcpy(&value, data_, count);
    data_ += count;
    left_ -= count;
    return value;
  }

 private:
  const std::uint8_t* data_;
  std::size_t left_;
};
