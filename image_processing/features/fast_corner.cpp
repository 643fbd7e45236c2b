#include "image_processing/features/fast_corner.h"

#include <algorithm>

namespace pelorin::image_processing {

CircleValues circleAround(const std::uint8_t* centre, std::ptrdiff_t stride) {
  CircleValues circle;
  for (std::size_t i = 0; i < circle.size(); ++i) {
    circle[i] = centre[fastCircle[i].y * stride + fastCircle[i].x];
  }
  return circle;
}

bool isCorner(std::uint8_t centre, const CircleValues& circle, int arc, int threshold) {
  // Bytes differ by 255 at most, so the bounds change no comparison and no sum can overflow.
  const int difference = std::clamp(threshold, -256, 255);
  int brighter = 0, darker = 0;  // how many in a row, up to this pixel
  for (int i = 0; i < 16 + arc - 1; ++i) {
    const int value = circle[i % 16];
    brighter = value > centre + difference ? brighter + 1 : 0;
    darker = value < centre - difference ? darker + 1 : 0;
    if (brighter == arc || darker == arc) return true;
  }
  return false;
}

int cornerScore(std::uint8_t centre, const CircleValues& circle, int arc, int threshold) {
  CircleValues least = circle, greatest = circle;  // on the arc that starts at each pixel
  std::array<std::uint8_t, 32> twice;
  std::copy(circle.begin(), circle.end(), twice.begin());
  std::copy(circle.begin(), circle.end(), twice.begin() + 16);
  for (int step = 1; step < arc; ++step) {
    for (int i = 0; i < 16; ++i) {
      least[i] = std::min(least[i], twice[i + step]);
      greatest[i] = std::max(greatest[i], twice[i + step]);
    }
  }
  // The pixel is a corner at every threshold below the smallest difference on its best arc.
  const int brighter = *std::max_element(least.begin(), least.end()) - centre;
  const int darker = centre - *std::min_element(greatest.begin(), greatest.end());
  return std::max(threshold, std::max(brighter, darker) - 1);
}

int cornerScoreScalar(std::uint8_t centre, const CircleValues& circle, int arc, int threshold) {
  int passes = threshold, fails = 255;
  while (passes < fails - 1) {
    const int middle = (passes + fails) / 2;
    (isCorner(centre, circle, arc, middle) ? passes : fails) = middle;
  }
  return passes;
}

}  // namespace pelorin::image_processing
