#include "image_processing/autoenhance/masks/shaping_tables.h"

#include <gtest/gtest.h>

namespace pelorin::image_processing {
namespace {

TEST(SuperQuadric, IsABumpOverItsRange) {
  const SuperQuadric bump(10.0f, 20.0f, 1024, 2.0f);
  EXPECT_EQ(bump(10.0f), 0.0f);
  EXPECT_NEAR(bump(15.0f), 1.0f, 1e-5f);
  EXPECT_NEAR(bump(20.0f), 0.0f, 1e-2f);
  EXPECT_NEAR(bump(12.5f), 0.75f, 2e-3f);
}

}  // namespace
}  // namespace pelorin::image_processing
