#pragma once

#include <cstdint>
#include <span>
#include <vector>

#include "bindings/c/boundary.h"
#include "photo/photo.h"

/// A decoded photo.
struct quenby_photo {
  pelorin::photo::Photo photo;
  int scale;  ///< How often smaller it was decoded than it is.
};

/// A file that was made.
struct quenby_file {
  std::vector<std::uint8_t> bytes;
  std::vector<pelorin::photo::Loss> lost;
};

namespace pelorin::c_api {

std::span<const std::uint8_t> bytesOf(const std::uint8_t* file, std::size_t size);

photo::OpenOptions openOptions(const quenby_open_options* given, const quenby_cancel* cancel);

}  // namespace pelorin::c_api
