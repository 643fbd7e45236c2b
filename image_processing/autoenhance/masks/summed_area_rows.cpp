#include "image_processing/autoenhance/masks/summed_area_rows.h"

namespace pelorin::image_processing {

void sumRowsScalar(const float* above, float* rows, std::ptrdiff_t stride, std::int64_t width) {
  for (std::int64_t i = 0; i < sumRowsAtOnce; ++i) {
    float* const row = rows + i * stride;
    float left = 0.0f;
    float aboveLeft = above[1];
    for (std::int64_t j = 0; j < width; ++j) {
      row[j] = ((row[j] + above[j]) + left) - aboveLeft;
      left = row[j];
      aboveLeft = above[j];
    }
    above = row;
  }
}

}  // namespace pelorin::image_processing
