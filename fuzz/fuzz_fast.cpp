// A picture, a stride, a threshold and an N out of bytes: corners, scores and maxima must be those
// of the definitions, and nothing may be read outside the picture.
#include <algorithm>
#include <cstdint>
#include <cstdlib>
#include <cstring>
#include <vector>

#include "image_processing/features/fast.h"
#include "image_processing/features/fast_corner.h"
#include "image_processing/features/fast_detector.h"

using namespace pelorin::image_processing;

namespace {

void check(bool holds) {
  if (!holds) std::abort();
}

bool same(const MallocArray<xy>& array, const std::vector<xy>& expected) {
  return std::equal(array.data(), array.end(), expected.begin(), expected.end());
}

void checkPicture(const GreyPixels& image, int arc, int threshold) {
  std::vector<xy> corners;
  std::vector<int> scores;
  for (int y = 3; y < image.height - 3; ++y) {
    for (int x = 3; x < image.width - 3; ++x) {
      const std::uint8_t* const centre = image.pixels + y * image.stride + x;
      const CircleValues circle = circleAround(centre, image.stride);
      if (!isCorner(*centre, circle, arc, threshold)) continue;
      corners.push_back({x, y});
      scores.push_back(cornerScoreScalar(*centre, circle, arc, threshold));
    }
  }
  check(same(detectCorners(image, arc, threshold), corners));
  const auto scored = scoreCorners(image, corners.data(), corners.size(), arc, threshold);
  check(std::equal(scored.data(), scored.end(), scores.begin(), scores.end()));
  const auto kept = keepMaxima(corners.data(), scores.data(), corners.size());
  check(same(detectMaxima(image, arc, threshold), std::vector<xy>(kept.data(), kept.end())));
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  if (size < 8) return 0;
  std::int32_t threshold;
  std::memcpy(&threshold, data, 4);
  if (data[4] & 1) threshold = threshold % 300 - 20;  // mostly one that finds something
  const int arc = 9 + data[5] % 4, width = 1 + data[6] % 128, padding = data[7] % 4;
  const std::vector<std::uint8_t> pixels(data + 8, data + size);
  const int stride = width + padding;
  const int height = static_cast<int>(pixels.size()) / stride;
  const bool upward = (data[4] & 2) != 0 && height > 0;
  const std::uint8_t* const first = pixels.data() + (upward ? (height - 1) * stride : 0);
  checkPicture({first, width, height, upward ? -stride : stride}, arc, threshold);
  return 0;
}
