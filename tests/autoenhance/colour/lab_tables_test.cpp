#include "image_processing/autoenhance/colour/lab_tables.h"

#include <gtest/gtest.h>

#include "image_processing/autoenhance/colour/colour_tables.h"

namespace pelorin::image_processing {
namespace {

TEST(XYZ2labTable, StartsAtSixteenOver116) {
  EXPECT_EQ(colourTables().xyzToLab(0.0f), 16.0f / 116.0f);
}

TEST(Lab2yTable, EndsAtOne) {
  EXPECT_EQ(colourTables().labToY(100.0f), 1.0f);
}

}  // namespace
}  // namespace pelorin::image_processing
