#pragma once

#include <cstdint>
#include <vector>

#include "image_processing/autoenhance/masks/image_rows.h"
#include "image_processing/core/pixel_types.h"

namespace pelorin::image_processing {

/// L / 100 of a photo's pixels, found a row at a time: cheaper than a plane of it would be to keep.
class LightnessRows : public RowSource<float> {
 public:
  /// @throws std::bad_alloc.
  explicit LightnessRows(const Image<RGBA8Pixel>& photo);

  const float* row(std::uint32_t y) override;

 private:
  const Image<RGBA8Pixel>& photo_;
  std::vector<std::uint16_t> steps_;
  std::vector<float> lightness_;
  std::int64_t current_ = -1;
};

}  // namespace pelorin::image_processing
