#include "image_processing/quality/image_structure.h"

#include <algorithm>
#include <cmath>

#include "image_processing/core/require.h"

namespace pelorin::image_processing {
namespace {

std::uint32_t clampedIndex(std::int64_t index, std::uint32_t size) {
  return static_cast<std::uint32_t>(std::clamp<std::int64_t>(index, 0, std::int64_t{size} - 1));
}

}  // namespace

void computeImageStructure(const Image<float>& grey, std::uint32_t width, std::uint32_t height,
                           Image<float>& structure) {
  require(holds(grey, width, height) && holds(structure, width, height),
          "image structure: an image is smaller than asked for");
  Image<float> columnMeans(width, height), columnSquares(width, height);
  for (std::uint32_t y = 0; y < height; ++y) {
    for (std::uint32_t x = 0; x < width; ++x) {
      float mean = 0.0f, square = 0.0f;
      for (int tap = 0; tap < 7; ++tap) {
        const float value = grey.row(clampedIndex(std::int64_t{y} + tap - 3, height))[x];
        mean += niqeWindow[tap] * value;
        square += niqeWindow[tap] * (value * value);
      }
      columnMeans.row(y)[x] = mean;
      columnSquares.row(y)[x] = square;
    }
  }
  for (std::uint32_t y = 0; y < height; ++y) {
    for (std::uint32_t x = 0; x < width; ++x) {
      float mean = 0.0f, square = 0.0f;
      for (int tap = 0; tap < 7; ++tap) {
        const std::uint32_t column = clampedIndex(std::int64_t{x} + tap - 3, width);
        mean += niqeWindow[tap] * columnMeans.row(y)[column];
        square += niqeWindow[tap] * columnSquares.row(y)[column];
      }
      const float deviation = std::sqrt(std::fabs(square - mean * mean));
      structure.row(y)[x] = (grey.row(y)[x] - mean) / (deviation + 1.0f);
    }
  }
}

}  // namespace pelorin::image_processing
