#include "tests/features/brute_force.h"

#include <algorithm>
#include <cmath>
#include <cstdlib>

namespace pelorin::test_support {

std::vector<xy> circleByGeometry() {
  std::vector<xy> circle;
  for (int y = -4; y <= 4; ++y) {
    for (int x = -4; x <= 4; ++x) {
      if (std::lround(std::hypot(x, y)) == 3) circle.push_back({x, y});
    }
  }
  std::sort(circle.begin(), circle.end(),
            [](const xy& a, const xy& b) { return std::atan2(a.y, a.x) < std::atan2(b.y, b.x); });
  return circle;
}

bool passesSegmentTest(const GreyImage& image, int x, int y, int arc, long long b) {
  static const std::vector<xy> circle = circleByGeometry();
  const long long p = image.row(y)[x];
  for (int start = 0; start < 16; ++start) {
    bool brighter = true, darker = true;
    for (int i = start; i < start + arc; ++i) {
      const long long value = image.row(y + circle[i % 16].y)[x + circle[i % 16].x];
      brighter = brighter && value > p + b;
      darker = darker && value < p - b;
    }
    if (brighter || darker) return true;
  }
  return false;
}

std::vector<xy> cornersByBruteForce(const GreyImage& image, int arc, long long b) {
  std::vector<xy> corners;
  for (int y = 3; y <= static_cast<int>(image.height) - 4; ++y) {
    for (int x = 3; x <= static_cast<int>(image.width) - 4; ++x) {
      if (passesSegmentTest(image, x, y, arc, b)) corners.push_back({x, y});
    }
  }
  return corners;
}

int scoreByBruteForce(const GreyImage& image, int x, int y, int arc, int b) {
  int largest = b;
  for (int t = b; t <= 254; ++t) {
    if (passesSegmentTest(image, x, y, arc, t)) largest = t;
  }
  return largest;
}

std::vector<xy> maximaByBruteForce(const std::vector<xy>& corners, const std::vector<int>& scores) {
  std::vector<xy> maxima;
  for (std::size_t i = 0; i < corners.size(); ++i) {
    bool beaten = false;
    for (std::size_t j = 0; j < corners.size(); ++j) {
      const long long dx = static_cast<long long>(corners[j].x) - corners[i].x;
      const long long dy = static_cast<long long>(corners[j].y) - corners[i].y;
      const bool neighbours = (dx != 0 || dy != 0) && std::abs(dx) <= 1 && std::abs(dy) <= 1;
      beaten = beaten || (neighbours && scores[j] >= scores[i]);
    }
    if (!beaten) maxima.push_back(corners[i]);
  }
  return maxima;
}

}  // namespace pelorin::test_support
