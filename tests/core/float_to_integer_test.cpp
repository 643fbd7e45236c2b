#include "image_processing/core/float_to_integer.h"

#include <gtest/gtest.h>

#include <cmath>
#include <limits>

#include "image_processing/core/checked_size.h"

namespace pelorin::image_processing {
namespace {

constexpr float infinity = std::numeric_limits<float>::infinity();

TEST(TruncateTo, GoesTowardZero) {
  EXPECT_EQ(truncateTo<std::int32_t>(2.9f), 2);
  EXPECT_EQ(truncateTo<std::int32_t>(-2.9f), -2);
  EXPECT_EQ(truncateTo<std::uint32_t>(0.999f), 0u);
  EXPECT_EQ(truncateTo<std::uint32_t>(-0.5f), 0u);
}

TEST(TruncateTo, SaturatesAtBothEnds) {
  EXPECT_EQ(truncateTo<std::int32_t>(2147483648.0f), 2147483647);
  EXPECT_EQ(truncateTo<std::int32_t>(2147483520.0f), 2147483520);
  EXPECT_EQ(truncateTo<std::int32_t>(-2147483648.0f), std::numeric_limits<std::int32_t>::min());
  EXPECT_EQ(truncateTo<std::int32_t>(-1e30f), std::numeric_limits<std::int32_t>::min());
  EXPECT_EQ(truncateTo<std::int32_t>(infinity), 2147483647);
  EXPECT_EQ(truncateTo<std::int32_t>(-infinity), std::numeric_limits<std::int32_t>::min());
  EXPECT_EQ(truncateTo<std::uint32_t>(-1e30f), 0u);
  EXPECT_EQ(truncateTo<std::uint32_t>(4294967296.0f), 4294967295u);
  EXPECT_EQ(truncateTo<std::uint32_t>(infinity), 4294967295u);
  EXPECT_EQ(truncateTo<std::int32_t>(2147483647.5), 2147483647);
}

TEST(TruncateTo, TakesNaNForZero) {
  EXPECT_EQ(truncateTo<std::int32_t>(std::nanf("")), 0);
  EXPECT_EQ(truncateTo<std::uint32_t>(std::nanf("")), 0u);
  EXPECT_EQ(truncateTo<std::int32_t>(std::nan("")), 0);
}

TEST(CheckedProduct, MultipliesWhatFits) {
  EXPECT_EQ(checkedProduct(3, 5u, 4u), 60u);
  EXPECT_EQ(checkedProduct(0, 4294967295u, 4u), 0u);
}

TEST(CheckedProduct, ThrowsBadAllocBeyondTheAddressSpace) {
  EXPECT_THROW(checkedProduct(4294967295u, 4294967295u, 4u), std::bad_alloc);
  EXPECT_THROW(checkedProduct(std::uint64_t{1} << 62, 2u), std::bad_alloc);
  if constexpr (sizeof(void*) == 4) {
    EXPECT_THROW(checkedProduct(65536, 65536u), std::bad_alloc);
  }
}

}  // namespace
}  // namespace pelorin::image_processing
