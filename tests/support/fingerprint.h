#pragma once

#include <cstddef>
#include <string>

#include "image_processing/core/image.h"

namespace pelorin::test_support {

/// A 64-bit FNV-1a hash of the bytes, as 16 hexadecimal digits: what golden tests compare.
std::string fingerprint(const void* bytes, std::size_t count);

template <typename T>
std::string fingerprint(const image_processing::Image<T>& image) {
  return fingerprint(image.data.get(), image.byteSize());
}

}  // namespace pelorin::test_support
