#include "image_processing/autoenhance/masks/grid_blur.h"

#include <gtest/gtest.h>

#include <cmath>

#include "image_processing/autoenhance/masks/grid_splat.h"
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

TEST(GridBlur, MatchesItsDefinition) {
  for (const Geometry& g : geometries) {
    const Image<float> lightness = lightnessOf(g, 1);
    Grid splatted = gridFor(g);
    splatScalar(lightness, g.cellSize, splatted);
    for (const float range :
         {0.7f, 0.0f, -1.0f, 0.03f, 1.0f / 32, 0.1f, 1.0f, 5.0f, 1e30f, std::nanf("")}) {
      if (g.width > 1000 && range != 0.7f) continue;  // takes its time
      Grid expected = splatted;
      blurScalar(expected, range);
      onEveryInstructionSet([&] {
        Grid actual = splatted;
        blur(actual, range);
        ASSERT_EQ(fingerprint(actual), fingerprint(expected))
            << g.width << " x " << g.height << ", range " << range;
      });
    }
  }
}

}  // namespace
}  // namespace pelorin::image_processing
