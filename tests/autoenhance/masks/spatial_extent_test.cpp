#include "image_processing/autoenhance/masks/spatial_extent.h"

#include <gtest/gtest.h>

#include <cmath>

namespace pelorin::image_processing {
namespace {

TEST(SpatialExtent, IsAShareOfTheShorterSideAndAtLeastOnePixel) {
  FilterConfig config = defaultFilterConfigValue;
  config.bilateralSpatialFraction = 0.25f;
  EXPECT_EQ(spatialExtent(400, 100, config), 25.0f);
  EXPECT_EQ(spatialExtent(100, 400, config), 25.0f);
  EXPECT_EQ(spatialExtent(10, 10, config), 2.5f);
  EXPECT_EQ(spatialExtent(400, 3, config), 1.0f);
  EXPECT_EQ(spatialExtent(0, 0, config), 1.0f);
  config.bilateralSpatialFraction = NAN;
  EXPECT_EQ(spatialExtent(400, 400, config), 1.0f);
}

}  // namespace
}  // namespace pelorin::image_processing
