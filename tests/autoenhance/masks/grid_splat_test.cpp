#include "image_processing/autoenhance/masks/grid_splat.h"

#include <gtest/gtest.h>

#include <cstdint>

#include "tests/autoenhance/masks/geometries.h"
#include "tests/support/instruction_sets.h"

namespace pelorin::image_processing {
namespace {

using test_support::fingerprint;
using test_support::geometries;
using test_support::Geometry;
using test_support::gridFor;
using test_support::lightnessOf;
using test_support::onEveryInstructionSet;

TEST(GridSplat, MatchesItsDefinition) {
  for (const Geometry& g : geometries) {
    for (std::uint64_t seed = 0; seed < 6; ++seed) {
      const Image<float> lightness = lightnessOf(g, seed);
      Grid expected = gridFor(g);
      splatScalar(lightness, g.cellSize, expected);
      onEveryInstructionSet([&] {
        Grid actual = gridFor(g);
        splat(lightness, g.cellSize, actual);
        ASSERT_EQ(fingerprint(actual), fingerprint(expected))
            << g.width << " x " << g.height << ", seed " << seed;
      });
    }
  }
}

}  // namespace
}  // namespace pelorin::image_processing
