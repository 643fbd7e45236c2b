#include "image_processing/autoenhance/masks/mirror.h"

#include <gtest/gtest.h>

namespace pelorin::image_processing {
namespace {

TEST(Reflect, MirrorsAtBothEnds) {
  EXPECT_EQ(reflect(-3, 10), 3);
  EXPECT_EQ(reflect(0, 10), 0);
  EXPECT_EQ(reflect(9, 10), 9);
  EXPECT_EQ(reflect(10, 10), 9);
  EXPECT_EQ(reflect(12, 10), 7);
  EXPECT_EQ(reflect(1, 1), 0);
}

TEST(Reflect, HoldsIndicesFarOutsideToAnEdge) {
  EXPECT_EQ(reflectInto(-30, 10), 9);
  EXPECT_EQ(reflectInto(50, 10), 0);
  EXPECT_EQ(reflectInto(-5, 1), 0);
}

}  // namespace
}  // namespace pelorin::image_processing
