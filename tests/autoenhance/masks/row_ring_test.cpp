#include "image_processing/autoenhance/masks/row_ring.h"

#include <gtest/gtest.h>

namespace pelorin::image_processing {
namespace {

TEST(RowRing, HoldsTheLatestRowsWhereOlderOnesStood) {
  const RowRing<float> ring(4, 3);
  EXPECT_EQ(ring.held(), 3u);
  for (std::uint32_t y = 0; y < 10; ++y) {
    ring.row(y)[3] = static_cast<float>(y);
    for (std::uint32_t latest = y < 2 ? 0 : y - 2; latest <= y; ++latest) {
      EXPECT_EQ(ring.row(latest)[3], static_cast<float>(latest));
    }
  }
  EXPECT_EQ(ring.row(9), ring.row(6));
  EXPECT_NE(ring.row(9), ring.row(8));
}

TEST(RowRing, OfAnImageIsItsRows) {
  const Image<float> image(2, 5);
  const RowRing<float> ring(image);
  EXPECT_EQ(ring.held(), 5u);
  for (std::uint32_t y = 0; y < 5; ++y) EXPECT_EQ(ring.row(y), image.row(y));
}

}  // namespace
}  // namespace pelorin::image_processing
