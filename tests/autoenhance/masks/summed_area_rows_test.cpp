#include "image_processing/autoenhance/masks/summed_area_rows.h"

#include <gtest/gtest.h>

#include <cstdint>
#include <cstring>
#include <vector>

#include "tests/support/instruction_sets.h"
#include "tests/support/pictures.h"

namespace pelorin::image_processing {
namespace {

using test_support::onEveryInstructionSet;
using test_support::Random;

TEST(SumRows, MatchTheirDefinition) {
  for (const std::int64_t width :
       {2, 3, 4, 5, 17, 31, 32, 33, 34, 35, 36, 63, 64, 100, 257, 1000}) {
    const std::int64_t stride = width + sumRowsPadding;
    Random random(width);
    std::vector<float> above(stride), weights(sumRowsAtOnce * stride);
    for (float& sum : above) sum = 100.0f * random.nextFloat();
    for (float& weight : weights) weight = random.nextFloat() / 289.0f;
    std::vector<float> expected = weights;
    sumRowsScalar(above.data(), expected.data(), stride, width);
    onEveryInstructionSet([&] {
      std::vector<float> actual = weights;
      sumRows(above.data(), actual.data(), stride, width);
      for (std::int64_t i = 0; i < sumRowsAtOnce; ++i) {
        ASSERT_EQ(std::memcmp(&actual[i * stride], &expected[i * stride], width * sizeof(float)), 0)
            << "row " << i << " of width " << width;
      }
    });
  }
}

}  // namespace
}  // namespace pelorin::image_processing
