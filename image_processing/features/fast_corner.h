#pragma once

#include <array>
#include <cstddef>
#include <cstdint>

#include "image_processing/features/xy.h"

namespace pelorin::image_processing {

/// The circle of radius 3 around a pixel, as steps from it, each a neighbour of the next.
constexpr std::array<xy, 16> fastCircle = {{{0, 3},
                                            {1, 3},
                                            {2, 2},
                                            {3, 1},
                                            {3, 0},
                                            {3, -1},
                                            {2, -2},
                                            {1, -3},
                                            {0, -3},
                                            {-1, -3},
                                            {-2, -2},
                                            {-3, -1},
                                            {-3, 0},
                                            {-3, 1},
                                            {-2, 2},
                                            {-1, 3}}};

/// How far the circle reaches; no pixel this close to a border of the picture is a corner.
constexpr int fastBorder = 3;

/// The pixels of the circle, in the order of `fastCircle`.
using CircleValues = std::array<std::uint8_t, 16>;

/// The circle around `*centre` in rows `stride` bytes apart.
CircleValues circleAround(const std::uint8_t* centre, std::ptrdiff_t stride);

/// Whether `arc` neighbouring pixels of the circle, 9 to 12, are all brighter than the centre by
/// more than `threshold` or all darker by more than it. Any threshold is allowed: from 255 on there
/// are no corners, and a negative one lets pixels pass that do not differ.
bool isCorner(std::uint8_t centre, const CircleValues& circle, int arc, int threshold);

/// The largest threshold up to 254 at which the pixel is a corner, and `threshold` itself where
/// that is larger: a score is never below the threshold.
int cornerScore(std::uint8_t centre, const CircleValues& circle, int arc, int threshold);

/// The definition of `cornerScore`: bisection with `isCorner`.
int cornerScoreScalar(std::uint8_t centre, const CircleValues& circle, int arc, int threshold);

}  // namespace pelorin::image_processing
