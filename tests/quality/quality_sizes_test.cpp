#include <gtest/gtest.h>

#include <stdexcept>

#include "image_processing/quality/block_features.h"
#include "image_processing/quality/image_structure.h"
#include "tests/quality/float_images.h"

namespace pelorin::image_processing {
namespace {

// Each image is the whole of its allocation, so that the address sanitizer sees a write beyond it.
TEST(Sizes, BlockFeaturesNeedTheirRowsAndColumns) {
  Image<float> structure(192, 96);
  structure.set(0.5f);
  Image<float> whole(2, 36);
  computeBlockFeatures(structure, 18, 96, 2, 1, 0, whole);
  computeBlockFeatures(structure, 18, 96, 2, 1, 1, whole);
  for (const auto& [columns, rows] : {std::pair{2u, 17u}, {1u, 36u}, {0u, 0u}}) {
    Image<float> small(columns, rows);
    EXPECT_THROW(computeBlockFeatures(structure, 18, 96, 2, 1, 0, small), std::invalid_argument);
    EXPECT_THROW(computeBlockFeaturesScalar(structure, 18, 96, 2, 1, 0, small),
                 std::invalid_argument);
  }
  Image<float> oneScale(2, 18);
  computeBlockFeatures(structure, 18, 96, 2, 1, 0, oneScale);
  EXPECT_THROW(computeBlockFeatures(structure, 18, 96, 2, 1, 1, oneScale), std::invalid_argument);
}

TEST(Sizes, StructureStaysWithinBothImages) {
  Image<float> grey(20, 10), structure(20, 10), narrow(19, 10), low(20, 9);
  grey.set(1.0f);
  for (const auto compute : {computeImageStructure_fast, computeImageStructure}) {
    compute(grey, 20, 10, structure);
    EXPECT_THROW(compute(grey, 21, 10, structure), std::invalid_argument);
    EXPECT_THROW(compute(grey, 20, 11, structure), std::invalid_argument);
    EXPECT_THROW(compute(grey, 20, 10, narrow), std::invalid_argument);
    EXPECT_THROW(compute(grey, 20, 10, low), std::invalid_argument);
    EXPECT_THROW(compute(low, 20, 10, structure), std::invalid_argument);
  }
}

}  // namespace
}  // namespace pelorin::image_processing
