#include "image_processing/autoenhance/masks/grid.h"

#include <gtest/gtest.h>

#include <cstdint>
#include <new>

namespace pelorin::image_processing {
namespace {

TEST(Grid, BeginsEmptyInWholeCacheLines) {
  Grid grid(3, 2);
  ASSERT_EQ(grid.cells.size(), 6u);
  for (const GridCell& cell : grid.cells) {
    EXPECT_EQ(reinterpret_cast<std::uintptr_t>(&cell) % 64, 0u);
    for (const GridNode& node : cell) {
      EXPECT_EQ(node.value, 0.0f);
      EXPECT_EQ(node.weight, 0.0f);
    }
  }
  EXPECT_EQ(grid.row(1), &grid.cells[3]);
}

TEST(Grid, TooWideOrTooLargeDoesNotFit) {
  EXPECT_NO_THROW(Grid(0, 5));
  EXPECT_THROW(Grid(std::int64_t{1} << 27, 1), std::bad_alloc);
  EXPECT_THROW(Grid((std::int64_t{1} << 27) - 1, std::int64_t{1} << 62), std::bad_alloc);
}

TEST(NearestNode, IsTheOneRoundedToAndInsideTheGrid) {
  EXPECT_EQ(nearestNode(0, 10.0f, 4), 0);
  EXPECT_EQ(nearestNode(4, 10.0f, 4), 0);
  EXPECT_EQ(nearestNode(5, 10.0f, 4), 1);
  EXPECT_EQ(nearestNode(24, 10.0f, 4), 2);
  EXPECT_EQ(nearestNode(39, 10.0f, 4), 3);  // 4 is beyond
  EXPECT_EQ(nearestNode(39, 10.0f, 1), 0);
}

TEST(GridNeighbours, EncloseThePosition) {
  const GridNeighbours between(14, 10.0f, 4);
  EXPECT_EQ(between.before, 1);
  EXPECT_EQ(between.after, 2);
  EXPECT_EQ(between.fraction, 14.0f / 10.0f - 1.0f);
  const GridNeighbours on(20, 10.0f, 4);
  EXPECT_EQ(on.before, 2);
  EXPECT_EQ(on.after, 3);
  EXPECT_EQ(on.fraction, 0.0f);
}

TEST(GridNeighbours, BeyondTheLastNodeAreThatNode) {
  const GridNeighbours last(39, 10.0f, 4);
  EXPECT_EQ(last.before, 3);
  EXPECT_EQ(last.after, 3);
  const GridNeighbours beyond(55, 10.0f, 4);
  EXPECT_EQ(beyond.before, 3);
  EXPECT_EQ(beyond.after, 3);
  EXPECT_EQ(beyond.fraction, 5.5f - 3.0f);
}

}  // namespace
}  // namespace pelorin::image_processing
