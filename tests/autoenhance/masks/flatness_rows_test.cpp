#include "image_processing/autoenhance/masks/flatness_rows.h"

#include <gtest/gtest.h>

#include <cstring>
#include <vector>

#include "tests/support/instruction_sets.h"
#include "tests/support/mask_types.h"

namespace pelorin::image_processing {
namespace {

using test_support::Quantized;

using test_support::onEveryInstructionSet;

TEST(WeighRow, TakesEveryByteAsItsDefinitionDoes) {
  std::vector<Quantized> bytes(256);
  for (std::size_t i = 0; i < 256; ++i) {
    const auto byte = static_cast<unsigned char>(i);
    std::memcpy(static_cast<void*>(&bytes[i]), &byte, 1);
  }
  // Around a peak of 2^20 the weight changes with the last bit of its argument.
  for (const float offset : {0.0f, 1e-7f, 0.01f, -0.03f, 0.07f}) {
    const GaussianApproximation<float> weight(-0.08f, 0.08f, 0.0f, 1048576.0f);
    std::vector<float> lightness(256), expected(256), actual(256);
    for (std::size_t i = 0; i < 256; ++i) lightness[i] = bytes[i] + offset;
    weighRowScalar(weight, lightness.data(), bytes.data(), expected.data(), 256);
    onEveryInstructionSet([&] {
      weighRow(weight, lightness.data(), bytes.data(), actual.data(), 256);
      ASSERT_EQ(actual, expected) << offset;
    });
  }
}

}  // namespace
}  // namespace pelorin::image_processing
