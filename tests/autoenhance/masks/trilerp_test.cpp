#include "image_processing/autoenhance/masks/trilerp.h"

#include <gtest/gtest.h>

namespace pelorin::image_processing {
namespace {

TEST(Trilerp, InterpolatesItsCornersAndExtrapolatesBeyond) {
  const auto at = [](float ty, float tx, float tb) {
    return trilerp(0.0f, 1.0f, 2.0f, 3.0f, 4.0f, 5.0f, 6.0f, 7.0f, ty, tx, tb);
  };
  EXPECT_EQ(at(0, 0, 0), 0.0f);
  EXPECT_EQ(at(1, 0, 0), 1.0f);
  EXPECT_EQ(at(0, 1, 0), 2.0f);
  EXPECT_EQ(at(0, 0, 1), 4.0f);
  EXPECT_EQ(at(1, 1, 1), 7.0f);
  EXPECT_EQ(at(0.5f, 0.5f, 0.5f), 3.5f);
  EXPECT_EQ(at(2, 0, 0), 2.0f);
}

}  // namespace
}  // namespace pelorin::image_processing
