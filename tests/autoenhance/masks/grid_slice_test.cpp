#include "image_processing/autoenhance/masks/grid_slice.h"

#include <gtest/gtest.h>

#include <cstdint>

#include "image_processing/autoenhance/masks/grid_blur.h"
#include "image_processing/autoenhance/masks/grid_splat.h"
#include "tests/autoenhance/masks/geometries.h"
#include "tests/support/fingerprint.h"
#include "tests/support/instruction_sets.h"
#include "tests/support/mask_types.h"

namespace pelorin::image_processing {
namespace {

using test_support::Quantized;

using test_support::fingerprint;
using test_support::geometries;
using test_support::Geometry;
using test_support::gridFor;
using test_support::lightnessOf;
using test_support::onEveryInstructionSet;

template <typename T>
class GridSlice : public testing::Test {};
TYPED_TEST_SUITE(GridSlice, test_support::MaskTypes);

TYPED_TEST(GridSlice, MatchesItsDefinition) {
  for (const Geometry& g : geometries) {
    for (std::uint64_t seed = 0; seed < 5; ++seed) {
      const Image<float> lightness = lightnessOf(g, seed);
      Grid grid = gridFor(g);
      splatScalar(lightness, g.cellSize, grid);
      if (seed < 4) blurScalar(grid, seed == 3 ? 0.0f : 0.7f);  // without it nodes stay empty
      Image<TypeParam> expected(g.width, g.height);
      sliceScalar(grid, lightness, g.cellSize, expected);
      onEveryInstructionSet([&] {
        Image<TypeParam> actual(g.width, g.height);
        slice(grid, lightness, g.cellSize, actual);
        ASSERT_EQ(fingerprint(actual), fingerprint(expected))
            << g.width << " x " << g.height << ", seed " << seed;
      });
    }
  }
}

}  // namespace
}  // namespace pelorin::image_processing
