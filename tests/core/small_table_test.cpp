#include <gtest/gtest.h>

#include <cstdint>

#undef HWY_TARGET_INCLUDE
#define HWY_TARGET_INCLUDE "tests/core/small_table_test.cpp"
#include <hwy/foreach_target.h>  // compiles the rest of this file once per instruction set
#include <hwy/highway.h>

#include "image_processing/core/small_table.h"
#include "tests/support/instruction_sets.h"

HWY_BEFORE_NAMESPACE();
namespace pelorin::image_processing::HWY_NAMESPACE {
namespace {
namespace hn = hwy::HWY_NAMESPACE;

/// result[i] = samples[63 - i] by way of the table.
void readBackwards(const float* samples, float* result) {
  const hn::CappedTag<float, 16> floats;
  const hn::RebindToSigned<decltype(floats)> ints;
  const simd::SmallTable table(samples);
  for (std::size_t i = 0; i < 64; i += hn::Lanes(floats)) {
    const auto last = hn::Set(ints, 63 - static_cast<std::int32_t>(i));
    hn::StoreU(table(hn::Sub(last, hn::Iota(ints, 0))), floats, result + i);
  }
}

}  // namespace
}  // namespace pelorin::image_processing::HWY_NAMESPACE
HWY_AFTER_NAMESPACE();

#if HWY_ONCE
namespace pelorin::image_processing {
namespace {
HWY_EXPORT(readBackwards);

TEST(SmallTable, HoldsSixtyFourSamples) {
  float samples[64];
  for (int i = 0; i < 64; ++i) samples[i] = 100.0f + static_cast<float>(i);
  test_support::onEveryInstructionSet([&] {
    float result[64] = {};
    HWY_DYNAMIC_DISPATCH(readBackwards)(samples, result);
    for (int i = 0; i < 64; ++i) EXPECT_EQ(result[i], samples[63 - i]) << i;
  });
}

}  // namespace
}  // namespace pelorin::image_processing
#endif
