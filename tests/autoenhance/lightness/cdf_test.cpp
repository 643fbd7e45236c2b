#include "image_processing/autoenhance/lightness/cdf.h"

#include <gtest/gtest.h>

#include <vector>

namespace pelorin::image_processing {
namespace {

TEST(ComputeCDF, AndItsInverseSumAndDifferLeftToRight) {
  std::vector<float> cdf, histogram;
  computeCDF({0.25f, 0.5f, 0.25f}, cdf);
  EXPECT_EQ(cdf, (std::vector<float>{0.0f, 0.25f, 0.75f, 1.0f}));
  computeHistogramFromCDF(cdf, histogram);
  EXPECT_EQ(histogram, (std::vector<float>{0.25f, 0.5f, 0.25f}));
}

}  // namespace
}  // namespace pelorin::image_processing
