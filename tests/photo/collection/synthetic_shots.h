#pragma once

#include <cstddef>
#include <cstdint>
#include <vector>

#include "photo/collection/shot.h"

namespace pelorin::test_support {

/// What a library of photos is made of; shares are in 1 / 1000.
struct LibraryKind {
  double secondsBetweenScenes = 300.0;
  std::uint32_t withoutTime = 0;  ///< Share of photos.
  std::uint32_t withoutZone = 0;  ///< Share of photos that know only the wall clock.
  std::uint32_t turned = 100;     ///< Share of photos in another orientation.
};

/// `count` shots of scenes of one to six each, seconds apart, in no order. One seed gives the same
/// shots everywhere.
std::vector<photo::Shot> syntheticShots(std::size_t count, const LibraryKind& kind,
                                        std::uint64_t seed);

}  // namespace pelorin::test_support
