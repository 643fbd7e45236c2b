#pragma once

#include <cstdint>

namespace pelorin::photo {

struct PictureSize {
  std::uint32_t width, height;

  friend bool operator==(const PictureSize&, const PictureSize&) = default;
};

}  // namespace pelorin::photo
