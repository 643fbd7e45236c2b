#include "tests/photo/collection/synthetic_shots.h"

#include <utility>

#include "tests/dupe/synthetic_cdfs.h"
#include "tests/support/pictures.h"

namespace pelorin::test_support {

std::vector<photo::Shot> syntheticShots(std::size_t count, const LibraryKind& kind,
                                        std::uint64_t seed) {
  Random random(seed);
  const auto happens = [&](std::uint32_t share) { return random.below(1000) < share; };
  std::vector<photo::Shot> shots(count);
  double now = 1.7e9;
  image_processing::GreenCDF scene{};
  std::uint32_t left = 0;
  for (photo::Shot& shot : shots) {
    if (left == 0) {
      left = 1 + random.below(6);
      now += kind.secondsBetweenScenes * random.nextFloat();
      scene = syntheticCDF(random.next32());
    }
    --left;
    now += 0.25 * random.below(60);
    const float moved = 0.004f * random.nextFloat();
    std::uint64_t pixels;
    const image_processing::GreenCDF cdf = anotherShot(scene, moved, random.next32(), &pixels);
    shot.cdf = {cdf, pixels};
    shot.orientation = happens(kind.turned) ? 6 : 1;
    const double offset = 3600.0 * (1 + random.below(2));
    if (happens(kind.withoutTime)) continue;
    shot.time = photo::ShotTime{now + offset, now};
    if (happens(kind.withoutZone)) shot.time->utc.reset();
  }
  for (std::size_t i = count; i > 1; --i) {
    std::swap(shots[i - 1], shots[random.below(static_cast<std::uint32_t>(i))]);
  }
  return shots;
}

}  // namespace pelorin::test_support
