#pragma once

#include <vector>

#include "image_processing/features/xy.h"
#include "tests/support/grey_pictures.h"

// Corners once more, as literally as can be and by no path of the engine.
namespace pelorin::test_support {

/// The 16 pixels whose distance from the middle rounds to 3, by their angle.
std::vector<xy> circleByGeometry();

/// Whether `arc` neighbours on the circle around (x, y) are all brighter than it by more than `b`,
/// or all darker.
bool passesSegmentTest(const GreyImage& image, int x, int y, int arc, long long b);

/// Every pixel at least three from the borders that passes, in raster order.
std::vector<xy> cornersByBruteForce(const GreyImage& image, int arc, long long b);

/// The largest threshold from `b` to 254 that the pixel passes, trying them all; `b` without one.
int scoreByBruteForce(const GreyImage& image, int x, int y, int arc, int b);

/// The corners without a corner of the same or a higher score among their eight neighbours.
std::vector<xy> maximaByBruteForce(const std::vector<xy>& corners, const std::vector<int>& scores);

}  // namespace pelorin::test_support
